#pragma once

namespace base
{

/// Pi as a 32-bit float, 3.1415927410125732. Stored scenes were placed with it, so angles convert by it and not by
/// the double.
inline constexpr float floatPi = 3.14159274f;

inline constexpr double RadiansFromDegrees(double degrees)
{
    return degrees * floatPi / 180.0;
}

inline constexpr double DegreesFromRadians(double radians)
{
    return radians * 180.0 / floatPi;
}

} // namespace base

#pragma once

#include <array>

namespace SimulationDataPoints
{

/// A rotation, row by row, that turns body coordinates into the scene's: p' = R p.
using VtTRotation = std::array<std::array<double, 3>, 3>;

struct VtTQuaternion
{
    double w = 1.0;
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;
};

/// R = Rz(yaw) Ry(pitch) Rx(roll), angles in degrees: z up, right-handed, yaw first, then pitch about the turned y
/// axis, then roll about the turned x axis (ISO 8855). A positive pitch takes the nose down.
VtTRotation RotationFromAngles(double yaw, double pitch, double roll);

/// Of a quaternion of any length but 0.
VtTRotation RotationFromQuaternion(const VtTQuaternion& q);

/// The unit quaternion with w not below 0 that comes nearest to `r`.
VtTQuaternion QuaternionFromRotation(const VtTRotation& r);

/// The largest amount by which an entry of R^T R differs from the identity; 2 for a mirrored `r`.
double RigidityError(const VtTRotation& r);

} // namespace SimulationDataPoints

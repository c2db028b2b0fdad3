#pragma once

#include <cstdint>
#include <string>

namespace host
{
class Progress;
class Texts;
} // namespace host
namespace SimulationDataPoints
{
class VtCSimulationDataPoint;
}

namespace hosts
{

inline constexpr const wchar_t* filePoint = L"File";       ///< the point that takes motion data files
inline constexpr std::uint32_t messageNoFilePoint = 9110;  ///< its module isn't there
inline constexpr std::uint32_t messageDataUnusable = 9111; ///< %1 the file

/// Loads the file (inner form) into the point, with the point's own steps shown as progress. False when it can't be
/// used; what the point has to say is on its message stack in either case.
bool LoadMotionData(SimulationDataPoints::VtCSimulationDataPoint& point, const std::wstring& file,
                    host::Progress& progress, const host::Texts& texts);

} // namespace hosts

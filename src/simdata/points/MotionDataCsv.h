#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace SimulationDataPoints
{

class VtILoadProgress;

/// How a conversion went.
struct VtTConversionReport
{
    std::wstring error; ///< with the file and the place in it; empty when the output file was written
    std::vector<std::wstring> warnings;
    std::uint64_t frames = 0;
    std::uint64_t poses = 0;
    std::uint64_t instruments = 0;
};

/// Motion data as text: tables of comma separated values, one row a frame, in UTF-8.
///
/// The first row names the columns:
/// - `time`, in seconds, required. Where it is empty in every row the file goes by frame number, without time stamps.
/// - for a pose NAME: `NAME.x`, `NAME.y`, `NAME.z` in metres, z up, with either `NAME.roll`, `NAME.pitch`, `NAME.yaw`
///   in degrees (yaw, then pitch, then roll: see `RotationFromAngles`) or `NAME.qw`, `NAME.qx`, `NAME.qy`, `NAME.qz`
///   (of any length but 0).
/// - any other column is an instrument stream, its unit in square brackets: `speed [km/h]`. A column with brackets is
///   always a stream, so that `Accel.x []` names one that would otherwise look like a pose. An empty field is a frame
///   without a value.
///
/// Fields may stand in double quotes. Separators are commas; where the first row holds semicolons or tabs, these, and
/// then numbers may have a decimal comma. A byte order mark, CRLF and empty lines are no matter.
class VtCMotionDataCsv
{
public:
    /// Makes a motion data file of a table; false with `report.error` otherwise, and then no file appears and an older
    /// one stays. `progress` may be null.
    static bool Import(const std::filesystem::path& table, const std::filesystem::path& motionData,
                       VtTConversionReport& report, VtILoadProgress* progress = nullptr, long activity = -1);

    /// Makes a table that `Import` reads back: positions, times and values exactly, rotations as quaternions to the
    /// precision of the floats. Track safety and stored names don't go along. A pose that scales, shears or mirrors
    /// can't be told by these columns and is an error, and so are the rare names that a header can't hold (" a" with a
    /// unit); what the reader had to leave out or repair is a warning.
    static bool Export(const std::filesystem::path& motionData, const std::filesystem::path& table,
                       VtTConversionReport& report, VtILoadProgress* progress = nullptr, long activity = -1);
};

} // namespace SimulationDataPoints

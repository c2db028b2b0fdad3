#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "simdata/points/ChannelDescription.h"

namespace SimulationDataPoints
{

/// Where the parts of a pose stand in a row; by column index.
struct VtTCsvPose
{
    static constexpr std::uint32_t none = 0xFFFFFFFF;

    std::array<std::uint32_t, 3> position = {none, none, none};         ///< x, y, z
    std::array<std::uint32_t, 3> angles = {none, none, none};           ///< roll, pitch, yaw; or
    std::array<std::uint32_t, 4> quaternion = {none, none, none, none}; ///< qw, qx, qy, qz

    bool HasQuaternion() const { return quaternion[0] != none; }
};

/// What the first row of a table says about its columns.
struct VtTCsvColumns
{
    std::size_t count = 0;
    std::uint32_t time = VtTCsvPose::none;
    std::vector<VtTCsvPose> poses;          ///< as in `channels.poses`
    std::vector<std::uint32_t> instruments; ///< as in `channels.instruments`
    VtTChannelDescription channels;
};

/// Reads the first row. Why it is unusable ("column 4 (Car.x): it stands twice"), or empty.
std::wstring ReadCsvHeader(const std::vector<std::string_view>& fields, VtTCsvColumns& columns);

/// The header fields of such a table: time, the poses with quaternions, the streams.
std::vector<std::string> CsvHeader(const VtTChannelDescription& channels);

} // namespace SimulationDataPoints

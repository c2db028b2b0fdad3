#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace SimulationDataPoints
{

struct VtTChannelDescription;

/// The fixed header of a motion data file; docs/motion-data-format.md has the byte table. Behind it stand the JSON
/// description and the frames.
struct VtTMotionDataHeader
{
    static constexpr std::size_t bytes = 40;
    static constexpr std::size_t frameCountOffset = 24;
    static constexpr std::array<unsigned char, 8> magic = {0x89, 'P', 'M', 'D', 'F', '\r', '\n', 0x1A};
    static constexpr std::uint32_t currentVersion = 1;

    /// Frame count of a file that is being written, or whose writer died: as many as there are.
    static constexpr std::uint64_t unknownFrameCount = 0xFFFFFFFFFFFFFFFFU;

    static constexpr std::uint32_t maxDescriptionBytes = 16 << 20;

    std::uint32_t version = currentVersion;
    std::uint32_t poseCount = 0;
    std::uint32_t instrumentCount = 0;
    std::uint32_t stride = 0; ///< bytes of a frame
    std::uint64_t frameCount = unknownFrameCount;
    std::uint32_t descriptionBytes = 0;

    std::array<std::byte, bytes> Encode() const;

    /// Why `data`, the first `size` bytes of a file of `fileSize` bytes, is no usable header; empty if it is one. All
    /// counts and lengths are checked against each other and against the file before anybody allocates by them.
    std::wstring Decode(const std::byte* data, std::size_t size, std::uint64_t fileSize);
};

/// The description as JSON, padded with blanks so that the frames behind it start at a multiple of 8.
std::string EncodeDescription(const VtTChannelDescription& channels);

/// Reads such a text. Why it is no usable description for a file with that header, or empty.
std::wstring DecodeDescription(std::string_view json, const VtTMotionDataHeader& header,
                               VtTChannelDescription& channels);

} // namespace SimulationDataPoints

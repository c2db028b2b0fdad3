#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace SimulationDataPoints
{

/// Whether frames recorded with one channel layout can be played against another.
enum TRACK_SAFETY : std::int32_t
{
    TRACK_SAFE = 0,
    TRACK_SAFE_WITH_WARNING = 1, ///< the layout is not fully known to match
    TRACK_UNSAFE = 2,            ///< also wherever there is no data point to ask
};

/// An instrument stream: its name, by which instruments are bound, and the unit of its values, which may be empty.
struct VtTInstrumentStream
{
    std::wstring name;
    std::wstring unit;

    bool operator==(const VtTInstrumentStream&) const = default;
};

/// What the channels of a frame are, and where each lies in the frame's record.
///
/// A record is one block of `Stride` bytes, little-endian as on the machine and in motion data files: the time as a
/// double, then each pose as 16 floats row by row, then each instrument value as a double. Channels count from 0,
/// poses first.
struct VtTChannelDescription
{
    std::vector<std::wstring> poses;
    std::vector<std::wstring> storedPoses; ///< the poses' names in the source, one each; empty: the same as `poses`
    std::vector<VtTInstrumentStream> instruments;
    TRACK_SAFETY trackSafety = TRACK_SAFE;
    bool timeStamps = true; ///< false: frames go by number, their times mean nothing

    bool operator==(const VtTChannelDescription&) const = default;

    static constexpr std::size_t timeBytes = 8;
    static constexpr std::size_t poseBytes = 64;
    static constexpr std::size_t instrumentBytes = 8;

    /// Most poses, and most instruments, that a frame may have.
    static constexpr std::size_t maxChannels = 100000;

    std::size_t ChannelCount() const { return poses.size() + instruments.size(); }
    std::size_t Stride() const { return timeBytes + poses.size() * poseBytes + instruments.size() * instrumentBytes; }
    std::size_t PoseOffset(std::size_t pose) const { return timeBytes + pose * poseBytes; }
    std::size_t InstrumentOffset(std::size_t instrument) const
    {
        return timeBytes + poses.size() * poseBytes + instrument * instrumentBytes;
    }

    /// Why these channels can't be used, or empty when they can: no channel at all, too many, a name that is empty,
    /// holds the "|" that separates names in lists or a control character, or stands twice without regard to case.
    std::wstring Fault() const;
};

} // namespace SimulationDataPoints

#pragma once

#include <cmath>
#include <cstddef>
#include <memory>
#include <vector>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/SimulationData.h"

namespace SimulationDataPoints
{

/// One sample of all channels at one time.
///
/// A view on a record of the frame buffer that handed it out: poses first, in the order of the channel names, then the
/// instrument streams. How long it stays valid is told at `VtCSimulationDataFrames`; whoever needs the values longer
/// copies them.
class VtCSimulationDataFrame
{
public:
    VtCSimulationDataFrame(const VtCSimulationDataFrame&) = delete;
    VtCSimulationDataFrame& operator=(const VtCSimulationDataFrame&) = delete;

    /// Channel by index from 0; null when out of range.
    VtCSimulationData* GetSimulationData(long index)
    {
        return index >= 0 && static_cast<std::size_t>(index) < channels.size() ? &channels[index] : nullptr;
    }

    /// The 16 floats of a pose where they lie, row by row as `GetMatrix4x4` gives them; null for an instrument stream
    /// and when out of range. For who reads thousands of them in every frame.
    const float* GetPose(long index) const
    {
        return index >= 0 && static_cast<std::size_t>(index) < poseCount
                   ? reinterpret_cast<const float*>(record + description->PoseOffset(static_cast<std::size_t>(index)))
                   : nullptr;
    }

    int GetCount() const { return static_cast<int>(channels.size()); }
    bool IsEmpty() const { return channels.empty(); }

    /// Seconds, rounded as `RoundTimeStamp` does.
    double GetTimestamp() const { return time; }

    /// The number of the frame in its buffer, from 1. In a ring that is full it is the number at the moment of asking:
    /// the oldest frame is always 1.
    int GetFrameId() const { return static_cast<int>(number); }

    /// The track that the frame belongs to at the moment; 0 is the live stream of the scene's own bodies, and what a
    /// view has when it is newly bound. Who collects the frames of tracks sets it each time.
    unsigned long GetTrackID() const { return track; }
    void SetTrackID(unsigned long id) { track = id; }

    /// The frame's whole record, laid out as `GetDescription` says.
    const std::byte* GetRecord() const { return record; }
    const VtTChannelDescription& GetDescription() const { return *description; }

    /// `t` to the resolution of time stamps, a microsecond, so that a computed time compares equal to a stored one.
    /// Rounding again changes nothing; times above 71 years, which a double can't hold that finely, stay as they are.
    static double RoundTimeStamp(double t)
    {
        constexpr double ticksPerSecond = 1e6;
        constexpr double largest = 2251799813.685248; // 2^51 ticks
        // Below 2^51 adding this leaves no room for fractions; a call of the mathematics library would cost more than
        // all the rest of finding a frame.
        constexpr double wholeNumbersOnly = 6755399441055744.0; // 1.5 * 2^52
        if (!(std::fabs(t) < largest))
            return t;
        return ((t * ticksPerSecond + wholeNumbersOnly) - wholeNumbersOnly) / ticksPerSecond;
    }

private:
    friend class VtCSimulationDataFrames;

    explicit VtCSimulationDataFrame(std::shared_ptr<const VtTChannelDescription> layout);

    void Bind(const std::byte* newRecord, double newTime, std::size_t newNumber)
    {
        record = newRecord;
        time = newTime;
        number = newNumber;
        track = 0;
    }

    std::shared_ptr<const VtTChannelDescription> description;
    std::size_t poseCount;
    std::vector<VtCSimulationData> channels;
    const std::byte* record = nullptr;
    double time = 0.0;
    std::size_t number = 0;
    unsigned long track = 0;
};

} // namespace SimulationDataPoints

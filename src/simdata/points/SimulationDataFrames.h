#pragma once

#include <array>
#include <cstddef>
#include <cstring>
#include <memory>
#include <optional>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/FrameBlock.h"
#include "simdata/points/SimulationDataFrame.h"
#include "simdata/points/TimeGrid.h"

namespace SimulationDataPoints
{

/// The record of a frame that was just appended, to be filled. Indices count from 0 and are the caller's to keep.
class VtCFrameRecord
{
public:
    VtCFrameRecord(std::byte* memory, const VtTChannelDescription& layout) : record(memory), description(&layout) {}

    /// As `GetMatrix4x4` gives it: `m[row][column]`.
    void SetPose(std::size_t pose, const float m[4][4])
    {
        std::memcpy(record + description->PoseOffset(pose), m, VtTChannelDescription::poseBytes);
    }

    /// Among the instrument streams, not the channels.
    void SetInstrument(std::size_t instrument, double value)
    {
        std::memcpy(record + description->InstrumentOffset(instrument), &value, sizeof value);
    }

private:
    std::byte* record;
    const VtTChannelDescription* description;
};

/// An ordered buffer of frames, owned by whoever holds it: a data point, or a track that took it over.
///
/// A ring of `capacity` records in one block, with the times apart in a compact array: a frame costs its record and 8
/// bytes. Memory is taken from the system page by page as the buffer fills. When it is full, the next frame takes the
/// place of the oldest.
///
/// Frames are handed out as views that the buffer owns, `viewCount` of them in turn: a frame stays valid until that
/// many other frames have been asked for, its record is overwritten, or the buffer goes. Asking again for the frame
/// that was handed out last gives the same view. Nothing here allocates after construction. Not thread safe.
class VtCSimulationDataFrames
{
public:
    static constexpr std::size_t viewCount = 16;

    /// `channels` without a `Fault`. Throws `std::bad_alloc` when the address space doesn't hold so much.
    VtCSimulationDataFrames(std::shared_ptr<const VtTChannelDescription> channels, std::size_t capacity);
    virtual ~VtCSimulationDataFrames();
    VtCSimulationDataFrames(const VtCSimulationDataFrames&) = delete;
    VtCSimulationDataFrames& operator=(const VtCSimulationDataFrames&) = delete;

    int GetCount() const { return static_cast<int>(count); }

    /// Walks the buffer: start with a `position` of 0 and pass the same variable on. Null behind the last frame, also
    /// in a repeating buffer; there `wrapped` (which may be null) becomes 1 and `position` 0, so that the next call
    /// begins a new round. Everywhere else `wrapped` becomes 0.
    VtCSimulationDataFrame* GetNext(unsigned long& position, int* wrapped);

    /// The last frame whose time stamp is not above `t`. Null before the first frame, beyond the last time stamp and
    /// in a buffer without time stamps. A repeating buffer takes a time beyond its end back by whole spans of the
    /// buffer. A sum where the times are even, otherwise a guess and a bounded search: never a walk.
    VtCSimulationDataFrame* GetAtTime(double t, int reserved);

    /// Time stamp of the last frame; 0.0 in an empty buffer and one without time stamps.
    double ComputeLatestTime() const;

    /// Says whether times beyond the end wrap (`repeat` non-zero). Zero if the buffer is empty.
    int PrepareForTimeSyncReplay(int repeat, unsigned long reserved);
    bool IsRepeating() const { return repeating; }

    TRACK_SAFETY GetTrackSafety() const { return description->trackSafety; }
    const VtTChannelDescription& GetDescription() const { return *description; }

    std::size_t GetCapacity() const { return capacity; }

    /// Frame by index from 0, the oldest; null when out of range.
    VtCSimulationDataFrame* GetFrame(std::size_t index);

    /// Index of the frame for `t`, as `GetAtTime` finds it.
    std::optional<std::size_t> FindAtTime(double t) const;

    /// Rounded time stamp of a frame by index, which must be in range.
    double GetTimeAt(std::size_t index) const { return times[Physical(index)]; }

    /// `t` brought into the span of the buffer by whole spans, from either side; `t` itself when it lies inside.
    double WrapIntoSpan(double t, bool& wrapped) const;

    /// Adds a frame behind the last one; the record is zero until it is filled. `time` is rounded and never less than
    /// the last frame's.
    VtCFrameRecord Append(double time);

    /// All frames copied, oldest first, into a buffer of `newCapacity` (the newest, where not all fit).
    std::unique_ptr<VtCSimulationDataFrames> Copy(std::size_t newCapacity) const;

    /// For a loader that fills records in place: the free records of a buffer that has never been full, and taking
    /// the next one of them as a frame. `time` must be rounded and not below the last.
    std::byte* FreeRecords() { return records.Data() + count * stride; }
    void TakeRecord(double time)
    {
        times[count++] = time;
        grid.Add(time);
    }

private:
    std::size_t Physical(std::size_t index) const
    {
        const std::size_t at = oldest + index;
        return at < capacity ? at : at - capacity;
    }
    VtCSimulationDataFrame* HandOut(std::size_t index);
    std::size_t Search(double t) const;

    std::shared_ptr<const VtTChannelDescription> description;
    std::size_t capacity;
    std::size_t stride;
    std::size_t count = 0;
    std::size_t oldest = 0;
    bool repeating = false;
    VtCTimeGrid grid; ///< of all frames, with those that were overwritten
    VtCFrameBlock records;
    VtCFrameBlock timeBlock;
    double* times;
    std::array<std::unique_ptr<VtCSimulationDataFrame>, viewCount> views;
    std::size_t lastView = 0;
};

} // namespace SimulationDataPoints

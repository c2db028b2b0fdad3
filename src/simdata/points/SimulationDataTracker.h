#pragma once

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

namespace SimulationDataPoints
{

class VtCSimulationDataFrame;

/// The frames of one delivery: the head is the active point's, behind it stand those of the tracks. Owns none.
///
/// A place in it (`VtPosition`) is good until the next change of the list other than `SetAt` and `AddTail`. Emptied
/// and filled again it allocates nothing.
class VtCSimulationDataTracker
{
public:
    using VtPosition = std::size_t; ///< 0 is none

    VtCSimulationDataTracker() = default;
    virtual ~VtCSimulationDataTracker();
    VtCSimulationDataTracker(const VtCSimulationDataTracker&) = default;
    VtCSimulationDataTracker& operator=(const VtCSimulationDataTracker&) = default;

    void AddHead(VtCSimulationDataFrame* frame) { frames.insert(frames.begin(), frame); }
    void AddTail(VtCSimulationDataFrame* frame) { frames.push_back(frame); }

    /// Null when the list is empty.
    VtCSimulationDataFrame* GetHead() const { return frames.empty() ? nullptr : frames.front(); }

    VtPosition GetHeadPosition() const { return frames.empty() ? 0 : 1; }

    /// The frame at `position`, which moves on to the next one and becomes 0 behind the last. Null for a place that
    /// isn't in the list.
    VtCSimulationDataFrame* GetNext(VtPosition& position) const;

    bool IsEmpty() const { return frames.empty(); }
    int GetCount() const { return static_cast<int>(frames.size()); }
    void RemoveAll() { frames.clear(); }

    /// The frame taken out; null when the list is empty.
    VtCSimulationDataFrame* RemoveHead();

    /// Replaces the frame at `position`; nothing for a place that isn't in the list.
    void SetAt(VtPosition position, VtCSimulationDataFrame* frame);

    /// Names the data point that the frames come from; empty for none.
    void SetSimulationDataPoints(std::wstring name) { pointName = std::move(name); }
    const std::wstring& GetSimulationDataPoints() const { return pointName; }

private:
    std::vector<VtCSimulationDataFrame*> frames;
    std::wstring pointName;
};

} // namespace SimulationDataPoints

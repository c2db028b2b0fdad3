#include "simdata/points/SimulationDataTracker.h"

namespace SimulationDataPoints
{

VtCSimulationDataTracker::~VtCSimulationDataTracker() = default;

VtCSimulationDataFrame* VtCSimulationDataTracker::GetNext(VtPosition& position) const
{
    if (position == 0 || position > frames.size())
    {
        position = 0;
        return nullptr;
    }
    VtCSimulationDataFrame* frame = frames[position - 1];
    position = position < frames.size() ? position + 1 : 0;
    return frame;
}

VtCSimulationDataFrame* VtCSimulationDataTracker::RemoveHead()
{
    if (frames.empty())
        return nullptr;
    VtCSimulationDataFrame* head = frames.front();
    frames.erase(frames.begin());
    return head;
}

void VtCSimulationDataTracker::SetAt(VtPosition position, VtCSimulationDataFrame* frame)
{
    if (position > 0 && position <= frames.size())
        frames[position - 1] = frame;
}

} // namespace SimulationDataPoints

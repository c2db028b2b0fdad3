// How a data point moves over its buffered frames: by number, by time and in the spool.
#include "simdata/points/SimulationDataPoint.h"

#include <cmath>
#include <optional>

namespace SimulationDataPoints
{

int VtCSimulationDataPoint::SetRecent(unsigned long frame)
{
    if (!buffer || frame < 1 || frame > static_cast<unsigned long>(buffer->GetCount()))
        return 0;
    cursor = frame - 1;
    return 1;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::GetRecent(unsigned long& frame)
{
    return MoveTo(cursor, frame);
}

int VtCSimulationDataPoint::GetTimeStampOfCurrentElement(double& t) const
{
    if (!buffer || !timeStamps || cursor >= static_cast<std::size_t>(buffer->GetCount()))
        return 0;
    t = buffer->GetTimeAt(cursor);
    return 1;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::GetAtTime(double t)
{
    const std::optional<std::size_t> index = buffer && timeStamps ? buffer->FindAtTime(t) : std::nullopt;
    unsigned long number = 0;
    return index ? MoveTo(*index, number) : nullptr;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::Rewind(double start, double elapsed, double speed, unsigned long& frame,
                                                       int& wrapped)
{
    return Spool(start - elapsed * speed, true, frame, wrapped);
}

VtCSimulationDataFrame* VtCSimulationDataPoint::FastForward(double start, double elapsed, double speed,
                                                            unsigned long& frame, int& wrapped)
{
    return Spool(start + elapsed * speed, false, frame, wrapped);
}

VtCSimulationDataFrame* VtCSimulationDataPoint::Spool(double t, bool backwards, unsigned long& frame, int& wrapped)
{
    wrapped = 0;
    unsigned long count = 0;
    if (!GetBufferedFrames(count) || !timeStamps || !std::isfinite(t))
        return nullptr;

    t = VtCSimulationDataFrame::RoundTimeStamp(t);
    bool outside = t < buffer->GetTimeAt(0) || t > buffer->GetTimeAt(count - 1);
    if (outside && buffer->IsRepeating())
    {
        t = buffer->WrapIntoSpan(t, outside);
        wrapped = 1;
    }
    else if (outside)
    {
        const std::size_t end = t < buffer->GetTimeAt(0) ? 0 : count - 1;
        const bool leaving = backwards == (end == 0);
        return cursor == end && leaving ? nullptr : MoveTo(end, frame);
    }
    const std::optional<std::size_t> index = buffer->FindAtTime(t);
    return index ? MoveTo(*index, frame) : nullptr;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::GetNextFrame(unsigned long& frame)
{
    return MoveTo(cursor + 1, frame);
}

VtCSimulationDataFrame* VtCSimulationDataPoint::GetPreviousFrame(unsigned long& frame)
{
    return cursor > 0 ? MoveTo(cursor - 1, frame) : nullptr;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::MoveTo(std::size_t index, unsigned long& frame)
{
    VtCSimulationDataFrame* found = buffer ? buffer->GetFrame(index) : nullptr;
    if (found != nullptr)
    {
        cursor = index;
        frame = index + 1;
    }
    return found;
}

VtCSimulationDataFrame* VtCSimulationDataPoint::NewestFrame(unsigned long& frame)
{
    return buffer && buffer->GetCount() > 0 ? MoveTo(static_cast<std::size_t>(buffer->GetCount()) - 1, frame) : nullptr;
}

} // namespace SimulationDataPoints

// The router's frame operations: take a frame, deliver it to the scene, tell the listeners.
#include "simdata/SimulationDataRouter.h"

#include <algorithm>

#include "simdata/SimulationDataReceiver.h"

using SimulationDataPoints::TRACK_UNSAFE;

bool VtCSimulationDataRouter::FetchFrames()
{
    frames.RemoveAll();
    // By index: a listener may deselect the point that it is being told about.
    for (std::size_t i = 0; i < activePoints.size(); ++i)
        if (!FetchFrame(*activePoints[i]))
            return false;
    Deliver();
    return true;
}

bool VtCSimulationDataRouter::FetchFrame(Point& point)
{
    if (point.IsTimeDriven())
    {
        clock.TickClock();
        point.SetSimulationTime(clock.GetCurrentTime());
    }
    unsigned long id = 0;
    Frame* frame = point.GetCurrentFrame(id);
    double time = 0.0;
    const double* reported = nullptr;
    if (frame)
    {
        frames.AddTail(frame);
        int ignoredMessage = 0;
        if (point.GetTrackSafety(ignoredMessage) != TRACK_UNSAFE)
        {
            time = frame->GetTimestamp();
            clock.SetCurrentTime(time);
            reported = &time;
        }
    }
    NotifyFrame(point, frame, static_cast<int>(id), reported);
    ReportMessages(point);
    return frame != nullptr;
}

void VtCSimulationDataRouter::Deliver()
{
    Frame* head = frames.GetHead();
    if (!head || receivers.IsEmpty())
        return;
    if (deliveredLayout != &head->GetDescription())
    {
        deliveredLayout = &head->GetDescription();
        channelsKnown = false;
    }
    const VtTChannelLists& lists = GetActiveChannels();
    receivers.ForEach([&](VtCSimulationDataReceiver& receiver) { receiver.ApplyFrames(frames, lists); });
}

void VtCSimulationDataRouter::DeliverAlone(Frame* frame)
{
    frames.RemoveAll();
    frames.AddHead(frame);
    Deliver();
}

void VtCSimulationDataRouter::DeliverTimed(Point& point, Frame* frame, unsigned long id)
{
    const double time = frame->GetTimestamp();
    const bool timed = point.GetTimestampsSupported() != 0;
    DeliverAlone(frame);
    NotifyFrame(point, frame, static_cast<int>(id), timed ? &time : nullptr);
}

bool VtCSimulationDataRouter::GotoTime(const std::wstring& name)
{
    clock.TickClock();
    Point* point = Resolve(name);
    if (!point)
        return false;

    unsigned long id = 0;
    Frame* frame = nullptr;
    if (point->GetTimestampsSupported())
    {
        frame = point->GetAtTime(clock.GetCurrentTime());
        if (!frame)
            return false;
        id = static_cast<unsigned long>(frame->GetFrameId());
        clock.SetCurrentTime(frame->GetTimestamp());
    }
    else
    {
        frame = point->GetNextFrame(id);
        if (!frame)
            return false;
    }
    DeliverTimed(*point, frame, id);
    return true;
}

bool VtCSimulationDataRouter::GotoFirst(const std::wstring& name)
{
    return GotoEnd(name, false);
}

bool VtCSimulationDataRouter::GotoLast(const std::wstring& name)
{
    return GotoEnd(name, true);
}

bool VtCSimulationDataRouter::GotoEnd(const std::wstring& name, bool last)
{
    Point* point = Resolve(name);
    unsigned long count = 0;
    if (!point || !point->GetBufferedFrames(count) || !point->SetRecent(last ? count : 1))
        return false;
    unsigned long id = 0;
    Frame* frame = point->GetRecent(id);
    if (!frame)
        return false;
    if (point->GetTimestampsSupported())
        clock.SetCurrentTime(frame->GetTimestamp());
    DeliverTimed(*point, frame, id);
    return true;
}

bool VtCSimulationDataRouter::GotoFrame(const std::wstring& name, long index)
{
    const long count = static_cast<long>(GetBufferedFrames(name));
    return ShowFrame(name, std::max(std::min(index, count), 1L));
}

bool VtCSimulationDataRouter::ShowFrame(const std::wstring& name, long index)
{
    Point* point = Resolve(name);
    if (!point || index < 1 || !point->SetRecent(static_cast<unsigned long>(index)))
        return false;
    unsigned long id = 0;
    Frame* frame = point->GetRecent(id);
    if (!frame)
        return false;
    DeliverTimed(*point, frame, id);
    return true;
}

bool VtCSimulationDataRouter::GotoNext(const std::wstring& name)
{
    Point* point = Resolve(name);
    unsigned long id = 0;
    return point && point->GetNextFrame(id) && GotoFrame(name, static_cast<long>(id));
}

bool VtCSimulationDataRouter::GotoPrevious(const std::wstring& name)
{
    Point* point = Resolve(name);
    unsigned long id = 0;
    return point && point->GetPreviousFrame(id) && GotoFrame(name, static_cast<long>(id));
}

bool VtCSimulationDataRouter::StepBack(const std::wstring& name)
{
    Point* point = Resolve(name);
    unsigned long id = 0;
    Frame* frame = point ? point->GetPreviousFrame(id) : nullptr;
    if (!frame)
        return false;
    DeliverAlone(frame);
    NotifyFrame(*point, frame, static_cast<int>(id), nullptr);
    return true;
}

bool VtCSimulationDataRouter::RewindStep(const std::wstring& name)
{
    return Spool(name, true);
}

bool VtCSimulationDataRouter::ForwardStep(const std::wstring& name)
{
    return Spool(name, false);
}

// The clock has put the speed into `elapsed` already and the point does so again: a spool grows with the speed squared.
bool VtCSimulationDataRouter::Spool(const std::wstring& name, bool backwards)
{
    Point* point = Resolve(name);
    if (!point)
        return false;
    if (!point->GetTimestampsSupported())
        return backwards ? StepBack(name) : GotoTime(name);

    const double start = clock.GetStartTime();
    const double elapsed = clock.GetCurrentTime() - start;
    unsigned long id = 0;
    int wrapped = 0;
    Frame* frame = backwards ? point->Rewind(start, elapsed, clock.GetSpeed(), id, wrapped)
                             : point->FastForward(start, elapsed, clock.GetSpeed(), id, wrapped);
    if (!frame)
        return false;
    DeliverTimed(*point, frame, id);
    return true;
}

bool VtCSimulationDataRouter::FetchOnce(const std::wstring& name)
{
    Point* point = Resolve(name);
    if (!point)
        return false;
    const bool fetched = point->CanRefresh() && point->FetchOnce();
    channelsKnown = false;
    unsigned long id = 0;
    if (Frame* frame = fetched ? point->GetRecent(id) : nullptr)
    {
        DeliverAlone(frame);
        NotifyFrame(*point, frame, static_cast<int>(id), nullptr);
    }
    ReportMessages(*point);
    return fetched;
}

bool VtCSimulationDataRouter::BeginSpool(double speed)
{
    const Point* point = GetActivePoint(0);
    if (!point)
        return false;
    if (!point->GetTimestampsSupported())
        return true;
    const std::optional<double> time = GetTimestampOfCurrent();
    if (!time)
        return false;
    clock.SetCurrentTime(*time);
    clock.SetSpeed(speed);
    clock.StartOneWayClock(*time);
    return true;
}

// The router's frame operations. Each takes a frame from a point and sends it on; how it goes from there stands once,
// in `Send`.
#include "simdata/SimulationDataRouter.h"

#include <algorithm>

using SimulationDataPoints::TRACK_UNSAFE;

// Take, collect, deliver, notify: there is no other way to the scene.
bool VtCSimulationDataRouter::Send(const Taken& taken, Way way)
{
    if (!taken.frame)
        return false;
    if (way != Way::shown && taken.time)
        clock.SetCurrentTime(*taken.time);
    Collect(taken);
    if (way == Way::online)
        Notify(taken);
    // A listener that deselects the point takes the frames away with it.
    Deliver();
    if (way != Way::online)
        Notify(taken);
    return true;
}

// What belongs to the moment of the taken frame comes together here, that frame at the head.
void VtCSimulationDataRouter::Collect(const Taken& taken)
{
    frames.RemoveAll();
    frames.AddHead(taken.frame);
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

void VtCSimulationDataRouter::Notify(const Taken& taken)
{
    changeObjects.ForEach(
        [&](VtCSimulationDataChangeObject& listener)
        {
            listener.OnFrame(taken.point->GetName(), taken.frame, static_cast<int>(taken.id),
                             taken.time ? &*taken.time : nullptr);
        });
}

VtCSimulationDataRouter::Taken VtCSimulationDataRouter::Timed(Point& point, Frame* frame, unsigned long id)
{
    Taken taken{&point, frame, id, {}};
    if (frame && point.GetTimestampsSupported())
        taken.time = frame->GetTimestamp();
    return taken;
}

VtCSimulationDataRouter::Taken VtCSimulationDataRouter::TakeNewest(Point& point, double now)
{
    if (point.IsTimeDriven())
        point.SetSimulationTime(now);
    Taken taken{&point, nullptr, 0, {}};
    taken.frame = point.GetCurrentFrame(taken.id);
    int ignoredMessage = 0;
    if (taken.frame && point.GetTrackSafety(ignoredMessage) != TRACK_UNSAFE)
        taken.time = taken.frame->GetTimestamp();
    return taken;
}

VtCSimulationDataRouter::Taken VtCSimulationDataRouter::TakeAt(Point& point, double now)
{
    unsigned long id = 0;
    if (!point.GetTimestampsSupported())
    {
        Frame* next = point.GetNextFrame(id);
        return Timed(point, next, id);
    }
    Frame* frame = point.GetAtTime(now);
    return Timed(point, frame, frame ? static_cast<unsigned long>(frame->GetFrameId()) : 0);
}

bool VtCSimulationDataRouter::FetchFrames()
{
    frames.RemoveAll();
    if (!active)
        return true;
    const Taken taken = TakeNewest(*active, clock.GetCurrentTime());
    if (!Send(taken, Way::online))
        Notify(taken);
    ReportMessages();
    return taken.frame != nullptr;
}

bool VtCSimulationDataRouter::GotoTime(const std::wstring& name)
{
    Point* point = Resolve(name);
    return point && Send(TakeAt(*point, clock.GetCurrentTime()), Way::replay);
}

bool VtCSimulationDataRouter::SendNumbered(Point* point, long index, Way way)
{
    if (!point || index < 1 || !point->SetRecent(static_cast<unsigned long>(index)))
        return false;
    unsigned long id = 0;
    Frame* frame = point->GetRecent(id);
    return Send(Timed(*point, frame, id), way);
}

bool VtCSimulationDataRouter::GotoFirst(const std::wstring& name)
{
    return SendNumbered(Resolve(name), 1, Way::replay);
}

bool VtCSimulationDataRouter::GotoLast(const std::wstring& name)
{
    return SendNumbered(Resolve(name), static_cast<long>(GetBufferedFrames(name)), Way::replay);
}

bool VtCSimulationDataRouter::GotoFrame(const std::wstring& name, long index)
{
    const long count = static_cast<long>(GetBufferedFrames(name));
    return ShowFrame(name, std::max(std::min(index, count), 1L));
}

bool VtCSimulationDataRouter::ShowFrame(const std::wstring& name, long index)
{
    return SendNumbered(Resolve(name), index, Way::shown);
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
    return Send({point, frame, id, {}}, Way::shown);
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
    return Send(Timed(*point, frame, id), Way::shown);
}

bool VtCSimulationDataRouter::BeginSpool(double speed)
{
    if (!active)
        return false;
    active->SetFrameBufferRepeat(0);
    if (!active->GetTimestampsSupported())
        return true;
    const std::optional<double> time = GetTimestampOfCurrent();
    if (!time)
        return false;
    clock.SetCurrentTime(*time);
    clock.SetSpeed(speed);
    clock.StartOneWayClock(*time);
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
    Frame* frame = fetched ? point->GetRecent(id) : nullptr;
    Send({point, frame, id, {}}, Way::shown);
    ReportMessages(*point);
    return fetched;
}

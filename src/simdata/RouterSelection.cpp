// How the router keeps the active point, its channels, and what hangs on them.
#include "simdata/SimulationDataRouter.h"

#include <algorithm>

#include "base/Text.h"
#include "host/Frame.h"
#include "scene/MovableBodies.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/ActiveScene.h"
#include "simdata/InstrumentFeed.h"
#include "simdata/SimulationDataChangeObject.h"

std::vector<std::wstring> VtCSimulationDataRouter::GetPointNames(unsigned flags) const
{
    std::vector<std::wstring> names;
    for (const VtTDataPointPtr& point : allPoints)
        if (((flags & sinks) && point->IsSink()) || ((flags & sources) && point->IsSource()))
            names.push_back(point->GetName());
    if ((flags & scene) && !receivers.IsEmpty())
        names.emplace_back(L"Scene3D");
    return names;
}

VtCSimulationDataRouter::Point* VtCSimulationDataRouter::FindPoint(const std::wstring& name) const
{
    if (name.empty())
        return nullptr;
    const auto found =
        std::find_if(allPoints.rbegin(), allPoints.rend(),
                     [&](const VtTDataPointPtr& point) { return base::EqualsNoCase(point->GetName(), name); });
    return found == allPoints.rend() ? nullptr : found->get();
}

VtCSimulationDataRouter::Point* VtCSimulationDataRouter::FindActivePoint(const std::wstring& name) const
{
    const auto found = std::find_if(activePoints.begin(), activePoints.end(),
                                    [&](const Point* point) { return base::EqualsNoCase(point->GetName(), name); });
    return found == activePoints.end() ? nullptr : *found;
}

const std::wstring& VtCSimulationDataRouter::GetActivePointName(std::size_t index) const
{
    static const std::wstring none;
    const Point* point = GetActivePoint(index);
    return point ? point->GetName() : none;
}

VtCSimulationDataRouter::Point* VtCSimulationDataRouter::GetActivePoint(std::size_t index) const
{
    return index < activePoints.size() ? activePoints[index] : nullptr;
}

VtCSimulationDataRouter::Point* VtCSimulationDataRouter::Resolve(const std::wstring& name) const
{
    return name.empty() ? GetActivePoint(0) : FindPoint(name);
}

void VtCSimulationDataRouter::SelectPoint(const std::wstring& name)
{
    if (FindActivePoint(name))
        return;
    Point* point = FindPoint(name);
    if (!point || !point->IsSource())
        return;

    if (activePoints.empty())
        activePoints.push_back(point);
    else
        activePoints.front() = point;
    frames.SetSimulationDataPoints(name);

    unsigned long count = 0;
    if (point->CanPreload() && point->GetInitialStreamMode() && !point->GetBufferedFrames(count))
    {
        point->FetchOnce();
        ReportMessages(*point);
    }
    NotifyConfiguration(point->GetConfigurationInfoText(0));
}

void VtCSimulationDataRouter::DeselectPoint(const std::wstring& name)
{
    Point* point = FindPoint(name);
    if (!point)
        return;
    point->Disconnect();
    if (std::erase(activePoints, point) == 0)
        return;
    frames.RemoveAll();
    frames.SetSimulationDataPoints({});
    NotifyConfiguration({});
}

void VtCSimulationDataRouter::NotifyConfiguration(const std::wstring& text)
{
    channelsKnown = false;
    RefreshReceivers();
    changeObjects.ForEach(
        [&](VtCSimulationDataChangeObject& listener)
        {
            if (text.empty())
                listener.OnDataPointCleared(text);
            else
                listener.OnDataPointSelected(text);
        });
    ShowStatus();
    RefreshChannelLists(0);
}

void VtCSimulationDataRouter::ShowStatus()
{
    if (!services.variables)
        return;
    const std::wstring status =
        activePoints.empty() ? L"No SimulationDataPoint" : L"SimulationDataPoint-" + GetActivePointName(0);
    services.variables->SetText(L"simulationDatapointInfo", status);
}

std::vector<std::wstring> VtCSimulationDataRouter::GetChannels(const std::wstring& name, int variant) const
{
    const Point* point = Resolve(name);
    std::wstring names;
    return point && point->GetChannelNames(names, variant) ? base::Split(names, L'|') : std::vector<std::wstring>();
}

VtTChannelLists VtCSimulationDataRouter::GetChannelLists(int flag) const
{
    VtTChannelLists lists;
    const Point* point = GetActivePoint(0);
    if (!point)
        return lists;
    if (point->GetInstrumentChannelNames(lists.instruments, flag) > 0)
        if (VtIInstrumentFeed* instruments = services.activeScene.GetActiveInstruments())
            instruments->SetDataMode(VtEInstrumentDataMode::SignalNames);
    point->GetBodyChannelNames(lists.poses, flag);
    return lists;
}

void VtCSimulationDataRouter::RefreshChannelLists(int variant)
{
    ReadChannels(variant);
    GetChannelLists(0);
    RefreshReceivers();
}

void VtCSimulationDataRouter::ReadChannels(int variant) const
{
    channels.poses = GetChannels({}, variant);
    channels.instruments.clear();
    if (const Point* point = GetActivePoint(0))
        point->GetInstrumentChannelNames(channels.instruments, 0);
    ++channels.revision;
    channelsKnown = true;
}

const VtTChannelLists& VtCSimulationDataRouter::GetActiveChannels() const
{
    if (!channelsKnown)
        ReadChannels(0);
    return channels;
}

const std::vector<std::wstring>* VtCSimulationDataRouter::GetCurrentChannels() const
{
    return activePoints.empty() ? nullptr : &GetActiveChannels().poses;
}

// The link state of a body hangs on the scene alone, so one pass serves all receivers.
void VtCSimulationDataRouter::RefreshReceivers()
{
    VtCScene3D* activeScene = receivers.IsEmpty() ? nullptr : services.activeScene.GetActiveScene();
    VtCMovableBodies* bodies = activeScene ? activeScene->GetMovableBodies(0) : nullptr;
    if (!bodies)
        return;
    for (VtC3DMovableBody* body : bodies->GetBodies())
        body->UpdateConnectionState();
}

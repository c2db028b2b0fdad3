#include "simdata/SimulationDataRouter.h"

#include <algorithm>
#include <utility>

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Frame.h"
#include "host/Messages.h"
#include "scene/MovableBodies.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/FrameBufferWriter.h"
#include "simdata/InstrumentFeed.h"
#include "simdata/LoadProgressDisplay.h"

namespace
{

constexpr std::uint32_t messageNoDataPoint = 303;
constexpr std::uint32_t messageOtherVersion = 9032; ///< %1: the module, %2: the reason

/// The host's cursor says "wait" as long as this stands.
class WaitCursor
{
public:
    explicit WaitCursor(host::UserInterface* hostInterface) : userInterface(hostInterface)
    {
        if (userInterface)
            userInterface->BeginWaitCursor();
    }
    ~WaitCursor()
    {
        if (userInterface)
            userInterface->EndWaitCursor();
    }
    WaitCursor(const WaitCursor&) = delete;
    WaitCursor& operator=(const WaitCursor&) = delete;

private:
    host::UserInterface* userInterface;
};

} // namespace

VtCSimulationDataRouter::VtCSimulationDataRouter(const VtTSimulationServices& hostServices)
    : services(hostServices), plugins(hostServices.pluginFolders), clock(hostServices.clock)
{
    if (services.progress)
        loadProgress = std::make_unique<VtCLoadProgressDisplay>(*services.progress);
    LoadPlugins();
}

VtCSimulationDataRouter::~VtCSimulationDataRouter()
{
    UnloadPlugins();
}

void VtCSimulationDataRouter::LoadPlugins()
{
    UnloadPlugins();
    for (const SimulationDataPoints::VtTDataPointKind& kind : SimulationDataPoints::dataPointKinds)
        LoadPlugin(kind.number);
    for (const VtTPluginFault& fault : plugins.GetFaults())
        if (fault.otherVersion)
            services.messages.ShowWarning(messageOtherVersion, base::Wide(base::NativePath(fault.path).string()),
                                          fault.reason);
    if (allPoints.empty())
        services.messages.ShowError(messageNoDataPoint);
    changeObjects.ForEach([](VtCSimulationDataChangeObject& listener) { listener.OnDataPointsChanged(1); });
}

bool VtCSimulationDataRouter::LoadPlugin(VtEDataPointKind kind)
{
    if (!plugins.Load(kind))
        return false;
    if (VtTDataPointPtr point = plugins.MakePoint(kind))
        AddPoint(std::move(point));
    return true;
}

void VtCSimulationDataRouter::UnloadPlugins()
{
    Activate(nullptr);
    channelsKnown = false;
    while (!allPoints.empty())
        allPoints.pop_back();
    plugins.Unload();
}

VtCSimulationDataRouter::Point& VtCSimulationDataRouter::AddPoint(VtTDataPointPtr point)
{
    point->SetFrameBufferSize(frameBufferSize);
    return *allPoints.emplace_back(std::move(point));
}

void VtCSimulationDataRouter::SetFrameBufferSize(unsigned long frameCount)
{
    frameBufferSize = frameCount;
    for (const VtTDataPointPtr& point : allPoints)
        point->SetFrameBufferSize(frameCount);
}

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

const std::wstring& VtCSimulationDataRouter::GetActivePointName(std::size_t index) const
{
    static const std::wstring none;
    const Point* point = GetActivePoint(index);
    return point ? point->GetName() : none;
}

VtCSimulationDataRouter::Point* VtCSimulationDataRouter::Resolve(const std::wstring& name) const
{
    return name.empty() ? active : FindPoint(name);
}

// The one place where the choice is kept. Lists, commands and the status line ask here.
void VtCSimulationDataRouter::Activate(Point* point)
{
    frames.RemoveAll();
    frames.SetSimulationDataPoints(point ? point->GetName() : std::wstring());
    Point* const before = std::exchange(active, point);
    if (before && before != point)
        before->OnDeselect();
    if (point && before != point)
        point->OnSelect();
}

void VtCSimulationDataRouter::SelectPoint(const std::wstring& name)
{
    Point* point = FindPoint(name);
    if (!point || !point->IsSource() || base::EqualsNoCase(name, GetActivePointName()))
        return;
    Activate(point);
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
    const bool chosen = point == active;
    if (chosen)
        Activate(nullptr);
    point->Disconnect();
    if (chosen)
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
    const std::wstring status = active ? L"SimulationDataPoint-" + active->GetName() : L"No SimulationDataPoint";
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
    if (!active)
        return lists;
    active->GetBodyChannelNames(lists.poses, flag);
    lists.instruments = active->GetInstrumentStreams(flag);
    return lists;
}

void VtCSimulationDataRouter::RefreshChannelLists(int variant)
{
    ReadChannels(variant);
    VtIInstrumentFeed* instruments = services.activeScene.GetActiveInstruments();
    if (instruments && !channels.instruments.empty())
        instruments->SetDataMode(VtEInstrumentDataMode::SignalNames);
    RefreshReceivers();
}

void VtCSimulationDataRouter::ReadChannels(int variant) const
{
    channels.poses = GetChannels({}, variant);
    channels.instruments.clear();
    if (active)
        channels.instruments = active->GetInstrumentStreams(0);
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
    return active ? &GetActiveChannels().poses : nullptr;
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

void VtCSimulationDataRouter::AddChangeObject(VtCSimulationDataChangeObject* listener)
{
    if (changeObjects.Add(listener))
        listener->OnDataPointsChanged(1);
}

void VtCSimulationDataRouter::NotifyMode(VtESimulationMode mode)
{
    changeObjects.ForEach([mode](VtCSimulationDataChangeObject& listener) { listener.OnModeChanged(mode); });
}

void VtCSimulationDataRouter::NotifyPlayState(VtEPlayState state)
{
    if (const Point* point = active)
        changeObjects.ForEach([&](VtCSimulationDataChangeObject& listener)
                              { listener.OnPlayStateChanged(point->GetName(), state); });
}

bool VtCSimulationDataRouter::ConnectAll()
{
    const WaitCursor wait(services.userInterface);
    if (active && active->IsTimeDriven())
    {
        double earliest = 0.0;
        double latest = 0.0;
        active->GetFrameBufferEarliestTime(earliest);
        active->GetFrameBufferLatestTime(latest);
        clock.StartLoopClock(earliest, latest, earliest, 1.0);
    }
    channelsKnown = false;
    if (active && !active->Connect())
        return false;
    NotifyMode(VtESimulationMode::Online);
    return true;
}

void VtCSimulationDataRouter::DisconnectAll()
{
    if (active)
        active->Disconnect();
    NotifyMode(VtESimulationMode::Offline);
}

void VtCSimulationDataRouter::Clear()
{
    Point* const before = active;
    Activate(nullptr);
    if (before)
        before->Disconnect();
    clock.Reset();
    NotifyConfiguration({});
}

SimulationDataPoints::VtCMessageStack* VtCSimulationDataRouter::GetMessageStack() const
{
    return active ? active->GetMessageStack() : nullptr;
}

void VtCSimulationDataRouter::ResetMessageStack()
{
    if (active)
        active->ResetMessageStack();
}

void VtCSimulationDataRouter::ReportMessages()
{
    if (active)
        ReportMessages(*active);
}

// Reset at once, so that the next one who looks doesn't show the same messages again.
void VtCSimulationDataRouter::ReportMessages(Point& point)
{
    if (const auto* stack = point.GetMessageStack())
    {
        services.messages.ReportStack(*stack);
        point.ResetMessageStack();
    }
}

unsigned long VtCSimulationDataRouter::GetBufferedFrames(const std::wstring& name) const
{
    unsigned long count = 0;
    const Point* point = Resolve(name);
    return point && point->GetBufferedFrames(count) ? count : 0;
}

unsigned long VtCSimulationDataRouter::GetRecent(const std::wstring& name) const
{
    unsigned long number = 0;
    Point* point = Resolve(name);
    return point && point->GetRecent(number) ? number : 0;
}

std::optional<double> VtCSimulationDataRouter::GetTimestampOfCurrent() const
{
    double time = 0.0;
    return active && active->GetTimeStampOfCurrentElement(time) ? std::optional(time) : std::nullopt;
}

std::wstring VtCSimulationDataRouter::GetConfigurationText(const std::wstring& name, int variant) const
{
    const Point* point = Resolve(name);
    return point ? point->GetConfigurationInfoText(variant) : std::wstring();
}

bool VtCSimulationDataRouter::IsConfigured(const std::wstring& name) const
{
    const Point* point = Resolve(name);
    if (!point)
        return false;
    std::wstring type;
    std::wstring path;
    point->GetSourceType(type);
    point->GetSourcePath(path);
    return !type.empty() && !path.empty();
}

bool VtCSimulationDataRouter::StoreFrameBuffer(const std::wstring& path, const std::wstring& type)
{
    unsigned long count = 0;
    if (!active || !active->GetBufferedFrames(count))
        return false;
    const VtTDataPointPtr writer = CreateFileDataPoint();
    if (!writer)
        return false;

    writer->SetTimestampSupport(active->GetTimestampsSupported());
    writer->SetTrackSafety(active->GetFrameBufferTrackSafety());
    writer->SetChannelNames(GetChannels({}, 0));
    const VtTChannelLists stored = GetChannelLists(0);
    std::vector<std::wstring> streams;
    for (const SimulationDataPoints::VtTInstrumentStream& stream : stored.instruments)
        streams.push_back(stream.name);
    writer->SetInstrumentChannelNames(streams);
    writer->SetBodyChannelNames(stored.poses);

    const bool written = VtCFrameBufferWriter(services).Write(*active, count, *writer, path, type);
    ReportMessages(*writer);
    return written;
}

#include "simdata/SimulationDataRouter.h"

#include "base/Text.h"
#include "host/Frame.h"
#include "host/Messages.h"
#include "simdata/FrameBufferWriter.h"
#include "simdata/LoadProgressDisplay.h"
#include "simdata/SimulationDataChangeObject.h"
#include "simdata/SimulationDataReceiver.h"

namespace
{

constexpr std::uint32_t messageNoDataPoint = 303;

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
    activePoints.clear();
    UnloadPlugins();
}

void VtCSimulationDataRouter::LoadPlugins()
{
    using enum VtEDataPointKind;
    UnloadPlugins();
    for (const VtEDataPointKind kind : {File, Network, OffSim, Hardware, NetConnection, Smart})
        LoadPlugin(kind);
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
    activePoints.clear();
    frames.RemoveAll();
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
    if (const Point* point = GetActivePoint(0))
        changeObjects.ForEach([&](VtCSimulationDataChangeObject& listener)
                              { listener.OnPlayStateChanged(point->GetName(), state); });
}

void VtCSimulationDataRouter::NotifyFrame(const Point& point, Frame* frame, int frameId, const double* time)
{
    changeObjects.ForEach([&](VtCSimulationDataChangeObject& listener)
                          { listener.OnFrame(point.GetName(), frame, frameId, time); });
}

bool VtCSimulationDataRouter::ConnectAll()
{
    const WaitCursor wait(services.userInterface);
    bool failed = false;
    for (Point* point : activePoints)
    {
        if (point->IsTimeDriven())
        {
            double earliest = 0.0;
            double latest = 0.0;
            point->GetFrameBufferEarliestTime(earliest);
            point->GetFrameBufferLatestTime(latest);
            clock.StartLoopClock(earliest, latest, earliest, 1.0);
        }
        if (!point->Connect())
            failed = true;
    }
    channelsKnown = false;
    if (!failed)
        NotifyMode(VtESimulationMode::Online);
    return !failed;
}

void VtCSimulationDataRouter::DisconnectAll()
{
    for (Point* point : activePoints)
        point->Disconnect();
    NotifyMode(VtESimulationMode::Offline);
}

void VtCSimulationDataRouter::Clear()
{
    for (Point* point : activePoints)
        point->Disconnect();
    activePoints.clear();
    clock.Reset();
    frames.RemoveAll();
    frames.SetSimulationDataPoints({});
    NotifyConfiguration({});
}

SimulationDataPoints::VtCMessageStack* VtCSimulationDataRouter::GetMessageStack() const
{
    Point* point = GetActivePoint(0);
    return point ? point->GetMessageStack() : nullptr;
}

void VtCSimulationDataRouter::ResetMessageStack()
{
    if (Point* point = GetActivePoint(0))
        point->ResetMessageStack();
}

void VtCSimulationDataRouter::ReportMessages()
{
    if (Point* point = GetActivePoint(0))
        ReportMessages(*point);
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
    const Point* point = GetActivePoint(0);
    return point && point->GetTimeStampOfCurrentElement(time) ? std::optional(time) : std::nullopt;
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
    Point* point = GetActivePoint(0);
    if (!point || !point->GetBufferedFrames(count))
        return false;
    const VtTDataPointPtr writer = CreateFileDataPoint();
    if (!writer)
        return false;

    writer->SetTimestampSupport(point->GetTimestampsSupported());
    writer->SetTrackSafety(point->GetFrameBufferTrackSafety());
    writer->SetChannelNames(GetChannels({}, 0));
    const VtTChannelLists stored = GetChannelLists(0);
    writer->SetInstrumentChannelNames(stored.instruments);
    writer->SetBodyChannelNames(stored.poses);

    const bool written = VtCFrameBufferWriter(services).Write(*point, count, *writer, path, type);
    ReportMessages(*writer);
    return written;
}

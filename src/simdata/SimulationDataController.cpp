#include "simdata/SimulationDataController.h"

#include <algorithm>

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Frame.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "host/Storage.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

// Without a host that keeps them: 100 s of a run at 100 Hz, and twice that for all tracks together.
constexpr std::int32_t defaultSimulationFrames = 10000;
constexpr std::int32_t defaultTrackFrames = 20000;

constexpr const wchar_t* filePoint = L"File"; ///< the point that takes motion data files
constexpr std::uint32_t messageNoFilePoint = 9030;
constexpr std::uint32_t messageDataUnusable = 9031; ///< %1: the file
constexpr std::uint32_t textLoadingData = 7004;
constexpr long loadingData = 41; ///< the progress activity

} // namespace

VtCSimulationDataController::VtCSimulationDataController(const VtTSimulationServices& hostServices)
    : services(hostServices), router(hostServices)
{
    ReadBufferSettings();
    router.SetFrameBufferSize(static_cast<unsigned long>(simulationBufferFrames));
}

VtCSimulationDataController::~VtCSimulationDataController() = default;

void VtCSimulationDataController::ReadBufferSettings()
{
    const host::Configuration* configuration = services.configuration;
    simulationBufferFrames = std::max(
        configuration ? configuration->GetSimulationBufferFrames() : defaultSimulationFrames, GetMinimumBufferFrames());
    trackBufferFrames = std::max(configuration ? configuration->GetTrackBufferFrames() : defaultTrackFrames, 0);
}

void VtCSimulationDataController::Start()
{
    if (!router.GetActivePoint(0))
        return;
    SetMode(VtESimulationMode::Online);
    UpdateRunningIndicator();
    const VtCScene3D* scene = services.activeScene.GetActiveScene();
    if (VtISceneObservers* observers = scene ? scene->GetSceneObservers() : nullptr)
        observers->ClearFollowers();
}

void VtCSimulationDataController::Stop()
{
    SetMode(VtESimulationMode::Offline);
    UpdateRunningIndicator();
}

void VtCSimulationDataController::Reset()
{
    if (IsOnline())
        SetMode(VtESimulationMode::Offline);
    else if (IsPlaying())
        playState = VtEPlayState::PlayStopped;
    router.Clear();
}

void VtCSimulationDataController::SetMode(VtESimulationMode newMode)
{
    if (newMode == mode)
        return;
    router.ResetMessageStack();
    mode = newMode;
    if (mode == VtESimulationMode::Offline)
        router.DisconnectAll();
    else if (router.ConnectAll())
        router.RefreshChannelLists(0);
    else
        mode = VtESimulationMode::Offline;
    router.ReportMessages();
}

void VtCSimulationDataController::SetModeQuietly(VtESimulationMode newMode)
{
    if (newMode == VtESimulationMode::Offline)
    {
        mode = newMode;
        router.NotifyMode(mode);
        return;
    }
    // `Start` stores the mode itself, since it connects only on a change.
    Start();
    router.NotifyMode(mode);
}

bool VtCSimulationDataController::Step()
{
    router.GetClock().TickClock();
    if (IsOnline())
    {
        if (router.FetchFrames())
            return true;
        router.ReportMessages();
        return false;
    }
    if (HasPlayState() && !StepReplay() && HasPlayState())
    {
        playState = VtEPlayState::PlayStopped;
        router.NotifyPlayState(playState);
        UpdateRunningIndicator();
    }
    return true;
}

// False at the end of what plays or spools.
bool VtCSimulationDataController::StepReplay()
{
    switch (playState)
    {
    case VtEPlayState::PlayOnce:
        if (router.GotoTime())
            return true;
        router.GotoLast();
        return false;
    case VtEPlayState::PlayLoop:
        return router.GotoTime() || router.ShowFrame({}, 1);
    case VtEPlayState::SpoolBackward:
        return router.RewindStep() && router.GetRecent({}) > 1;
    case VtEPlayState::SpoolForward:
        return router.ForwardStep() && router.GetRecent({}) < router.GetBufferedFrames({});
    case VtEPlayState::PlayStopped:
        break;
    }
    return true;
}

void VtCSimulationDataController::PlayOnce()
{
    Play(VtEPlayState::PlayOnce);
}

void VtCSimulationDataController::PlayLoop()
{
    Play(VtEPlayState::PlayLoop);
}

void VtCSimulationDataController::Play(VtEPlayState state)
{
    if (!IsOnline())
        playState = state;
    if (auto* point = router.GetActivePoint(0))
    {
        const bool loops = state == VtEPlayState::PlayLoop;
        point->SetFrameBufferRepeat(loops ? 1 : 0);
        double time = 0.0;
        if (point->GetTimestampsSupported() && point->GetTimeStampOfCurrentElement(time))
        {
            double earliest = time;
            double latest = time;
            if (loops && point->GetFrameBufferEarliestTime(earliest) && point->GetFrameBufferLatestTime(latest))
                router.GetClock().StartLoopClock(earliest, latest, time, speed);
            else
            {
                // A time-driven point's connection, or a recording, may have left a speed of its own.
                router.GetClock().SetSpeed(speed);
                router.GetClock().StartOneWayClock(time);
            }
        }
    }
    router.NotifyPlayState(playState);
    UpdateRunningIndicator();
}

void VtCSimulationDataController::StopPlay()
{
    if (HasPlayState())
    {
        playState = VtEPlayState::PlayStopped;
        router.NotifyPlayState(playState);
    }
    UpdateRunningIndicator();
}

void VtCSimulationDataController::SetPlayState(const std::wstring& name, VtEPlayState state)
{
    if (!name.empty() && !IsOnline())
        playState = state;
}

void VtCSimulationDataController::PlayForRecording(double start, double speedFactor)
{
    if (!IsOnline())
        playState = VtEPlayState::PlayLoop;
    router.GetClock().StartScaledClock(start, speedFactor);
}

void VtCSimulationDataController::SetSpeed(double factor)
{
    speed = factor;
    router.GetClock().SetSpeed(factor);
}

bool VtCSimulationDataController::GotoNext(const std::wstring& name)
{
    return !IsOnline() && !HasPlayState() && router.GotoNext(name);
}

bool VtCSimulationDataController::GotoPrevious(const std::wstring& name)
{
    return !IsOnline() && !HasPlayState() && router.GotoPrevious(name);
}

void VtCSimulationDataController::Refresh()
{
    router.NotifyMode(VtESimulationMode::Online);
    router.FetchOnce();
    router.NotifyMode(mode);
}

int VtCSimulationDataController::GetFrameBufferSize() const
{
    const auto* point = router.GetActivePoint(0);
    return point ? point->GetFrameBufferSizeEx() : 0;
}

std::unique_ptr<SimulationDataPoints::VtCSimulationDataFrames> VtCSimulationDataController::CopyFrameBuffer() const
{
    const auto* point = router.GetActivePoint(0);
    if (!point || point->GetFrameBufferSizeEx() <= 0)
        return nullptr;
    return std::unique_ptr<SimulationDataPoints::VtCSimulationDataFrames>(point->CopySimulationFrameBuffer());
}

SimulationDataPoints::TRACK_SAFETY VtCSimulationDataController::GetTrackSafety() const
{
    const auto* point = router.GetActivePoint(0);
    return point ? point->GetFrameBufferTrackSafety() : SimulationDataPoints::TRACK_UNSAFE;
}

bool VtCSimulationDataController::SetBufferSizes(std::int32_t simulationFrames, std::int32_t trackFrames)
{
    if (simulationFrames == simulationBufferFrames && trackFrames == trackBufferFrames)
        return false;
    simulationBufferFrames = simulationFrames;
    trackBufferFrames = trackFrames;
    if (services.configuration)
    {
        services.configuration->SetSimulationBufferFrames(simulationFrames);
        services.configuration->SetTrackBufferFrames(trackFrames);
    }
    return true;
}

void VtCSimulationDataController::UpdateRunningIndicator() const
{
    if (services.variables)
        services.variables->SetBool(L"simulationRunning", (IsOnline() || IsPlaying()) && services.navigator &&
                                                              services.navigator->IsTrackCurrent());
}

void VtCSimulationDataController::ChoosePoint(const std::wstring& name)
{
    if (name.empty())
        router.DeselectPoint(router.GetActivePointName());
    else
        router.SelectPoint(name);
}

bool VtCSimulationDataController::LoadMotionData(const std::wstring& path)
{
    auto* point = router.FindPoint(filePoint);
    if (!point)
    {
        services.messages.ShowError(messageNoFilePoint);
        return false;
    }
    if (services.progress)
        services.progress->ConnectProgressActivity(loadingData, services.texts.GetText(textLoadingData),
                                                   base::Wide(base::NativePath(path).filename().string()));
    point->SetProgressBarActivityID(loadingData);
    const bool loaded = point->Configure(L"MDF", path, 1, 0) != 0;
    if (services.progress)
        services.progress->DisconnectProgressActivity(loadingData);

    if (const auto* stack = point->GetMessageStack())
    {
        services.messages.ReportStack(*stack);
        point->ResetMessageStack();
    }
    else if (!loaded)
        services.messages.ShowError(messageDataUnusable, base::Wide(base::NativePath(path).string()));
    if (!loaded)
        return false;

    StopPlay();
    Stop();
    // A change of the active point is told by the router.
    if (point != router.GetActivePoint())
        ChoosePoint(filePoint);
    else
        router.NotifyConfiguration(point->GetConfigurationInfoText(0));
    GotoFirst();
    return true;
}

// The controller's commands: when they are enabled and what they do.
#include "simdata/ControllerCommands.h"

#include "host/Messages.h"
#include "host/Questions.h"
#include "simdata/SimulationDataController.h"

namespace
{

constexpr std::uint32_t messageStored = 529;
constexpr std::uint32_t messageNotStored = 530;

bool IsSelect(std::uint32_t command)
{
    return command >= ControllerCommand::firstSelect && command <= ControllerCommand::lastSelect;
}

} // namespace

VtTCommandState VtCSimulationDataController::IsCommandEnabled(const std::wstring& name, std::uint32_t command) const
{
    using namespace ControllerCommand;
    switch (command)
    {
    case speedControl:
    case pointList:
    case customize:
        return {!IsOnline() && !IsPlaying(), false};
    case stop:
        return {IsOnline(), false};
    default:
        break;
    }
    if (IsOnline() || !router.IsConfigured(name))
        return {};

    VtTCommandState state = FrameCommandState(name, command);
    if (command == spoolBack || command == spoolForward)
        state.checked = state.checked && state.enabled;
    return state;
}

VtTCommandState VtCSimulationDataController::FrameCommandState(const std::wstring& name, std::uint32_t command) const
{
    using namespace ControllerCommand;
    const bool idle = !IsPlaying();
    const unsigned long count = router.GetBufferedFrames(name);
    const unsigned long cursor = router.GetRecent(name);
    const bool behind = cursor > 1;
    const bool ahead = count > 0 && cursor != count;
    switch (command)
    {
    case start:
        return {idle, false};
    case refreshData:
    {
        const auto* point = name.empty() ? router.GetActivePoint() : router.FindPoint(name);
        return {idle && point && point->CanRefresh(), false};
    }
    case store:
    case videoConfiguration:
        return {idle && count > 0, false};
    case firstFrame:
    case previousFrame:
        return {idle && behind, false};
    case spoolBack:
        return {idle && behind, playState == VtEPlayState::SpoolBackward};
    case stopPlay:
        return {IsPlaying(), false};
    case nextFrame:
    case lastFrame:
        return {idle && ahead, false};
    case spoolForward:
        return {idle && ahead, playState == VtEPlayState::SpoolForward};
    case playLoop:
        return {playState != VtEPlayState::PlayOnce && count > 0, playState == VtEPlayState::PlayLoop};
    case playOnce:
        return {playState != VtEPlayState::PlayLoop && ahead, playState == VtEPlayState::PlayOnce && ahead};
    default:
        return {};
    }
}

std::optional<VtTMenuState> VtCSimulationDataController::GetMenuState(std::uint32_t command) const
{
    using namespace ControllerCommand;
    if (command == refreshChannels)
        return VtTMenuState{{true, false}, {}};
    if (command == noDataPoint)
        return VtTMenuState{{!IsOnline(), router.GetActivePoint(0) == nullptr}, {}};
    if (command == customize)
    {
        const bool shown = customizeSheet && customizeSheet->CanCustomize();
        return VtTMenuState{{shown && IsCommandEnabled({}, command).enabled, false}, {}};
    }
    if (IsSelect(command))
    {
        const std::vector<std::wstring> names = router.GetPointNames(VtCSimulationDataRouter::sources);
        const std::size_t place = command - firstSelect;
        if (place >= names.size())
            return VtTMenuState{};
        const auto* point = router.FindPoint(names[place]);
        return VtTMenuState{{!IsOnline(), point == router.GetActivePoint(0)}, point->GetConfigurationInfoText(0)};
    }
    const bool framesOrStart = command >= store && command <= spoolForward;
    if (command != start && command != stop && !framesOrStart)
        return std::nullopt;
    return VtTMenuState{IsCommandEnabled({}, command), {}};
}

bool VtCSimulationDataController::OnCmdMsg(std::uint32_t command)
{
    const std::optional<VtTMenuState> state = GetMenuState(command);
    if (state && state->enabled)
        Execute(command);
    return state.has_value();
}

void VtCSimulationDataController::Execute(std::uint32_t command)
{
    using namespace ControllerCommand;
    if (IsSelect(command))
        return ChoosePoint(router.GetPointNames(VtCSimulationDataRouter::sources)[command - firstSelect]);
    switch (command)
    {
    case refreshChannels:
        return router.RefreshChannelLists(1);
    case start:
        return Start();
    case stop:
        return Stop();
    case customize:
        return customizeSheet->Customize();
    case noDataPoint:
        return ChoosePoint({});
    case store:
        return Store();
    case refreshData:
        return Refresh();
    case firstFrame:
        router.GotoFirst();
        return;
    case previousFrame:
    case spoolBack:
        GotoPrevious();
        return;
    case stopPlay:
        return StopPlay();
    case nextFrame:
    case spoolForward:
        GotoNext();
        return;
    case lastFrame:
        router.GotoLast();
        return;
    case playLoop:
        return PlayLoop();
    case playOnce:
        return PlayOnce();
    default:
        return;
    }
}

void VtCSimulationDataController::Store()
{
    if (!services.questions)
        return;
    const std::optional<std::wstring> path =
        services.questions->AskSaveFile({{}, L"Motion Data file (*.mdf)|*.mdf||", L"mdf", L"*.mdf"});
    if (!path || IsOnline() || HasPlayState())
        return;
    if (router.StoreFrameBuffer(*path, L"MDF"))
        services.messages.ShowInformation(messageStored, *path);
    else
        services.messages.ShowError(messageNotStored, *path);
}

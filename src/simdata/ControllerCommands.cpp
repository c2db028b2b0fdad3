// The controller's commands: when they are enabled and what they do.
#include "simdata/ControllerCommands.h"

#include "host/Messages.h"
#include "host/Questions.h"
#include "simdata/SimulationDataController.h"

namespace
{

using Controller = VtCSimulationDataController;
using host::CommandGroup;
using State = VtTCommandState;

const std::wstring activePoint; // the empty name stands for it

constexpr std::uint32_t messageStored = 529;
constexpr std::uint32_t messageNotStored = 530;
constexpr std::uint32_t textPointSettings = 9184; // 6242 is taken by another text

bool IsSettled(const VtTPointFrames& frames)
{
    return !frames.controller.IsOnline() && !frames.controller.IsPlaying();
}

// Without a configured point, and online, all that works on frames is disabled.
bool HasPoint(const VtTPointFrames& frames)
{
    return !frames.controller.IsOnline() && frames.controller.GetRouter().IsConfigured(frames.point);
}

bool IsIdle(const VtTPointFrames& frames)
{
    return HasPoint(frames) && !frames.controller.IsPlaying();
}

bool HasFrames(const VtTPointFrames& frames)
{
    return HasPoint(frames) && frames.controller.GetRouter().GetBufferedFrames(frames.point) > 0;
}

bool IsBehindFirst(const VtTPointFrames& frames)
{
    return HasPoint(frames) && frames.controller.GetRouter().GetRecent(frames.point) > 1;
}

bool IsBeforeLast(const VtTPointFrames& frames)
{
    const VtCSimulationDataRouter& router = frames.controller.GetRouter();
    return HasFrames(frames) && router.GetRecent(frames.point) != router.GetBufferedFrames(frames.point);
}

State WhenSettled(const VtTPointFrames& frames, int)
{
    return {IsSettled(frames)};
}

State WhenIdle(const VtTPointFrames& frames, int)
{
    return {IsIdle(frames)};
}

State WhenFrames(const VtTPointFrames& frames, int)
{
    return {IsIdle(frames) && HasFrames(frames)};
}

State WhenOnline(const VtTPointFrames& frames, int)
{
    return {frames.controller.IsOnline()};
}

State WhenPlaying(const VtTPointFrames& frames, int)
{
    return {HasPoint(frames) && frames.controller.IsPlaying()};
}

// A spool that has reached the end of the data is over, though its button may still be down.
State Back(const VtTPointFrames& frames, int)
{
    const bool enabled = IsIdle(frames) && IsBehindFirst(frames);
    return {enabled, enabled && frames.controller.GetPlayState() == VtEPlayState::SpoolBackward};
}

State Forward(const VtTPointFrames& frames, int)
{
    const bool enabled = IsIdle(frames) && IsBeforeLast(frames);
    return {enabled, enabled && frames.controller.GetPlayState() == VtEPlayState::SpoolForward};
}

State CanRefresh(const VtTPointFrames& frames, int)
{
    const VtCSimulationDataRouter& router = frames.controller.GetRouter();
    const auto* point = frames.point.empty() ? router.GetActivePoint() : router.FindPoint(frames.point);
    return {IsIdle(frames) && point && point->CanRefresh()};
}

State CanRefreshChannels(const VtTPointFrames& frames, int)
{
    return {frames.controller.GetRouter().GetActivePoint() != nullptr};
}

State CanLoop(const VtTPointFrames& frames, int)
{
    const VtEPlayState playState = frames.controller.GetPlayState();
    return {playState != VtEPlayState::PlayOnce && HasFrames(frames),
            HasPoint(frames) && playState == VtEPlayState::PlayLoop};
}

State CanPlay(const VtTPointFrames& frames, int)
{
    const VtEPlayState playState = frames.controller.GetPlayState();
    const bool ahead = IsBeforeLast(frames);
    return {playState != VtEPlayState::PlayLoop && ahead, playState == VtEPlayState::PlayOnce && ahead};
}

State CanDeselect(const VtTPointFrames& frames, int)
{
    return {!frames.controller.IsOnline(), frames.controller.GetRouter().GetActivePoint() == nullptr};
}

std::wstring SourceName(const VtCSimulationDataRouter& router, int place)
{
    const std::vector<std::wstring> names = router.GetPointNames(VtCSimulationDataRouter::sources);
    return static_cast<std::size_t>(place) < names.size() ? names[static_cast<std::size_t>(place)] : std::wstring();
}

State CanSelect(const VtTPointFrames& frames, int place)
{
    const VtCSimulationDataRouter& router = frames.controller.GetRouter();
    const auto* point = router.FindPoint(SourceName(router, place));
    if (!point)
        return {};
    return {!frames.controller.IsOnline(), point == router.GetActivePoint(), point->GetConfigurationInfoText(0)};
}

void Select(Controller& controller, int place)
{
    controller.ChoosePoint(SourceName(controller.GetRouter(), place));
}

void StepBack(Controller& controller, int)
{
    controller.GotoPrevious();
}

void StepForward(Controller& controller, int)
{
    controller.GotoNext();
}

} // namespace

const VtCControllerCommandTable& VtCSimulationDataController::GetCommands()
{
    using namespace ControllerCommand;
    using enum CommandGroup;
    constexpr unsigned menu = host::inMenu;
    constexpr unsigned both = host::inMenu | host::onToolBar;
    constexpr unsigned check = host::hasCheck;
    static const VtCControllerCommandTable table{
        // number, group, where, icon, shortcut, key | state | what it does
        {{noDataPoint, source, menu | check}, CanDeselect, [](Controller& c, int) { c.ChoosePoint({}); }},
        {{firstSelect, source, menu | check}, CanSelect, Select, 0},
        {{firstSelect + 1, source, menu | check}, CanSelect, Select, 1},
        {{firstSelect + 2, source, menu | check}, CanSelect, Select, 2},
        {{firstSelect + 3, source, menu | check}, CanSelect, Select, 3},
        {{firstSelect + 4, source, menu | check}, CanSelect, Select, 4},
        {{lastSelect, source, menu | check}, CanSelect, Select, 5},

        {{start, simulation, both, "start", "F9"}, WhenIdle, [](Controller& c, int) { c.Start(); }},
        {{stop, simulation, both, "halt", "Shift+F9"}, WhenOnline, [](Controller& c, int) { c.Stop(); }},

        {{firstFrame, frames, both, "first", "Ctrl+Home", "Home"},
         [](const VtTPointFrames& f, int) { return State{Back(f, 0).enabled}; },
         [](Controller& c, int) { c.GotoFirst(); }},
        {{spoolBack, frames, 0, "spool-back"}, Back, StepBack},
        {{previousFrame, frames, both, "previous", "Ctrl+Left", "Left"},
         [](const VtTPointFrames& f, int) { return State{Back(f, 0).enabled}; },
         StepBack},
        {{playOnce, frames, both | check, "play", "F5"}, CanPlay, [](Controller& c, int) { c.PlayOnce(); }},
        {{playLoop, frames, both | check, "loop", "Ctrl+L"}, CanLoop, [](Controller& c, int) { c.PlayLoop(); }},
        {{stopPlay, frames, both, "stop", "F7"}, WhenPlaying, [](Controller& c, int) { c.StopPlay(); }},
        {{nextFrame, frames, both, "next", "Ctrl+Right", "Right"},
         [](const VtTPointFrames& f, int) { return State{Forward(f, 0).enabled}; },
         StepForward},
        {{spoolForward, frames, 0, "spool-forward"}, Forward, StepForward},
        {{lastFrame, frames, both, "last", "Ctrl+End", "End"},
         [](const VtTPointFrames& f, int) { return State{Forward(f, 0).enabled}; },
         [](Controller& c, int) { c.GotoLast(); }},

        {{refreshData, data, menu, "refresh", "Ctrl+R"}, CanRefresh, [](Controller& c, int) { c.Refresh(); }},
        {{refreshChannels, data, menu, "channels"},
         CanRefreshChannels,
         [](Controller& c, int) { c.router.RefreshChannelLists(1); }},
        {{store, data, menu, "store", "Ctrl+E"}, WhenFrames, [](Controller& c, int) { c.Store(); }},
        {{customize, data, menu, "customise"}, WhenSettled, [](Controller& c, int) { c.customizeSheet->Customize(); }},

        {{customizePoint, none, 0, "customise-point", "", "", textPointSettings}, WhenSettled},
        {{pointList, none}, WhenSettled},
        {{speedControl, none}, WhenSettled},
        {{videoConfiguration, none}, WhenFrames},
    };
    return table;
}

VtTCommandState VtCSimulationDataController::IsCommandEnabled(const std::wstring& name, std::uint32_t command) const
{
    const auto* row = GetCommands().Find(command);
    // What stands in menus alone hangs on no point that could be asked for.
    if (!row || row->look.group == CommandGroup::source || command == ControllerCommand::refreshChannels)
        return {};
    return row->state({*this, name}, row->value);
}

std::optional<VtTCommandState> VtCSimulationDataController::GetMenuState(std::uint32_t command) const
{
    std::optional<VtTCommandState> state = GetCommands().GetState({*this, activePoint}, command);
    if (command == ControllerCommand::customize && !(customizeSheet && customizeSheet->CanCustomize()))
        state->enabled = false;
    return state;
}

bool VtCSimulationDataController::OnCmdMsg(std::uint32_t command)
{
    const std::optional<VtTCommandState> state = GetMenuState(command);
    const auto* row = GetCommands().Find(command);
    if (state && state->enabled)
        row->execute(*this, row->value);
    return state.has_value();
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

#include "hosts/desktop/CommandActions.h"

#include <algorithm>
#include <iterator>

#include <QAction>

#include "app/PanoramicApp.h"
#include "host/CommandState.h"
#include "host/Host.h"
#include "hosts/desktop/Icons.h"
#include "hosts/desktop/Wording.h"
#include "render/ViewCommandsHandler.h"
#include "simdata/ControllerCommands.h"

namespace desktop
{

namespace
{

struct CommandLook
{
    std::uint32_t command;
    CommandActions::Look look;
    bool checkable;
};

constexpr std::uint32_t textCustomize = 6903;

const CommandLook looks[] = {
    {commandSingleView, {textSingleView, "layout-single", "Ctrl+1"}, false},
    {commandTwoColumns, {textTwoColumns, "layout-columns", "Ctrl+2"}, false},
    {commandTwoRows, {textTwoRows, "layout-rows", "Ctrl+3"}, false},
    {commandFourViews, {textFourViews, "layout-four", "Ctrl+4"}, false},
    {commandGouraud, {textGouraud, "mode-gouraud", "Alt+1"}, true},
    {commandTextured, {textTextured, "mode-textured", "Alt+2"}, true},
    {commandFlat, {textFlat, "mode-flat", "Alt+3"}, true},
    {commandWireFrame, {textWireFrame, "mode-wire", "Alt+4"}, true},
    {commandMixed, {textMixed, "mode-mixed", "Alt+5"}, true},
    {commandStraighten, {textStraighten, "straighten", "Ctrl+T"}, false},
    {ControllerCommand::start, {textStart, "controller/start", "F9"}, false},
    {ControllerCommand::stop, {textStop, "controller/halt", "Shift+F9"}, false},
    {ControllerCommand::firstFrame, {textFirstFrame, "controller/first", "Ctrl+Home"}, false},
    {ControllerCommand::previousFrame, {textPreviousFrame, "controller/previous", "Ctrl+Left"}, false},
    {ControllerCommand::stopPlay, {textStopPlay, "controller/stop", "F7"}, false},
    {ControllerCommand::nextFrame, {textNextFrame, "controller/next", "Ctrl+Right"}, false},
    {ControllerCommand::lastFrame, {textLastFrame, "controller/last", "Ctrl+End"}, false},
    {ControllerCommand::playOnce, {textPlayOnce, "controller/play", "F5"}, true},
    {ControllerCommand::playLoop, {textPlayLoop, "controller/loop", "F6"}, true},
    {ControllerCommand::store, {textStore, "controller/store", nullptr}, false},
    {ControllerCommand::refreshData, {textRefreshData, "controller/refresh", nullptr}, false},
    {ControllerCommand::refreshChannels, {textRefreshChannels, "channels", nullptr}, false},
    {ControllerCommand::noDataPoint, {textNoDataPoint, nullptr, nullptr}, true},
    {ControllerCommand::customize, {textCustomize, "controller/customise", nullptr}, false},
};

} // namespace

CommandActions::CommandActions(VtCPanoramicApp& application, QObject& actionOwner, std::function<void()> executedAction)
    : app(application), owner(actionOwner), texts(application.GetHost().GetTexts()), executed(std::move(executedAction))
{
}

QAction* CommandActions::Make(const QString& name, const Look& look)
{
    auto* action = new QAction(Part(texts, look.text, 0), &owner);
    action->setObjectName(name);
    action->setStatusTip(Part(texts, look.text, 1));
    if (look.icon)
        action->setIcon(MakeIcon(look.icon));
    QString tip = action->text().remove('&').remove("...");
    if (look.shortcut)
    {
        action->setShortcut(QKeySequence(look.shortcut));
        tip += " (" + action->shortcut().toString(QKeySequence::NativeText) + ")";
    }
    action->setToolTip(tip);
    return action;
}

QAction* CommandActions::Get(std::uint32_t command)
{
    QAction*& action = commands[command];
    if (action)
        return action;
    const auto* found = std::find_if(std::begin(looks), std::end(looks),
                                     [command](const CommandLook& l) { return l.command == command; });
    action =
        found == std::end(looks) ? Make(QString::number(command), {}) : Make(QString::number(command), found->look);
    action->setCheckable(found == std::end(looks) || found->checkable);
    QObject::connect(action, &QAction::triggered, &owner, [this, command] { Execute(command); });
    return action;
}

QAction* CommandActions::MakeOwn(const char* name, const Look& look, std::function<void()> carryOut)
{
    QAction* action = Make(name, look);
    QObject::connect(action, &QAction::triggered, &owner, std::move(carryOut));
    return action;
}

void CommandActions::Execute(std::uint32_t command)
{
    app.OnCmdMsg(command);
    executed();
}

void CommandActions::Refresh()
{
    for (const auto& [command, action] : commands)
    {
        const std::optional<VtTMenuState> state = app.GetMenuState(command);
        action->setEnabled(state && state->enabled);
        if (action->isCheckable())
            action->setChecked(state && state->checked);
    }
}

} // namespace desktop

#pragma once

#include <cstdint>
#include <functional>
#include <map>

#include <QString>

class QAction;
class QObject;
class VtCPanoramicApp;

namespace host
{
class Texts;
}

namespace desktop
{

/// The actions of menus and tool bars. Those that stand for a command of the component send its number and show the
/// state that the component tells for it.
class CommandActions
{
public:
    /// How an action shows. The text is "label|what it does".
    struct Look
    {
        std::uint32_t text = 0;
        const char* icon = nullptr;
        const char* shortcut = nullptr;
    };

    /// The actions belong to `owner`. `executed` is called behind every command.
    CommandActions(VtCPanoramicApp& application, QObject& owner, std::function<void()> executed);

    /// The action of a command; made with the first call, one for each command.
    QAction* Get(std::uint32_t command);

    /// An action of the program itself; `name` tells it from the others.
    QAction* MakeOwn(const char* name, const Look& look, std::function<void()> carryOut);

    /// Carries a command out as its action would.
    void Execute(std::uint32_t command);

    /// Brings the states of all commands up to date.
    void Refresh();

    const std::map<std::uint32_t, QAction*>& GetCommands() const { return commands; }

private:
    QAction* Make(const QString& name, const Look& look);

    VtCPanoramicApp& app;
    QObject& owner;
    const host::Texts& texts;
    std::function<void()> executed;
    std::map<std::uint32_t, QAction*> commands;
};

} // namespace desktop

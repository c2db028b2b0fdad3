#pragma once

#include <functional>

#include <QObject>

class QMainWindow;
class QMenu;
class QToolBar;

namespace host
{
class Texts;
class ToolBarEvents;
} // namespace host

namespace desktop
{

class CommandActions;
class StateFile;

/// The menu bar and the tool bars, and the page that tells all commands with their keys.
class Menus : public QObject
{
public:
    /// `openFile` opens one of the recent files. All outlive this.
    Menus(QMainWindow& mainWindow, CommandActions& commandActions, const host::Texts& displayTexts,
          StateFile& stateFile, std::function<void(const QString&)> openFile);

    /// Once, when the window has its docks.
    void Build();

    /// Not owned; null lets it go.
    void SetToolBarEvents(host::ToolBarEvents* events) { toolBarEvents = events; }

    /// Opens the page over the window; that is used on meanwhile.
    void ShowHelp() const;

private:
    QToolBar* AddBar(const char* name, int title);
    void BuildToolBars(QMenu& view);
    void FillSources();
    void FillRecent();

    QMainWindow& window;
    CommandActions& actions;
    const host::Texts& texts;
    StateFile& state;
    std::function<void(const QString&)> open;
    host::ToolBarEvents* toolBarEvents = nullptr;
    QMenu* sources = nullptr;
    QMenu* recent = nullptr;
};

} // namespace desktop

#pragma once

#include <cstdint>
#include <vector>

#include <QMainWindow>
#include <QTimer>

#include "host/Selection.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/DesktopHost.h"
#include "hosts/desktop/Menus.h"
#include "hosts/desktop/SceneFiles.h"
#include "hosts/desktop/SceneWindows.h"
#include "hosts/desktop/StateFile.h"
#include "hosts/desktop/ViewArea.h"
#include "hosts/desktop/WindowCommands.h"
#include "scene/SceneObjects.h"

class QDockWidget;
class QLabel;
class QPlainTextEdit;
class VtCPanoramicApp;

namespace desktop
{

class ControllerDock;

/// The one main window: menus, tool bars, the scene's panes in the middle, docks around it and the status line.
///
/// It carries no rule of the component: its widgets show what that tells, and send commands by their number.
class MainWindow : public QMainWindow,
                   public WindowServices,
                   public ViewSurroundings,
                   private host::CommandTarget,
                   private host::SelectionListener,
                   private VtISceneListener
{
public:
    /// The services of the window are there from now on; menus and docks come with `Build`.
    MainWindow(DesktopHost& desktopHost, VtCPanoramicApp& application);
    ~MainWindow() override;

    /// Once, when the component has told its commands and sources.
    void Build();

    /// Before the component shuts down: no more looking at it.
    void LetGo();

    SceneFiles& GetFiles() { return files; }
    CommandActions& GetActions() { return actions; }
    const ViewArea* GetViewArea() const { return sceneWindows.GetArea(); }

    /// Of the object selected last; empty when nothing is.
    std::wstring GetSelectedId() const;
    std::wstring GetSelectedName() const;

    // What its commands do

    void EditProgramSettings();
    bool CanTogglePlay() const;
    void TogglePlay();
    void ShowHelp() const { menus.ShowHelp(); }

    /// On to the next pane or dock that shows, or back; a pane becomes the active one.
    void MoveFocus(int step);

    std::int32_t GetWindowState() const override;
    void SetWindowState(std::int32_t state) override;
    void Hide() override { hide(); }
    void ShowMaximised() override { showMaximized(); }
    void AddMenuResource(std::uint32_t) override {} // the menus are the window's own
    void SetToolBarEvents(host::ToolBarEvents* events) override { menus.SetToolBarEvents(events); }
    bool IsPaneShown(std::uint32_t pane) const override;
    void BeginWaitCursor() override;
    void EndWaitCursor() override;
    void ShowVariable(const std::wstring& name, const std::wstring& value) override;

    VtCChildFrame* GetChildFrame() const override;
    void SetFlying(bool flag) override;
    void ShowPaneMenu(VtCPanoramicView& view, const QPoint& position) override;

protected:
    void closeEvent(QCloseEvent* event) override;
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dropEvent(QDropEvent* event) override;
    void moveEvent(QMoveEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void changeEvent(QEvent* event) override;
    void showEvent(QShowEvent* event) override;

private:
    std::vector<host::CommandLook> GetCommands() const override;
    std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const override
    {
        return GetWindowCommands().GetState(*this, command);
    }
    bool OnCmdMsg(std::uint32_t command) override { return GetWindowCommands().Execute(*this, *this, command); }

    void BuildLog();
    void BuildController();
    void BuildStatusLine();
    void RestorePlaces();
    void StorePlaces();
    void Place(ViewArea* area);

    // What is selected and active shows as soon as it changes.
    void SelectionChanged() override;
    void ObjectRenamed(VtCGlidePanelAbstractNavigatorObject& object, const std::wstring& formerName) override;
    void ActiveViewChanged(VtCBase3DView* view, VtCGlidePanelAbstractNavigatorObject* observer) override;
    void Refresh();
    void UpdateTitle();
    void FollowScreen();

    DesktopHost& host;
    VtCPanoramicApp& app;
    const host::Texts& texts;
    CommandActions actions;
    StateFile state;
    SceneFiles files;
    Menus menus;
    SceneWindows sceneWindows;

    QWidget* middle = nullptr;
    QDockWidget* logDock = nullptr;
    ControllerDock* controllerDock = nullptr;
    QPlainTextEdit* log = nullptr;
    QLabel* frameRate = nullptr;
    QLabel* source = nullptr;
    QLabel* selection = nullptr;
    QTimer refreshTimer;
    QTimer storeTimer;
    bool built = false;
};

} // namespace desktop

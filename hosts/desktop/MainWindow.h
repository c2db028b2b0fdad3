#pragma once

#include <cstdint>
#include <vector>

#include <QMainWindow>
#include <QTimer>

#include "host/Selection.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/DesktopHost.h"
#include "hosts/desktop/SceneFiles.h"
#include "hosts/desktop/SceneWindows.h"
#include "hosts/desktop/StateFile.h"
#include "hosts/desktop/ViewArea.h"
#include "scene/SceneObjects.h"

class QDockWidget;
class QLabel;
class QMenu;
class QPlainTextEdit;
class QToolBar;
class QToolButton;
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
    const CommandActions& GetActions() const { return actions; }
    const ViewArea* GetViewArea() const { return sceneWindows.GetArea(); }

    /// Of the object selected last; empty when nothing is.
    std::wstring GetSelectedId() const;
    std::wstring GetSelectedName() const;

    std::int32_t GetWindowState() const override;
    void SetWindowState(std::int32_t state) override;
    void Hide() override { hide(); }
    void ShowMaximised() override { showMaximized(); }
    void AddMenuResource(std::uint32_t) override {} // the menus are the window's own
    void SetToolBarEvents(host::ToolBarEvents* events) override { toolBarEvents = events; }
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
    void BuildOwnActions();
    void AddCommands(QWidget& bar, const std::vector<std::uint32_t>& commands);
    void BuildMenus();
    void BuildToolBars();
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
    void FillSourceMenu();
    void FillRecentMenu();
    void EditProgramSettings();
    void FollowScreen();
    QToolBar* AddBar(const char* name, int title);

    DesktopHost& host;
    VtCPanoramicApp& app;
    const host::Texts& texts;
    CommandActions actions;
    StateFile state;
    SceneFiles files;
    SceneWindows sceneWindows;
    host::ToolBarEvents* toolBarEvents = nullptr;

    QWidget* middle = nullptr;
    QAction* newScene = nullptr;
    QAction* openScene = nullptr;
    QAction* openData = nullptr;
    QAction* save = nullptr;
    QAction* saveAs = nullptr;
    QAction* quit = nullptr;
    QAction* settings = nullptr;
    QMenu* sourceMenu = nullptr;
    QMenu* recentMenu = nullptr;
    QMenu* viewMenu = nullptr;
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

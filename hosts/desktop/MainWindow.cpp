#include "hosts/desktop/MainWindow.h"

#include <QApplication>
#include <QCloseEvent>
#include <QDockWidget>
#include <QDragEnterEvent>
#include <QLabel>
#include <QMenuBar>
#include <QMimeData>
#include <QPlainTextEdit>
#include <QScreen>
#include <QStatusBar>
#include <QToolBar>
#include <QToolButton>
#include <QVBoxLayout>
#include <QWindow>

#include "app/PanoramicApp.h"
#include "app/PanoramicDocument.h"
#include "base/Text.h"
#include "hosts/common/IniTexts.h"
#include "hosts/desktop/controller/ControllerDock.h"
#include "hosts/desktop/Icons.h"
#include "hosts/desktop/PaneMenu.h"
#include "hosts/desktop/SettingsDialog.h"
#include "hosts/desktop/Wording.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/ViewCommandsHandler.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "ui/SimulationDataControllerDialog.h"

namespace desktop
{

namespace
{

constexpr QSize firstSize(1280, 840);
constexpr QSize frameRoom(16, 48);   // what a window manager may put around a window
constexpr int refreshInterval = 100; // milliseconds between two looks at the states of commands
constexpr int storeDelay = 1000;     // milliseconds that a window rests before its place is kept

constexpr const char* windowSection = "Window";
constexpr int placesVersion = 1; // of what the docks and bars are

constexpr std::uint32_t separator = 0; // among commands

const std::vector<std::uint32_t> viewCommands = {
    commandSingleView, commandTwoColumns, commandTwoRows,   commandFourViews, separator, commandGouraud,
    commandTextured,   commandFlat,       commandWireFrame, commandMixed,     separator, commandStraighten};

QString LocalFile(const QMimeData* data)
{
    for (const QUrl& url : data->urls())
        if (url.isLocalFile())
            return url.toLocalFile();
    return {};
}

} // namespace

MainWindow::MainWindow(DesktopHost& desktopHost, VtCPanoramicApp& application)
    : host(desktopHost),
      app(application),
      texts(desktopHost.GetTexts()),
      actions(application, *this,
              [this]
              {
                  Refresh();
                  host.GetPump().Hurry();
              }),
      state(desktopHost.GetStateFile(), desktopHost.GetMessages()),
      files(application, desktopHost, state, *this, [this] { UpdateTitle(); }),
      sceneWindows(*this, [this](ViewArea* area) { Place(area); })
{
    setObjectName("main");
    setWindowIcon(MakeIcon("panoramic"));
    setAcceptDrops(true);
    setDockNestingEnabled(true);
    middle = new QWidget;
    auto* layout = new QVBoxLayout(middle);
    layout->setContentsMargins(0, 0, 0, 0);
    setCentralWidget(middle);
    resize(firstSize.boundedTo(screen()->availableSize() - frameRoom));

    host.SetWindow(this, &sceneWindows);
    host.GetMessages().SetWindow(this);
    host.GetProgressBox().SetWindow(this);
    host.GetFileQuestions().SetWindow(this);
    BuildLog();
    BuildStatusLine();
    host.GetSelection().AddListener(*this);
    app.AddSceneListener(*this);
}

MainWindow::~MainWindow()
{
    app.RemoveSceneListener(*this);
    host.GetSelection().RemoveListener(*this);
    host.GetMessages().SetLog({});
    host.GetMessages().SetWindow(nullptr);
    host.GetProgressBox().SetWindow(nullptr);
    host.GetFileQuestions().SetWindow(nullptr);
    host.SetWindow(nullptr, nullptr);
}

void MainWindow::Build()
{
    BuildOwnActions();
    BuildController();
    BuildMenus();
    BuildToolBars();
    RestorePlaces();
    built = true;

    connect(&refreshTimer, &QTimer::timeout, this, [this] { Refresh(); });
    refreshTimer.start(refreshInterval);
    storeTimer.setSingleShot(true);
    connect(&storeTimer, &QTimer::timeout, this, [this] { StorePlaces(); });
    for (QDockWidget* dock : findChildren<QDockWidget*>())
    {
        connect(dock, &QDockWidget::dockLocationChanged, this, [this] { storeTimer.start(storeDelay); });
        connect(dock, &QDockWidget::visibilityChanged, this, [this] { storeTimer.start(storeDelay); });
    }
    UpdateTitle();
}

void MainWindow::LetGo()
{
    refreshTimer.stop();
    storeTimer.stop();
    delete controllerDock;
    controllerDock = nullptr;
}

void MainWindow::BuildOwnActions()
{
    newScene = actions.MakeOwn("new", {textNewScene, "new", "Ctrl+N"}, [this] { files.New(); });
    openScene = actions.MakeOwn("open", {textOpenScene, "open", "Ctrl+O"}, [this] { files.Open(); });
    openData = actions.MakeOwn("open-data", {textOpenData, "open-data", "Ctrl+D"}, [this] { files.OpenData(); });
    save = actions.MakeOwn("save", {textSave, "save", "Ctrl+S"}, [this] { files.Save(); });
    saveAs = actions.MakeOwn("save-as", {textSaveAs, "save-as", "Ctrl+Shift+S"}, [this] { files.SaveAs(); });
    quit = actions.MakeOwn("quit", {textQuit, "quit", "Ctrl+Q"}, [this] { close(); });
    settings = actions.MakeOwn("settings", {textSettings, "settings", "Ctrl+,"}, [this] { EditProgramSettings(); });
}

void MainWindow::AddCommands(QWidget& bar, const std::vector<std::uint32_t>& commands)
{
    for (const std::uint32_t command : commands)
    {
        QAction* action = command == separator ? new QAction(this) : actions.Get(command);
        if (command == separator)
            action->setSeparator(true);
        bar.addAction(action);
    }
}

void MainWindow::BuildMenus()
{
    QMenu* file = menuBar()->addMenu(Part(texts, textFileMenu, 0));
    file->addAction(newScene);
    file->addAction(openScene);
    file->addAction(openData);
    recentMenu = file->addMenu(MakeIcon("recent"), Part(texts, textRecent, 0));
    connect(recentMenu, &QMenu::aboutToShow, this, [this] { FillRecentMenu(); });
    file->addSeparator();
    file->addAction(save);
    file->addAction(saveAs);
    file->addSeparator();
    file->addAction(settings);
    file->addSeparator();
    file->addAction(quit);

    viewMenu = menuBar()->addMenu(Part(texts, textViewMenu, 0));
    AddCommands(*viewMenu, viewCommands);

    using namespace ControllerCommand;
    QMenu* simulation = menuBar()->addMenu(Part(texts, textSimulationMenu, 0));
    sourceMenu = simulation->addMenu(MakeIcon("source"), Part(texts, textDataSource, 0));
    connect(sourceMenu, &QMenu::aboutToShow, this, [this] { FillSourceMenu(); });
    AddCommands(*simulation,
                {customize, refreshChannels, separator, start, stop, separator, playOnce, playLoop, stopPlay, separator,
                 firstFrame, previousFrame, nextFrame, lastFrame, separator, refreshData, store});
}

QToolBar* MainWindow::AddBar(const char* name, int title)
{
    QToolBar* bar = addToolBar(Part(texts, textToolBars, title));
    bar->setObjectName(name);
    return bar;
}

void MainWindow::BuildToolBars()
{
    using namespace ControllerCommand;
    QToolBar* file = AddBar("files", 0);
    file->addActions({newScene, openScene, openData, save});

    QToolBar* views = AddBar("views", 1);
    AddCommands(*views, viewCommands);

    QToolBar* simulation = AddBar("simulation", 2);
    auto* sourceButton = new QToolButton;
    sourceButton->setObjectName("source");
    sourceButton->setIcon(MakeIcon("source"));
    sourceButton->setMenu(sourceMenu);
    sourceButton->setPopupMode(QToolButton::InstantPopup);
    sourceButton->setToolTip(Part(texts, textDataSource, 0).remove('&'));
    sourceButton->setStatusTip(Part(texts, textDataSource, 1));
    simulation->addWidget(sourceButton);
    AddCommands(*simulation, {start, stop, separator, firstFrame, previousFrame, playOnce, playLoop, stopPlay,
                              nextFrame, lastFrame});

    viewMenu->addSeparator();
    for (QToolBar* bar : {file, views, simulation})
        viewMenu->addAction(bar->toggleViewAction());
    viewMenu->addSeparator();
    for (QDockWidget* dock : findChildren<QDockWidget*>())
        viewMenu->addAction(dock->toggleViewAction());
}

void MainWindow::BuildLog()
{
    logDock = new QDockWidget(Part(texts, textLog, 0), this);
    logDock->setObjectName("log");
    log = new QPlainTextEdit;
    log->setObjectName("log-text");
    log->setReadOnly(true);
    log->setMaximumBlockCount(5000);
    log->setLineWrapMode(QPlainTextEdit::NoWrap);
    log->setContextMenuPolicy(Qt::CustomContextMenu);
    connect(log, &QWidget::customContextMenuRequested, this,
            [this](const QPoint& at)
            {
                QMenu* menu = log->createStandardContextMenu();
                menu->setAttribute(Qt::WA_DeleteOnClose);
                menu->addSeparator();
                connect(menu->addAction(Part(texts, textLog, 1)), &QAction::triggered, log, &QPlainTextEdit::clear);
                menu->popup(log->mapToGlobal(at));
            });
    logDock->setWidget(log);
    addDockWidget(Qt::BottomDockWidgetArea, logDock);
    resizeDocks({logDock}, {110}, Qt::Vertical);
    host.GetMessages().SetLog([this](const QString& line) { log->appendPlainText(line); });
}

void MainWindow::BuildController()
{
    VtCSimulationDataControllerDialog* dialog = app.GetControllerDialog();
    if (!dialog)
        return;
    controllerDock = new ControllerDock(*dialog, texts, this);
    addDockWidget(Qt::BottomDockWidgetArea, controllerDock);
    splitDockWidget(controllerDock, logDock, Qt::Horizontal);
}

void MainWindow::BuildStatusLine()
{
    frameRate = new QLabel;
    source = new QLabel;
    selection = new QLabel;
    statusBar()->addPermanentWidget(selection);
    statusBar()->addPermanentWidget(source);
    statusBar()->addPermanentWidget(frameRate);
}

void MainWindow::RestorePlaces()
{
    const auto stored = [this](const char* key)
    { return QByteArray::fromBase64(QByteArray::fromStdString(state.Get(windowSection, key))); };
    restoreGeometry(stored("Geometry"));
    restoreState(stored("State"), placesVersion);
}

void MainWindow::StorePlaces()
{
    if (!built || !isVisible())
        return;
    state.Set(windowSection, "Geometry", saveGeometry().toBase64().toStdString());
    state.Set(windowSection, "State", saveState(placesVersion).toBase64().toStdString());
}

void MainWindow::Place(ViewArea* area)
{
    if (area)
        middle->layout()->addWidget(area);
}

void MainWindow::SelectionChanged()
{
    const std::wstring name = GetSelectedName();
    selection->setText(name.empty() ? QString() : ToQt(hosts::IniTexts::Format(texts, textSelected, name, {})));
}

void MainWindow::ObjectRenamed(VtCGlidePanelAbstractNavigatorObject& object, const std::wstring&)
{
    if (host.GetSelection().IsSelected(object.GetInternalId()))
        SelectionChanged();
}

void MainWindow::ActiveViewChanged(VtCBase3DView*, VtCGlidePanelAbstractNavigatorObject*)
{
    if (sceneWindows.GetArea())
        sceneWindows.GetArea()->update();
}

std::wstring MainWindow::GetSelectedId() const
{
    const std::vector<std::wstring>& selected = host.GetSelection().GetSelection();
    return selected.empty() ? std::wstring() : selected.back();
}

std::wstring MainWindow::GetSelectedName() const
{
    const VtCScene3D* scene = app.GetActiveScene();
    const VtCGlidePanelAbstractNavigatorObject* object =
        scene ? scene->GetObjects().FindById(GetSelectedId()) : nullptr;
    return object ? object->GetName() : std::wstring();
}

void MainWindow::Refresh()
{
    actions.Refresh();
    setWindowModified(files.IsModified());
}

void MainWindow::UpdateTitle()
{
    setWindowTitle(ToQt(files.GetSceneName()) + "[*] - " + ToQt(app.GetName()));
    Refresh();
}

void MainWindow::FillSourceMenu()
{
    using namespace ControllerCommand;
    sourceMenu->clear();
    sourceMenu->addAction(actions.Get(noDataPoint));
    sourceMenu->addSeparator();
    const std::vector<std::wstring> entries =
        toolBarEvents ? toolBarEvents->OnDropDown(firstSelect) : std::vector<std::wstring>();
    for (std::uint32_t i = 0; i < entries.size() && firstSelect + i <= lastSelect; ++i)
    {
        QAction* choice = actions.Get(firstSelect + i);
        choice->setText(ToQt(entries[i]));
        sourceMenu->addAction(choice);
    }
    actions.Refresh();
}

void MainWindow::FillRecentMenu()
{
    recentMenu->clear();
    for (const std::string& path : state.GetRecentFiles())
    {
        const QString shown = QString::fromStdString(path);
        connect(recentMenu->addAction(QString(shown).replace('&', "&&")), &QAction::triggered, this,
                [this, shown] { files.OpenFile(InnerPath(shown)); });
    }
    const bool any = !recentMenu->isEmpty();
    recentMenu->addSeparator();
    QAction* clear = recentMenu->addAction(Part(texts, textRecent, 2));
    clear->setEnabled(any);
    connect(clear, &QAction::triggered, this, [this] { state.ClearRecentFiles(); });
}

void MainWindow::EditProgramSettings()
{
    if (EditSettings(*this, app, state))
        FollowScreen();
}

void MainWindow::FollowScreen()
{
    const QScreen* shownOn = screen();
    host.GetPump().SetRefreshRate(IsPaced(state) && shownOn ? shownOn->refreshRate() : 0.0);
}

std::int32_t MainWindow::GetWindowState() const
{
    return isMinimized() ? host::windowMinimised : host::windowNormal;
}

void MainWindow::SetWindowState(std::int32_t newState)
{
    newState == host::windowMinimised ? showMinimized() : showNormal();
}

bool MainWindow::IsPaneShown(std::uint32_t pane) const
{
    return pane == VtCSimulationDataControllerDialog::pane && controllerDock && controllerDock->IsOnShow();
}

void MainWindow::BeginWaitCursor()
{
    QApplication::setOverrideCursor(Qt::WaitCursor);
}

void MainWindow::EndWaitCursor()
{
    QApplication::restoreOverrideCursor();
}

void MainWindow::ShowVariable(const std::wstring& name, const std::wstring& value)
{
    if (name == L"fps")
        frameRate->setText(value.empty() ? QString() : ToQt(hosts::IniTexts::Format(texts, textFrameRate, value, {})));
    else if (name == L"simulationDatapointInfo")
        source->setText(ToQt(value));
}

VtCChildFrame* MainWindow::GetChildFrame() const
{
    const VtCPanoramicDocument* document = app.GetActiveDocument();
    return document ? document->GetChildFrame() : nullptr;
}

void MainWindow::SetFlying(bool flag)
{
    host.GetPump().SetFlying(flag);
}

void MainWindow::ShowPaneMenu(VtCPanoramicView& view, const QPoint& position)
{
    if (VtCPanoramicDocument* document = app.GetActiveDocument())
        MakePaneMenu(*this, *document, view, actions, texts)->popup(position);
}

void MainWindow::closeEvent(QCloseEvent* event)
{
    std::int32_t allowed = 0;
    app.ShutDownRequest(allowed);
    event->setAccepted(allowed != 0 && files.MayClose());
    if (!event->isAccepted())
        return;
    StorePlaces();
    QApplication::quit();
}

void MainWindow::dragEnterEvent(QDragEnterEvent* event)
{
    if (!LocalFile(event->mimeData()).isEmpty())
        event->acceptProposedAction();
}

void MainWindow::dropEvent(QDropEvent* event)
{
    const QString file = LocalFile(event->mimeData());
    event->acceptProposedAction();
    // The other program waits for the drop to end, and opening may ask the user.
    QTimer::singleShot(0, this, [this, file] { files.OpenFile(InnerPath(file)); });
}

void MainWindow::moveEvent(QMoveEvent* event)
{
    QMainWindow::moveEvent(event);
    if (built)
        storeTimer.start(storeDelay);
}

void MainWindow::resizeEvent(QResizeEvent* event)
{
    QMainWindow::resizeEvent(event);
    if (built)
        storeTimer.start(storeDelay);
}

void MainWindow::changeEvent(QEvent* event)
{
    QMainWindow::changeEvent(event);
    if (event->type() == QEvent::WindowStateChange)
        host.GetPump().Hurry();
}

void MainWindow::showEvent(QShowEvent* event)
{
    QMainWindow::showEvent(event);
    if (windowHandle())
        connect(windowHandle(), &QWindow::screenChanged, this, &MainWindow::FollowScreen, Qt::UniqueConnection);
    FollowScreen();
}

} // namespace desktop

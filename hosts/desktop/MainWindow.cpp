#include "hosts/desktop/MainWindow.h"

#include <algorithm>
#include <iterator>

#include <QApplication>
#include <QCloseEvent>
#include <QDockWidget>
#include <QDragEnterEvent>
#include <QLabel>
#include <QMenu>
#include <QMimeData>
#include <QPlainTextEdit>
#include <QScreen>
#include <QStatusBar>
#include <QVBoxLayout>
#include <QWindow>

#include "app/PanoramicApp.h"
#include "app/PanoramicDocument.h"
#include "base/Text.h"
#include "hosts/common/HostTexts.h"
#include "hosts/desktop/ControllerDock.h"
#include "hosts/desktop/Icons.h"
#include "hosts/desktop/PaneMenu.h"
#include "hosts/desktop/SettingsDialog.h"
#include "hosts/desktop/ViewPane.h"
#include "hosts/desktop/WindowCommands.h"
#include "hosts/desktop/Wording.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
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
      actions({&application, this}, texts, *this,
              [this]
              {
                  Refresh();
                  host.GetPump().Hurry();
              }),
      state(desktopHost.GetStateFile(), desktopHost.GetMessages()),
      files(application, desktopHost, state, *this, [this] { UpdateTitle(); }),
      menus(*this, actions, texts, state, [this](const QString& file) { files.OpenFile(InnerPath(file)); }),
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
    BuildController();
    menus.Build();
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

std::vector<host::CommandLook> MainWindow::GetCommands() const
{
    std::vector<host::CommandLook> looks;
    GetWindowCommands().AddTo(looks);
    return looks;
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
    controllerDock = new ControllerDock(*dialog, actions, texts, *this);
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
    // With the panes of the last scene the focus would go to the next field there is, which would keep the keys.
    setFocus();
    if (area)
    {
        middle->layout()->addWidget(area);
        for (int pane = 1; pane <= 4; ++pane)
            area->GetPaneWindow(pane).setAccessibleName(
                Part(texts, textViewName + static_cast<std::uint32_t>(pane) - 1, 0));
    }
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

bool MainWindow::CanTogglePlay() const
{
    using namespace ControllerCommand;
    const auto enabled = [this](std::uint32_t command) { return app.GetMenuState(command)->enabled; };
    return app.GetControllerDialog() && (enabled(playOnce) || enabled(stopPlay) || enabled(firstFrame));
}

void MainWindow::TogglePlay()
{
    app.GetControllerDialog()->TogglePlay();
}

void MainWindow::MoveFocus(int step)
{
    std::vector<QWidget*> stops;
    ViewArea* area = sceneWindows.GetArea();
    for (int pane = 1; pane <= 4; ++pane)
        if (area->GetPaneWindow(pane).isVisible())
            stops.push_back(&area->GetPaneWindow(pane));
    const std::ptrdiff_t shownPanes = std::ssize(stops);
    for (QDockWidget* dock : {static_cast<QDockWidget*>(controllerDock), logDock})
    {
        if (!dock || !dock->isVisible())
            continue;
        QList<QWidget*> insides = dock->widget()->findChildren<QWidget*>();
        insides.prepend(dock->widget());
        const auto first = std::find_if(insides.begin(), insides.end(),
                                        [](const QWidget* inside) {
                                            return inside->isEnabled() && inside->isVisible() &&
                                                   (inside->focusPolicy() & Qt::TabFocus);
                                        });
        if (first != insides.end())
            stops.push_back(*first);
    }
    if (stops.empty())
        return;

    // Wherever in a dock the focus is, the dock is where it stands.
    const auto holdsFocus = [this](const QWidget* stop)
    {
        for (const QWidget* widget = focusWidget(); widget; widget = widget->parentWidget())
            if (widget == stop || (qobject_cast<const QDockWidget*>(widget) && widget->isAncestorOf(stop)))
                return true;
        return false;
    };
    const auto at = std::find_if(stops.begin(), stops.end(), holdsFocus);
    const std::ptrdiff_t count = std::ssize(stops);
    // From nowhere a step forward leads to the first, one back to the last.
    const std::ptrdiff_t from = at != stops.end() ? at - stops.begin() : step > 0 ? -1 : count;
    const std::ptrdiff_t to = (from + step + count) % count;
    QWidget* next = stops[static_cast<std::size_t>(to)];
    next->setFocus(Qt::ShortcutFocusReason);
    if (to < shownPanes)
        if (VtCPanoramicView* view = area->GetView(static_cast<ViewPane*>(next)->GetNumber()))
            GetChildFrame()->activateView(*view);
    Refresh();
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

#include "hosts/desktop/TestHook.h"

#include <iostream>

#include <nlohmann/json.hpp>
#include <QAction>
#include <QApplication>
#include <QDockWidget>
#include <QLineEdit>
#include <QLocalServer>
#include <QLocalSocket>
#include <QMenu>
#include <QMenuBar>
#include <QMessageBox>
#include <QPlainTextEdit>
#include <QStatusBar>
#include <QToolBar>

#include "app/PanoramicApp.h"
#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "hosts/desktop/DesktopHost.h"
#include "hosts/desktop/MainWindow.h"
#include "hosts/desktop/ViewPane.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "simdata/SimulationDataController.h"

namespace desktop
{

namespace
{

using Json = nlohmann::ordered_json;

Json Numbers(const osg::Vec3d& vector)
{
    return {vector.x(), vector.y(), vector.z()};
}

/// [x, y, width, height] in pixels of the screen.
Json OnScreen(const QWidget& widget, const QRect& rectangle)
{
    const double ratio = widget.devicePixelRatioF();
    const QPoint corner = widget.mapToGlobal(rectangle.topLeft());
    return {qRound(corner.x() * ratio), qRound(corner.y() * ratio), qRound(rectangle.width() * ratio),
            qRound(rectangle.height() * ratio)};
}

std::string Path(const std::wstring& inner)
{
    return inner.empty() ? std::string() : base::NativePath(inner).string();
}

Json DescribePanes(const VtCChildFrame& frame, const ViewArea& area)
{
    Json panes = Json::array();
    for (int number = 1; number <= 4; ++number)
    {
        const VtCPanoramicView& view = *frame.getSplitter().getView(number);
        const ViewPane& pane = area.GetPaneWindow(number);
        Json one = {{"pane", number},
                    {"name", base::Utf8(view.getName())},
                    {"active", frame.GetActiveView() == &view},
                    {"visible", pane.isVisible()},
                    {"drawn", pane.CanBeSeen()},
                    {"rectangle", pane.isVisible() ? OnScreen(pane, pane.rect()) : Json{0, 0, 0, 0}},
                    {"in_viewer", view.isInViewer()},
                    {"observer", view.getObserver() ? base::Utf8(view.getObserver()->GetName()) : ""}};
        if (view.getView())
        {
            const osg::Matrixd camera = osg::Matrixd::inverse(view.getView()->getCamera()->getViewMatrix());
            one["eye"] = Numbers(camera.getTrans());
            one["look"] = Numbers(osg::Matrixd::transform3x3(osg::Vec3d(0, 0, -1), camera));
        }
        panes.push_back(one);
    }
    return panes;
}

Json DescribeBodies(const VtCScene3D& scene)
{
    Json bodies = Json::object();
    for (const VtC3DMovableBody* body : scene.GetMovableBodies(0)->GetBodies())
        bodies[base::Utf8(body->GetName())] = Numbers(body->GetTransform().getTrans());
    return bodies;
}

Json DescribeObservers(const VtC3DObservers& observers)
{
    Json described = Json::object();
    for (const VtC3DObserver* observer : observers.GetObservers())
        described[base::Utf8(observer->GetName())] = {
            {"eye", Numbers(osg::Matrixd::inverse(observer->GetViewMatrix()).getTrans())},
            {"free", observer->IsFree()}};
    return described;
}

/// Where a menu shows an action, if it is open.
Json InMenu(const QAction& action)
{
    for (const QObject* object : action.associatedObjects())
        if (const auto* menu = qobject_cast<const QMenu*>(object); menu && menu->isVisible())
            return OnScreen(*menu, menu->actionGeometry(const_cast<QAction*>(&action)));
    return nullptr;
}

Json InToolBar(const QAction& action)
{
    for (const QObject* object : action.associatedObjects())
        if (const auto* bar = qobject_cast<const QToolBar*>(object))
            if (const QWidget* button = bar->widgetForAction(const_cast<QAction*>(&action));
                button && button->isVisible())
                return OnScreen(*button, button->rect());
    return nullptr;
}

Json DescribeActions(const MainWindow& window)
{
    Json described = Json::object();
    for (const QAction* action : window.findChildren<QAction*>())
        if (!action->objectName().isEmpty() && !action->isSeparator())
            described[action->objectName().toStdString()] = {{"text", action->text().toStdString()},
                                                             {"enabled", action->isEnabled()},
                                                             {"checked", action->isChecked()},
                                                             {"tool_bar", InToolBar(*action)},
                                                             {"menu", InMenu(*action)}};
    return described;
}

/// Every menu that is open, with its entries.
Json DescribeMenus(const MainWindow& window)
{
    Json described = Json::array();
    for (const QMenu* menu : window.findChildren<QMenu*>())
    {
        if (!menu->isVisible())
            continue;
        Json entries = Json::array();
        for (QAction* action : menu->actions())
            entries.push_back({{"text", action->text().toStdString()},
                               {"enabled", action->isEnabled()},
                               {"checked", action->isChecked()},
                               {"rectangle", OnScreen(*menu, menu->actionGeometry(action))}});
        described.push_back(entries);
    }
    return described;
}

Json DescribeBar(const MainWindow& window)
{
    Json titles = Json::object();
    const QMenuBar& bar = *static_cast<QMenuBar*>(window.menuWidget());
    for (QAction* action : bar.actions())
        titles[action->text().remove('&').toStdString()] = OnScreen(bar, bar.actionGeometry(action));
    return titles;
}

/// The windows over the main one: boxes and dialogs.
Json DescribeDialogs()
{
    Json described = Json::array();
    for (const QWidget* widget : QApplication::topLevelWidgets())
    {
        const auto* dialog = qobject_cast<const QDialog*>(widget);
        if (!dialog || !dialog->isVisible())
            continue;
        Json one = {{"title", dialog->windowTitle().toStdString()},
                    {"rectangle", OnScreen(*dialog, dialog->rect())},
                    {"has_keyboard", dialog->isActiveWindow()},
                    {"text", ""},
                    {"icon", 0}};
        if (const auto* box = qobject_cast<const QMessageBox*>(dialog))
        {
            one["text"] = box->text().toStdString();
            one["icon"] = static_cast<int>(box->icon());
        }
        Json buttons = Json::object();
        for (const auto* button : dialog->findChildren<QAbstractButton*>())
            if (button->isVisible() && !button->text().isEmpty())
                buttons[button->text().remove('&').toStdString()] = OnScreen(*button, button->rect());
        one["buttons"] = buttons;
        Json fields = Json::array();
        for (const auto* field : dialog->findChildren<QLineEdit*>())
            if (field->isVisible())
                fields.push_back(field->text().toStdString());
        one["fields"] = fields;
        described.push_back(one);
    }
    return described;
}

Json DescribeDocks(const MainWindow& window)
{
    Json described = Json::object();
    for (const QDockWidget* dock : window.findChildren<QDockWidget*>())
        described[dock->objectName().toStdString()] = {{"visible", dock->isVisible()},
                                                       {"floating", dock->isFloating()},
                                                       {"rectangle", OnScreen(*dock, dock->rect())}};
    return described;
}

const char* PlayStateName(VtEPlayState state)
{
    switch (state)
    {
    case VtEPlayState::PlayStopped:
        break;
    case VtEPlayState::PlayOnce:
        return "once";
    case VtEPlayState::PlayLoop:
        return "loop";
    case VtEPlayState::SpoolBackward:
        return "backward";
    case VtEPlayState::SpoolForward:
        return "forward";
    }
    return "stopped";
}

} // namespace

std::unique_ptr<TestHook> TestHook::Open(VtCPanoramicApp& app, DesktopHost& host, MainWindow& window)
{
    const QString path = qEnvironmentVariable("PANORAMIC_TEST_HOOK");
    if (path.isEmpty())
        return nullptr;
    std::unique_ptr<TestHook> hook(new TestHook(app, host, window));
    QLocalServer::removeServer(path);
    if (hook->server->listen(path))
        return hook;
    std::cerr << "panoramic-desktop: " << path.toStdString() << ": " << hook->server->errorString().toStdString()
              << '\n';
    return nullptr;
}

TestHook::TestHook(VtCPanoramicApp& application, DesktopHost& desktopHost, MainWindow& mainWindow)
    : app(application), host(desktopHost), window(mainWindow), server(std::make_unique<QLocalServer>())
{
    server->setSocketOptions(QLocalServer::UserAccessOption);
    QObject::connect(server.get(), &QLocalServer::newConnection, server.get(),
                     [this]
                     {
                         QLocalSocket* socket = server->nextPendingConnection();
                         QObject::connect(socket, &QLocalSocket::disconnected, socket, &QObject::deleteLater);
                         QObject::connect(socket, &QLocalSocket::readyRead, socket,
                                          [this, socket]
                                          {
                                              while (socket->canReadLine())
                                              {
                                                  Obey(socket->readLine().trimmed());
                                                  socket->write((Describe() + "\n").c_str());
                                              }
                                              socket->flush();
                                          });
                     });
}

TestHook::~TestHook() = default;

void TestHook::Obey(const QByteArray& line)
{
    host::MainWindow& mainWindow = *host.GetMainWindow();
    if (line == "hide")
        mainWindow.Hide();
    else if (line == "show")
        mainWindow.ShowMaximised();
}

std::string TestHook::Describe() const
{
    Json state = {{"document", Path(window.GetFiles().GetScenePath())},
                  {"data", Path(window.GetFiles().GetDataPath())},
                  {"modified", window.GetFiles().IsModified()},
                  {"title", window.windowTitle().remove("[*]").toStdString()},
                  {"window", OnScreen(window, window.rect())},
                  {"minimised", window.isMinimized()},
                  {"shown", window.isVisible()},
                  {"maximised", window.isMaximized()},
                  {"has_keyboard", window.isActiveWindow()},
                  {"fps", base::Utf8(host.GetDesktopVariables().GetText(L"fps"))},
                  {"source", base::Utf8(host.GetDesktopVariables().GetText(L"simulationDatapointInfo"))},
                  {"selected", base::Utf8(window.GetSelectedName())},
                  {"selected_id", base::Utf8(window.GetSelectedId())}};
    if (VtCSimulationDataController* controller = app.GetController())
    {
        state["play_state"] = PlayStateName(controller->GetPlayState());
        state["mode"] = controller->IsOnline() ? "online" : "offline";
        state["frame"] = controller->GetRouter().GetRecent({});
        state["frames"] = controller->GetRouter().GetBufferedFrames({});
        const std::optional<double> time = controller->GetRouter().GetTimestampOfCurrent();
        state["time"] = time ? Json(*time) : Json();
        state["speed"] = controller->GetSpeed();
    }
    const VtCPanoramicDocument* document = app.GetActiveDocument();
    const VtCChildFrame* frame = document ? document->GetChildFrame() : nullptr;
    if (frame && window.GetViewArea())
    {
        state["views_created"] = frame->areViewsCreated();
        state["layout"] = frame->getSplitter().getLayout();
        state["view_area"] = OnScreen(*window.GetViewArea(), window.GetViewArea()->rect());
        state["panes"] = DescribePanes(*frame, *window.GetViewArea());
        state["observers"] = DescribeObservers(document->GetObservers());
        state["bodies"] = DescribeBodies(*document->GetScene());
    }
    if (const osgViewer::CompositeViewer* viewer = getViewer())
        state["drawn_frames"] = viewer->getFrameStamp() ? viewer->getFrameStamp()->getFrameNumber() : 0U;
    state["contexts"] = osg::GraphicsContext::getAllRegisteredGraphicsContexts().size();
    if (const auto* speed = window.findChild<QWidget*>("speed"); speed && speed->isVisible())
        state["speed_control"] = OnScreen(*speed, speed->rect());
    state["actions"] = DescribeActions(window);
    state["menu_bar"] = DescribeBar(window);
    state["menus"] = DescribeMenus(window);
    state["docks"] = DescribeDocks(window);
    state["dialogs"] = DescribeDialogs();
    if (const auto* log = window.findChild<QPlainTextEdit*>("log-text"))
        state["log"] = log->toPlainText().toStdString();
    return state.dump(-1, ' ', false, Json::error_handler_t::replace);
}

} // namespace desktop

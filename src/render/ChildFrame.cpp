#include "render/ChildFrame.h"

#include "base/Text.h"
#include "host/Clock.h"
#include "host/Selection.h"
#include "host/ViewWindows.h"
#include "interaction/InteractionServices.h"
#include "interaction/MouseInput.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/AttributeNames.h"
#include "render/PanoramicView.h"
#include "render/ViewCommandsHandler.h"
#include "render/Viewer.h"
#include "scene/Body.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

constexpr std::uint32_t creationTimer = 1;
constexpr std::uint32_t creationDelay = 250; // milliseconds
constexpr std::uint32_t pauseTime = 100;

} // namespace

VtCChildFrame::VtCChildFrame(VtTChildFrameServices frameServices)
    : services(std::move(frameServices)),
      commands(std::make_unique<VtCVisualizationViewCommandsHandler>(*this)),
      window(services.windows.MakeChildFrame())
{
    Pause();
    createViewer();
    splitter = std::make_unique<VtCSplitterEx>(*this, window->GetSplitter());
    GiveDefaultObservers();
}

VtCChildFrame::~VtCChildFrame()
{
    if (VtCScene3D* scene = services.document.GetScene())
        scene->SetActiveView(nullptr, nullptr);
    window->KillTimer(creationTimer);
    activeView = nullptr;
    splitter.reset();
}

void VtCChildFrame::Pause() const
{
    services.clock.Sleep(pauseTime);
}

void VtCChildFrame::GiveDefaultObservers()
{
    const auto free = [this](int pane)
    { return pane % 2 == 1 ? services.observers.GetFree2() : services.observers.GetFree1(); };
    for (int pane = 1; pane <= 4; ++pane)
        if (VtC3DObserver* observer = free(pane))
            splitter->getView(pane)->assignObserverByName(observer->GetName());
    if (const VtC3DObserver* observer = splitter->getView(4)->getObserver())
        splitter->getView(1)->assignObserverByName(observer->GetName());
    activateView(*splitter->getView(1));
}

void VtCChildFrame::startViewCreation()
{
    window->StartTimer(creationTimer, creationDelay, [this] { CreateViews(); });
}

void VtCChildFrame::CreateViews()
{
    if (viewsCreated)
        return;
    createSharedContext(window->GetSplitter());
    splitter->forEachView([](VtCPanoramicView& view) { view.createOsgView(); });
    splitter->forEachView(
        [](VtCPanoramicView& view)
        {
            const VtISceneObject* record = view.getSceneObject();
            if (const auto* name = record ? record->Find<std::wstring>(attribute::observer) : nullptr)
                view.assignObserverByName(std::wstring(*name));
        });
    viewsCreated = true;
    renderEmptyFrame(false);
    undrawn.reset();
    Pause();
    window->KillTimer(creationTimer);
}

void VtCChildFrame::setClearColor(int red, int green, int blue)
{
    splitter->forEachView([&](VtCPanoramicView& view) { view.setClearColor(red, green, blue); });
}

void VtCChildFrame::setFarClipPlane(float distance)
{
    splitter->forEachView([&](VtCPanoramicView& view) { view.setFarClipPlane(distance); });
}

void VtCChildFrame::assignObserver(const VtC3DObserver& old, VtC3DObserver& substitute)
{
    splitter->forEachView(
        [&](VtCPanoramicView& view)
        {
            if (view.getObserver() == &old)
                view.assignObserverByName(substitute.GetName());
        });
}

int VtCChildFrame::countViewsOfObserver(const VtC3DObserver& observer) const
{
    int count = 0;
    if (splitter)
        splitter->forEachView([&](VtCPanoramicView& view) { count += view.getObserver() == &observer; });
    return count;
}

void VtCChildFrame::activateView(VtCBase3DView& view)
{
    services.mouseInputManager.setActiveInput(view.getMouseInput());
    activeView = &view;
    ObserverAssigned(view);
}

void VtCChildFrame::ObserverAssigned(const VtCBase3DView& view)
{
    VtCScene3D* scene = services.document.GetScene();
    if (scene && &view == activeView)
        scene->SetActiveView(activeView, activeView->getObserver());
}

void VtCChildFrame::ForgetView(const VtCBase3DView& view)
{
    if (activeView != &view)
        return;
    activeView = nullptr;
    if (VtCPanoramicView* first = splitter ? splitter->getView(1) : nullptr)
        activateView(*first);
    else if (VtCScene3D* scene = services.document.GetScene())
        scene->SetActiveView(nullptr, nullptr);
}

VtCPanoramicView* VtCChildFrame::GetActivePane() const
{
    return dynamic_cast<VtCPanoramicView*>(activeView);
}

bool VtCChildFrame::IsActiveView(const osgViewer::View* view) const
{
    const osgViewer::View* own = activeView ? activeView->getView() : nullptr;
    if (!view || !own || view == own)
        return view && own;
    const osgGA::CameraManipulator* manipulator = view->getCameraManipulator();
    return manipulator && manipulator == own->getCameraManipulator();
}

const VtC3DObserver* VtCChildFrame::GetActiveObserver() const
{
    return activeView ? activeView->getObserver() : nullptr;
}

void VtCChildFrame::ApplyViewRecord(std::int32_t pane, VtISceneObject& record, const std::wstring& id)
{
    VtCPanoramicView* view = splitter->getView(pane);
    if (!view)
        return;
    view->ApplyAttributes(record);
    view->RebindAttributes(id);
}

void VtCChildFrame::ActivateObserver()
{
    VtC3DObserver* observer = activeView ? activeView->getObserver() : nullptr;
    if (!observer)
        return;
    observer->SetAssigned(true);
    services.interaction.SetHeadLightPosition(observer->GetPosition());
}

void VtCChildFrame::SelectBody(const VtC3DBody& body)
{
    services.selection.SelectOnly(body.GetInternalId());
}

void VtCChildFrame::ApplyLayout(std::int32_t layout)
{
    splitter->setLayout(layout);
    const std::int32_t pane = activeView ? activeView->getViewPosition() : 0;
    if ((layout == layoutTwoColumns && pane != 1 && pane != 2) || (layout == layoutTwoRows && pane != 1 && pane != 3))
        activateView(*splitter->getView(1));
    renderEmptyFrame(true);
}

void VtCChildFrame::SetFrameHidden(bool flag)
{
    frameHidden = flag;
    if (flag)
    {
        window->GetSplitter().Hide();
        return;
    }
    {
        const VtCFrameSuspension suspended;
        Pause();
        window->GetSplitter().ShowMaximised();
        splitter->forEachView([](VtCPanoramicView& view) { view.OnSize(); });
    }
    Pause();
    renderEmptyFrame(true);
}

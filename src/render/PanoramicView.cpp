#include "render/PanoramicView.h"

#include <osgGA/EventQueue>
#include <osgUtil/LineSegmentIntersector>

#include "base/Ids.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/ViewWindows.h"
#include "interaction/CameraManipulator.h"
#include "interaction/MouseInput.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "render/Viewer.h"
#include "render/ViewFrame.h"
#include "render/ViewUserData.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"
#include "scene/StaticBody.h"
#include "scene/UserData.h"

namespace
{

using Event = osgGA::GUIEventAdapter;

// Which default observer the next view takes: even calls the first, odd ones the second.
int createdViews = 0;

constexpr float nearDistance = 0.015f;
constexpr float farDistance = 10000.0f;
constexpr std::uint32_t messageEmptyViewport = 9020;

int KeySymbol(VtEViewKey key)
{
    switch (key)
    {
    case VtEViewKey::tab:
        return VtCOsgCameramanipulator::keyTab;
    case VtEViewKey::shiftLeft:
        return VtCOsgCameramanipulator::keyShiftLeft;
    case VtEViewKey::shiftRight:
        return VtCOsgCameramanipulator::keyShiftRight;
    }
    return 0;
}

} // namespace

VtCPanoramicView::VtCPanoramicView(VtIViewFrame& viewFrame, host::PaneWindow& paneWindow)
    : VtCBase3DView(viewFrame), window(paneWindow), mouseInput(std::make_unique<VtCBaseMouseInput>())
{
    osg::ref_ptr<VtISceneObject> record = MakeDefaultObject(objectTypeView);
    if (!record)
        return;
    const std::wstring id = base::NewId();
    record->Write(L"internal_id", id);
    frame.GetDocument().GetServices().store.AddObject(id, record.get());
    Listen(record.get());
}

VtCPanoramicView::~VtCPanoramicView()
{
    if (osgViewer::View* own = getView())
    {
        removeViewFromViewer(own);
        if (auto* data = dynamic_cast<VtCOsgViewUserData*>(own->getUserData()))
            data->owner = nullptr;
        own->setUserData(nullptr);
    }
    if (!sceneObject)
        return;
    if (const auto* id = sceneObject->Find<std::wstring>(L"internal_id"))
        frame.GetDocument().GetServices().store.RemoveObject(*id);
    Listen(nullptr);
}

void VtCPanoramicView::Listen(VtISceneObject* record)
{
    if (sceneObject)
        sceneObject->Unadvise(*this);
    sceneObject = record;
    if (sceneObject)
        sceneObject->Advise(*this);
}

void VtCPanoramicView::Write(const wchar_t* attribute, VtTAttributeValue value)
{
    if (!sceneObject)
        return;
    const bool outer = writing;
    writing = true;
    sceneObject->Write(attribute, std::move(value));
    writing = outer;
}

void VtCPanoramicView::setName(const std::wstring& newName)
{
    if (newName == getName())
        return;
    VtCBase3DView::setName(newName);
    Write(L"name", newName);
}

void VtCPanoramicView::setViewPosition(std::int32_t position)
{
    VtCBase3DView::setViewPosition(position);
    Write(L"view_pos", position);
}

void VtCPanoramicView::createOsgView()
{
    clientRect = window.GetRectangleInParent();
    osg::ref_ptr<osgViewer::View> made = createView(window, clientRect);
    made->setCameraManipulator(new VtCOsgCameramanipulator(frame.GetInteraction()), true);
    attachView(made.get());

    const VtCScene3D* scene = frame.GetDocument().GetScene();
    if (scene)
        made->setSceneData(scene->GetRootNode());
    if (VtC3DObservers* observers = frame.GetObservers())
        assignObserver(createdViews++ % 2 == 0 ? observers->GetFree1() : observers->GetFree2());
    setClearColor(200, 230, 255);
    setNearClipPlane(nearDistance);
    setFarClipPlane(farDistance);
    resize(clientRect);
    if (clientRect.width > 0 && clientRect.height > 0)
        addViewToViewer(made.get());
    made->setUserData(new VtCOsgViewUserData(*this));
}

bool VtCPanoramicView::assignObserverByName(const std::wstring& observerName)
{
    VtC3DObservers* observers = frame.GetObservers();
    VtC3DObserver* found = observers ? observers->FindObserverByName(observerName) : nullptr;
    if (!found)
        return false;
    assignObserver(found);
    Write(L"observer", found->GetName());
    return true;
}

void VtCPanoramicView::ApplyAttributes(const VtISceneObject& record)
{
    // A copy of the list: a setter writes to the own record, which may be this one.
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : VtISceneObject::Attributes(record.GetAttributes()))
    {
        if (sceneObject.get() != &record)
            Write(attribute->GetName().c_str(), attribute->GetValue());
        AttributeChanged(attribute->GetName(), attribute->GetValue());
    }
}

void VtCPanoramicView::RebindAttributes(const std::wstring& id)
{
    VtISceneObjectStore& store = frame.GetDocument().GetServices().store;
    VtISceneObject* stored = store.GetObject(id);
    if (!stored || stored == sceneObject)
        return;
    if (sceneObject)
        if (const auto* old = sceneObject->Find<std::wstring>(L"internal_id"); old && !base::EqualsNoCase(*old, id))
            store.RemoveObject(std::wstring(*old));
    Listen(stored);
}

void VtCPanoramicView::OnPropertyChanged(VtISceneObject&, VtISceneAttribute& attribute)
{
    if (!writing)
        AttributeChanged(attribute.GetName(), attribute.GetValue());
}

void VtCPanoramicView::AttributeChanged(const std::wstring& attribute, const VtTAttributeValue& value)
{
    const auto* text = std::get_if<std::wstring>(&value);
    const auto* real = std::get_if<float>(&value);
    const auto* number = std::get_if<std::int32_t>(&value);

    if (getView())
        resize(clientRect);
    if (attribute == L"name" && text)
        setName(*text);
    else if (attribute == L"view_angle" && real)
        setViewAngle(*real);
    else if (attribute == L"front_clip_plane" && real)
        setNearClipPlane(*real);
    else if (attribute == L"back_clip_plane" && real)
        setFarClipPlane(*real);
    else if (attribute == L"observer" && text)
        assignObserverByName(*text);
    else if (attribute == L"view_pos" && number)
        setViewPosition(*number);
}

bool VtCPanoramicView::TakesInput() const
{
    return getView() && frame.GetDocument().GetScene();
}

double VtCPanoramicView::EventTime() const
{
    const osg::FrameStamp* stamp = getView()->getFrameStamp();
    return stamp ? stamp->getSimulationTime() : 0.0;
}

int VtCPanoramicView::Upwards(int y) const
{
    const osg::Viewport* viewport = getView()->getCamera()->getViewport();
    return (viewport ? static_cast<int>(viewport->height()) : 0) - y;
}

void VtCPanoramicView::QueueMouse(int eventType, int x, int y)
{
    osg::ref_ptr<Event> event = new Event;
    event->setEventType(static_cast<Event::EventType>(eventType));
    event->setTime(EventTime());
    event->setButton(Event::LEFT_MOUSE_BUTTON);
    event->setX(static_cast<float>(x));
    event->setY(static_cast<float>(Upwards(y)));
    getView()->getEventQueue()->addEvent(event.get());
}

void VtCPanoramicView::OnLeftButtonDown(int x, int y)
{
    if (!TakesInput())
        return;
    frame.activateView(*this);
    leftButtonDown = true;
    QueueMouse(Event::PUSH, x, y);
}

void VtCPanoramicView::OnLeftButtonUp(int x, int y)
{
    leftButtonDown = false;
    if (TakesInput())
        QueueMouse(Event::RELEASE, x, y);
}

void VtCPanoramicView::OnRightButtonDown()
{
    if (TakesInput())
        frame.activateView(*this);
}

void VtCPanoramicView::OnMouseLeave()
{
    if (!TakesInput())
        return;
    osg::ref_ptr<Event> event = new Event;
    event->setEventType(Event::RELEASE);
    event->setTime(EventTime());
    getView()->getEventQueue()->addEvent(event.get());
}

void VtCPanoramicView::OnMouseMove(int x, int y)
{
    if (!TakesInput())
        return;
    if (clientRect.width <= 0 || clientRect.height <= 0)
    {
        frame.GetDocument().GetServices().messages.Log(messageEmptyViewport, getName());
        return;
    }
    VtCPanoramicView* active = frame.GetActiveView();
    if (active && active != this)
        active->OnMouseLeave();
    QueueMouse(leftButtonDown ? Event::DRAG : Event::MOVE, x, y);
}

void VtCPanoramicView::OnLeftDoubleClick(int x, int y)
{
    if (!TakesInput())
        return;
    getView()->getEventQueue()->getCurrentEventState()->setEventType(Event::DOUBLECLICK);
    if (const VtC3DBody* body = Pick(x, y))
        frame.SelectBody(*body);
    else
        frame.ShowSingleView();
}

VtC3DBody* VtCPanoramicView::Pick(int x, int y) const
{
    osgUtil::LineSegmentIntersector::Intersections hits;
    // In the window of the camera: what the queue knows of pointer and window is that of the library's own windows.
    if (!getView()->computeIntersections(getView()->getCamera(), osgUtil::Intersector::WINDOW, x, Upwards(y), hits))
        return nullptr;
    const osg::NodePath& path = hits.begin()->nodePath;
    for (auto node = path.rbegin(); node != path.rend(); ++node)
        if (const auto* owner = dynamic_cast<const VtCOsgUserData*>((*node)->getUserData()))
        {
            VtCGlidePanelAbstractNavigatorObject* object = owner->owner;
            if (auto* movable = dynamic_cast<VtC3DMovableBody*>(object))
                return movable;
            return dynamic_cast<VtC3DStaticBody*>(object);
        }
    return nullptr;
}

void VtCPanoramicView::OnKey(VtEViewKey key, bool down)
{
    if (!TakesInput())
        return;
    osg::ref_ptr<Event> event = new Event;
    event->setEventType(down ? Event::KEYDOWN : Event::KEYUP);
    event->setTime(EventTime());
    event->setKey(KeySymbol(key));
    getView()->getEventQueue()->addEvent(event.get());
}

void VtCPanoramicView::OnPaint()
{
    if (TakesInput())
        RenderViewerFrame();
}

void VtCPanoramicView::OnSize()
{
    clientRect = window.GetRectangleInParent();
    osgViewer::View* own = getView();
    if (clientRect.width <= 0 || clientRect.height <= 0)
    {
        clientRect.width = clientRect.height = 0;
        resize(clientRect);
        removeViewFromViewer(own);
        return;
    }
    resize(clientRect);
    if (own && !isInViewer())
        addViewToViewer(own);
}

#include "render/PanoramicView.h"

#include "base/Ids.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/ViewWindows.h"
#include "interaction/CameraManipulator.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "interaction/Pick.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

// Which default observer the next view takes: even calls the first, odd ones the second.
int createdViews = 0;

constexpr float nearDistance = 0.015f;
constexpr float farDistance = 10000.0f;
constexpr std::uint32_t messageEmptyViewport = 9020;

} // namespace

VtCPanoramicView::VtCPanoramicView(VtIViewFrame& viewFrame, host::PaneWindow& paneWindow)
    : VtCBase3DView(viewFrame), window(paneWindow), mouseInput(*this)
{
    window.SetEvents(&mouseInput);
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
    window.SetEvents(nullptr);
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

void VtCPanoramicView::attachView(osgViewer::View* newView)
{
    VtCBase3DView::attachView(newView);
    mouseInput.Attach(getView());
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

void VtCPanoramicView::OnPress()
{
    frame.activateView(*this);
}

bool VtCPanoramicView::OnPointer()
{
    if (clientRect.width <= 0 || clientRect.height <= 0)
    {
        frame.GetDocument().GetServices().messages.Log(messageEmptyViewport, getName());
        return false;
    }
    // The active view may still take the mouse for held.
    VtCBase3DView* active = frame.GetActiveView();
    if (auto* input = active && active != this ? dynamic_cast<VtCViewInput*>(active->getMouseInput()) : nullptr)
        input->OnMouseLeave();
    return true;
}

void VtCPanoramicView::OnDoubleClick(int x, int y)
{
    if (const VtC3DBody* body = VtCPick(getView(), x, y).GetBody())
        frame.SelectBody(*body);
    else
        frame.ApplyLayout(0);
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

#include "render/PanoramicView.h"

#include "base/Ids.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/ViewWindows.h"
#include "interaction/CameraManipulator.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "interaction/Pick.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "render/SplitterEx.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

// Which default observer the next view takes: even calls the first, odd ones the second.
int createdViews = 0;

constexpr std::uint32_t messageEmptyViewport = 9020;

} // namespace

VtCPanoramicView::VtCPanoramicView(VtIViewFrame& viewFrame, host::PaneWindow& paneWindow)
    : VtCBase3DView(viewFrame), window(paneWindow), mouseInput(*this)
{
    window.SetEvents(&mouseInput);
    const osg::ref_ptr<VtISceneObject> record = Attributes().MakeRecord();
    const std::wstring id = base::NewId();
    record->Write(attribute::internalId, id);
    frame.GetDocument().GetServices().store.AddObject(id, record.get());
    Listen(record.get(), id);
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
    sink.Disconnect();
    frame.GetDocument().GetServices().store.RemoveObject(recordId);
}

const VtCAttributeTable& VtCPanoramicView::Attributes()
{
    using Self = VtCPanoramicView;
    static const VtCAttributeTable table(
        objectTypeView,
        {IdentityRows(objectTypeView,
                      Attribute<Self>(attribute::name, L"", &Self::setName, &Self::getName, "as the tree shows it")),
         {
             Attribute<Self>(attribute::viewPos, 0, &Self::setViewPosition, &Self::getViewPosition, "the pane, 1 to 4"),
             Attribute<Self>(attribute::observer, L"", &Self::assignObserverByName, &Self::GiveObserver,
                             "name of an observer"),
             KeptAttribute(attribute::track, -1, "number of the track, -1 for none"),
             Attribute<Self>(attribute::viewAngle, 40.0F, &Self::setViewAngle, &Self::getViewAngle,
                             "degrees: half of what is seen across, in a portrait pane upright"),
             Attribute<Self>(attribute::frontClipPlane, 0.015F, &Self::setNearClipPlane, &Self::getNearClipPlane,
                             "metres"),
             Attribute<Self>(attribute::backClipPlane, 10000.0F, &Self::setFarClipPlane, &Self::getFarClipPlane,
                             "metres"),
         }});
    return table;
}

void RegisterViewAttributes()
{
    RegisterAttributeTable(VtCPanoramicView::Attributes());
    RegisterAttributeTable(VtCSplitterEx::Attributes());
}

void VtCPanoramicView::Listen(VtISceneObject* record, const std::wstring& id)
{
    sink.Connect(record);
    sceneObject = record;
    recordId = id;
}

std::optional<std::wstring> VtCPanoramicView::GiveObserver() const
{
    return getObserver() ? std::optional(getObserver()->GetName()) : std::nullopt;
}

void VtCPanoramicView::setName(const std::wstring& newName)
{
    if (newName == getName())
        return;
    VtCBase3DView::setName(newName);
    valueChanged(attribute::name);
}

void VtCPanoramicView::setViewPosition(std::int32_t position)
{
    VtCBase3DView::setViewPosition(position);
    valueChanged(attribute::viewPos);
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
    {
        // The one that the record tells of stays; it has been assigned while there was no camera yet.
        VtC3DObserver* usual = createdViews++ % 2 == 0 ? observers->GetFree1() : observers->GetFree2();
        assignObserver(getObserver() ? getObserver() : usual);
    }
    setClearColor(200, 230, 255);
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
    return true;
}

void VtCPanoramicView::RebindAttributes(const std::wstring& id)
{
    VtISceneObjectStore& store = frame.GetDocument().GetServices().store;
    const osg::ref_ptr<VtISceneObject> stored = store.GetObject(id);
    if (!stored || stored == sceneObject)
        return;
    if (!base::EqualsNoCase(recordId, id))
        store.RemoveObject(recordId);
    Listen(stored.get(), id);
}

void VtCPanoramicView::OnAttributeChanged(const std::wstring&, const std::wstring& attributeName,
                                          const VtTAttributeValue& value)
{
    if (getView())
        resize(clientRect);
    Attributes().Take(*this, attributeName, value);
}

void VtCPanoramicView::OnRecordChanged()
{
    frame.GetDocument().SetModified(true);
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

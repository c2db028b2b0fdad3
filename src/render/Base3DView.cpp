#include "render/Base3DView.h"

#include "interaction/CameraManipulator.h"
#include "interaction/Observer.h"
#include "records/AttributeNames.h"
#include "render/Viewer.h"
#include "scene/SceneServices.h"

VtCBase3DView::~VtCBase3DView()
{
    frame.ForgetView(*this);
    if (view)
    {
        if (observer)
            observer->RemoveCamera(view->getCamera());
        view->setCameraManipulator(nullptr);
        view->setCamera(nullptr);
    }
    if (observer)
        observer->Release();
}

VtISceneDocument& VtCBase3DView::GetDocument() const
{
    return frame.GetDocument();
}

void VtCBase3DView::attachView(osgViewer::View* newView)
{
    if (newView)
        view = newView;
}

void VtCBase3DView::setClearColor(int red, int green, int blue)
{
    if (!view)
        return;
    const auto part = [](int value) { return static_cast<float>(value) / 255.0f; };
    clearColor.set(part(red), part(green), part(blue), 1.0f);
    view->getCamera()->setClearColor(clearColor);
}

void VtCBase3DView::setFarClipPlane(float distance)
{
    farClipPlane = distance;
    updateProjection();
    valueChanged(attribute::backClipPlane);
}

void VtCBase3DView::setNearClipPlane(float distance)
{
    nearClipPlane = distance;
    updateProjection();
    valueChanged(attribute::frontClipPlane);
}

void VtCBase3DView::setViewAngle(float angle)
{
    if (angle == viewAngle)
        return;
    viewAngle = angle;
    updateProjection();
    frame.GetDocument().SetModified(true);
    valueChanged(attribute::viewAngle);
}

void VtCBase3DView::updateProjection()
{
    if (!view || width <= 0 || height <= 0)
        return;
    const double aspect = static_cast<double>(width) / height;
    const double fieldOfView = width < height ? 2.0 * viewAngle * aspect : 2.0 * viewAngle / aspect;
    view->getCamera()->setProjectionMatrixAsPerspective(fieldOfView, aspect, nearClipPlane, farClipPlane);
}

void VtCBase3DView::resize(const host::Rectangle& rectangle)
{
    width = rectangle.width;
    height = rectangle.height;
    osg::Camera* camera = view ? view->getCamera() : nullptr;
    if (!camera)
        return;
    if (width <= 0 || height <= 0)
    {
        camera->setViewport(0, 0, 0, 0);
        return;
    }
    camera->setViewport(0, 0, width, height);
    camera->setProjectionResizePolicy(height > width ? osg::Camera::HORIZONTAL : osg::Camera::VERTICAL);
    updateProjection();
}

void VtCBase3DView::assignObserver(VtC3DObserver* newObserver)
{
    if (!newObserver)
        return;
    const bool isAnother = newObserver != observer; // the same one may have another name
    newObserver->AddRef();                          // a removed observer lives on until no view looks through it
    if (observer)
    {
        if (frame.GetObservers() && frame.countViewsOfObserver(*observer) < 2)
            observer->SetAssigned(false);
        if (view)
            observer->RemoveCamera(view->getCamera());
        observer->Release();
    }
    observer = newObserver;
    observer->SetAssigned(true);
    if (view)
    {
        observer->AddCamera(view->getCamera());
        if (VtCOsgCameramanipulator* manipulator = GetManipulator())
            manipulator->setObserver(observer, view.get());
        observer->PushViewMatrix();
    }
    valueChanged(attribute::observer);
    if (isAnother)
        frame.ObserverAssigned(*this);
}

VtCOsgCameramanipulator* VtCBase3DView::GetManipulator() const
{
    return view ? dynamic_cast<VtCOsgCameramanipulator*>(view->getCameraManipulator()) : nullptr;
}

void VtCBase3DView::straightenCamera()
{
    VtCOsgCameramanipulator* manipulator = GetManipulator();
    if (manipulator && observer)
        manipulator->straighten();
}

bool VtCBase3DView::isInViewer() const
{
    return view && isViewInViewer(view.get());
}

std::int32_t VtCBase3DView::getVisiblePolygonCount()
{
    polygonCount = ::getVisiblePolygonCount(view.get(), polygonCount);
    return polygonCount;
}

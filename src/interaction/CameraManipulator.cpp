#include "interaction/CameraManipulator.h"

#include <osg/Transform>
#include <osgViewer/View>

#include "interaction/InteractionServices.h"
#include "interaction/Observer.h"

namespace
{

constexpr float sensitivityScale = 0.005f; // pixels to speed, for each unit of the user's setting
constexpr float moveFactor = 0.1f;
constexpr float turnFactor = 0.01f;
constexpr float attachedPanFactor = 0.02f; // an offset on a moving body wants a finer hand
constexpr float attachedMoveFactor = 0.2f;

const osg::Vec3d alongX(1, 0, 0);
const osg::Vec3d alongY(0, 1, 0);
const osg::Vec3d alongZ(0, 0, 1);

int Sign(float value)
{
    return (value > 0) - (value < 0);
}

osg::Vec3d Normalised(osg::Vec3d vector)
{
    vector.normalize(); // a zero vector stays zero
    return vector;
}

} // namespace

VtCOsgCameramanipulator::VtCOsgCameramanipulator(VtIInteractionServices& interactionServices)
    : services(interactionServices),
      panSpeed(static_cast<float>(interactionServices.GetMouseSensitivity()) * sensitivityScale),
      moveSpeed(panSpeed),
      turnSpeed(panSpeed * turnFactor)
{
}

void VtCOsgCameramanipulator::setObserver(VtC3DObserver* newObserver, osgViewer::View* ownView)
{
    observer = newObserver;
    view = ownView;
}

bool VtCOsgCameramanipulator::DrivesFreely() const
{
    return observer && observer->IsFree();
}

bool VtCOsgCameramanipulator::handle(const osgGA::GUIEventAdapter& event, osgGA::GUIActionAdapter& actions)
{
    using Event = osgGA::GUIEventAdapter;

    if (event.getEventType() == Event::FRAME)
    {
        if (DrivesFreely() && services.IsActiveView(view.get()) && calcMovement())
            actions.requestRedraw();
        return false;
    }
    if (event.getEventType() == Event::RESIZE)
    {
        Restart();
        actions.requestRedraw();
        return false;
    }
    if (event.getHandled())
        return false;

    switch (event.getEventType())
    {
    case Event::PUSH:
        if (event.getButton() != Event::LEFT_MOUSE_BUTTON)
            return false;
        Press(event);
        actions.requestContinuousUpdate(true);
        if (calcMovement())
            actions.requestRedraw();
        return true;
    case Event::RELEASE:
        actions.requestContinuousUpdate(false);
        Release();
        return true;
    case Event::DRAG:
        Record(event);
        if (calcMovement())
            actions.requestRedraw();
        return true;
    case Event::KEYDOWN:
        return Key(event.getKey(), true);
    case Event::KEYUP:
        return Key(event.getKey(), false);
    default:
        return false;
    }
}

void VtCOsgCameramanipulator::Restart()
{
    eventAnchor = nullptr;
    eventCurrent = nullptr;
    panSpeed = sensitivityScale * static_cast<float>(services.GetMouseSensitivity());
    rollMode = false;
    panMode = false;
    deltaX = 0;
    deltaY = 0;
    offsetPosition.set(0, 0, 0);
    offsetRotation = osg::Quat();
}

void VtCOsgCameramanipulator::Press(const osgGA::GUIEventAdapter& event)
{
    eventAnchor = &event;
    eventCurrent = &event;
    moveSpeed = panSpeed = static_cast<float>(services.GetMouseSensitivity()) * sensitivityScale;
    if (!DrivesFreely())
    {
        panSpeed *= attachedPanFactor;
        moveSpeed = panSpeed * attachedMoveFactor;
    }
    dragging = true;
    turnSpeed = panSpeed * turnFactor;
    offsetPosition.set(0, 0, 0);
    offsetRotation = osg::Quat();
}

void VtCOsgCameramanipulator::Release()
{
    dragging = false;
    deltaX = 0;
    deltaY = 0;
    offsetPosition.set(0, 0, 0);
    offsetRotation = osg::Quat();
    eventAnchor = nullptr;
    eventCurrent = nullptr;
    // A click, or a pointer that leaves the pane, has moved nothing, and doesn't change the scene.
    if (DrivesFreely() && moved)
        WriteBack();
    moved = false;
}

void VtCOsgCameramanipulator::Record(const osgGA::GUIEventAdapter& event)
{
    // A free observer measures from the press; an offset takes each step of the mouse by itself.
    if (eventCurrent && eventCurrent->getTime() < event.getTime() && !DrivesFreely())
        eventAnchor = eventCurrent;
    eventCurrent = &event;
}

bool VtCOsgCameramanipulator::Key(int key, bool down)
{
    const bool shift = key == keyShiftLeft || key == keyShiftRight;
    if (key != keyTab && !shift)
        return false;
    if (down)
    {
        rollMode = !shift;
        panMode = shift;
    }
    else
        (shift ? panMode : rollMode) = false;
    return true;
}

bool VtCOsgCameramanipulator::calcMovement()
{
    if (!eventAnchor || !eventCurrent || !dragging)
        return false;

    const bool freely = DrivesFreely();
    UpdateDeltas(eventCurrent->getX() - eventAnchor->getX(), eventCurrent->getY() - eventAnchor->getY(), freely);
    moved = moved || deltaX != 0 || deltaY != 0;
    if (panMode)
        Pan(freely);
    else if (rollMode)
        Roll(freely);
    else
        Drive(freely);

    if (freely)
    {
        services.SetHeadLightPosition(position);
        for (osg::Camera* camera : observer->GetCameras())
        {
            auto* other = dynamic_cast<osgViewer::View*>(camera->getView());
            if (!other || other == view.get())
                continue;
            camera->setViewMatrix(getInverseMatrix());
            if (auto* manipulator = dynamic_cast<VtCOsgCameramanipulator*>(other->getCameraManipulator()))
                manipulator->copyStateFrom(*this);
        }
    }
    return true;
}

void VtCOsgCameramanipulator::UpdateDeltas(float dx, float dy, bool freely)
{
    if (freely)
    {
        deltaX = dx;
        deltaY = dy;
        return;
    }
    // Turning the mouse round starts the offset's motion over instead of working off what had piled up.
    if (Sign(dx) != 0 && Sign(dx) != Sign(deltaX))
        deltaX = 0;
    if (Sign(dy) != 0 && Sign(dy) != Sign(deltaY))
        deltaY = 0;
    deltaX += dx;
    deltaY += dy;
}

void VtCOsgCameramanipulator::Pan(bool freely)
{
    const double a = deltaX * moveSpeed * moveFactor;
    const double b = deltaY * moveSpeed * moveFactor;
    if (freely)
        position += osg::Vec3f(Normalised(rotation * alongX) * a + alongZ * b);
    else
        offsetPosition += osg::Vec3f(alongX * a + alongY * b);
}

void VtCOsgCameramanipulator::Roll(bool freely)
{
    const double a = -deltaX * turnSpeed;
    const double b = -deltaY * turnSpeed;
    if (freely)
        rotation = rotation * (osg::Quat(b, rotation * alongX) * osg::Quat(a, rotation * alongZ));
    else
        offsetRotation = offsetRotation * (osg::Quat(b, alongX) * osg::Quat(a, alongZ));
}

void VtCOsgCameramanipulator::Drive(bool freely)
{
    const double a = -turnSpeed * deltaX;
    const double b = -moveSpeed * deltaY * moveFactor;
    if (freely)
    {
        rotation = rotation * osg::Quat(a, alongZ);
        position += osg::Vec3f(Normalised(rotation * alongZ) * b);
    }
    else
    {
        offsetRotation = offsetRotation * osg::Quat(a, alongY);
        offsetPosition += osg::Vec3f(alongZ * b);
    }
}

void VtCOsgCameramanipulator::setByMatrix(const osg::Matrixd& matrix)
{
    position = matrix.getTrans();
    rotation = matrix.getRotate();
}

void VtCOsgCameramanipulator::setByInverseMatrix(const osg::Matrixd& matrix)
{
    // In every frame, so without the inverse of a matrix of any kind.
    rotation = matrix.getRotate().conj();
    position = rotation * -matrix.getTrans();
}

osg::Matrixd VtCOsgCameramanipulator::getMatrix() const
{
    const osg::Matrixd placement = osg::Matrixd::rotate(rotation) * osg::Matrixd::translate(position);
    if (DrivesFreely())
        return placement;
    return osg::Matrixd::rotate(offsetRotation) * osg::Matrixd::translate(offsetPosition) * placement;
}

osg::Matrixd VtCOsgCameramanipulator::getInverseMatrix() const
{
    const osg::Matrixd placement = osg::Matrixd::translate(-position) * osg::Matrixd::rotate(rotation.inverse());
    if (DrivesFreely())
        return placement;
    return placement * osg::Matrixd::translate(-offsetPosition) * osg::Matrixd::rotate(offsetRotation.inverse());
}

void VtCOsgCameramanipulator::WriteBack()
{
    observer->StoreFreeView(position, rotation);
    observer->setMatrix(getInverseMatrix(), true);
}

void VtCOsgCameramanipulator::straighten()
{
    osg::Quat level;
    level.makeRotate(rotation * alongY, alongZ);
    rotation = rotation * level;
    if (!DrivesFreely())
        return;
    observer->StoreFreeView(position, rotation);
    observer->setMatrix(getInverseMatrix(), true);
}

void VtCOsgCameramanipulator::copyStateFrom(const VtCOsgCameramanipulator& other)
{
    position = other.position;
    rotation = other.rotation;
    offsetRotation = other.offsetRotation;
    offsetPosition = other.offsetPosition;
    deltaX = other.deltaX;
    deltaY = other.deltaY;
    eventAnchor = other.eventAnchor;
    eventCurrent = other.eventCurrent;
}

void frameNode(osgViewer::View* view, const osg::Node* node)
{
    if (!view || !node || node->getNumParents() == 0)
        return;

    osgGA::CameraManipulator* manipulator = view->getCameraManipulator();
    osg::Matrixd matrix = manipulator ? manipulator->getMatrix() : view->getCamera()->getInverseViewMatrix();
    const double radius = node->getBound().radius();
    const osg::Vec3d back = Normalised(matrix.getRotate() * alongZ) * (2 * radius);
    const osg::Vec3d origin = osg::computeLocalToWorld(node->getParentalNodePaths().front(), true).getTrans();
    matrix.setTrans(origin.x() + back.x(), origin.y() + back.y(), origin.z() + 0.5 * radius);

    if (manipulator)
        manipulator->setByMatrix(matrix);
    else
        view->getCamera()->setViewMatrix(osg::Matrixd::inverse(matrix));
}

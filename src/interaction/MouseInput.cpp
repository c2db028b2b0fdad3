#include "interaction/MouseInput.h"

#include <osgViewer/View>

#include "interaction/CameraManipulator.h"

namespace
{

int KeySymbol(host::ViewKey key)
{
    switch (key)
    {
    case host::ViewKey::tab:
        return VtCOsgCameramanipulator::keyTab;
    case host::ViewKey::shiftLeft:
        return VtCOsgCameramanipulator::keyShiftLeft;
    case host::ViewKey::shiftRight:
        return VtCOsgCameramanipulator::keyShiftRight;
    }
    return 0;
}

} // namespace

void VtCMouseInputManager::setActiveInput(VtCBaseMouseInput* input)
{
    if (!input || input == currentInput)
        return;
    previousInput = currentInput;
    currentInput = input;
    if (previousInput)
        previousInput->deactivate();
    currentInput->activate();
}

VtCViewInput::~VtCViewInput() = default;

void VtCViewInput::Attach(osgViewer::View* newView, osg::Camera* newCamera)
{
    view = newView;
    camera = newCamera || !newView ? newCamera : newView->getCamera();
}

bool VtCViewInput::TakesInput() const
{
    return view.valid() && camera.valid() && owner.TakesInput();
}

int VtCViewInput::Upwards(int y) const
{
    const osg::Viewport* viewport = camera->getViewport();
    return (viewport ? static_cast<int>(viewport->height()) : 0) - y;
}

bool VtCViewInput::IsInside(int x, int y) const
{
    const osg::Viewport* viewport = camera->getViewport();
    return viewport && x >= 0 && y >= 0 && x < viewport->width() && y < viewport->height();
}

osg::ref_ptr<osgGA::GUIEventAdapter> VtCViewInput::MakeEvent(Event::EventType type) const
{
    osg::ref_ptr<Event> event = new Event;
    event->setEventType(type);
    const osg::FrameStamp* stamp = view->getFrameStamp();
    event->setTime(stamp ? stamp->getSimulationTime() : 0.0);
    return event;
}

void VtCViewInput::Queue(Event& event)
{
    view->getEventQueue()->addEvent(&event);
}

void VtCViewInput::QueueMouse(Event::EventType type, int x, int y)
{
    const osg::ref_ptr<Event> event = MakeEvent(type);
    event->setButton(Event::LEFT_MOUSE_BUTTON);
    event->setX(static_cast<float>(x));
    event->setY(static_cast<float>(Upwards(y)));
    Queue(*event);
}

void VtCViewInput::OnLeftButtonDown(int x, int y)
{
    if (!TakesInput())
        return;
    owner.OnPress();
    leftButtonDown = true;
    pointerInside = true;
    QueueMouse(Event::PUSH, x, y);
}

void VtCViewInput::OnLeftButtonUp(int x, int y)
{
    leftButtonDown = false;
    if (TakesInput())
        QueueMouse(Event::RELEASE, x, y);
}

void VtCViewInput::OnRightButtonDown()
{
    if (TakesInput())
        owner.OnPress();
}

void VtCViewInput::OnMouseMove(int x, int y)
{
    if (!TakesInput() || !owner.OnPointer())
        return;
    // A window that holds the pointer goes on telling of it outside; the view has been left.
    const bool inside = IsInside(x, y);
    if (pointerInside && !inside)
        OnMouseLeave();
    pointerInside = inside;
    if (inside)
        QueueMouse(leftButtonDown ? Event::DRAG : Event::MOVE, x, y);
}

void VtCViewInput::OnMouseLeave()
{
    if (TakesInput())
        Queue(*MakeEvent(Event::RELEASE));
}

void VtCViewInput::OnLeftDoubleClick(int x, int y)
{
    if (!TakesInput())
        return;
    view->getEventQueue()->getCurrentEventState()->setEventType(Event::DOUBLECLICK);
    owner.OnDoubleClick(x, Upwards(y));
}

void VtCViewInput::OnKey(host::ViewKey key, bool down)
{
    bool& known = keyDown[static_cast<int>(key)];
    if (known == down)
        return;
    known = down;
    if (!TakesInput())
        return;
    const osg::ref_ptr<Event> event = MakeEvent(down ? Event::KEYDOWN : Event::KEYUP);
    event->setKey(KeySymbol(key));
    Queue(*event);
}

void VtCViewInput::OnShiftState(bool held)
{
    OnKey(host::ViewKey::shiftLeft, held && !keyDown[static_cast<int>(host::ViewKey::shiftRight)]);
}

void VtCViewInput::OnFocusLost()
{
    for (const host::ViewKey key : {host::ViewKey::tab, host::ViewKey::shiftLeft, host::ViewKey::shiftRight})
        OnKey(key, false);
}

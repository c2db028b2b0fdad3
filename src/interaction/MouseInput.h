#pragma once

#include <osg/Camera>
#include <osg/observer_ptr>
#include <osgGA/GUIEventAdapter>

#include "host/ViewWindows.h"

namespace osgViewer
{
class View;
}

/// Extension point for modes of the mouse. Each view owns one; the base does nothing.
class VtCBaseMouseInput
{
public:
    virtual ~VtCBaseMouseInput() = default;
    virtual void activate() {}
    virtual void deactivate() {}
};

/// Remembers which view's input holds the mouse of a scene, and tells the old and the new one when that changes.
///
/// The objects aren't owned, and a view that goes away doesn't say so: whoever reads them must know that their view
/// still exists.
class VtCMouseInputManager
{
public:
    virtual ~VtCMouseInputManager() = default;

    /// Null and the present object change nothing. The old one is deactivated before the new one is activated, and both
    /// see the new values.
    void setActiveInput(VtCBaseMouseInput* input);

    VtCBaseMouseInput* getCurrentInput() const { return currentInput; }
    VtCBaseMouseInput* getPreviousInput() const { return previousInput; }

private:
    VtCBaseMouseInput* currentInput = nullptr;
    VtCBaseMouseInput* previousInput = nullptr;
};

/// What the input of a view asks of the view, and tells it beyond what goes into the queue.
class VtIViewInputOwner
{
public:
    virtual ~VtIViewInputOwner() = default;

    /// Is there a scene to look at? All input is ignored without one.
    virtual bool TakesInput() const = 0;

    /// A mouse button went down: a pane becomes the active one.
    virtual void OnPress() {}

    /// The pointer moves. False keeps the motion from the view.
    virtual bool OnPointer() { return true; }

    /// The left button was double-clicked; pixels from the lower left corner.
    virtual void OnDoubleClick(int, int) {}
};

/// The input of a view in one window: makes events of the view's queue of what the window tells, from where the camera
/// manipulator takes them.
///
///     VtCViewInput input(owner);       // who implements VtIViewInputOwner
///     input.Attach(view);              // an osgViewer::View, as soon as there is one
///     window->SetEvents(&input);       // a host::ViewWindow of any kind
///
/// A view that is seen in several windows, as one over two screens is, has an input for each of them, attached with the
/// camera of that window. Events carry the left button, the simulation time of the view's frame, and y upwards.
class VtCViewInput : public VtCBaseMouseInput, public host::WindowEvents
{
public:
    explicit VtCViewInput(VtIViewInputOwner& viewOwner) : owner(viewOwner) {}
    ~VtCViewInput() override;

    /// `view` (not owned) takes the events. Positions are measured in the viewport of `camera`, or of the view's own
    /// camera for null. Without a view all input is ignored.
    void Attach(osgViewer::View* view, osg::Camera* camera = nullptr);

    bool IsLeftButtonDown() const { return leftButtonDown; }

    void OnLeftButtonDown(int x, int y) override;
    void OnLeftButtonUp(int x, int y) override;
    void OnRightButtonDown() override;
    void OnMouseMove(int x, int y) override;
    void OnMouseLeave() override;
    void OnLeftDoubleClick(int x, int y) override;
    void OnKey(host::ViewKey key, bool down) override;
    void OnShiftState(bool held) override;
    void OnFocusLost() override;

private:
    using Event = osgGA::GUIEventAdapter;

    bool TakesInput() const;
    int Upwards(int y) const;
    bool IsInside(int x, int y) const;
    osg::ref_ptr<Event> MakeEvent(Event::EventType type) const;
    void Queue(Event& event);
    void QueueMouse(Event::EventType type, int x, int y);

    VtIViewInputOwner& owner;
    osg::observer_ptr<osgViewer::View> view;
    osg::observer_ptr<osg::Camera> camera;
    bool leftButtonDown = false;
    bool pointerInside = true; ///< while the button is held
    bool keyDown[3] = {false, false, false};
};

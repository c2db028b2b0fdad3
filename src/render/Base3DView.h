#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include <osg/ref_ptr>
#include <osg/Vec4f>
#include <osgViewer/View>

#include "host/Graphics.h"

class VtC3DBody;
class VtC3DObserver;
class VtC3DObservers;
class VtCBase3DView;
class VtCBaseMouseInput;
class VtCOsgCameramanipulator;
class VtIInteractionServices;
class VtISceneDocument;

/// The frame around the views of a scene, as one view sees it. The child frame implements it.
class VtIViewFrame
{
public:
    virtual ~VtIViewFrame() = default;

    virtual VtISceneDocument& GetDocument() const = 0;

    /// Null without a scene.
    virtual VtC3DObservers* GetObservers() const = 0;

    virtual VtIInteractionServices& GetInteraction() const = 0;

    /// How many of the four panes look through `observer`.
    virtual int countViewsOfObserver(const VtC3DObserver& observer) const = 0;

    /// Gives the view the mouse and makes it the scene's active one, a pane or any other.
    virtual void activateView(VtCBase3DView& view) = 0;

    /// The view that has the focus; null before there is one.
    virtual VtCBase3DView* GetActiveView() const = 0;

    /// `view` goes away, and isn't looked at any more.
    virtual void ForgetView(const VtCBase3DView& view) = 0;

    /// Selects a body in the host.
    virtual void SelectBody(const VtC3DBody& body) = 0;

    /// `view` looks through another observer now.
    virtual void ObserverAssigned(const VtCBase3DView& view) = 0;

    /// What the layout commands do: the layout, an active view that can be seen, an empty frame for cards that want
    /// one. 0 lets the active pane fill the frame.
    virtual void ApplyLayout(std::int32_t layout) = 0;
    virtual std::int32_t GetLayout() const = 0;
};

/// Everything about a view of the scene except its window: camera, viewport, projection, observer.
///
/// Without an `osgViewer::View`, which arrives after the windows, everything is stored and nothing is drawn.
class VtCBase3DView
{
public:
    explicit VtCBase3DView(VtIViewFrame& viewFrame) : frame(viewFrame) {}
    virtual ~VtCBase3DView();
    VtCBase3DView(const VtCBase3DView&) = delete;
    VtCBase3DView& operator=(const VtCBase3DView&) = delete;

    virtual void setName(const std::wstring& newName) { name = newName; }
    const std::wstring& getName() const { return name; }

    /// Pane number, 1 to 4; 0 for a view that is no pane.
    virtual void setViewPosition(std::int32_t position) { viewPosition = position; }
    std::int32_t getViewPosition() const { return viewPosition; }

    VtISceneDocument& GetDocument() const;

    /// Who gets the mouse with this view; null for a view without input of its own.
    virtual VtCBaseMouseInput* getMouseInput() { return nullptr; }

    /// Null is ignored.
    virtual void attachView(osgViewer::View* newView);
    osgViewer::View* getView() const { return view.get(); }

    /// 0 to 255 each; nothing without a view.
    void setClearColor(int red, int green, int blue);

    /// Metres.
    void setFarClipPlane(float distance);
    void setNearClipPlane(float distance);

    /// Degrees: half of what is seen across in a landscape pane, and upright in a portrait one. Marks the document as
    /// changed if it differs.
    void setViewAngle(float angle);

    float getNearClipPlane() const { return nearClipPlane; }
    float getFarClipPlane() const { return farClipPlane; }
    float getViewAngle() const { return viewAngle; }

    /// The pane has this size now; an empty one has no viewport.
    void resize(const host::Rectangle& rectangle);

    /// Looks through `newObserver` from now on; null is ignored.
    void assignObserver(VtC3DObserver* newObserver);

    /// Null before the first assignment.
    VtC3DObserver* getObserver() const { return observer; }

    /// Levels the camera; nothing without a view and an observer.
    void straightenCamera();

    bool isInViewer() const;

    /// Draws one more frame to count; takes half a second.
    std::int32_t getVisiblePolygonCount();

protected:
    VtCOsgCameramanipulator* GetManipulator() const;

    /// A value that is stored under `attribute` has changed.
    virtual void valueChanged(std::wstring_view /*attribute*/) {}

    VtIViewFrame& frame;

private:
    void updateProjection();

    float nearClipPlane = 0.015f;
    float farClipPlane = 10000.0f;
    float viewAngle = 40.0f;
    std::int32_t width = 0;
    std::int32_t height = 0;
    std::int32_t polygonCount = 0;
    osg::Vec4f clearColor{200 / 255.0f, 230 / 255.0f, 1.0f, 1.0f};
    std::wstring name;
    std::int32_t viewPosition = 0;
    osg::ref_ptr<osgViewer::View> view;
    VtC3DObserver* observer = nullptr; ///< one reference
};

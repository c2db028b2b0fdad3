#pragma once

class VtC3DBody;
class VtC3DObserver;
class VtC3DObservers;
class VtCPanoramicView;
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

    /// How many of the four views look through `observer`.
    virtual int countViewsOfObserver(const VtC3DObserver& observer) const = 0;

    /// Gives the view the mouse and makes it the scene's active one.
    virtual void activateView(VtCPanoramicView& view) = 0;

    /// The view that has the focus; null before there is one.
    virtual VtCPanoramicView* GetActiveView() const = 0;

    /// Selects a body in the host.
    virtual void SelectBody(const VtC3DBody& body) = 0;

    /// Lets the active view fill the frame.
    virtual void ShowSingleView() = 0;
};

#pragma once

#include <cstdint>

#include <osg/Vec3f>

namespace osgViewer
{
class View;
}
class VtC3DObserver;

/// What observers and manipulators ask of the layers above them. The document implements it.
class VtIInteractionServices
{
public:
    virtual ~VtIInteractionServices() = default;

    /// The user's setting, 5 unless changed; 0 holds the camera still.
    virtual std::uint32_t GetMouseSensitivity() const = 0;

    /// True for the view that has the focus, the one that the mouse moves.
    virtual bool IsActiveView(const osgViewer::View* view) const = 0;

    /// The observer of that view; null without one.
    virtual const VtC3DObserver* GetActiveObserver() const = 0;

    /// The eye of the active view has moved to `position` (scene, metres); the head light goes with it.
    virtual void SetHeadLightPosition(const osg::Vec3f& position) = 0;

    /// Every view that looks through `gone` looks through `substitute` from now on.
    virtual void ReplaceObserverInViews(const VtC3DObserver& gone, VtC3DObserver& substitute) = 0;
};

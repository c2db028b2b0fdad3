#pragma once

#include <osg/GraphicsContext>
#include <osg/ref_ptr>

namespace host
{

/// A rectangle in pixels; the origin is the upper left corner.
struct Rectangle
{
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
};

/// A place that can be drawn to: the window of a pane, or an off-screen surface.
class Window
{
public:
    virtual ~Window() = default;

    /// The drawable area; empty while the window is collapsed or minimised.
    virtual Rectangle GetClientRectangle() const = 0;
};

/// Makes graphics contexts: the root context, whose objects all others share, and one for each window.
class Graphics
{
public:
    virtual ~Graphics() = default;

    /// A context with `traits` that draws to `window`. When `traits.sharedContext` is set the new context shares its
    /// objects and takes its context id. The host installs no event handling of the scene graph library.
    /// Null when the platform refuses; `GetLastError` then tells why.
    virtual osg::ref_ptr<osg::GraphicsContext> CreateContext(osg::GraphicsContext::Traits& traits, Window& window) = 0;

    /// Why the last `CreateContext` gave null, in words for the user.
    virtual std::wstring GetLastError() const = 0;
};

} // namespace host

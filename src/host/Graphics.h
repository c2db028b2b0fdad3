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

/// What a window is for. It decides what a host makes to draw there, and who sizes it.
enum class WindowKind
{
    root,       ///< never drawn to: its context owns the textures, programs and buffers that all the others share
    pane,       ///< one of the four panes of a scene's frame, in the host's main window; the splitter sizes it
    editorView, ///< a view of a scene editor, in a window that a tool outside owns and sizes
    fullscreen, ///< without a border over a whole screen, while the main window is hidden
};

/// A place that can be drawn to: the window of a pane, or an off-screen surface.
class Window
{
public:
    virtual ~Window() = default;

    /// The drawable area; empty while the window is collapsed or minimised.
    virtual Rectangle GetClientRectangle() const = 0;
};

/// A context as it is asked for.
struct ContextRequest
{
    WindowKind kind;
    Window& window;                       ///< what is drawn to; for the root, a window of the screen it is for
    osg::GraphicsContext::Traits& traits; ///< `sharedContext` is the root, or null while there is none
};

/// Makes graphics contexts: the root context, whose objects all others share, and one for each window.
class Graphics
{
public:
    virtual ~Graphics() = default;

    /// A context for a window of that kind. When `traits.sharedContext` is set the new context shares its objects and
    /// takes its context id, whatever the kind; a root shares with nobody. The host installs no event handling of the
    /// scene graph library. Null when the platform refuses, or the host shows no windows of that kind; `GetLastError`
    /// then tells why.
    virtual osg::ref_ptr<osg::GraphicsContext> CreateContext(const ContextRequest& request) = 0;

    /// Why the last `CreateContext` gave null, in words for the user.
    virtual std::wstring GetLastError() const = 0;
};

} // namespace host

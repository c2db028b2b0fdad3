#pragma once

#include <memory>

#include <osgViewer/GraphicsWindow>
#include <QPointer>

class QOffscreenSurface;
class QOpenGLContext;

namespace desktop
{

class ViewPane;

/// A context of the windowing toolkit as the scene graph library takes one: of a pane, or the root context, which has
/// a surface that nobody sees. It raises no events.
///
/// The window of a pane may change its size under it. While that window can't be seen the context isn't valid, and the
/// viewer leaves it out.
class PaneContext : public osgViewer::GraphicsWindow
{
public:
    /// Of `pane`, which may go before this does.
    PaneContext(osg::GraphicsContext::Traits& traits, std::unique_ptr<QOpenGLContext> newContext, ViewPane& shownPane);

    /// The root context.
    PaneContext(osg::GraphicsContext::Traits& traits, std::unique_ptr<QOpenGLContext> newContext,
                std::unique_ptr<QOffscreenSurface> newSurface);

    QOpenGLContext* GetContext() const { return context.get(); }

    bool valid() const override;
    bool isSameKindAs(const osg::Object* object) const override
    {
        return dynamic_cast<const PaneContext*>(object) != nullptr;
    }
    const char* libraryName() const override { return "desktop"; }
    const char* className() const override { return "PaneContext"; }

    bool checkEvents() override { return false; }
    void requestRedraw() override {}
    void requestContinuousUpdate(bool) override {}
    void requestWarpPointer(float, float) override {}

protected:
    ~PaneContext() override;

    bool realizeImplementation() override;
    bool isRealizedImplementation() const override { return realised; }
    void closeImplementation() override;
    bool makeCurrentImplementation() override;
    bool makeContextCurrentImplementation(osg::GraphicsContext*) override { return makeCurrentImplementation(); }
    bool releaseContextImplementation() override;
    void bindPBufferToTextureImplementation(GLenum) override {}
    void swapBuffersImplementation() override;

private:
    std::unique_ptr<QOpenGLContext> context;
    std::unique_ptr<QOffscreenSurface> surface; ///< of the root context; null for a pane
    QPointer<ViewPane> pane;
    bool realised = false;
    bool prepared = false;
};

} // namespace desktop

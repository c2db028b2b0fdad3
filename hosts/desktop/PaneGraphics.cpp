#include "hosts/desktop/PaneGraphics.h"

#include <memory>

#include <osg/GLObjects>
#include <osgViewer/GraphicsWindow>
#include <QOffscreenSurface>
#include <QOpenGLContext>
#include <QPointer>
#include <QWindow>

#include "base/Text.h"
#include "hosts/common/ContextState.h"
#include "hosts/desktop/ViewPane.h"

namespace desktop
{

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

PaneContext::PaneContext(osg::GraphicsContext::Traits& traits, std::unique_ptr<QOpenGLContext> newContext,
                         ViewPane& shownPane)
    : context(std::move(newContext)), pane(&shownPane)
{
    _traits = &traits;
    hosts::GiveContextState(*this);
}

PaneContext::PaneContext(osg::GraphicsContext::Traits& traits, std::unique_ptr<QOpenGLContext> newContext,
                         std::unique_ptr<QOffscreenSurface> newSurface)
    : context(std::move(newContext)), surface(std::move(newSurface))
{
    _traits = &traits;
    hosts::GiveContextState(*this);
}

PaneContext::~PaneContext()
{
    close(true);
}

bool PaneContext::valid() const
{
    return context && (surface || (pane && pane->CanBeSeen()));
}

bool PaneContext::realizeImplementation()
{
    realised = valid();
    return realised;
}

void PaneContext::closeImplementation()
{
    if (context && QOpenGLContext::currentContext() == context.get())
        context->doneCurrent();
    context.reset();
    surface.reset();
    realised = false;
}

bool PaneContext::makeCurrentImplementation()
{
    QSurface* target = surface ? static_cast<QSurface*>(surface.get()) : pane ? pane->windowHandle() : nullptr;
    if (!context || !target || !context->makeCurrent(target))
        return false;
    if (!prepared)
        hosts::PrepareContextState(*this);
    prepared = true;
    return true;
}

bool PaneContext::releaseContextImplementation()
{
    if (context)
        context->doneCurrent();
    return context != nullptr;
}

void PaneContext::swapBuffersImplementation()
{
    if (context && pane && pane->windowHandle())
        context->swapBuffers(pane->windowHandle());
}

namespace
{

/// What scenes that are closed have left with the driver, since nothing has been drawn after them.
void FreeDeletedObjects(osg::GraphicsContext& root)
{
    if (!root.makeCurrent())
        return;
    osg::flushAllDeletedGLObjects(root.getState()->getContextID());
    root.releaseContext();
}

} // namespace

QSurfaceFormat PaneGraphics::Format(int samples)
{
    QSurfaceFormat format;
    // Version 2.1 without a profile gives the newest compatibility context; asking for that one by its number gives a
    // core context with some drivers, in which the scene graph library draws nothing.
    format.setVersion(2, 1);
    format.setProfile(QSurfaceFormat::NoProfile);
    format.setRedBufferSize(8);
    format.setGreenBufferSize(8);
    format.setBlueBufferSize(8);
    format.setDepthBufferSize(24);
    format.setStencilBufferSize(8);
    format.setSamples(samples);
    // The host paces its pictures itself; four windows that each wait for the screen would take four of its frames.
    format.setSwapInterval(0);
    return format;
}

PaneGraphics::PaneGraphics() = default;

PaneGraphics::~PaneGraphics() = default;

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::CreateContext(const host::ContextRequest& request)
{
    lastError.clear();
    if (request.kind == host::WindowKind::root)
        return CreateRoot(request.traits);
    auto* pane = dynamic_cast<ViewPane*>(&request.window);
    if (request.kind == host::WindowKind::pane && pane)
        return CreateForPane(request.traits, *pane);
    return Fail("this program draws to the panes of its window only");
}

std::unique_ptr<QOpenGLContext> PaneGraphics::CreateDriverContext(const osg::GraphicsContext::Traits& traits)
{
    auto context = std::make_unique<QOpenGLContext>();
    context->setFormat(Format(static_cast<int>(traits.samples)));
    const osg::ref_ptr<osg::GraphicsContext> shared = traits.sharedContext.get();
    const auto* sharing = dynamic_cast<PaneContext*>(shared.get());
    if (shared && (!sharing || !sharing->GetContext()))
    {
        Fail("the root context is closed or another library's");
        return nullptr;
    }
    if (shared)
        context->setShareContext(sharing->GetContext());
    if (!context->create())
    {
        Fail("the driver gives no context of desktop OpenGL");
        return nullptr;
    }
    if (shared && !context->shareContext())
    {
        Fail("the driver lets the contexts of two windows share nothing");
        return nullptr;
    }
    return context;
}

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::CreateForPane(osg::GraphicsContext::Traits& traits, ViewPane& pane)
{
    std::unique_ptr<QOpenGLContext> context = CreateDriverContext(traits);
    if (!context)
        return nullptr;
    pane.SetFormat(context->format());
    return new PaneContext(traits, std::move(context), pane);
}

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::CreateRoot(osg::GraphicsContext::Traits& traits)
{
    if (root && root->valid() && root->getTraits()->samples == traits.samples)
    {
        FreeDeletedObjects(*root);
        return root;
    }
    std::unique_ptr<QOpenGLContext> context = CreateDriverContext(traits);
    if (!context)
        return nullptr;
    auto surface = std::make_unique<QOffscreenSurface>();
    surface->setFormat(context->format());
    surface->create();
    if (!surface->isValid())
        return Fail("the driver has no off-screen surface");
    root = new PaneContext(traits, std::move(context), std::move(surface));
    return root;
}

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::Fail(const char* reason)
{
    lastError = L"OpenGL: " + base::Wide(reason);
    return nullptr;
}

} // namespace desktop

#include "hosts/desktop/PaneGraphics.h"

#include <memory>

#include <QOffscreenSurface>
#include <QOpenGLContext>

#include "base/Text.h"
#include "hosts/desktop/PaneContext.h"
#include "hosts/desktop/ViewPane.h"

namespace desktop
{

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

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::CreateContext(osg::GraphicsContext::Traits& traits,
                                                               host::Window& window)
{
    auto* pane = dynamic_cast<ViewPane*>(&window);
    const QSurfaceFormat format = Format(static_cast<int>(traits.samples));

    auto context = std::make_unique<QOpenGLContext>();
    context->setFormat(format);
    const osg::ref_ptr<osg::GraphicsContext> shared = traits.sharedContext.get();
    if (shared)
    {
        const auto* root = dynamic_cast<PaneContext*>(shared.get());
        if (!root || !root->GetContext())
            return Fail("the root context is closed or another library's");
        context->setShareContext(root->GetContext());
    }
    if (!context->create())
        return Fail("the driver gives no context of desktop OpenGL");
    if (shared && !context->shareContext())
        return Fail("the driver lets the contexts of two windows share nothing");

    lastError.clear();
    if (pane)
    {
        pane->SetFormat(context->format());
        return new PaneContext(traits, std::move(context), *pane);
    }
    auto surface = std::make_unique<QOffscreenSurface>();
    surface->setFormat(context->format());
    surface->create();
    if (!surface->isValid())
        return Fail("the driver has no off-screen surface");
    return new PaneContext(traits, std::move(context), std::move(surface));
}

osg::ref_ptr<osg::GraphicsContext> PaneGraphics::Fail(const char* reason)
{
    lastError = L"OpenGL: " + base::Wide(reason);
    return nullptr;
}

} // namespace desktop

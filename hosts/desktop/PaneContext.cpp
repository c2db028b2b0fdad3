#include "hosts/desktop/PaneContext.h"

#include <QOffscreenSurface>
#include <QOpenGLContext>
#include <QWindow>

#include "hosts/common/ContextState.h"
#include "hosts/desktop/ViewPane.h"

namespace desktop
{

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

} // namespace desktop

#include "hosts/common/EglContext.h"

#include "hosts/common/ContextState.h"
#include "hosts/common/EglDisplay.h"

namespace hosts
{

EglContext::EglContext(const EglDisplay& openDisplay, osg::GraphicsContext::Traits& traits, EGLContext newContext,
                       EGLSurface newSurface)
    : display(openDisplay), context(newContext), surface(newSurface)
{
    _traits = &traits;
    GiveContextState(*this);
}

EglContext::~EglContext()
{
    close(true);
}

bool EglContext::realizeImplementation()
{
    realised = valid();
    return realised;
}

void EglContext::closeImplementation()
{
    if (context == EGL_NO_CONTEXT)
        return;

    if (eglGetCurrentContext() == context)
        eglMakeCurrent(display.Get(), EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    eglDestroySurface(display.Get(), surface);
    eglDestroyContext(display.Get(), context);
    surface = EGL_NO_SURFACE;
    context = EGL_NO_CONTEXT;
    realised = false;
}

bool EglContext::makeCurrentImplementation()
{
    return MakeCurrent(surface);
}

bool EglContext::makeContextCurrentImplementation(osg::GraphicsContext* readContext)
{
    const auto* read = dynamic_cast<EglContext*>(readContext);
    return MakeCurrent(read ? read->surface : surface);
}

bool EglContext::releaseContextImplementation()
{
    return eglMakeCurrent(display.Get(), EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT) == EGL_TRUE;
}

void EglContext::swapBuffersImplementation()
{
    glFlush();
}

bool EglContext::MakeCurrent(EGLSurface read)
{
    // The choice of desktop OpenGL belongs to the thread, not to the context.
    if (!valid() || !eglBindAPI(EGL_OPENGL_API) || !eglMakeCurrent(display.Get(), surface, read, context))
        return false;

    if (!prepared)
    {
        PrepareContextState(*this);
        prepared = true;
    }
    return true;
}

} // namespace hosts

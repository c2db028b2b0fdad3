#include "hosts/common/EglContext.h"

#include <algorithm>

#include <osg/DisplaySettings>
#include <osg/GLExtensions>
#include <osg/State>

#include "hosts/common/EglDisplay.h"

namespace hosts
{

namespace
{

/// Ids are not used a second time: models outlive a root context, and under a reused id they would call display lists
/// and textures that went with the old one.
unsigned int NewContextId()
{
    static unsigned int last = 0;
    const unsigned int id = std::max(last + 1, osg::GraphicsContext::getMaxContextID() + 1);
    last = id;
    return id;
}

} // namespace

EglContext::EglContext(const EglDisplay& openDisplay, osg::GraphicsContext::Traits& traits, EGLContext newContext,
                       EGLSurface newSurface)
    : display(openDisplay), context(newContext), surface(newSurface)
{
    _traits = &traits;
    setState(new osg::State);
    getState()->setGraphicsContext(this);

    const osg::ref_ptr<osg::GraphicsContext> shared = traits.sharedContext.get();
    const unsigned int id = shared ? shared->getState()->getContextID() : NewContextId();
    getState()->setContextID(id);
    incrementContextIDUsageCount(id);
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
        // Vertex array objects are the one kind of object that contexts don't share, but the scene graph library
        // keeps them by context id like the others: a second context would draw with names of the first.
        osg::GLExtensions::Get(getState()->getContextID(), true)->isVAOSupported = false;
        osg::ref_ptr<osg::DisplaySettings> settings = new osg::DisplaySettings(*osg::DisplaySettings::instance());
        if (settings->getVertexBufferHint() == osg::DisplaySettings::VERTEX_ARRAY_OBJECT)
            settings->setVertexBufferHint(osg::DisplaySettings::VERTEX_BUFFER_OBJECT);
        getState()->setDisplaySettings(settings.get());
        getState()->initializeExtensionProcs();
        prepared = true;
    }
    return true;
}

} // namespace hosts

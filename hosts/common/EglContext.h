#pragma once

#include <EGL/egl.h>
#include <osg/GraphicsContext>

namespace hosts
{

class EglDisplay;

/// A context of desktop OpenGL with a pbuffer of its own to draw to, current on one thread at a time.
///
/// A pbuffer has one buffer: what reads front and back reads the same, and a swap only hands the commands over.
/// The pbuffer stays as large as it was made; a new size takes a new context, because drivers leak with each pbuffer
/// that is changed under a living context.
class EglContext : public osg::GraphicsContext
{
public:
    /// Takes over `newContext` and `newSurface`. With `traits.sharedContext` its context id is shared, so that
    /// textures, programs, buffers and display lists of the scene graph serve both.
    EglContext(const EglDisplay& openDisplay, osg::GraphicsContext::Traits& traits, EGLContext newContext,
               EGLSurface newSurface);

    EGLContext GetEglContext() const { return context; }

    bool valid() const override { return context != EGL_NO_CONTEXT; }
    bool isSameKindAs(const osg::Object* object) const override
    {
        return dynamic_cast<const EglContext*>(object) != nullptr;
    }
    const char* libraryName() const override { return "hosts"; }
    const char* className() const override { return "EglContext"; }

protected:
    ~EglContext() override;

    bool realizeImplementation() override;
    bool isRealizedImplementation() const override { return realised; }
    void closeImplementation() override;
    bool makeCurrentImplementation() override;
    bool makeContextCurrentImplementation(osg::GraphicsContext* readContext) override;
    bool releaseContextImplementation() override;
    void bindPBufferToTextureImplementation(GLenum) override {}
    void swapBuffersImplementation() override;

private:
    bool MakeCurrent(EGLSurface read);

    const EglDisplay& display;
    EGLContext context;
    EGLSurface surface;
    bool realised = false;
    bool prepared = false;
};

} // namespace hosts

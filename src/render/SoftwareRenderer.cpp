#include "render/SoftwareRenderer.h"

#include <string_view>

#include <osg/GL>
#include <osg/GLExtensions>
#include <osg/GraphicsContext>

void adaptToSoftwareRenderer(osg::GraphicsContext& context)
{
    if (!context.makeCurrent())
        return;
    const auto* text = reinterpret_cast<const char*>(glGetString(GL_RENDERER));
    const std::string_view renderer = text ? text : "";
    for (const char* software : {"llvmpipe", "softpipe", "swrast"})
        if (renderer.find(software) != std::string_view::npos)
            context.getState()->get<osg::GLExtensions>()->isTextureFilterAnisotropicSupported = false;
    context.releaseContext();
}

#include "assets/TextureSizeVisitor.h"

#include <osg/Geode>
#include <osg/StateSet>
#include <osg/Texture2D>

namespace
{

constexpr unsigned units = 8;

float BytesPerPixel(GLint internalFormat)
{
    switch (internalFormat)
    {
    case GL_RGBA:
        return 4.0f;
    case GL_UNSIGNED_BYTE:
        return 1.0f;
    default:
        return 3.0f;
    }
}

/// A texture takes size and format of its image when it is first drawn; until then the image tells them.
float Size(const osg::Texture2D& texture)
{
    const osg::Image* image = texture.getImage();
    int width = texture.getTextureWidth();
    int height = texture.getTextureHeight();
    GLint format = texture.getInternalFormat();
    if (image && (width == 0 || height == 0))
    {
        width = image->s();
        height = image->t();
    }
    if (image && format == 0)
        format = image->getInternalTextureFormat();
    return static_cast<float>(width) * static_cast<float>(height) * BytesPerPixel(format);
}

} // namespace

void VtCOsgTextureSizeVisitor::apply(osg::Node& node)
{
    Examine(node.getStateSet());
    traverse(node);
}

void VtCOsgTextureSizeVisitor::apply(osg::Geode& geode)
{
    Examine(geode.getStateSet());
    for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
        Examine(geode.getDrawable(i)->getStateSet());
}

void VtCOsgTextureSizeVisitor::Examine(const osg::StateSet* state)
{
    for (unsigned unit = 0; state && unit < units; ++unit)
        if (const auto* texture =
                dynamic_cast<const osg::Texture2D*>(state->getTextureAttribute(unit, osg::StateAttribute::TEXTURE)))
            textureSizes[texture] = Size(*texture);
}

float VtCOsgTextureSizeVisitor::getTotalSize(int exponent) const
{
    float total = 0;
    for (const auto& [texture, size] : textureSizes)
        total += size;
    for (int i = 0; i < exponent; ++i)
        total *= 0.0009765625f;
    return total;
}

#include "StateBuilder.h"

#include <osg/AlphaFunc>
#include <osg/BlendColor>
#include <osg/BlendFunc>
#include <osg/Material>
#include <osg/TexEnv>
#include <osg/TexMat>
#include <osgDB/ReadFile>

#include "assets/models/ModelGraph.h"
#include "Preparation.h"

namespace
{

constexpr int maxImageSide = 16384;
constexpr float maxShininess = 128.0f; ///< OpenGL takes no more
constexpr float leastVisibleAlpha = 0.02f;

bool IsEmpty(const osg::StateSet& state)
{
    return state.getModeList().empty() && state.getAttributeList().empty() && state.getTextureModeList().empty() &&
           state.getTextureAttributeList().empty() &&
           state.getRenderBinMode() == osg::StateSet::INHERIT_RENDERBIN_DETAILS;
}

template <class Attribute>
osg::ref_ptr<Attribute> Copy(const osg::StateAttribute* attribute)
{
    const auto* typed = dynamic_cast<const Attribute*>(attribute);
    osg::ref_ptr<Attribute> copy = typed ? new Attribute(*typed) : nullptr;
    if (copy)
        copy->setUserDataContainer(nullptr);
    return copy;
}

} // namespace

StateBuilder::StateBuilder(ReadContext& readContext, unsigned mainTextureUnit)
    : context(readContext), mainUnit(mainTextureUnit)
{
}

osg::ref_ptr<osg::StateSet> StateBuilder::Merge(osg::StateSet* outer, osg::StateSet* inner)
{
    if (!inner || IsEmpty(*inner))
        return outer;
    if (!outer)
        return inner;
    osg::ref_ptr<osg::StateSet>& result = merged[{outer, inner}];
    if (!result)
    {
        result = new osg::StateSet(*outer);
        result->merge(*inner);
        result->setName(inner->getName().empty() ? outer->getName() : inner->getName());
    }
    return result;
}

osg::ref_ptr<osg::StateSet> StateBuilder::Make(osg::StateSet* source, bool hasColours, bool twoSided)
{
    osg::ref_ptr<osg::StateSet>& result = made[{source, hasColours, twoSided}];
    if (result)
        return result;
    result = new osg::StateSet;
    TakeMaterial(*result, source, hasColours);
    if (twoSided || (source && source->getMode(GL_CULL_FACE) == osg::StateAttribute::OFF))
        result->setMode(GL_CULL_FACE, osg::StateAttribute::OFF);
    if (source)
    {
        result->setName(source->getName());
        if (source->getMode(GL_LIGHTING) == osg::StateAttribute::OFF)
            result->setMode(GL_LIGHTING, osg::StateAttribute::OFF);
        TakeTextures(*result, *source);
    }
    TakeBlending(*result, source);
    return result;
}

unsigned StateBuilder::SourceUnit(unsigned unit) const
{
    return unit == 0 ? mainUnit : unit == mainUnit ? 0 : unit;
}

void StateBuilder::TakeMaterial(osg::StateSet& target, const osg::StateSet* source, bool hasColours) const
{
    osg::ref_ptr<osg::Material> material =
        Copy<osg::Material>(source ? source->getAttribute(osg::StateAttribute::MATERIAL) : nullptr);
    const osg::Material::Face both = osg::Material::FRONT_AND_BACK;
    if (!material)
    {
        // Dye and transparency of a body work on materials, so a surface without one gets one.
        const auto grey = [](double value)
        {
            const float level = static_cast<float>(value);
            return osg::Vec4(level, level, level, 1);
        };
        material = new osg::Material;
        material->setDiffuse(both, osg::Vec4(0.8f, 0.8f, 0.8f, 1));
        material->setAmbient(both, grey(0.8 * context.request.Number("useAmbientIntensity").value_or(0.2)));
        material->setSpecular(both, grey(context.request.Number("useSpecularity").value_or(0)));
        material->setShininess(both, static_cast<float>(context.request.Number("useShininess").value_or(0)));
    }
    if (!(material->getShininess(osg::Material::FRONT) <= maxShininess))
        material->setShininess(both, maxShininess);
    material->setColorMode(hasColours ? osg::Material::DIFFUSE : osg::Material::OFF);
    target.setAttribute(material);
}

void StateBuilder::TakeTextures(osg::StateSet& target, const osg::StateSet& source)
{
    for (unsigned unit = 0; unit < maxUnits; ++unit)
    {
        const unsigned from = SourceUnit(unit);
        const auto* attribute = source.getTextureAttribute(from, osg::StateAttribute::TEXTURE);
        auto* given = dynamic_cast<osg::Texture2D*>(const_cast<osg::StateAttribute*>(attribute));
        if (!given)
            continue;
        osg::ref_ptr<osg::Texture2D>& texture = textures[given];
        if (!texture)
        {
            osg::ref_ptr<osg::Image> image = TakeImage(given->getImage());
            if (!image)
                continue;
            texture = new osg::Texture2D(image);
            for (const auto axis : {osg::Texture::WRAP_S, osg::Texture::WRAP_T})
                texture->setWrap(axis, given->getWrap(axis));
            Finish(*texture);
        }
        target.setTextureAttributeAndModes(unit, texture);
        if (auto mode = Copy<osg::TexEnv>(source.getTextureAttribute(from, osg::StateAttribute::TEXENV)))
            target.setTextureAttribute(unit, mode);
        if (auto matrix = Copy<osg::TexMat>(source.getTextureAttribute(from, osg::StateAttribute::TEXMAT)))
            target.setTextureAttribute(unit, matrix);
    }
}

void StateBuilder::TakeBlending(osg::StateSet& target, const osg::StateSet* source)
{
    const auto* texture =
        dynamic_cast<const osg::Texture2D*>(target.getTextureAttribute(0, osg::StateAttribute::TEXTURE));
    const bool seenThrough = texture && texture->getImage()->isImageTranslucent();
    const bool blends = source && (source->getMode(GL_BLEND) & osg::StateAttribute::ON);
    if (!seenThrough && !blends)
        return;

    osg::ref_ptr<osg::BlendFunc> function =
        Copy<osg::BlendFunc>(source ? source->getAttribute(osg::StateAttribute::BLENDFUNC) : nullptr);
    if (!function)
        function = new osg::BlendFunc(GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA);
    target.setAttributeAndModes(function);
    // How much of a surface without a picture is seen: COLLADA's transparency becomes a colour for the whole surface.
    if (auto colour = Copy<osg::BlendColor>(source ? source->getAttribute(osg::StateAttribute::BLENDCOLOR) : nullptr))
        target.setAttributeAndModes(colour);
    target.setRenderingHint(osg::StateSet::TRANSPARENT_BIN);
    if (seenThrough) // leaves and fences: what is clear must not fill the depth buffer
        target.setAttributeAndModes(new osg::AlphaFunc(osg::AlphaFunc::GREATER, leastVisibleAlpha));
}

osg::ref_ptr<osg::Texture2D> StateBuilder::LoadTexture(const std::string& path)
{
    osg::ref_ptr<osg::Image> image = TakeImage(osgDB::readRefImageFile(path).get());
    if (!image)
    {
        context.Warn("the texture \"" + path + "\" can't be read");
        return nullptr;
    }
    osg::ref_ptr<osg::Texture2D> texture = new osg::Texture2D(image);
    for (const auto axis : {osg::Texture::WRAP_S, osg::Texture::WRAP_T})
        texture->setWrap(axis, osg::Texture::REPEAT);
    Finish(*texture);
    return texture;
}

osg::ref_ptr<osg::Image> StateBuilder::TakeImage(osg::Image* image)
{
    if (!image || !image->data() || image->s() <= 0 || image->t() <= 0)
        return nullptr;
    if (image->s() > maxImageSide || image->t() > maxImageSide || image->r() > 1)
    {
        context.Warn("the texture \"" + image->getFileName() + "\" is larger than " + std::to_string(maxImageSide) +
                     " pixels a side");
        context.textures.erase(image->getFileName());
        return nullptr;
    }
    context.textures.erase(image->getFileName());
    if (!IsKnownImage(*image))
    {
        context.Warn("the texture \"" + image->getFileName() + "\" is of a kind that can't be drawn");
        return nullptr;
    }
    osg::ref_ptr<osg::Image>& known = images[image->getFileName()];
    if (known && !image->getFileName().empty())
        return known;
    // A static image would be dropped once a context has it; another context (a full screen window) needs it again,
    // and its file name is asked for as long as the model lives.
    image->setDataVariance(osg::Object::DYNAMIC);
    known = image;
    return known;
}

void StateBuilder::Finish(osg::Texture2D& texture) const
{
    texture.setFilter(osg::Texture::MIN_FILTER, osg::Texture::LINEAR_MIPMAP_LINEAR);
    texture.setFilter(osg::Texture::MAG_FILTER, osg::Texture::LINEAR);
    texture.setUnRefImageDataAfterApply(false);
    texture.setResizeNonPowerOfTwoHint(false);
    texture.setMaxAnisotropy(static_cast<float>(context.request.Number("useMaxTexAnisotropy").value_or(1)));
}

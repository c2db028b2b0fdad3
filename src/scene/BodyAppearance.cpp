#include "scene/Body.h"

#include "records/AttributeNames.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

#include <algorithm>

#include <osg/BlendFunc>
#include <osg/CullFace>
#include <osg/PolygonMode>
#include <osg/ShadeModel>
#include <osg/Texture2D>

namespace
{

using osg::StateAttribute;

using Value = StateAttribute::GLModeValue;
constexpr Value off = StateAttribute::OFF;
constexpr Value onAndOverride = StateAttribute::ON | StateAttribute::OVERRIDE;

constexpr float dyedAmbient = 0.3F;
constexpr float dyedSpecular = 0.8F;

template <class Attribute>
osg::ref_ptr<Attribute> Take(osg::StateSet& stateSet, StateAttribute::Type type)
{
    auto* present = dynamic_cast<Attribute*>(stateSet.getAttribute(type));
    return present ? present : new Attribute;
}

const StateAttribute* TextureOf(const osg::Drawable& drawable)
{
    const osg::StateSet* stateSet = drawable.getStateSet();
    return stateSet ? stateSet->getTextureAttribute(0, StateAttribute::TEXTURE) : nullptr;
}

bool IsPlain(VtERenderMode mode)
{
    return mode == VtERenderMode::Gouraud || mode == VtERenderMode::Flat;
}

// Textured surfaces show their texture unshaded by the file's colour, where textures are drawn as they are meant.
osg::Vec4f DiffuseFor(VtERenderMode mode, const osg::Drawable& drawable, const VtCOsgMatMapObject& record)
{
    const bool usesRecord = IsPlain(mode) || mode == VtERenderMode::WireFrame;
    return !usesRecord && dynamic_cast<const osg::Texture2D*>(TextureOf(drawable)) ? osg::Vec4f(1, 1, 1, 1)
                                                                                   : record.diffuse;
}

void Restore(const VtTMaterialMap& materials)
{
    for (const auto& [drawable, record] : materials)
    {
        osg::Material& material = *record->material;
        material.setDiffuse(osg::Material::FRONT_AND_BACK, record->diffuse);
        material.setAmbient(osg::Material::FRONT_AND_BACK, record->ambient);
        material.setSpecular(osg::Material::FRONT_AND_BACK, record->specular);
        material.setShininess(osg::Material::FRONT_AND_BACK, record->shininess);
    }
}

void SetBlending(osg::StateSet& stateSet, bool blended)
{
    if (blended)
    {
        stateSet.setMode(GL_BLEND, StateAttribute::ON);
        stateSet.setAttributeAndModes(
            new osg::BlendFunc(GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA, GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA),
            StateAttribute::ON);
        stateSet.setRenderingHint(osg::StateSet::TRANSPARENT_BIN);
    }
    else
    {
        stateSet.removeAttribute(StateAttribute::BLENDFUNC);
        stateSet.removeAttribute(StateAttribute::DEPTH);
        stateSet.setRenderingHint(osg::StateSet::OPAQUE_BIN);
    }
}

} // namespace

VtERenderMode VtC3DBody::GetGlobalMode() const
{
    const VtCScene3D* scene = GetDocument().GetScene();
    return scene ? scene->GetGlobalRenderMode() : VtERenderMode::Mixed;
}

VtERenderMode VtC3DBody::GetShownMode() const
{
    const VtERenderMode global = GetGlobalMode();
    return global == VtERenderMode::Mixed ? renderMode : global;
}

void VtC3DBody::SetRenderMode(VtERenderMode mode)
{
    if (mode == renderMode)
        return;
    TakeRenderMode(mode);
    WriteBack(attribute::renderMode);
}

void VtC3DBody::TakeRenderMode(VtERenderMode mode)
{
    if (mode != renderMode && GetGlobalMode() == VtERenderMode::Mixed)
        ApplyRenderState(mode);
    renderMode = mode;
    ApplyStoredDye();
    ApplyTransparency(GetShownMode());
}

void VtC3DBody::ApplyGlobalMode(VtERenderMode mode)
{
    ApplyRenderState(mode);
    ApplyTransparency(mode);
}

void VtC3DBody::SetTransparency(float value)
{
    transparency = value;
    WriteBack(attribute::transparency);
}

void VtC3DBody::TakeTransparency(float value)
{
    if (GetGlobalMode() != VtERenderMode::Mixed)
        return;
    transparency = value;
    ApplyStoredDye();
    ApplyTransparency(renderMode);
}

void VtC3DBody::TakeWaitingTransparency()
{
    if (const float* stored = attributeObject ? attributeObject->Find<float>(attribute::transparency) : nullptr)
        transparency = *stored;
}

void VtC3DBody::ApplyTransparency(VtERenderMode mode)
{
    const float taken = mode == VtERenderMode::Transparent ? transparency : 0.0F;
    if (taken > 0)
        MoveToPrivateCopy();

    // The shared model has the file's alpha already. A geode with both kinds of drawables counts as transparent.
    const bool ownMaterials = IsOnPrivateCopy();
    for (const bool blended : {false, true})
        for (const auto& [drawable, record] : materials)
        {
            const float alpha = record->diffuse.a() * (1.0F - taken);
            if ((alpha < 1.0F) != blended)
                continue;
            if (ownMaterials)
                record->material->setAlpha(osg::Material::FRONT_AND_BACK, alpha);
            if (drawable->getNumParents() > 0)
                SetBlending(*drawable->getParent(0)->getOrCreateStateSet(), blended);
        }
}

void VtC3DBody::SetDye(float red, float green, float blue)
{
    *dye = {1, red, green, blue};
    PaintDye();
    WriteBack(attribute::dyeColor);
    WriteBack(attribute::dyeEnabled);
}

void VtC3DBody::PaintDye()
{
    const auto [enabled, red, green, blue] = *dye;
    MoveToPrivateCopy();
    if (!IsOnPrivateCopy())
        return;
    for (const auto& [drawable, record] : materials)
    {
        if (TextureOf(*drawable))
            continue;
        osg::Material& material = *record->material;
        const float diffuseAlpha = material.getDiffuse(osg::Material::FRONT).a();
        const float ambientAlpha = material.getAmbient(osg::Material::FRONT).a();
        material.setDiffuse(osg::Material::FRONT_AND_BACK, osg::Vec4f(red, green, blue, diffuseAlpha));
        material.setAmbient(osg::Material::FRONT_AND_BACK,
                            osg::Vec4f(red * dyedAmbient, green * dyedAmbient, blue * dyedAmbient, ambientAlpha));
        material.setSpecular(osg::Material::FRONT_AND_BACK,
                             osg::Vec4f(dyedSpecular, dyedSpecular, dyedSpecular, ambientAlpha));
    }
}

void VtC3DBody::SetDyeBytes(std::uint8_t red, std::uint8_t green, std::uint8_t blue)
{
    SetDye(static_cast<float>(red / 255.0), static_cast<float>(green / 255.0), static_cast<float>(blue / 255.0));
}

void VtC3DBody::TakeDyeColour(const VtTIntTupel3& colour)
{
    dye->red = static_cast<float>(colour[0] / 255.0);
    dye->green = static_cast<float>(colour[1] / 255.0);
    dye->blue = static_cast<float>(colour[2] / 255.0);
    if (dye->enabled != 0)
        RefreshAppearance();
}

VtTIntTupel3 VtC3DBody::GiveDyeColour() const
{
    const auto byte = [](float part) { return static_cast<std::int32_t>(std::lround(part * 255.0)); };
    return {byte(dye->red), byte(dye->green), byte(dye->blue)};
}

void VtC3DBody::TakeDyeEnabled(bool flag)
{
    // A stored "no dye" of a body without one must leave the picture as it is.
    if (flag == (dye->enabled != 0))
        return;
    dye->enabled = flag ? 1 : 0;
    RefreshAppearance();
}

void VtC3DBody::ClearDye()
{
    dye->enabled = 0;
    UnpaintDye();
    WriteBack(attribute::dyeEnabled);
}

void VtC3DBody::UnpaintDye()
{
    if (!IsOnPrivateCopy())
        return; // the shared model was never dyed
    for (const auto& [drawable, record] : materials)
    {
        if (TextureOf(*drawable))
            continue;
        osg::Material& material = *record->material;
        material.setDiffuse(osg::Material::FRONT_AND_BACK, record->diffuse);
        material.setAmbient(osg::Material::FRONT_AND_BACK, record->ambient);
        material.setSpecular(osg::Material::FRONT_AND_BACK, record->specular);
        material.setShininess(osg::Material::FRONT_AND_BACK, record->shininess);
    }
}

void VtC3DBody::ApplyStoredDye()
{
    if (dye->enabled != 0)
        PaintDye();
    else
        UnpaintDye();
}

void VtC3DBody::RefreshAppearance()
{
    if (GetGlobalMode() == VtERenderMode::Mixed)
        ApplyRenderState(renderMode);
    ApplyStoredDye();
    ApplyTransparency(GetShownMode());
}

osg::Node* VtC3DBody::GetModelClone()
{
    if (!modelClone && modelNode)
    {
        modelClone = GetServices().models.clone(modelNode);
        VtCOsgNodeMaterialCollector collector;
        if (modelClone)
            modelClone->accept(collector);
        cloneMaterials = std::move(collector.materials);
    }
    return modelClone;
}

void VtC3DBody::BuildMaterialMaps()
{
    VtCOsgNodeMaterialCollector collector;
    transformNode->accept(collector);
    materials = std::move(collector.materials);
    fileMaterials = CopyRecords(materials);
}

bool VtC3DBody::IsOnPrivateCopy() const
{
    return modelClone && transformNode && transformNode->containsNode(modelClone);
}

void VtC3DBody::MoveToPrivateCopy()
{
    if (!transformNode || IsOnPrivateCopy() || !GetModelClone())
        return;
    transformNode->addChild(modelClone);
    transformNode->removeChild(modelNode);
    // What an earlier dye or transparency left on the copy goes.
    Restore(cloneMaterials);
    materials = cloneMaterials;
}

void VtC3DBody::MoveToSharedModel()
{
    if (!IsOnPrivateCopy())
        return;
    transformNode->addChild(modelNode);
    transformNode->removeChild(modelClone);
    materials = fileMaterials;
}

void VtC3DBody::ApplyRenderState(VtERenderMode mode)
{
    if (!transformNode)
        return;
    ApplyModelFor(mode);
    ApplyModeState(mode);
    AdjustMaterials(mode);
}

void VtC3DBody::ApplyModelFor(VtERenderMode mode)
{
    if (mode == VtERenderMode::Transparent || dye->enabled != 0)
        MoveToPrivateCopy();
    else
        MoveToSharedModel();
}

void VtC3DBody::ApplyModeState(VtERenderMode mode)
{
    osg::StateSet& stateSet = *transformNode->getOrCreateStateSet();
    const auto polygonMode = Take<osg::PolygonMode>(stateSet, StateAttribute::POLYGONMODE);
    const auto shadeModel = Take<osg::ShadeModel>(stateSet, StateAttribute::SHADEMODEL);
    const auto cullFace = Take<osg::CullFace>(stateSet, StateAttribute::CULLFACE);
    const bool wire = mode == VtERenderMode::WireFrame;
    const bool plain = IsPlain(mode);

    polygonMode->setMode(osg::PolygonMode::FRONT_AND_BACK, wire ? osg::PolygonMode::LINE : osg::PolygonMode::FILL);
    stateSet.setAttributeAndModes(polygonMode, wire ? onAndOverride : off);

    shadeModel->setMode(mode == VtERenderMode::Flat ? osg::ShadeModel::FLAT : osg::ShadeModel::SMOOTH);
    stateSet.setAttributeAndModes(shadeModel, plain ? onAndOverride : off);

    // Lines of the far side belong to a wire frame.
    cullFace->setMode(osg::CullFace::BACK);
    stateSet.setAttributeAndModes(cullFace, wire ? StateAttribute::OVERRIDE : StateAttribute::ON);

    // An empty texture with OVERRIDE and without ON switches texturing off below; without it the model's own count.
    osg::ref_ptr<StateAttribute> texture = stateSet.getTextureAttribute(0, StateAttribute::TEXTURE);
    if (plain)
        stateSet.setTextureAttributeAndModes(0, texture ? texture.get() : new osg::Texture2D, StateAttribute::OVERRIDE);
    else if (texture)
        stateSet.setTextureAttributeAndModes(0, texture, StateAttribute::INHERIT);
}

void VtC3DBody::AdjustMaterials(VtERenderMode mode)
{
    const bool setsShininess = !IsPlain(mode) && mode != VtERenderMode::WireFrame;
    const auto changes = [&](const auto& entry)
    {
        const auto& [drawable, record] = entry;
        const osg::Material& material = *record->material;
        return material.getDiffuse(osg::Material::FRONT) != DiffuseFor(mode, *drawable, *record) ||
               material.getSpecular(osg::Material::FRONT) != record->specular ||
               (setsShininess && material.getShininess(osg::Material::FRONT) != record->shininess);
    };
    // Other bodies show the shared model too, in modes of their own.
    if (!IsOnPrivateCopy() && std::any_of(materials.begin(), materials.end(), changes))
        MoveToPrivateCopy();
    if (!IsOnPrivateCopy())
        return;

    for (const auto& [drawable, record] : materials)
    {
        osg::Material& material = *record->material;
        material.setDiffuse(osg::Material::FRONT_AND_BACK, DiffuseFor(mode, *drawable, *record));
        material.setSpecular(osg::Material::FRONT_AND_BACK, record->specular);
        if (setsShininess)
            material.setShininess(osg::Material::FRONT_AND_BACK, record->shininess);
    }
}

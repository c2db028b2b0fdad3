#include "scene/StaticBody.h"

using namespace std::string_view_literals;

void VtC3DStaticBody::OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                                         const VtTAttributeValue& value)
{
    const std::int32_t* integer = std::get_if<std::int32_t>(&value);
    const float* real = std::get_if<float>(&value);
    const VtTFloatTupel3* vector = std::get_if<VtTFloatTupel3>(&value);

    if (integer &&
        (attributeName == L"selectable"sv || attributeName == L"fixed_to_world"sv || attributeName == L"visible"sv))
    {
        VtC3DBody::OnAttributeChanged(objectId, attributeName, value);
        SetModified();
    }
    else if (attributeName == L"transparency"sv && real)
    {
        if (GetGlobalMode() != VtERenderMode::Mixed)
            return;
        SetTransparency(*real);
        if (dye->enabled != 0)
            ApplyStoredDye();
        ApplyTransparency(GetRenderMode());
    }
    else if (attributeName == L"position"sv && vector)
    {
        const osg::Vec3f axes = ToModelAxes(*vector);
        SetPositionX(axes.x());
        SetPositionY(axes.y());
        SetPositionZ(axes.z());
    }
    else if (attributeName == L"center"sv && vector)
    {
        const osg::Vec3f axes = ToModelAxes(*vector);
        SetCenterX(axes.x());
        SetCenterY(axes.y());
        SetCenterZ(axes.z());
    }
    else if (attributeName == L"rotation"sv && vector)
    {
        const osg::Vec3f axes = ToModelAxes(*vector);
        SetRotationX(axes.x());
        SetRotationY(axes.y());
        SetRotationZ(axes.z());
    }
    else if (attributeName == L"scale"sv && vector)
    {
        const osg::Vec3f percent = ToModelScale(*vector);
        SetScaleX(percent.x());
        SetScaleY(percent.y());
        SetScaleZ(percent.z());
    }
    else if (attributeName == L"scale_orient"sv && vector)
        SetScaleOrientation(ToModelAxes(*vector));
    else if (attributeName == L"render_mode"sv && integer)
    {
        SetRenderMode(static_cast<VtERenderMode>(*integer));
        if (dye->enabled != 0)
        {
            ApplyStoredDye();
            ApplyTransparency(GetRenderMode());
        }
    }
    else if (attributeName == L"dye_enabled"sv && integer)
    {
        dye->enabled = *integer > 0 ? 1 : 0;
        RefreshAppearance();
        SetModified();
    }
    else if (const auto* colour = std::get_if<VtTIntTupel3>(&value); colour && attributeName == L"dye_color"sv)
    {
        StoreDyeColour(*colour);
        if (dye->enabled != 0)
        {
            ApplyStoredDye();
            ApplyTransparency(GetRenderMode());
        }
        SetModified();
    }
    else
    {
        if (isGrouped)
            OnChildAttributeChanged(attributeName, value);
        VtC3DBody::OnAttributeChanged(objectId, attributeName, value);
    }
}

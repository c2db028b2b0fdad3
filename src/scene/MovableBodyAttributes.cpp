#include "scene/MovableBody.h"

#include "host/Messages.h"
#include "scene/MovableBodies.h"
#include "scene/SceneServices.h"

#include <algorithm>

using namespace std::string_view_literals;

namespace
{

constexpr std::wstring_view storedAsUnconnected = L"Not connected"; // in every language
constexpr std::uint32_t textUnconnected = 6239;

const std::vector<std::wstring>* CurrentChannels(const VtTSceneServices& services)
{
    return services.channels ? services.channels->GetCurrentChannels() : nullptr;
}

} // namespace

void VtC3DMovableBody::ConnectChannel(std::int32_t index, const std::wstring& stream)
{
    if (isGrouped)
        return;

    const VtTSceneServices& services = GetServices();
    motion->simulationDataIndex = index;
    if (!stream.empty())
        simulationDataStream = stream;
    else if (index == -1)
        simulationDataStream = services.texts.GetText(textUnconnected);
    else
        simulationDataStream = L"Body_" + std::to_wstring(index);
    UpdateConnectionState();
    SetModified();

    if (!attributeObject && !IsLoading())
        return;
    const std::vector<std::wstring>* channels = CurrentChannels(services);
    if (channels && index >= 0 && static_cast<std::size_t>(index) < channels->size() &&
        !(*channels)[static_cast<std::size_t>(index)].empty())
        simulationDataStream = (*channels)[static_cast<std::size_t>(index)];
    // The names of these two run crosswise; stored scenes rely on it.
    WriteAttribute(L"simulation_data_stream", index);
    WriteAttribute(L"simulation_data_index", simulationDataStream);
}

void VtC3DMovableBody::UpdateConnectionState()
{
    const std::vector<std::wstring>* channels = CurrentChannels(GetServices());
    const std::int32_t index = motion->simulationDataIndex;
    const bool offered = channels && index >= 0 && static_cast<std::size_t>(index) < channels->size();
    connectionState = index == -1 ? notConnected : offered ? connected : channelMissing;
    for (VtC3DMovableBody* part : parts)
        part->UpdateConnectionState();
}

void VtC3DMovableBody::OnChannelNameChanged(const std::wstring& name)
{
    if (name == storedAsUnconnected)
    {
        ConnectChannel(-1, name);
        return;
    }
    const std::vector<std::wstring>* channels = CurrentChannels(GetServices());
    if (!channels)
        return;
    const auto at = std::find(channels->begin(), channels->end(), name);
    if (at != channels->end())
        ConnectChannel(static_cast<std::int32_t>(at - channels->begin()), std::wstring(name));
}

void VtC3DMovableBody::OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                                          const VtTAttributeValue& value)
{
    const std::int32_t* integer = std::get_if<std::int32_t>(&value);
    const float* real = std::get_if<float>(&value);
    const VtTFloatTupel3* vector = std::get_if<VtTFloatTupel3>(&value);
    const std::vector<float>* list = std::get_if<std::vector<float>>(&value);
    const bool isMatrix = list && list->size() == 16;

    if (attributeName == L"transparency"sv && real)
    {
        if (GetGlobalMode() != VtERenderMode::Mixed)
            return;
        SetTransparency(*real);
        ApplyStoredDye();
        ApplyTransparency(GetRenderMode());
    }
    else if (attributeName == L"position"sv && vector)
    {
        SetCenterX((*vector)[0]);
        SetCenterY((*vector)[1]);
        SetCenterZ((*vector)[2]);
    }
    else if (attributeName == L"rotation"sv && vector)
    {
        SetRotationX((*vector)[0]);
        SetRotationY(-(*vector)[1]);
        SetRotationZ((*vector)[2]);
    }
    else if (attributeName == L"scale"sv && vector)
    {
        SetScaleX((*vector)[0] * 100);
        SetScaleY((*vector)[2] * 100);
        SetScaleZ((*vector)[1] * 100);
    }
    else if (attributeName == L"render_mode"sv && integer)
    {
        SetRenderMode(static_cast<VtERenderMode>(*integer));
        ApplyStoredDye();
        ApplyTransparency(GetRenderMode());
    }
    else if (attributeName == L"simulation_data_stream"sv && integer)
        ConnectChannel(*integer, {});
    else if (const auto* text = std::get_if<std::wstring>(&value); text && attributeName == L"simulation_data_index"sv)
        OnChannelNameChanged(*text);
    else if (attributeName == L"last_transform_matrix"sv && isMatrix)
        SetTransform(osg::Matrixd(list->data()));
    else if (attributeName == L"insert_transform_matrix"sv && isMatrix)
        SetInsertMatrix(osg::Matrixd(list->data()));
    else if (attributeName == L"dye_enabled"sv && integer)
    {
        dye->enabled = *integer > 0 ? 1 : 0;
        RefreshAppearance();
    }
    else if (const auto* colour = std::get_if<VtTIntTupel3>(&value); colour && attributeName == L"dye_color"sv)
    {
        StoreDyeColour(*colour);
        if (dye->enabled != 0)
            RefreshAppearance();
    }
    else
        VtC3DBody::OnAttributeChanged(objectId, attributeName, value);
}

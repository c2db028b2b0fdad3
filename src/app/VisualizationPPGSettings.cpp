#include "app/VisualizationPPGSettings.h"

#include "host/Storage.h"

namespace
{

constexpr const wchar_t* mouseSensitivityKey = L"MouseSensitivity";
constexpr const wchar_t* rendererModeKey = L"RendererMode";
constexpr const wchar_t* fullscreenUseAllKey = L"FullscreenUseAll";
constexpr const wchar_t* fullscreenUseScreensKey = L"FullscreenUseScreens";

} // namespace

VtCVisualizationPPGSettings::VtCVisualizationPPGSettings(VtISettingsEffects& target) : effects(target) {}

void VtCVisualizationPPGSettings::PutMouseSensitivity(std::uint32_t sensitivity)
{
    mouseSensitivity = sensitivity;
    changed = true;
    effects.SetMouseSensitivity(sensitivity);
}

void VtCVisualizationPPGSettings::PutRendererMode(std::uint32_t mode)
{
    rendererMode = mode;
    changed = true;
    effects.SetRendererMode(mode);
}

void VtCVisualizationPPGSettings::PutFullscreenUseAll(bool useAll)
{
    fullscreenUseAll = useAll;
    changed = true;
}

void VtCVisualizationPPGSettings::PutFullscreenUseScreens(const std::wstring& screens)
{
    fullscreenScreens = screens;
    changed = true;
}

host::SettingsNode VtCVisualizationPPGSettings::ToNode() const
{
    host::SettingsNode node{nodeName, {}};
    node.entries.emplace_back(mouseSensitivityKey, mouseSensitivity);
    node.entries.emplace_back(rendererModeKey, rendererMode);
    node.entries.emplace_back(fullscreenUseAllKey, std::uint32_t{fullscreenUseAll});
    if (!fullscreenUseAll)
        node.entries.emplace_back(fullscreenUseScreensKey, fullscreenScreens);
    return node;
}

void VtCVisualizationPPGSettings::FromNode(const host::SettingsNode& node)
{
    if (const auto value = node.Find<std::uint32_t>(mouseSensitivityKey))
        mouseSensitivity = *value;
    if (const auto value = node.Find<std::uint32_t>(rendererModeKey); value && *value <= rmeQuality)
        rendererMode = *value;
    if (const auto value = node.Find<std::uint32_t>(fullscreenUseAllKey))
        fullscreenUseAll = *value > 0;
    if (const auto value = node.Find<std::wstring>(fullscreenUseScreensKey))
        fullscreenScreens = *value;
}

void VtCVisualizationPPGSettings::Load(const host::Settings& settings)
{
    if (const auto node = settings.Load(nodeName))
        FromNode(*node);
}

bool VtCVisualizationPPGSettings::StoreChanges(host::Settings& settings)
{
    if (!changed)
        return true;
    changed = !settings.Store(ToNode());
    return !changed;
}

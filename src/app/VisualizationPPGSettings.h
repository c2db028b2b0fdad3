#pragma once

#include <cstdint>
#include <string>

namespace host
{
class Settings;
struct SettingsNode;
} // namespace host

enum VtERenderModeExtern : std::uint32_t
{
    rmePerformance = 0,
    rmeQuality = 1,
};

/// Where a setting takes effect. The application object implements it.
class VtISettingsEffects
{
public:
    virtual ~VtISettingsEffects() = default;

    virtual void SetMouseSensitivity(std::uint32_t sensitivity) = 0;

    /// 0 and 1; other modes change nothing.
    virtual void SetRendererMode(std::uint32_t mode) = 0;
};

/// The user's settings of the component, as the host keeps them in a node of its own and shows them on a page.
///
/// Setting a property takes effect at once. Reading a stored node sets the fields only.
class VtCVisualizationPPGSettings
{
public:
    static constexpr const wchar_t* nodeName = L"Visualisation";

    explicit VtCVisualizationPPGSettings(VtISettingsEffects& effects);

    std::uint32_t GetMouseSensitivity() const { return mouseSensitivity; }
    std::uint32_t GetRendererMode() const { return rendererMode; }
    bool GetFullscreenUseAll() const { return fullscreenUseAll; }

    /// Screen numbers with "," between them: "0,2".
    const std::wstring& GetFullscreenUseScreens() const { return fullscreenScreens; }

    void PutMouseSensitivity(std::uint32_t sensitivity);
    void PutRendererMode(std::uint32_t mode);
    void PutFullscreenUseAll(bool useAll);
    void PutFullscreenUseScreens(const std::wstring& screens);

    /// The stored form, and back. An entry that is missing, of another type or out of range leaves its field alone.
    host::SettingsNode ToNode() const;
    void FromNode(const host::SettingsNode& node);

    void Load(const host::Settings& settings);

    /// Writes the node if a property has been set since the last time; false when the host couldn't.
    bool StoreChanges(host::Settings& settings);

private:
    VtISettingsEffects& effects;
    std::uint32_t rendererMode = rmePerformance;
    std::uint32_t mouseSensitivity = 5;
    bool fullscreenUseAll = true;
    std::wstring fullscreenScreens = L"0";
    bool changed = false;
};

#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <variant>
#include <vector>

namespace host
{

/// Integers that the host keeps for the component across sessions.
class Configuration
{
public:
    virtual ~Configuration() = default;

    virtual std::int32_t GetTrackBufferFrames() const = 0;
    virtual void SetTrackBufferFrames(std::int32_t frames) = 0;
    virtual std::int32_t GetSimulationBufferFrames() const = 0;
    virtual void SetSimulationBufferFrames(std::int32_t frames) = 0;

    /// How many tracks a scene may hold; 0 or more.
    virtual std::int32_t GetMaxTracks() const = 0;
};

/// A node of named values as the host stores it among the user's settings. Entries keep their order.
struct SettingsNode
{
    using Value = std::variant<std::uint32_t, std::wstring>;

    std::wstring name;
    std::vector<std::pair<std::wstring, Value>> entries;

    /// The entry of that name and type, or nothing.
    template <class Type>
    std::optional<Type> Find(const std::wstring& key) const
    {
        for (const auto& [entry, value] : entries)
            if (entry == key && std::holds_alternative<Type>(value))
                return std::get<Type>(value);
        return std::nullopt;
    }
};

/// The user's settings.
class Settings
{
public:
    virtual ~Settings() = default;

    /// False when the settings couldn't be written; the earlier ones then stand.
    virtual bool Store(const SettingsNode& node) = 0;

    /// The stored node of that name, or nothing.
    virtual std::optional<SettingsNode> Load(const std::wstring& name) const = 0;
};

} // namespace host

#pragma once

#include <cstdint>
#include <filesystem>

#include "host/Storage.h"

namespace base
{
class IniFile;
}
namespace host
{
class MessageService;
}

namespace hosts
{

/// The component's integers in the section [Panoramic] of the configuration file, which outlives this.
///
/// A value that is no number, or out of its range, is told as a warning with its key, and the default stands.
class FileConfiguration : public host::Configuration
{
public:
    FileConfiguration(base::IniFile& file, host::MessageService& messages);

    std::int32_t GetTrackBufferFrames() const override { return trackBufferFrames; }
    void SetTrackBufferFrames(std::int32_t frames) override;
    std::int32_t GetSimulationBufferFrames() const override { return simulationBufferFrames; }
    void SetSimulationBufferFrames(std::int32_t frames) override;
    std::int32_t GetMaxTracks() const override { return maxTracks; }

private:
    std::int32_t Read(const char* key, std::int32_t lowest, std::int32_t byDefault);
    void Write(const char* key, std::int32_t value);

    base::IniFile& file;
    host::MessageService& messages;
    std::int32_t trackBufferFrames;
    std::int32_t simulationBufferFrames;
    std::int32_t maxTracks;
};

/// The user's settings in a file: a section for each node, numbers plain and texts in quotes.
///
/// Each call reads the file anew, so that several programs can keep their settings in it. A file that can't be used is
/// told once as a warning; then there are no stored settings, and the file stays as it is.
class FileSettings : public host::Settings
{
public:
    FileSettings(std::filesystem::path file, host::MessageService& messages);

    bool Store(const host::SettingsNode& node) override;
    std::optional<host::SettingsNode> Load(const std::wstring& name) const override;

private:
    void Warn(const std::string& reason) const;

    std::filesystem::path file;
    host::MessageService& messages;
    mutable bool warned = false;
};

} // namespace hosts

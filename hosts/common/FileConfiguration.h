#pragma once

#include <cstdint>

#include "host/Storage.h"

namespace host
{
class MessageService;
}

namespace hosts
{

class IniFile;

/// The component's integers in the section [Panoramic] of the configuration file, which outlives this.
///
/// A value that is no number, or out of its range, is told as a warning with its key, and the default stands.
class FileConfiguration : public host::Configuration
{
public:
    FileConfiguration(IniFile& file, host::MessageService& messages);

    std::int32_t GetTrackBufferFrames() const override { return trackBufferFrames; }
    void SetTrackBufferFrames(std::int32_t frames) override;
    std::int32_t GetSimulationBufferFrames() const override { return simulationBufferFrames; }
    void SetSimulationBufferFrames(std::int32_t frames) override;
    std::int32_t GetMaxTracks() const override { return maxTracks; }

private:
    std::int32_t Read(const char* key, std::int32_t lowest, std::int32_t byDefault);
    void Write(const char* key, std::int32_t value);

    IniFile& file;
    host::MessageService& messages;
    std::int32_t trackBufferFrames;
    std::int32_t simulationBufferFrames;
    std::int32_t maxTracks;
};

} // namespace hosts

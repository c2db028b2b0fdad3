#include "hosts/common/FileConfiguration.h"

#include <limits>

#include "base/Numbers.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "hosts/common/HostMessages.h"
#include "hosts/common/IniFile.h"

namespace hosts
{

namespace
{

constexpr const char* section = "Panoramic";

// Ten minutes at 100 Hz for the simulation and four such runs for the tracks. A buffer takes memory only as it fills.
constexpr std::int32_t defaultSimulationBufferFrames = 60000;
constexpr std::int32_t defaultTrackBufferFrames = 240000;
constexpr std::int32_t smallestBuffer = 1000;
constexpr std::int32_t defaultMaxTracks = 10;

} // namespace

FileConfiguration::FileConfiguration(IniFile& ini, host::MessageService& service)
    : file(ini),
      messages(service),
      trackBufferFrames(Read("TrackBufferFrames", smallestBuffer, defaultTrackBufferFrames)),
      simulationBufferFrames(Read("SimulationBufferFrames", smallestBuffer, defaultSimulationBufferFrames)),
      maxTracks(Read("MaxTracks", 0, defaultMaxTracks))
{
}

std::int32_t FileConfiguration::Read(const char* key, std::int32_t lowest, std::int32_t byDefault)
{
    const auto text = file.Find(section, key);
    if (!text)
        return byDefault;
    const auto value = base::ParseInteger(*text);
    if (value && *value >= lowest && *value <= std::numeric_limits<std::int32_t>::max())
        return static_cast<std::int32_t>(*value);

    const std::string reason = file.Path().string() + ": \"" + *text + "\" is no value for " + key;
    messages.Show({.number = messageDefaultsUsed, .first = base::Wide(reason), .severity = host::Severity::warning});
    return byDefault;
}

void FileConfiguration::SetTrackBufferFrames(std::int32_t frames)
{
    trackBufferFrames = frames;
    Write("TrackBufferFrames", frames);
}

void FileConfiguration::SetSimulationBufferFrames(std::int32_t frames)
{
    simulationBufferFrames = frames;
    Write("SimulationBufferFrames", frames);
}

void FileConfiguration::Write(const char* key, std::int32_t value)
{
    file.Set(section, key, std::to_string(value));
    const std::string reason = file.Save();
    if (!reason.empty())
        messages.Show({.number = messageNotStored, .first = base::Wide(reason), .severity = host::Severity::warning});
}

} // namespace hosts

#include "hosts/common/FileStorage.h"

#include <limits>

#include "base/IniFile.h"
#include "base/Numbers.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "hosts/common/HostTexts.h"

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

FileConfiguration::FileConfiguration(base::IniFile& ini, host::MessageService& service)
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

namespace
{

std::string Quoted(const std::wstring& text)
{
    std::string result = "\"";
    for (const char c : base::Utf8(text))
        if (c == '"' || c == '\\')
            (result += '\\') += c;
        else if (c == '\n')
            result += "\\n";
        else if (c == '\r')
            result += "\\r";
        else
            result += c;
    return result + '"';
}

std::wstring Unquoted(std::string_view text)
{
    std::string result;
    for (std::size_t at = 0; at < text.size(); ++at)
    {
        if (text[at] != '\\' || at + 1 == text.size())
        {
            result += text[at];
            continue;
        }
        const char escaped = text[++at];
        result += escaped == 'n' ? '\n' : escaped == 'r' ? '\r' : escaped;
    }
    return base::Wide(result);
}

// A user may write a text without its quotes; what isn't a number is one.
host::SettingsNode::Value ValueOf(const std::string& text)
{
    if (text.size() >= 2 && text.front() == '"' && text.back() == '"')
        return Unquoted(std::string_view(text).substr(1, text.size() - 2));
    if (const auto number = base::ParseInteger(text); number && *number >= 0 && *number <= 0xFFFFFFFF)
        return static_cast<std::uint32_t>(*number);
    return base::Wide(text);
}

} // namespace

FileSettings::FileSettings(std::filesystem::path path, host::MessageService& service)
    : file(std::move(path)), messages(service)
{
}

bool FileSettings::Store(const host::SettingsNode& node)
{
    base::IniFile ini(file);
    const std::string section = base::Utf8(node.name);
    for (const auto& [key, value] : ini.FindSection(section).value_or(base::IniFile::Entries()))
        ini.Remove(section, key);
    for (const auto& [key, value] : node.entries)
        ini.Set(section, base::Utf8(key),
                std::holds_alternative<std::uint32_t>(value) ? std::to_string(std::get<std::uint32_t>(value))
                                                             : Quoted(std::get<std::wstring>(value)));

    const std::string reason = ini.Save();
    if (!reason.empty())
        messages.Show({.number = messageNotStored, .first = base::Wide(reason), .severity = host::Severity::warning});
    return reason.empty();
}

std::optional<host::SettingsNode> FileSettings::Load(const std::wstring& name) const
{
    const base::IniFile ini(file);
    if (!ini.Error().empty())
        Warn(ini.Error());
    const auto entries = ini.FindSection(base::Utf8(name));
    if (!entries)
        return std::nullopt;

    host::SettingsNode node{name, {}};
    for (const auto& [key, value] : *entries)
        node.entries.emplace_back(base::Wide(key), ValueOf(value));
    return node;
}

void FileSettings::Warn(const std::string& reason) const
{
    if (!warned)
        messages.Show(
            {.number = messageDefaultsUsed, .first = base::Wide(reason), .severity = host::Severity::warning});
    warned = true;
}

} // namespace hosts

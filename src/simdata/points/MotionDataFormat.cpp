#include "simdata/points/MotionDataFormat.h"

#include <bit>
#include <cstring>
#include <limits>

#include <nlohmann/json.hpp>

#include "base/Text.h"
#include "simdata/points/ChannelDescription.h"

namespace SimulationDataPoints
{

namespace
{

static_assert(std::endian::native == std::endian::little, "files and records are little-endian and taken as they lie");

using json = nlohmann::json;

/// A description nests to 3: the object, its lists, the streams in a list. Deeper ones are a user's own and not kept.
constexpr int maxDepth = 4;

template <typename T>
void Put(std::byte*& at, T value)
{
    std::memcpy(at, &value, sizeof value);
    at += sizeof value;
}

template <typename T>
void Get(const std::byte*& at, T& value)
{
    std::memcpy(&value, at, sizeof value);
    at += sizeof value;
}

/// A key that doesn't have the type it must have.
struct KeyError
{
    std::string key;
    const char* expected;
};

std::wstring TextOf(const json& value, const char* key)
{
    if (!value.is_string())
        throw KeyError{key, "texts"};
    return base::Wide(value.get_ref<const std::string&>());
}

std::vector<std::wstring> Names(const json& object, const char* key)
{
    std::vector<std::wstring> names;
    const auto found = object.find(key);
    if (found == object.end())
        return names;
    if (!found->is_array())
        throw KeyError{key, "a list of texts"};
    for (const json& name : *found)
        names.push_back(TextOf(name, key));
    return names;
}

std::vector<VtTInstrumentStream> Streams(const json& object)
{
    std::vector<VtTInstrumentStream> streams;
    const auto found = object.find("instruments");
    if (found == object.end())
        return streams;
    if (!found->is_array())
        throw KeyError{"instruments", "a list of objects"};
    for (const json& stream : *found)
    {
        if (!stream.is_object() || !stream.contains("name"))
            throw KeyError{"instruments", "a list of objects with a \"name\""};
        streams.push_back({TextOf(stream["name"], "name"), {}});
        if (const auto unit = stream.find("unit"); unit != stream.end())
            streams.back().unit = TextOf(*unit, "unit");
    }
    return streams;
}

void Fill(VtTChannelDescription& channels, const json& object)
{
    channels.poses = Names(object, "poses");
    channels.storedPoses = Names(object, "stored");
    if (channels.storedPoses == channels.poses)
        channels.storedPoses.clear();
    channels.instruments = Streams(object);
    if (const auto safety = object.find("trackSafety"); safety != object.end())
    {
        if (!safety->is_number_unsigned() || safety->get<std::uint64_t>() > TRACK_UNSAFE)
            throw KeyError{"trackSafety", "0, 1 or 2"};
        channels.trackSafety = static_cast<TRACK_SAFETY>(safety->get<int>());
    }
    if (const auto stamps = object.find("timeStamps"); stamps != object.end())
    {
        if (!stamps->is_boolean())
            throw KeyError{"timeStamps", "true or false"};
        channels.timeStamps = stamps->get<bool>();
    }
}

std::wstring CountFault(const char* what, std::size_t named, std::uint32_t counted)
{
    if (named == counted)
        return {};
    return L"the header counts " + std::to_wstring(counted) + L" " + base::Wide(what) + L", the description names " +
           std::to_wstring(named);
}

} // namespace

std::array<std::byte, VtTMotionDataHeader::bytes> VtTMotionDataHeader::Encode() const
{
    std::array<std::byte, bytes> data{};
    std::byte* at = data.data();
    std::memcpy(at, magic.data(), magic.size());
    at += magic.size();
    Put(at, version);
    Put(at, poseCount);
    Put(at, instrumentCount);
    Put(at, stride);
    Put(at, frameCount);
    Put(at, descriptionBytes);
    return data;
}

std::wstring VtTMotionDataHeader::Decode(const std::byte* data, std::size_t size, std::uint64_t fileSize)
{
    if (size == 0)
        return L"the file is empty";
    if (size < magic.size() || std::memcmp(data, magic.data(), magic.size()) != 0)
        return L"this is no motion data file";
    if (size < bytes)
        return L"the file ends within its header";
    const std::byte* at = data + magic.size();
    Get(at, version);
    if (version != currentVersion)
        return L"the file has version " + std::to_wstring(version) + L", this program reads version " +
               std::to_wstring(currentVersion);
    Get(at, poseCount);
    Get(at, instrumentCount);
    Get(at, stride);
    Get(at, frameCount);
    Get(at, descriptionBytes);

    constexpr std::size_t most = VtTChannelDescription::maxChannels;
    if (poseCount > most || instrumentCount > most)
        return L"the header counts " + std::to_wstring(poseCount) + L" poses and " + std::to_wstring(instrumentCount) +
               L" instrument streams, more than " + std::to_wstring(most);
    const std::uint64_t expected = VtTChannelDescription::timeBytes +
                                   poseCount * std::uint64_t{VtTChannelDescription::poseBytes} +
                                   instrumentCount * std::uint64_t{VtTChannelDescription::instrumentBytes};
    if (stride != expected)
        return L"the header gives " + std::to_wstring(stride) + L" bytes for a frame, its channels take " +
               std::to_wstring(expected);
    if (descriptionBytes > maxDescriptionBytes)
        return L"the header gives " + std::to_wstring(descriptionBytes) + L" bytes for the description, more than " +
               std::to_wstring(maxDescriptionBytes);
    if (descriptionBytes > fileSize - bytes)
        return L"the file ends within its description";
    // Frame numbers end there. A count that is merely above what the file holds belongs to a file that was cut off.
    constexpr std::uint64_t mostFrames = std::numeric_limits<std::int32_t>::max();
    const std::uint64_t held = (fileSize - bytes - descriptionBytes) / stride;
    if (held > mostFrames || (frameCount > mostFrames && frameCount != unknownFrameCount))
        return L"the file counts more than " + std::to_wstring(mostFrames) + L" frames";
    return {};
}

std::string EncodeDescription(const VtTChannelDescription& channels)
{
    json object;
    json poses = json::array();
    for (const std::wstring& pose : channels.poses)
        poses.push_back(base::Utf8(pose));
    object["poses"] = std::move(poses);
    if (!channels.storedPoses.empty())
    {
        json stored = json::array();
        for (const std::wstring& pose : channels.storedPoses)
            stored.push_back(base::Utf8(pose));
        object["stored"] = std::move(stored);
    }
    json streams = json::array();
    for (const VtTInstrumentStream& stream : channels.instruments)
        streams.push_back({{"name", base::Utf8(stream.name)}, {"unit", base::Utf8(stream.unit)}});
    object["instruments"] = std::move(streams);
    object["trackSafety"] = static_cast<int>(channels.trackSafety);
    object["timeStamps"] = channels.timeStamps;

    std::string text = object.dump();
    text.append((8 - (VtTMotionDataHeader::bytes + text.size()) % 8) % 8, ' ');
    return text;
}

std::wstring DecodeDescription(std::string_view text, const VtTMotionDataHeader& header,
                               VtTChannelDescription& channels)
{
    try
    {
        const json object = json::parse(text.begin(), text.end(),
                                        [](int depth, json::parse_event_t, json&)
                                        {
                                            // What isn't built costs no memory: a text of brackets alone would cost a
                                            // hundred times its size.
                                            return depth <= maxDepth;
                                        });
        if (!object.is_object())
            return L"the description is no JSON object";
        Fill(channels, object);
    }
    catch (const json::exception& error)
    {
        return L"the description is no JSON text: " + base::Wide(error.what());
    }
    catch (const KeyError& error)
    {
        return L"the key \"" + base::Wide(error.key) + L"\" of the description must hold " + base::Wide(error.expected);
    }
    if (std::wstring fault = CountFault("poses", channels.poses.size(), header.poseCount); !fault.empty())
        return fault;
    if (std::wstring fault = CountFault("instrument streams", channels.instruments.size(), header.instrumentCount);
        !fault.empty())
        return fault;
    return channels.Fault();
}

} // namespace SimulationDataPoints

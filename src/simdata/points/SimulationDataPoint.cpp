#include "simdata/points/SimulationDataPoint.h"

#include <algorithm>
#include <limits>
#include <new>
#include <optional>
#include <utility>

#include "base/Text.h"
#include "simdata/points/LoadProgress.h"

namespace SimulationDataPoints
{

namespace
{

constexpr int messageUnsafe = 434;
constexpr int messageSafeWithWarning = 433;

VtILoadProgress* loadProgress = nullptr;

std::wstring Escaped(std::wstring text)
{
    return base::Replace(base::Replace(std::move(text), L"%", L"%25"), L"|", L"%7C");
}

std::wstring Unescaped(std::wstring text)
{
    return base::Replace(base::Replace(std::move(text), L"%7C", L"|"), L"%25", L"%");
}

} // namespace

VtCSimulationDataPoint::VtCSimulationDataPoint(std::wstring pointName) : name(std::move(pointName)) {}

VtCSimulationDataPoint::~VtCSimulationDataPoint() = default;

std::wstring VtCSimulationDataPoint::GetConfigurationInfoText(int) const
{
    std::wstring type;
    std::wstring path;
    GetSourceType(type);
    GetSourcePath(path);
    return Escaped(name) + L"|" + Escaped(type) + L"|" + path;
}

int VtCSimulationDataPoint::ExtractConfigurationInfoText(const std::wstring& text, std::wstring* kind,
                                                         std::wstring* type, std::wstring* source)
{
    const std::size_t first = text.find(L'|');
    const std::size_t second = first == std::wstring::npos ? first : text.find(L'|', first + 1);
    if (first == 0 || second == std::wstring::npos)
        return 0;
    if (kind != nullptr)
        *kind = Unescaped(text.substr(0, first));
    if (type != nullptr)
        *type = Unescaped(text.substr(first + 1, second - first - 1));
    if (source != nullptr)
        *source = text.substr(second + 1);
    return 1;
}

void VtCSimulationDataPoint::SetFrameBufferSize(unsigned long frames)
{
    bufferFrames = std::clamp<std::size_t>(frames, 1, std::numeric_limits<int>::max());
    if (!buffer || bufferLoaded || buffer->GetCapacity() == bufferFrames)
        return;
    try
    {
        const std::size_t before = static_cast<std::size_t>(buffer->GetCount());
        buffer = buffer->Copy(bufferFrames);
        const std::size_t lost = before - static_cast<std::size_t>(buffer->GetCount());
        cursor = cursor > lost ? cursor - lost : 0;
    }
    catch (const std::bad_alloc&)
    {
        messages.Add(VtEMessageSeverity::error,
                     name + L": no memory for a buffer of " + std::to_wstring(bufferFrames) + L" frames");
    }
}

int VtCSimulationDataPoint::GetFrameBufferSizeEx() const
{
    return static_cast<int>(buffer ? buffer->GetCapacity() : bufferFrames);
}

int VtCSimulationDataPoint::GetBufferedFrames(unsigned long& count) const
{
    count = buffer ? static_cast<unsigned long>(buffer->GetCount()) : 0;
    return count > 0;
}

int VtCSimulationDataPoint::GetTimestampsSupported() const
{
    return timeStamps;
}

void VtCSimulationDataPoint::SetTimestampSupport(int supported)
{
    timeStamps = supported != 0;
}

int VtCSimulationDataPoint::GetFrameBufferEarliestTime(double& t) const
{
    if (!timeEndless && (!buffer || buffer->GetCount() == 0 || !timeStamps))
        return 0;
    t = timeEndless ? 0.0 : buffer->GetTimeAt(0);
    return 1;
}

int VtCSimulationDataPoint::GetFrameBufferLatestTime(double& t) const
{
    if (!timeEndless && (!buffer || buffer->GetCount() == 0 || !timeStamps))
        return 0;
    t = timeEndless ? endlessTime : buffer->ComputeLatestTime();
    return 1;
}

int VtCSimulationDataPoint::SetFrameBufferRepeat(int newRepeat)
{
    repeat = newRepeat != 0;
    if (buffer)
        buffer->PrepareForTimeSyncReplay(repeat, 0);
    return 1;
}

void VtCSimulationDataPoint::SetSimulationTime(double t)
{
    simulationTime = t;
    simulationTimeKnown = true;
}

VtCSimulationDataFrames* VtCSimulationDataPoint::CopySimulationFrameBuffer() const
{
    if (!buffer)
        return nullptr;
    try
    {
        return buffer->Copy(static_cast<std::size_t>(buffer->GetCount())).release();
    }
    catch (const std::bad_alloc&)
    {
        return nullptr;
    }
}

VtCSimulationDataFrames* VtCSimulationDataPoint::RelinquishFrameBuffer()
{
    cursor = 0;
    return buffer.release();
}

TRACK_SAFETY VtCSimulationDataPoint::GetFrameBufferTrackSafety() const
{
    return buffer ? buffer->GetTrackSafety() : TRACK_UNSAFE;
}

void VtCSimulationDataPoint::SetLoadProgress(VtILoadProgress* progress)
{
    loadProgress = progress;
}

VtILoadProgress* VtCSimulationDataPoint::GetLoadProgress()
{
    return loadProgress;
}

int VtCSimulationDataPoint::GetChannelNames(std::wstring& names, int) const
{
    names.clear();
    if (!description)
        return 0;
    for (const std::wstring& pose : description->poses)
        names.append(names.empty() ? L"" : L"|").append(pose);
    return static_cast<int>(description->poses.size());
}

int VtCSimulationDataPoint::GetInstrumentChannelNames(std::vector<std::wstring>& names, int) const
{
    names.clear();
    if (description)
        for (const VtTInstrumentStream& stream : description->instruments)
            names.push_back(stream.name);
    return static_cast<int>(names.size());
}

std::vector<VtTInstrumentStream> VtCSimulationDataPoint::GetInstrumentStreams(int flag) const
{
    std::vector<std::wstring> names;
    GetInstrumentChannelNames(names, flag);
    std::vector<VtTInstrumentStream> streams;
    streams.reserve(names.size());
    for (std::wstring& streamName : names)
    {
        const std::size_t at = streams.size();
        const bool described =
            description && at < description->instruments.size() && description->instruments[at].name == streamName;
        streams.push_back({std::move(streamName), described ? description->instruments[at].unit : std::wstring()});
    }
    return streams;
}

void VtCSimulationDataPoint::GetBodyChannelNames(std::vector<std::wstring>& names, int) const
{
    names.clear();
    if (description)
        names = description->storedPoses.empty() ? description->poses : description->storedPoses;
}

TRACK_SAFETY VtCSimulationDataPoint::GetTrackSafety(int& messageId) const
{
    const TRACK_SAFETY safety = description ? description->trackSafety : TRACK_UNSAFE;
    messageId = safety == TRACK_UNSAFE ? messageUnsafe : safety == TRACK_SAFE ? 0 : messageSafeWithWarning;
    return safety;
}

void VtCSimulationDataPoint::Reset()
{
    Disconnect();
    DropBuffer();
    description.reset();
    streamMode = 1;
    timeStamps = true;
    simulationTimeKnown = false;
    messages.Reset();
}

void VtCSimulationDataPoint::SetDescription(std::shared_ptr<const VtTChannelDescription> channels)
{
    description = std::move(channels);
    if (description)
        timeStamps = description->timeStamps;
}

bool VtCSimulationDataPoint::StartBuffer()
{
    DropBuffer();
    const std::wstring fault = description ? description->Fault() : L"there is no channel";
    if (!fault.empty())
    {
        messages.Add(VtEMessageSeverity::error, name + L": " + fault);
        return false;
    }
    try
    {
        buffer = std::make_unique<VtCSimulationDataFrames>(description, bufferFrames);
    }
    catch (const std::bad_alloc&)
    {
        messages.Add(VtEMessageSeverity::error,
                     name + L": no memory for a buffer of " + std::to_wstring(bufferFrames) + L" frames");
        return false;
    }
    buffer->PrepareForTimeSyncReplay(repeat, 0);
    return true;
}

VtCFrameRecord VtCSimulationDataPoint::AppendFrame(double time)
{
    const VtCFrameRecord record = buffer->Append(time);
    cursor = static_cast<std::size_t>(buffer->GetCount()) - 1;
    return record;
}

void VtCSimulationDataPoint::TakeBuffer(std::unique_ptr<VtCSimulationDataFrames> loaded)
{
    buffer = std::move(loaded);
    bufferLoaded = true;
    cursor = 0;
    buffer->PrepareForTimeSyncReplay(repeat, 0);
}

void VtCSimulationDataPoint::DropBuffer()
{
    buffer.reset();
    bufferLoaded = false;
    cursor = 0;
}

} // namespace SimulationDataPoints

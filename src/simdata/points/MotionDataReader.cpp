#include "simdata/points/MotionDataReader.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "base/Text.h"
#include "simdata/points/LoadProgress.h"
#include "simdata/points/MotionDataFormat.h"
#include "simdata/points/SimulationDataFrames.h"

namespace SimulationDataPoints
{

namespace
{

constexpr std::size_t chunkBytes = 256 << 10;
constexpr std::uint64_t progressSteps = 100;

constexpr std::uint32_t floatExponent = 0x7F800000U;
constexpr std::uint64_t doubleExponent = 0x7FF0000000000000U;

using Lanes __attribute__((vector_size(16))) = std::uint32_t;

Lanes NotFiniteLanes(const std::byte* floats)
{
    Lanes bits;
    std::memcpy(&bits, floats, sizeof bits);
    return reinterpret_cast<Lanes>((bits & floatExponent) == floatExponent);
}

/// Not finite means that all bits of the exponent are set. Without branches, four floats at a time, since every byte
/// of a file passes through here.
bool ArePosesFinite(const std::byte* poses, const std::byte* end)
{
    Lanes bad = {};
    for (; poses < end; poses += VtTChannelDescription::poseBytes)
        bad |= NotFiniteLanes(poses) | NotFiniteLanes(poses + 16) | NotFiniteLanes(poses + 32) |
               NotFiniteLanes(poses + 48);
    return (bad[0] | bad[1] | bad[2] | bad[3]) == 0;
}

bool IsValueFinite(const std::byte* value)
{
    std::uint64_t bits = 0;
    std::memcpy(&bits, value, sizeof bits);
    return (bits & doubleExponent) != doubleExponent;
}

bool IsRecordFinite(const std::byte* record, const VtTChannelDescription& channels)
{
    const std::byte* const poses = record + VtTChannelDescription::timeBytes;
    const std::byte* const values = poses + channels.poses.size() * VtTChannelDescription::poseBytes;
    const std::byte* const end = values + channels.instruments.size() * VtTChannelDescription::instrumentBytes;
    bool finite = ArePosesFinite(poses, values);
    for (const std::byte* value = values; value < end; value += VtTChannelDescription::instrumentBytes)
        finite &= IsValueFinite(value);
    return finite;
}

/// A file can be sparse and claim more than the machine could ever hold.
bool FitsIntoMemory(std::uint64_t bytes)
{
    const long pages = sysconf(_SC_PHYS_PAGES);
    const long pageBytes = sysconf(_SC_PAGESIZE);
    return pages <= 0 || pageBytes <= 0 || bytes / static_cast<std::uint64_t>(pageBytes) < std::uint64_t(pages);
}

} // namespace

VtCMotionDataReader::VtCMotionDataReader(std::filesystem::path where) : path(std::move(where)) {}

VtCMotionDataReader::~VtCMotionDataReader()
{
    if (file >= 0)
        close(file);
}

bool VtCMotionDataReader::Fail(const std::wstring& reason)
{
    error = base::Wide(path.string()) + L": " + reason;
    return false;
}

bool VtCMotionDataReader::FailBySystem()
{
    return Fail(base::Wide(std::strerror(errno)));
}

bool VtCMotionDataReader::Open()
{
    // A named pipe without a writer would block; data come from plain files only.
    file = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    struct stat status = {};
    if (file < 0 || fstat(file, &status) != 0)
        return FailBySystem();
    if (!S_ISREG(status.st_mode))
        return Fail(L"this is no file");
    fileBytes = static_cast<std::uint64_t>(status.st_size);

    std::array<std::byte, VtTMotionDataHeader::bytes> start;
    const std::size_t got = ReadBytes(start.data(), start.size());
    if (!error.empty())
        return false;
    VtTMotionDataHeader header;
    if (const std::wstring fault = header.Decode(start.data(), got, fileBytes); !fault.empty())
        return Fail(fault);

    std::string json(header.descriptionBytes, '\0');
    if (ReadBytes(reinterpret_cast<std::byte*>(json.data()), json.size()) != json.size())
        return error.empty() ? Fail(L"the file ends within its description") : false;
    auto channels = std::make_shared<VtTChannelDescription>();
    if (const std::wstring fault = DecodeDescription(json, header, *channels); !fault.empty())
        return Fail(fault);
    description = std::move(channels);

    stride = header.stride;
    const std::uint64_t bytes = fileBytes - VtTMotionDataHeader::bytes - header.descriptionBytes;
    const std::uint64_t held = bytes / stride;
    unfinished = header.frameCount == VtTMotionDataHeader::unknownFrameCount;
    damage.framesExpected = unfinished ? 0 : header.frameCount;
    damage.framesWhole = unfinished ? held : std::min(held, header.frameCount);
    if (!unfinished && held >= header.frameCount)
        damage.excessBytes = bytes - header.frameCount * stride;
    else
        damage.partialBytes = bytes % stride;
    framesLeft = damage.framesWhole;
    return true;
}

std::size_t VtCMotionDataReader::GetChunkFrames() const
{
    return std::max<std::size_t>(chunkBytes / stride, 1);
}

std::size_t VtCMotionDataReader::ReadBytes(std::byte* into, std::size_t size)
{
    std::size_t done = 0;
    while (done < size)
    {
        const ssize_t got = read(file, into + done, size - done);
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0)
        {
            FailBySystem();
            break;
        }
        if (got == 0)
            break;
        done += static_cast<std::size_t>(got);
    }
    return done;
}

std::size_t VtCMotionDataReader::ReadRecords(std::byte* into, std::size_t frames)
{
    frames = static_cast<std::size_t>(std::min<std::uint64_t>(frames, framesLeft));
    if (frames == 0 || !error.empty())
        return 0;
    const std::size_t got = ReadBytes(into, frames * stride);
    if (!error.empty())
        return 0;
    if (got < frames * stride)
    {
        // Cut off since it was opened: what is gone counts as damage like any other cut.
        damage.framesExpected = std::max(damage.framesExpected, damage.framesWhole);
        damage.framesWhole = framesRead + got / stride;
        damage.partialBytes = got % stride;
        frames = got / stride;
        framesLeft = frames;
    }
    framesLeft -= frames;

    const std::size_t good = CheckRecords(into, frames);
    if (good < frames)
    {
        damage.framesOutOfOrder = frames - good + framesLeft;
        framesLeft = 0;
    }
    if (good > 0)
        lastRecord.assign(into + (good - 1) * stride, into + good * stride);
    return good;
}

std::size_t VtCMotionDataReader::CheckRecords(std::byte* first, std::size_t frames)
{
    const std::byte* before = lastRecord.empty() ? nullptr : lastRecord.data();
    for (std::size_t index = 0; index < frames; ++index)
    {
        std::byte* const record = first + index * stride;
        if (!CheckTime(record))
            return index;
        ++framesRead;
        if (!IsRecordFinite(record, *description))
            RepairRecord(record, before);
        before = record;
    }
    return frames;
}

bool VtCMotionDataReader::CheckTime(std::byte* record)
{
    double time = 0.0;
    std::memcpy(&time, record, sizeof time);
    if (!description->timeStamps)
        time = 0.0;
    const double rounded = VtCSimulationDataFrame::RoundTimeStamp(time);
    if (!std::isfinite(rounded) || (framesRead > 0 && rounded < lastTime))
    {
        damage.decreaseFrame = framesRead + 1;
        damage.timeBefore = framesRead > 0 ? lastTime : 0.0;
        damage.timeAfter = time;
        return false;
    }
    lastTime = rounded;
    std::memcpy(record, &rounded, sizeof rounded);
    return true;
}

void VtCMotionDataReader::RepairRecord(std::byte* record, const std::byte* before)
{
    static constexpr float identity[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
    for (std::size_t pose = 0; pose < description->poses.size(); ++pose)
    {
        const std::size_t offset = description->PoseOffset(pose);
        if (ArePosesFinite(record + offset, record + offset + VtTChannelDescription::poseBytes))
            continue;
        ++damage.nonFinitePoses;
        NameNonFinite(description->poses[pose]);
        const void* good = before != nullptr ? static_cast<const void*>(before + offset) : identity;
        std::memcpy(record + offset, good, VtTChannelDescription::poseBytes);
    }
    for (std::size_t stream = 0; stream < description->instruments.size(); ++stream)
        if (!IsValueFinite(record + description->InstrumentOffset(stream)))
        {
            ++damage.nonFiniteValues;
            NameNonFinite(description->instruments[stream].name);
        }
}

void VtCMotionDataReader::NameNonFinite(const std::wstring& channel)
{
    if (damage.nonFinite.size() < VtTMotionDataDamage::maxNamed)
        damage.nonFinite.push_back({framesRead, channel});
}

std::unique_ptr<VtCSimulationDataFrames> VtCMotionDataReader::LoadFrames(VtILoadProgress* progress, long activity)
{
    const std::uint64_t total = framesLeft;
    if (total == 0)
    {
        Fail(damage.partialBytes > 0 ? L"the file ends within its first frame" : L"the file holds no frame");
        return nullptr;
    }
    std::unique_ptr<VtCSimulationDataFrames> frames;
    if (FitsIntoMemory(total * (stride + sizeof(double))))
        try
        {
            frames = std::make_unique<VtCSimulationDataFrames>(description, static_cast<std::size_t>(total));
        }
        catch (const std::bad_alloc&) // told below, with the other way to have too little memory
        {
        }
    if (!frames)
    {
        Fail(L"no memory for " + std::to_wstring(total) + L" frames of " + std::to_wstring(stride) + L" bytes");
        return nullptr;
    }

    std::uint64_t toldStep = 0;
    const std::size_t chunk = GetChunkFrames();
    while (const std::size_t got = ReadRecords(frames->FreeRecords(), chunk))
    {
        for (std::size_t index = 0; index < got; ++index)
        {
            double time = 0.0;
            std::memcpy(&time, frames->FreeRecords(), sizeof time);
            frames->TakeRecord(time);
        }
        const std::uint64_t step = framesRead * progressSteps / total;
        if (progress != nullptr && step > toldStep && framesRead < total)
        {
            progress->OnLoadProgress(activity, framesRead, total);
            toldStep = step;
        }
    }
    if (!error.empty())
        return nullptr;
    if (frames->GetCount() == 0)
    {
        Fail(L"no frame has a usable time stamp");
        return nullptr;
    }
    if (progress != nullptr)
        progress->OnLoadProgress(activity, total, total);
    return frames;
}

} // namespace SimulationDataPoints

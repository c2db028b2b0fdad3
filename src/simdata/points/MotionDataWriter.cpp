#include "simdata/points/MotionDataWriter.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

#include "base/AtomicFile.h"
#include "base/Text.h"
#include "simdata/points/ChannelDescription.h"
#include "simdata/points/MotionDataFormat.h"

namespace SimulationDataPoints
{

namespace
{
constexpr std::size_t pendingBytes = 1 << 20;
}

VtCMotionDataWriter::VtCMotionDataWriter(std::filesystem::path where, Manner how) : path(std::move(where)), manner(how)
{
}

VtCMotionDataWriter::~VtCMotionDataWriter()
{
    if (file >= 0)
        FinishGrowing();
}

bool VtCMotionDataWriter::Fail(const std::wstring& reason)
{
    if (error.empty())
        error = base::Wide(path.string()) + L": " + reason;
    return false;
}

bool VtCMotionDataWriter::FailBySystem()
{
    return Fail(base::Wide(std::strerror(errno)));
}

bool VtCMotionDataWriter::Open()
{
    if (manner == Manner::whole)
    {
        atomic = std::make_unique<base::AtomicFile>(path);
        error = base::Wide(atomic->Error());
        return error.empty();
    }
    file = open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    made = file >= 0;
    if (!made && errno == EEXIST)
        file = open(path.c_str(), O_WRONLY | O_CLOEXEC);
    return file >= 0 || FailBySystem();
}

bool VtCMotionDataWriter::Begin(const VtTChannelDescription& channels)
{
    if (!error.empty() || HasBegun())
        return false;
    if (const std::wstring fault = channels.Fault(); !fault.empty())
        return Fail(fault);
    const std::string json = EncodeDescription(channels);
    VtTMotionDataHeader header;
    header.poseCount = static_cast<std::uint32_t>(channels.poses.size());
    header.instrumentCount = static_cast<std::uint32_t>(channels.instruments.size());
    header.stride = static_cast<std::uint32_t>(channels.Stride());
    header.descriptionBytes = static_cast<std::uint32_t>(json.size());
    if (json.size() > VtTMotionDataHeader::maxDescriptionBytes)
        return Fail(L"the channel names take more than " + std::to_wstring(VtTMotionDataHeader::maxDescriptionBytes) +
                    L" bytes");
    if (file >= 0 && ftruncate(file, 0) != 0)
        return FailBySystem();
    stride = channels.Stride();
    const auto start = header.Encode();
    std::string both(reinterpret_cast<const char*>(start.data()), start.size());
    both += json;
    return Put(both.data(), both.size());
}

bool VtCMotionDataWriter::Write(const std::byte* record)
{
    if (!HasBegun() || !Put(record, stride))
        return false;
    ++frameCount;
    return true;
}

bool VtCMotionDataWriter::Put(const void* data, std::size_t size)
{
    if (!error.empty())
        return false;
    if (atomic)
    {
        const auto* bytes = static_cast<const std::byte*>(data);
        pending.insert(pending.end(), bytes, bytes + size);
        return pending.size() < pendingBytes || Flush();
    }
    const char* rest = static_cast<const char*>(data);
    std::size_t left = size;
    while (left > 0)
    {
        const ssize_t written = write(file, rest, left);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return FailBySystem();
        rest += written;
        left -= static_cast<std::size_t>(written);
    }
    wholeBytes += size;
    return true;
}

bool VtCMotionDataWriter::Flush()
{
    if (!atomic->Write(pending.data(), pending.size()))
        error = base::Wide(atomic->Error());
    pending.clear();
    return error.empty();
}

bool VtCMotionDataWriter::Finish()
{
    if (!atomic)
        return FinishGrowing();
    if (HasBegun() && error.empty() && Flush() &&
        !(atomic->WriteAt(VtTMotionDataHeader::frameCountOffset, &frameCount, sizeof frameCount) && atomic->Commit()))
        error = base::Wide(atomic->Error());
    atomic.reset();
    return HasBegun() && error.empty();
}

bool VtCMotionDataWriter::FinishGrowing()
{
    if (file < 0)
        return false;
    if (wholeBytes > 0)
    {
        // After a failure too: the frames that got through are worth keeping, the torn end of one isn't.
        if (!error.empty() && ftruncate(file, static_cast<off_t>(wholeBytes)) != 0)
            FailBySystem();
        const auto at = static_cast<off_t>(VtTMotionDataHeader::frameCountOffset);
        if (pwrite(file, &frameCount, sizeof frameCount, at) != static_cast<ssize_t>(sizeof frameCount))
            FailBySystem();
    }
    else if (made)
        unlink(path.c_str());
    if (close(std::exchange(file, -1)) != 0)
        FailBySystem();
    return HasBegun() && error.empty();
}

} // namespace SimulationDataPoints

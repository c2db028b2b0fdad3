#include "file/SimulationDataPointFile.h"

#include <algorithm>
#include <new>
#include <optional>
#include <utility>

#include "base/Paths.h"
#include "base/Text.h"
#include "simdata/points/ExportFactory.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/MotionDataWriter.h"
#include "simdata/points/SimulationDataTracker.h"

namespace SimulationDataPoints
{

namespace
{
constexpr wchar_t sourceType[] = L"MDF";
constexpr int modeRead = 1;
constexpr int modeWrite = 2;
} // namespace

VtCSimulationDataPointFile::VtCSimulationDataPointFile() : VtCSimulationDataPoint(L"File") {}

VtCSimulationDataPointFile::~VtCSimulationDataPointFile() = default;

void VtCSimulationDataPointFile::Disconnect()
{
    connected = false;
    ForgetSimulationTime();
    if (!writer)
        return;
    if (!writer->Finish() && !writer->GetError().empty())
        Messages().Add(VtEMessageSeverity::error, writer->GetError());
    writer.reset();
}

int VtCSimulationDataPointFile::Connect()
{
    Disconnect();
    if (use == Use::none)
    {
        Messages().Add(VtEMessageSeverity::error, GetName() + L": no file is configured");
        return 0;
    }
    if (use == Use::writing)
    {
        writer = std::make_unique<VtCMotionDataWriter>(File(), growing ? VtCMotionDataWriter::Manner::growing
                                                                       : VtCMotionDataWriter::Manner::whole);
        mismatchTold = false;
        connected = writer->Open();
        if (!connected)
        {
            Messages().Add(VtEMessageSeverity::error, writer->GetError());
            writer.reset();
        }
        return connected;
    }
    unsigned long count = 0;
    connected = GetInitialStreamMode() == 0 ? LookAtFile(sourcePath) : GetBufferedFrames(count) || LoadFile(sourcePath);
    startOver = true;
    return connected;
}

void VtCSimulationDataPointFile::GetSourceType(std::wstring& type) const
{
    type = use == Use::none ? L"" : sourceType;
}

void VtCSimulationDataPointFile::GetSourcePath(std::wstring& path) const
{
    path = sourcePath;
}

int VtCSimulationDataPointFile::Configure(const std::wstring& type, const std::wstring& path, int mode, int)
{
    const int direction = mode & 0xFFFF;
    if (!base::EqualsNoCase(type, sourceType) || path.empty() || (direction != modeRead && direction != modeWrite))
    {
        Messages().Add(VtEMessageSeverity::error,
                       GetName() + L": this is no motion data file to read or write: \"" + path + L"\"");
        return 0;
    }
    const std::wstring wanted = base::InnerPath(base::NativePath(path));
    if (direction == modeWrite)
    {
        // The buffer stays: a track stores the frames it got from this very point.
        Disconnect();
        use = Use::writing;
        growing = (static_cast<unsigned>(mode) >> 16) == 0;
    }
    else
    {
        // Read first: a file that can't be used leaves what is there as it was.
        const bool lookOnly = GetInitialStreamMode() == 0;
        if (!(lookOnly ? LookAtFile(wanted) : LoadFile(wanted)))
            return 0;
        if (lookOnly)
            DropBuffer();
        Disconnect();
        use = Use::reading;
    }
    sourcePath = wanted;
    return 1;
}

// The channels alone.
int VtCSimulationDataPointFile::LookAtFile(const std::wstring& path)
{
    VtCMotionDataReader reader(base::NativePath(path));
    if (!reader.Open())
        return FailReading(reader);
    SetDescription(reader.GetDescription());
    return 1;
}

int VtCSimulationDataPointFile::LoadFile(const std::wstring& path)
{
    VtCMotionDataReader reader(base::NativePath(path));
    if (!reader.Open())
        return FailReading(reader);
    const long activity = GetProgressBarActivityID();
    std::unique_ptr<VtCSimulationDataFrames> frames =
        reader.LoadFrames(activity >= 0 ? GetLoadProgress() : nullptr, activity);
    if (!frames)
        return FailReading(reader);
    SetDescription(reader.GetDescription());
    TakeBuffer(std::move(frames));
    for (const std::wstring& damage : reader.GetDamage().Texts())
        Messages().Add(VtEMessageSeverity::warning, base::Wide(base::NativePath(path).string()) + L": " + damage);
    return 1;
}

int VtCSimulationDataPointFile::FailReading(const VtCMotionDataReader& reader)
{
    Messages().Add(VtEMessageSeverity::error, reader.GetError());
    return 0;
}

std::filesystem::path VtCSimulationDataPointFile::File() const
{
    return base::NativePath(sourcePath);
}

int VtCSimulationDataPointFile::FetchOnce()
{
    return use == Use::reading ? LoadFile(sourcePath) : 0;
}

VtCSimulationDataFrame* VtCSimulationDataPointFile::GetCurrentFrame(unsigned long& frame)
{
    unsigned long count = 0;
    if (!connected || use != Use::reading || !GetBufferedFrames(count))
        return nullptr;
    if (!GetTimestampsSupported())
    {
        VtCSimulationDataFrame* next = startOver ? nullptr : GetNextFrame(frame);
        startOver = false;
        return next != nullptr ? next : MoveTo(0, frame);
    }
    const double* time = GetSimulationTime();
    if (time == nullptr)
        return MoveTo(0, frame);
    // The clock counts whole milliseconds, so it may stand a little beyond either end.
    const std::optional<std::size_t> index = GetBuffer()->FindAtTime(*time);
    return MoveTo(index ? *index : *time < GetBuffer()->GetTimeAt(0) ? 0 : count - 1, frame);
}

VtTChannelDescription VtCSimulationDataPointFile::ChannelsToWrite(const VtTChannelDescription& ofFrame) const
{
    VtTChannelDescription channels = ofFrame;
    channels.trackSafety = writeSafety;
    channels.timeStamps = channels.timeStamps && GetTimestampsSupported();
    if (!writePoses.empty())
    {
        channels.poses = writePoses;
        channels.storedPoses.clear();
    }
    if (!writeStoredPoses.empty() && writeStoredPoses != channels.poses)
        channels.storedPoses = writeStoredPoses;
    if (!writeInstruments.empty())
    {
        channels.instruments.clear();
        for (const std::wstring& wanted : writeInstruments)
        {
            const auto known =
                std::find_if(ofFrame.instruments.begin(), ofFrame.instruments.end(),
                             [&](const auto& stream) { return base::EqualsNoCase(stream.name, wanted); });
            channels.instruments.push_back({wanted, known == ofFrame.instruments.end() ? L"" : known->unit});
        }
    }
    return channels;
}

bool VtCSimulationDataPointFile::BeginWriting(const VtCSimulationDataFrame& frame)
{
    const VtTChannelDescription& ofFrame = frame.GetDescription();
    const VtTChannelDescription channels = ChannelsToWrite(ofFrame);
    if (channels.poses.size() != ofFrame.poses.size() || channels.instruments.size() != ofFrame.instruments.size())
    {
        if (!std::exchange(mismatchTold, true))
            Messages().Add(VtEMessageSeverity::error, base::Wide(File().string()) + L": the frames have " +
                                                          std::to_wstring(ofFrame.poses.size()) + L" poses and " +
                                                          std::to_wstring(ofFrame.instruments.size()) +
                                                          L" instrument streams, the names given are for " +
                                                          std::to_wstring(channels.poses.size()) + L" and " +
                                                          std::to_wstring(channels.instruments.size()));
        return false;
    }
    return writer->Begin(channels);
}

void VtCSimulationDataPointFile::WriteFrames(VtCSimulationDataTracker& frames)
{
    VtCSimulationDataTracker::VtPosition position = frames.GetHeadPosition();
    while (const VtCSimulationDataFrame* frame = frames.GetNext(position))
        if (!WriteFrame(*frame))
            return;
}

bool VtCSimulationDataPointFile::WriteFrame(const VtCSimulationDataFrame& frame)
{
    if (!writer || !writer->GetError().empty())
        return false;
    const VtTChannelDescription& channels = frame.GetDescription();
    if (!writer->HasBegun())
    {
        writePoseCount = channels.poses.size();
        writeInstrumentCount = channels.instruments.size();
        if (!BeginWriting(frame))
            return false;
    }
    if (channels.poses.size() != writePoseCount || channels.instruments.size() != writeInstrumentCount)
    {
        if (!std::exchange(mismatchTold, true))
            Messages().Add(VtEMessageSeverity::error,
                           base::Wide(File().string()) + L": a frame with other channels than the first was left out");
        return false;
    }
    return writer->Write(frame.GetRecord());
}

void VtCSimulationDataPointFile::Reset()
{
    VtCSimulationDataPoint::Reset();
    use = Use::none;
    sourcePath.clear();
    writePoses.clear();
    writeStoredPoses.clear();
    writeInstruments.clear();
    writeSafety = TRACK_SAFE;
}

} // namespace SimulationDataPoints

SIMULATION_DATA_POINT_FACTORY
{
    return new (std::nothrow) SimulationDataPoints::VtCSimulationDataPointFile;
}

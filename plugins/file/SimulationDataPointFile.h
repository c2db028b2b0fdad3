#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "simdata/points/SimulationDataPoint.h"

namespace SimulationDataPoints
{

class VtCMotionDataReader;
class VtCMotionDataWriter;

/// The point "File": replays a motion data file, or writes one.
///
/// Reading: `Configure` opens the file, and with the initial stream mode 1 loads all its frames, so that they can be
/// walked offline; a file that can't be used leaves the one before it in place. `Connect` loads what isn't there yet,
/// and with the mode 0 only looks at the header. `FetchOnce` reads the file again, with what has been added to it.
/// Online a file with time stamps plays by the simulation time, held at its ends; one without gives its frames one
/// after another, round and round.
///
/// Writing: `Configure` with a writing mode, `Connect`, `WriteFrames`, `Disconnect`. Channels come from the `Set...`
/// operations; what these leave out (always the units) comes from the first frame. See `MotionDataWriteMode` for the
/// two ways in which the file appears.
class VtCSimulationDataPointFile : public VtCSimulationDataPoint
{
public:
    VtCSimulationDataPointFile();
    ~VtCSimulationDataPointFile() override;

    void Disconnect() override;
    int Connect() override;
    void GetSourceType(std::wstring& type) const override;
    void GetSourcePath(std::wstring& path) const override;
    int Configure(const std::wstring& type, const std::wstring& path, int mode, int flags) override;
    int CanRefresh() const override { return use == Use::reading; }
    int CanPreload() const override { return use == Use::reading; }
    int FetchOnce() override;
    void WriteFrames(VtCSimulationDataTracker& frames) override;
    VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) override;
    void SetChannelNames(const std::vector<std::wstring>& names) override { writePoses = names; }
    void SetInstrumentChannelNames(const std::vector<std::wstring>& names) override { writeInstruments = names; }
    void SetBodyChannelNames(const std::vector<std::wstring>& names) override { writeStoredPoses = names; }
    int IsTimeDriven() const override { return use == Use::reading && GetTimestampsSupported(); }
    void SetTrackSafety(TRACK_SAFETY safety) override { writeSafety = safety; }
    void Reset() override;

private:
    enum class Use
    {
        none,
        reading,
        writing,
    };

    int LookAtFile(const std::wstring& path);
    int LoadFile(const std::wstring& path);
    int FailReading(const VtCMotionDataReader& reader);
    VtTChannelDescription ChannelsToWrite(const VtTChannelDescription& ofFrame) const;
    bool BeginWriting(const VtCSimulationDataFrame& frame);
    bool WriteFrame(const VtCSimulationDataFrame& frame);
    std::filesystem::path File() const;

    Use use = Use::none;
    std::wstring sourcePath; ///< in the backslash form
    bool connected = false;
    bool startOver = true;          ///< online without time stamps: the next frame is the first
    bool growing = false;           ///< of a file to write
    bool mismatchTold = false;      ///< frames of another layout were refused
    std::size_t writePoseCount = 0; ///< of the first frame, which all others must have
    std::size_t writeInstrumentCount = 0;
    std::unique_ptr<VtCMotionDataWriter> writer;
    std::vector<std::wstring> writePoses;
    std::vector<std::wstring> writeStoredPoses;
    std::vector<std::wstring> writeInstruments;
    TRACK_SAFETY writeSafety = TRACK_SAFE;
};

} // namespace SimulationDataPoints

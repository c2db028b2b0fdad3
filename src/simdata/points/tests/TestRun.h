#pragma once

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <stdexcept>
#include <stdlib.h>
#include <string>
#include <utility>
#include <vector>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/MotionDataWriter.h"
#include "simdata/points/SimulationDataFrames.h"

namespace SimulationDataPoints
{

/// A folder of the test's own, gone with it.
class TestFolder
{
public:
    TestFolder()
    {
        std::string name = (std::filesystem::temp_directory_path() / "points.XXXXXX").string();
        if (mkdtemp(name.data()) == nullptr)
            throw std::runtime_error("no folder for the test");
        path = name;
    }
    ~TestFolder() { std::filesystem::remove_all(path); }
    TestFolder(const TestFolder&) = delete;
    TestFolder& operator=(const TestFolder&) = delete;

    std::filesystem::path operator/(const char* name) const { return path / name; }

    std::filesystem::path path;
};

inline std::string ReadAll(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

inline void WriteAll(const std::filesystem::path& path, const std::string& bytes)
{
    std::ofstream(path, std::ios::binary) << bytes;
}

inline std::shared_ptr<VtTChannelDescription> CarChannels()
{
    auto channels = std::make_shared<VtTChannelDescription>();
    channels->poses = {L"Chassis", L"Wheel FL"};
    channels->instruments = {{L"speed", L"km/h"}};
    return channels;
}

/// One stream whose value is the frame's number from 1, at the given times.
inline std::unique_ptr<VtCSimulationDataFrames> FramesAt(const std::vector<double>& times, std::size_t capacity = 0)
{
    auto channels = std::make_shared<VtTChannelDescription>();
    channels->instruments = {{L"number", L""}};
    auto frames = std::make_unique<VtCSimulationDataFrames>(channels, capacity == 0 ? times.size() : capacity);
    double number = 0.0;
    for (const double time : times)
        frames->Append(time).SetInstrument(0, ++number);
    return frames;
}

/// What `FramesAt` put in, read back through the interface; 0 for no frame.
inline int NumberIn(VtCSimulationDataFrame* frame)
{
    VtTInstrumentVariant value;
    return frame != nullptr && frame->GetSimulationData(0)->getInstrumentValue(value) ? static_cast<int>(value.value)
                                                                                      : 0;
}

/// Frames of `CarChannels`, 10 ms apart: the chassis at x = frame, the wheel at z = -frame, speed = 100 + frame.
inline void FillCar(VtCSimulationDataFrames& frames, int count)
{
    for (int i = 0; i < count; ++i)
    {
        float m[4][4] = {{1, 0, 0, static_cast<float>(i)}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}};
        VtCFrameRecord record = frames.Append(0.01 * i);
        record.SetPose(0, m);
        std::swap(m[0][3], m[2][3]);
        m[2][3] = -m[2][3];
        record.SetPose(1, m);
        record.SetInstrument(0, 100.0 + i);
    }
}

/// A whole file of such frames.
inline void WriteCar(const std::filesystem::path& path, int count)
{
    const auto channels = CarChannels();
    VtCSimulationDataFrames frames(channels, static_cast<std::size_t>(count));
    FillCar(frames, count);
    VtCMotionDataWriter writer(path, VtCMotionDataWriter::Manner::whole);
    bool written = writer.Open() && writer.Begin(*channels);
    for (int i = 0; i < count; ++i)
        written = written && writer.Write(frames.GetFrame(static_cast<std::size_t>(i))->GetRecord());
    if (!written || !writer.Finish())
        throw std::runtime_error("the test's file can't be written");
}

} // namespace SimulationDataPoints

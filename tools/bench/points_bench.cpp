// The data point library: finding a frame by time, and loading a file.
#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <random>
#include <stdexcept>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <benchmark/benchmark.h>

#include "simdata/points/FrameBlock.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/MotionDataWriter.h"
#include "simdata/points/SimulationDataFrames.h"

using namespace SimulationDataPoints;

namespace
{

/// Five poses and six streams, as a car with four wheels has them.
std::shared_ptr<VtTChannelDescription> CarChannels()
{
    auto channels = std::make_shared<VtTChannelDescription>();
    channels->poses = {L"Chassis", L"Wheel FL", L"Wheel FR", L"Wheel RL", L"Wheel RR"};
    for (const wchar_t* name : {L"speed", L"engine", L"steering", L"acceleration", L"gear", L"brake"})
        channels->instruments.push_back({name, L""});
    return channels;
}

/// Random times in a buffer of so many frames, 10 ms apart; with `jitter`, each up to 40% of that off.
void GetAtTime(benchmark::State& state, int frameCount, bool jitter)
{
    std::mt19937 random(1);
    std::uniform_real_distribution<double> off(-0.004, 0.004);
    VtCSimulationDataFrames frames(CarChannels(), static_cast<std::size_t>(frameCount));
    for (int i = 0; i < frameCount; ++i)
        frames.Append(0.01 * i + (jitter ? off(random) : 0.0));
    frames.PrepareForTimeSyncReplay(0, 0);

    std::uniform_real_distribution<double> anywhere(0.0, 0.01 * (frameCount - 2));
    std::vector<double> times(1 << 16);
    std::generate(times.begin(), times.end(), [&] { return anywhere(random); });
    std::size_t next = 0;
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(frames.GetAtTime(times[next], 0));
        next = (next + 1) % times.size();
    }
}

constexpr std::size_t fileBytes = 200'000'000;

/// A file of 200 MB, removed at the end.
class LargeFile
{
public:
    LargeFile()
        : path(std::filesystem::temp_directory_path() / ("panoramic_bench." + std::to_string(getpid()) + ".mdf"))
    {
        const auto channels = CarChannels();
        VtCSimulationDataFrames frames(channels, 1);
        VtCMotionDataWriter writer(path, VtCMotionDataWriter::Manner::whole);
        bool written = writer.Open() && writer.Begin(*channels);
        for (std::size_t i = 0; i < fileBytes / channels->Stride(); ++i)
        {
            frames.Append(0.01 * static_cast<double>(i));
            written = written && writer.Write(frames.GetFrame(0)->GetRecord());
        }
        if (!written || !writer.Finish())
            throw std::runtime_error("no room for the file to load");
    }
    ~LargeFile() { std::filesystem::remove(path); }
    LargeFile(const LargeFile&) = delete;
    LargeFile& operator=(const LargeFile&) = delete;

    const std::filesystem::path path;
};

const std::filesystem::path& TheLargeFile()
{
    static const LargeFile file;
    return file.path;
}

void LoadMdf(benchmark::State& state)
{
    const std::filesystem::path& path = TheLargeFile();
    for (auto _ : state)
    {
        VtCMotionDataReader reader(path);
        const auto frames = reader.Open() ? reader.LoadFrames(nullptr, -1) : nullptr;
        if (!frames)
            state.SkipWithError("the file can't be loaded");
        benchmark::DoNotOptimize(frames.get());
    }
}

/// `read` of all bytes into fresh memory of the kind that frame buffers have. Into malloc'd memory it takes several
/// times as long, since that comes in small pages.
void ReadBytes(benchmark::State& state)
{
    const std::filesystem::path& path = TheLargeFile();
    const std::size_t size = std::filesystem::file_size(path);
    for (auto _ : state)
    {
        const VtCFrameBlock memory(size);
        const int file = open(path.c_str(), O_RDONLY);
        std::size_t done = 0;
        for (ssize_t got = 1; got > 0 && done < size; done += static_cast<std::size_t>(std::max<ssize_t>(got, 0)))
            got = read(file, memory.Data() + done, size - done);
        close(file);
        if (done != size)
            state.SkipWithError("the file can't be read");
        benchmark::DoNotOptimize(memory.Data());
    }
}

BENCHMARK_CAPTURE(GetAtTime, million, 1'000'000, false)->Name("get_at_time/subject");
BENCHMARK_CAPTURE(GetAtTime, thousand, 1'000, false)->Name("get_at_time/baseline");
BENCHMARK_CAPTURE(GetAtTime, uneven_million, 1'000'000, true)->Name("get_at_time_uneven/subject");
BENCHMARK_CAPTURE(GetAtTime, uneven_thousand, 1'000, true)->Name("get_at_time_uneven/baseline");
BENCHMARK(LoadMdf)->Name("load_mdf/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(ReadBytes)->Name("load_mdf/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();

} // namespace

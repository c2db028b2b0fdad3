#include <dlfcn.h>
#include <filesystem>
#include <fstream>
#include <memory>
#include <stdlib.h>
#include <string>

#include <gtest/gtest.h>

#include "base/Paths.h"
#include "base/Text.h"
#include "simdata/points/ExportFactory.h"
#include "simdata/points/LoadProgress.h"
#include "simdata/points/MotionDataInfo.h"
#include "simdata/points/SimulationDataPoint.h"
#include "simdata/points/SimulationDataTracker.h"

using namespace SimulationDataPoints;

namespace
{

/// The module as a program loads it, from plugins/ beside the test; and a folder of its own.
class FilePoint : public testing::Test
{
protected:
    void SetUp() override
    {
        const auto beside = std::filesystem::read_symlink("/proc/self/exe").parent_path();
        module = dlopen((beside / "plugins/SimulationDataPointFileU.so").c_str(), RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(module, nullptr) << dlerror();
        factory = reinterpret_cast<FactoryFunction>(dlsym(module, factoryName));
        ASSERT_NE(factory, nullptr);
        std::string name = (std::filesystem::temp_directory_path() / "filepoint.XXXXXX").string();
        ASSERT_NE(mkdtemp(name.data()), nullptr);
        folder = name;
        point = Make();
    }

    void TearDown() override
    {
        VtCSimulationDataPoint::SetLoadProgress(nullptr);
        point.reset();
        std::filesystem::remove_all(folder);
        dlclose(module);
    }

    struct Released
    {
        void operator()(VtCSimulationDataPoint* gone) const
        {
            gone->Release();
            delete gone;
        }
    };
    using Point = std::unique_ptr<VtCSimulationDataPoint, Released>;

    Point Make() const
    {
        Point made(factory());
        made->SetKind(1);
        return made;
    }

    std::wstring Path(const char* name) const { return base::InnerPath(folder / name); }

    /// Frames 0.5 s apart with the pose "Car" at x = number and the stream "speed" of the number, from 1.
    static std::unique_ptr<VtCSimulationDataFrames> Run(int count, bool timeStamps = true)
    {
        auto channels = std::make_shared<VtTChannelDescription>();
        channels->poses = {L"Car"};
        channels->storedPoses = {L"body_7"};
        channels->instruments = {{L"speed", L"km/h"}};
        channels->trackSafety = TRACK_SAFE_WITH_WARNING;
        channels->timeStamps = timeStamps;
        auto frames = std::make_unique<VtCSimulationDataFrames>(channels, static_cast<std::size_t>(count));
        for (int i = 0; i < count; ++i)
        {
            const float pose[4][4] = {{1, 0, 0, static_cast<float>(i + 1)}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}};
            VtCFrameRecord record = frames->Append(0.5 * i);
            record.SetPose(0, pose);
            record.SetInstrument(0, i + 1);
        }
        return frames;
    }

    /// Writes as the system does: a tracker with one frame after the other.
    static int Write(VtCSimulationDataPoint& writer, const std::wstring& path, int mode,
                     VtCSimulationDataFrames& frames)
    {
        if (!writer.Configure(L"MDF", path, mode, 0) || !writer.Connect())
            return 0;
        VtCSimulationDataTracker tracker;
        unsigned long position = 0;
        while (VtCSimulationDataFrame* frame = frames.GetNext(position, nullptr))
        {
            tracker.AddHead(frame);
            writer.WriteFrames(tracker);
            tracker.RemoveHead();
        }
        writer.Disconnect();
        return 1;
    }

    void WriteRun(const char* name, int count, bool timeStamps = true)
    {
        const Point writer = Make();
        writer->SetTrackSafety(TRACK_SAFE_WITH_WARNING);
        ASSERT_NE(
            Write(*writer, Path(name), MotionDataWriteMode(static_cast<unsigned long>(count)), *Run(count, timeStamps)),
            0);
        ASSERT_EQ(writer->GetMessageStack(), nullptr);
    }

    std::wstring LastMessage() const
    {
        const VtCMessageStack* stack = point->GetMessageStack();
        return stack != nullptr ? stack->GetMessages().back().text : L"";
    }

    static int Speed(VtCSimulationDataFrame* frame)
    {
        VtTInstrumentVariant value;
        return frame != nullptr && frame->GetSimulationData(1)->getInstrumentValue(value)
                   ? static_cast<int>(value.value)
                   : 0;
    }

    void* module = nullptr;
    FactoryFunction factory = nullptr;
    std::filesystem::path folder;
    Point point;
};

class ProgressLog : public VtILoadProgress
{
public:
    void OnLoadProgress(long id, std::uint64_t done, std::uint64_t total) override
    {
        lastId = id;
        complete = done == total;
    }

    long lastId = 0;
    bool complete = false;
};

} // namespace

TEST_F(FilePoint, LooksAtTheHeaderBeforeItLoads)
{
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"File||");
    EXPECT_EQ(point->Connect(), 0);
    EXPECT_NE(LastMessage().find(L"no file is configured"), std::wstring::npos);
    WriteRun("run.mdf", 4);
    ProgressLog progress;
    VtCSimulationDataPoint::SetLoadProgress(&progress);
    std::wstring names;
    std::vector<std::wstring> list;
    int message = 0;
    unsigned long count = 0;

    point->Reset();
    point->SetInitialStreamMode(0);
    ASSERT_NE(point->Configure(L"MDF", Path("run.mdf"), 1, 0), 0);
    ASSERT_NE(point->Connect(), 0);
    point->Disconnect();
    EXPECT_EQ(point->GetTrackSafety(message), TRACK_SAFE_WITH_WARNING);
    EXPECT_EQ(message, 433);
    EXPECT_EQ(point->GetChannelNames(names, 0), 1);
    EXPECT_EQ(names, L"Car");
    EXPECT_EQ(point->GetBufferedFrames(count), 0) << "no frames yet";
    EXPECT_EQ(point->RelinquishFrameBuffer(), nullptr);
    point->SetInitialStreamMode(1);

    // The first place, as a new track shows it.
    unsigned long number = 0;
    ASSERT_NE(point->Connect(), 0);
    EXPECT_EQ(Speed(point->GetCurrentFrame(number)), 1);
    point->Disconnect();

    point->Reset();
    point->SetProgressBarActivityID(151);
    ASSERT_NE(point->Configure(L"mdf", Path("run.mdf"), 1, 0), 0);
    EXPECT_EQ(progress.lastId, 151);
    EXPECT_TRUE(progress.complete);
    EXPECT_EQ(point->GetFrameBufferSizeEx(), 4);
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"File|MDF|" + Path("run.mdf"));
    EXPECT_EQ(point->GetInstrumentChannelNames(list, 0), 1);
    EXPECT_EQ(list[0], L"speed");
    point->GetBodyChannelNames(list, 0);
    EXPECT_EQ(list[0], L"body_7");
    const std::unique_ptr<VtCSimulationDataFrames> frames(point->RelinquishFrameBuffer());
    ASSERT_NE(frames, nullptr);
    EXPECT_EQ(frames->GetCount(), 4);
    EXPECT_EQ(frames->GetTrackSafety(), TRACK_SAFE_WITH_WARNING);
    EXPECT_EQ(point->RelinquishFrameBuffer(), nullptr);
    EXPECT_EQ(point->GetMessageStack(), nullptr);
}

TEST_F(FilePoint, PlaysOnlineByTheTimeItIsTold)
{
    WriteRun("run.mdf", 4);
    unsigned long number = 0;
    ASSERT_NE(point->Configure(L"MDF", Path("run.mdf"), 1, 0), 0);
    EXPECT_TRUE(point->IsTimeDriven() && point->CanRefresh() && point->CanPreload());
    EXPECT_EQ(point->GetCurrentFrame(number), nullptr) << "not connected";
    ASSERT_NE(point->Connect(), 0);
    const std::pair<double, int> heard[] = {{0.0, 1}, {0.7, 2}, {1.5, 4}, {1.501, 4}, {-0.001, 1}};
    for (const auto& [time, speed] : heard)
    {
        point->SetSimulationTime(time);
        EXPECT_EQ(Speed(point->GetCurrentFrame(number)), speed) << time;
    }
    EXPECT_EQ(number, 1u);
    point->Disconnect();
    EXPECT_EQ(Speed(point->GetAtTime(1.2)), 3) << "the buffer stays for replay";

    WriteRun("numbers.mdf", 2, false);
    ASSERT_NE(point->Configure(L"MDF", Path("numbers.mdf"), 1, 0), 0);
    EXPECT_FALSE(point->IsTimeDriven());
    EXPECT_EQ(point->GetTimestampsSupported(), 0);
    for (int round = 0; round < 2; ++round)
    {
        ASSERT_NE(point->Connect(), 0);
        for (const int speed : {1, 2, 1, 2, 1})
            EXPECT_EQ(Speed(point->GetCurrentFrame(number)), speed);
    }
}

TEST_F(FilePoint, RefreshTakesWhatHasBeenAdded)
{
    const auto frames = Run(3);
    const Point writer = Make();
    ASSERT_TRUE(writer->Configure(L"MDF", Path("live.mdf"), 2, 0) && writer->Connect());
    VtCSimulationDataTracker tracker;
    tracker.AddTail(frames->GetFrame(0));
    writer->WriteFrames(tracker);

    unsigned long count = 0;
    ASSERT_NE(point->Configure(L"MDF", Path("live.mdf"), 1, 0), 0);
    EXPECT_NE(point->GetBufferedFrames(count), 0);
    EXPECT_EQ(count, 1u);
    tracker.SetAt(tracker.GetHeadPosition(), frames->GetFrame(1));
    tracker.AddTail(frames->GetFrame(2));
    writer->WriteFrames(tracker);
    EXPECT_NE(point->FetchOnce(), 0);
    EXPECT_NE(point->GetBufferedFrames(count), 0);
    EXPECT_EQ(count, 3u);

    writer->Disconnect();
    std::filesystem::remove(folder / "live.mdf");
    EXPECT_EQ(point->FetchOnce(), 0);
    EXPECT_NE(point->GetBufferedFrames(count), 0) << "what was read is kept";
}

TEST_F(FilePoint, WritesTheNamesItIsGivenOrThoseOfTheFrames)
{
    const auto frames = Run(3);
    const int mode = MotionDataWriteMode(3);
    const Point writer = Make();
    EXPECT_NE(Write(*writer, Path("own.mdf"), mode, *frames), 0);
    VtTMotionDataInfo info = ReadMotionDataInfo(folder / "own.mdf");
    EXPECT_EQ(info.frames, 3u);
    EXPECT_EQ(info.channels.poses[0], L"Car");
    EXPECT_EQ(info.channels.storedPoses[0], L"body_7");
    EXPECT_EQ(info.channels.trackSafety, TRACK_SAFE);

    writer->SetChannelNames({L"Truck"});
    writer->SetBodyChannelNames({L"truck_1"});
    writer->SetInstrumentChannelNames({L"Speed"});
    writer->SetTrackSafety(TRACK_UNSAFE);
    writer->SetTimestampSupport(0);
    EXPECT_NE(Write(*writer, Path("given.mdf"), mode, *frames), 0);
    info = ReadMotionDataInfo(folder / "given.mdf");
    EXPECT_EQ(info.channels.poses[0], L"Truck");
    EXPECT_EQ(info.channels.storedPoses[0], L"truck_1");
    EXPECT_EQ(info.channels.instruments[0], (VtTInstrumentStream{L"Speed", L"km/h"}));
    EXPECT_EQ(info.channels.trackSafety, TRACK_UNSAFE);
    EXPECT_FALSE(info.channels.timeStamps);
    EXPECT_EQ(writer->GetMessageStack(), nullptr);

    writer->SetChannelNames({L"Truck", L"Trailer"});
    writer->SetBodyChannelNames({});
    Write(*writer, Path("wrong.mdf"), mode, *frames);
    ASSERT_NE(writer->GetMessageStack(), nullptr);
    ASSERT_EQ(writer->GetMessageStack()->GetMessages().size(), 1u) << "told once, not for each frame";
    EXPECT_NE(writer->GetMessageStack()->GetMessages()[0].text.find(L"1 poses and 1 instrument streams"),
              std::wstring::npos);
    EXPECT_FALSE(std::filesystem::exists(folder / "wrong.mdf"));

    // A track stores the buffer that it read with the same point.
    ASSERT_NE(point->Configure(L"MDF", Path("own.mdf"), 1, 0), 0);
    const std::unique_ptr<VtCSimulationDataFrames> taken(point->RelinquishFrameBuffer());
    taken->PrepareForTimeSyncReplay(1, 0);
    EXPECT_NE(Write(*point, Path("again.mdf"), MotionDataWriteMode(100000), *taken), 0);
    EXPECT_EQ(ReadMotionDataInfo(folder / "again.mdf").frames, 3u);
}

TEST_F(FilePoint, FailuresAreOnTheMessageStack)
{
    WriteRun("run.mdf", 10);
    std::filesystem::resize_file(folder / "run.mdf", std::filesystem::file_size(folder / "run.mdf") - 1);
    std::ofstream(folder / "text.mdf") << "no motion data";

    ASSERT_NE(point->Configure(L"MDF", Path("run.mdf"), 1, 0), 0);
    ASSERT_NE(point->GetMessageStack(), nullptr);
    EXPECT_EQ(point->GetMessageStack()->GetMessages()[0].severity, VtEMessageSeverity::warning);
    EXPECT_NE(LastMessage().find(L"run.mdf: the file is cut off: 9 of 10 frames"), std::wstring::npos);

    struct Case
    {
        const wchar_t* type;
        const char* file;
        int mode;
        const wchar_t* reason;
    };
    const Case cases[] = {
        {L"MDF", "none.mdf", 1, L"none.mdf: No such file"},
        {L"MDF", "run.mdf", 3, L"no motion data file to read or write"},
        {L"MDF", "none/new.mdf", 0x10002, L"none/new.mdf: No such file"},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.file);
        point->ResetMessageStack();
        EXPECT_FALSE(point->Configure(c.type, Path(c.file), c.mode, 0) && point->Connect());
        EXPECT_NE(LastMessage().find(c.reason), std::wstring::npos) << base::Utf8(LastMessage());
    }
    EXPECT_EQ(point->Configure(L"MDF", L"", 1, 0), 0);
}

TEST_F(FilePoint, AFileThatCannotBeReadLeavesTheRunBefore)
{
    WriteRun("run.mdf", 4);
    std::ofstream(folder / "text.mdf") << "no motion data";
    ASSERT_NE(point->Configure(L"MDF", Path("run.mdf"), 1, 0), 0);
    ASSERT_NE(point->Connect(), 0);
    point->SetRecent(3);
    for (const int streamMode : {1, 0})
        for (const char* bad : {"text.mdf", "none.mdf", ""})
        {
            point->SetInitialStreamMode(streamMode);
            EXPECT_EQ(point->Configure(L"MDF", *bad ? Path(bad) : L"", 1, 0), 0) << bad;
            unsigned long number = 0;
            EXPECT_EQ(Speed(point->GetRecent(number)), 3) << bad;
            EXPECT_EQ(point->GetConfigurationInfoText(0), L"File|MDF|" + Path("run.mdf"));
            std::wstring names;
            EXPECT_EQ(point->GetChannelNames(names, 0), 1);
        }
    unsigned long number = 0;
    EXPECT_EQ(Speed(point->GetCurrentFrame(number)), 1) << "still connected";
}

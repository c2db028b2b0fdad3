#include <cmath>
#include <csignal>
#include <cstring>
#include <limits>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "base/Text.h"
#include "simdata/points/MotionDataInfo.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/tests/TestRun.h"

using namespace SimulationDataPoints;

namespace
{

constexpr std::size_t headerBytes = 40;
constexpr std::size_t carStride = 8 + 2 * 64 + 8;

template <typename T>
std::string Bytes(T value)
{
    return {reinterpret_cast<const char*>(&value), sizeof value};
}

/// `bytes` with `value` in place of what stands at `at`.
template <typename T>
std::string With(std::string bytes, std::size_t at, T value)
{
    return bytes.replace(at, sizeof value, Bytes(value));
}

/// A file put together by hand: the header for one stream and no pose, a description, frames of time and value.
std::string Plain(const std::string& json, const std::vector<std::pair<double, double>>& frames)
{
    std::string file = "\x89PMDF\r\n\x1a" + Bytes<std::uint32_t>(1) + Bytes<std::uint32_t>(0) +
                       Bytes<std::uint32_t>(1) + Bytes<std::uint32_t>(16) + Bytes<std::uint64_t>(frames.size()) +
                       Bytes<std::uint32_t>(static_cast<std::uint32_t>(json.size())) + Bytes<std::uint32_t>(0) + json;
    for (const auto& [time, value] : frames)
        file += Bytes(time) + Bytes(value);
    return file;
}

const char onePlainStream[] = R"({"instruments": [{"name": "n"}]})";

} // namespace

TEST(MotionDataFile, IsWrittenAsTheByteTableSays)
{
    const TestFolder folder;
    WriteCar(folder / "run.mdf", 3);
    const std::string file = ReadAll(folder / "run.mdf");

    const unsigned char start[36] = {0x89, 'P', 'M', 'D', 'F', '\r', '\n', 0x1A, // magic
                                     1,    0,   0,   0,                          // version
                                     2,    0,   0,   0,                          // poses
                                     1,    0,   0,   0,                          // streams
                                     144,  0,   0,   0,                          // 8 + 2 * 64 + 8
                                     3,    0,   0,   0,   0,   0,    0,    0,    // frames
                                     0,    0,   0,   0};                         // the description's length, below
    ASSERT_GT(file.size(), headerBytes);
    EXPECT_EQ(std::memcmp(file.data(), start, 32), 0);
    std::uint32_t length = 0;
    std::memcpy(&length, file.data() + 32, 4);
    ASSERT_EQ(file.size(), headerBytes + length + 3 * carStride);
    EXPECT_EQ((headerBytes + length) % 8, 0u);
    EXPECT_EQ(file.substr(headerBytes, length)
                  .find(R"({"instruments":[{"name":"speed","unit":"km/h"}],"poses":["Chassis","Wheel FL"],)"),
              0u);

    const char* second = file.data() + headerBytes + length + carStride;
    double time = 0.0;
    double speed = 0.0;
    float chassis[16];
    std::memcpy(&time, second, 8);
    std::memcpy(chassis, second + 8, 64);
    std::memcpy(&speed, second + 8 + 128, 8);
    EXPECT_EQ(time, 0.01);
    EXPECT_EQ(chassis[3], 1.0F);
    EXPECT_EQ(chassis[15], 1.0F);
    EXPECT_EQ(speed, 101.0);
}

TEST(MotionDataFile, AFileThatCantBeUsedSaysWhy)
{
    const TestFolder folder;
    WriteCar(folder / "good.mdf", 3);
    const std::string good = ReadAll(folder / "good.mdf");
    const std::string plain = Plain(onePlainStream, {{0.0, 1.0}});
    constexpr std::uint32_t many = 0xFFFFFFFF;
    struct Case
    {
        const char* name;
        std::string bytes;
        const wchar_t* reason;
    };
    const Case cases[] = {
        {"empty", "", L"the file is empty"},
        {"foreign", std::string(500, 'x'), L"this is no motion data file"},
        {"sent as text", With(good, 5, '\n'), L"this is no motion data file"},
        {"half a header", good.substr(0, 39), L"the file ends within its header"},
        {"version 2", With<std::uint32_t>(good, 8, 2), L"the file has version 2"},
        {"too many poses", With(good, 12, many), L"more than 100000"},
        {"poses that the stride doesn't hold", With<std::uint32_t>(good, 12, 100000), L"its channels take 6400016"},
        {"a frame count whose bytes overflow", With<std::uint64_t>(good, 24, UINT64_MAX / 144 + 5),
         L"more than 2147483647 frames"},
        {"a huge description", With(good, 32, many), L"more than 16777216"},
        {"cut in the description", good.substr(0, 60), L"the file ends within its description"},
        {"cut in the first frame", plain.substr(0, plain.size() - 1), L"ends within its first frame"},
        {"no frame", plain.substr(0, plain.size() - 16), L"the file holds no frame"},
        {"a first time that is none", Plain(onePlainStream, {{NAN, 1.0}}), L"no frame has a usable time stamp"},
        {"no JSON", Plain("{\"poses\": [", {}), L"no JSON text"},
        {"poses that are numbers", Plain(R"({"poses": [1]})", {}), L"the key \"poses\""},
        {"a safety of 3", Plain(R"({"instruments": [{"name": "n"}], "trackSafety": 3})", {}), L"\"trackSafety\""},
        {"fewer names than counted", Plain("{}", {}), L"counts 1 instrument streams, the description names 0"},
        {"names in excess", Plain(R"({"poses": ["p"], "instruments": [{"name": "n"}]})", {}), L"counts 0 poses"},
        {"a name with a bar", Plain(R"({"instruments": [{"name": "a|b"}]})", {}), L"holds a \"|\""},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        const auto path = folder / "bad.mdf";
        WriteAll(path, c.bytes);
        VtCMotionDataReader reader(path);
        EXPECT_TRUE(!reader.Open() || reader.LoadFrames(nullptr, -1) == nullptr);
        const std::wstring error = reader.GetError();
        EXPECT_EQ(error.find(base::Wide(path.string()) + L": "), 0u) << base::Utf8(error);
        EXPECT_NE(error.find(c.reason), std::wstring::npos) << base::Utf8(error);
    }

    mkfifo((folder / "pipe").c_str(), 0600);
    for (const char* name : {"missing.mdf", "pipe", "."})
    {
        const VtTMotionDataInfo info = ReadMotionDataInfo(folder / name);
        EXPECT_NE(info.error.find(base::Wide((folder / name).string()) + L": "), std::wstring::npos) << name;
    }
}

TEST(MotionDataFile, WhatCanBeUsedOfADamagedFileIsUsed)
{
    const TestFolder folder;
    WriteCar(folder / "good.mdf", 60);
    const std::string good = ReadAll(folder / "good.mdf");
    constexpr double nan = std::numeric_limits<double>::quiet_NaN();
    WriteCar(folder / "long.mdf", 5000); // several chunks
    const std::string longRun = ReadAll(folder / "long.mdf");
    const std::string backwards = Plain(onePlainStream, {{0, 1}, {1, 1}, {2, 1}, {1.5, 1}, {3, 1}});
    struct Case
    {
        const char* name;
        std::string bytes;
        int frames;
        const wchar_t* warning;
    };
    const Case cases[] = {
        {"cut within a frame", good.substr(0, good.size() - 1), 59, L"cut off: 59 of 60 frames are whole and used"},
        {"cut while it was written", With(good, 24, UINT64_MAX).substr(0, good.size() - 100), 59,
         L"ends within a frame: 59 frames are whole"},
        {"bytes behind the end", good + "abc", 60, L"3 bytes behind the last frame"},
        {"a time that decreases", backwards, 3, L"decreases at frame 4, from 2 s to 1.5 s"},
        {"a time that decreases early", With(longRun, longRun.size() - 4990 * carStride, 0.001), 10,
         L"decreases at frame 11, from 0.09 s to 0.001 s: the frames before it are used, 4990 are left out"},
        {"values that are none", Plain(onePlainStream, {{0, 1}, {1, nan}, {2, -INFINITY}, {3, 4}}), 4,
         L"2 instrument values are not finite, first \"n\" in frame 2, \"n\" in frame 3"},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        WriteAll(folder / "run.mdf", c.bytes);
        VtCMotionDataReader reader(folder / "run.mdf");
        ASSERT_TRUE(reader.Open()) << base::Utf8(reader.GetError());
        const auto frames = reader.LoadFrames(nullptr, -1);
        ASSERT_NE(frames, nullptr) << base::Utf8(reader.GetError());
        EXPECT_EQ(frames->GetCount(), c.frames);
        const std::vector<std::wstring> texts = reader.GetDamage().Texts();
        ASSERT_EQ(texts.size(), 1u);
        EXPECT_NE(texts[0].find(c.warning), std::wstring::npos) << base::Utf8(texts[0]);
        EXPECT_EQ(ReadMotionDataInfo(folder / "run.mdf").damage.Texts(), texts);
    }
}

TEST(MotionDataFile, ABrokenPoseKeepsItsLastPlace)
{
    const TestFolder folder;
    constexpr int count = 5000; // more than one chunk, so that the place comes from the chunk before as well
    WriteCar(folder / "run.mdf", count);
    std::string file = ReadAll(folder / "run.mdf");
    const std::size_t frames = file.size() - count * carStride;
    for (int i = 0; i < count; i += 2)
        file = With(std::move(file), frames + static_cast<std::size_t>(i) * carStride + 8 + 12, NAN);
    WriteAll(folder / "run.mdf", file);
    VtCMotionDataReader reader(folder / "run.mdf");
    ASSERT_TRUE(reader.Open());
    const auto buffer = reader.LoadFrames(nullptr, -1);
    for (int i = 0; i < count; ++i)
    {
        float v[3];
        buffer->GetFrame(static_cast<std::size_t>(i))->GetSimulationData(0)->GetVector(v);
        ASSERT_EQ(v[0], i == 0 ? 0.0F : static_cast<float>(i % 2 == 0 ? i - 1 : i));
    }
    EXPECT_EQ(reader.GetDamage().nonFinitePoses, static_cast<std::uint64_t>(count / 2));
    EXPECT_EQ(reader.GetDamage().nonFinite[4].frame, 9u);
}

TEST(MotionDataFile, AWriterThatDiesLosesNoWholeFrame)
{
    const TestFolder folder;
    const auto path = folder / "live.mdf";
    const auto channels = CarChannels();
    VtCSimulationDataFrames frames(channels, 20);
    FillCar(frames, 20);
    const pid_t child = fork();
    if (child == 0)
    {
        VtCMotionDataWriter writer(path, VtCMotionDataWriter::Manner::growing);
        if (writer.Open() && writer.Begin(*channels))
            for (std::size_t i = 0; i < 20; ++i)
                writer.Write(frames.GetFrame(i)->GetRecord());
        kill(getpid(), SIGKILL);
    }
    int status = 0;
    waitpid(child, &status, 0);
    ASSERT_TRUE(WIFSIGNALED(status));

    VtTMotionDataInfo info = ReadMotionDataInfo(path);
    EXPECT_EQ(info.frames, 20u);
    EXPECT_TRUE(info.unfinished);
    EXPECT_FALSE(info.damage.IsAny());
    EXPECT_EQ(info.firstTime, 0.0);
    EXPECT_EQ(info.lastTime, 0.19);
    EXPECT_NEAR(info.meanRate, 100.0, 1e-9);
    EXPECT_EQ(info.channels.instruments[0].unit, L"km/h");

    // Written again over the old one, and closed.
    VtCMotionDataWriter writer(path, VtCMotionDataWriter::Manner::growing);
    ASSERT_TRUE(writer.Open() && writer.Begin(*channels));
    EXPECT_TRUE(writer.Write(frames.GetFrame(0)->GetRecord()));
    EXPECT_EQ(ReadMotionDataInfo(path).frames, 1u) << "a frame is there as soon as it is written";
    EXPECT_TRUE(writer.Finish());
    info = ReadMotionDataInfo(path);
    EXPECT_FALSE(info.unfinished);
    EXPECT_EQ(info.damage.framesExpected, 1u);
}

TEST(MotionDataFile, AFailedWriterLeavesNothingHalf)
{
    const TestFolder folder;
    const auto channels = CarChannels();
    // The disk is full after 10000 bytes: the whole file doesn't appear, the growing one keeps its whole frames.
    VtCSimulationDataFrames frames(channels, 1);
    FillCar(frames, 1);
    for (const auto manner : {VtCMotionDataWriter::Manner::whole, VtCMotionDataWriter::Manner::growing})
    {
        const pid_t child = fork();
        if (child == 0)
        {
            signal(SIGXFSZ, SIG_IGN);
            const rlimit small = {10000, 10000};
            setrlimit(RLIMIT_FSIZE, &small);
            VtCMotionDataWriter writer(folder / "full.mdf", manner);
            bool all = writer.Open() && writer.Begin(*channels);
            for (int i = 0; i < 100; ++i)
                all = writer.Write(frames.GetFrame(0)->GetRecord()) && all;
            all = writer.Finish() && all;
            _exit(all || writer.GetError().empty() ? 1 : 0);
        }
        int status = 0;
        waitpid(child, &status, 0);
        EXPECT_EQ(status, 0);
        EXPECT_EQ(std::filesystem::is_empty(folder.path), manner == VtCMotionDataWriter::Manner::whole);
    }
    const VtTMotionDataInfo info = ReadMotionDataInfo(folder / "full.mdf");
    EXPECT_GT(info.frames, 60u);
    EXPECT_LT(info.frames, 70u);
    EXPECT_FALSE(info.damage.IsAny());
}

TEST(MotionDataFile, ThePythonOfTheDocumentReadsAndWritesIt)
{
    const TestFolder folder;
    WriteCar(folder / "ours.mdf", 50);
    const std::string text = ReadAll(PANORAMIC_DOCS "/motion-data-format.md");
    std::string script;
    for (std::size_t at = text.find("```python\n"); at != std::string::npos; at = text.find("```python\n", at + 1))
        script += text.substr(at + 10, text.find("```", at + 10) - at - 10);
    ASSERT_NE(script.find("def read_motion_data"), std::string::npos);
    script += R"(
description, frames = read_motion_data("ours.mdf")
assert description["poses"] == ["Chassis", "Wheel FL"], description
assert frames["time"].tolist() == [round(0.01 * i, 6) for i in range(50)]
assert frames["pose"][:, 0, 0, 3].tolist() == list(range(50))
assert frames["pose"][49, 1, 2, 3] == -49
assert frames["value"][7, 0] == 107

description = {"poses": ["B\u00f6dy"], "instruments": [{"name": "a", "unit": "m"}, {"name": "b"}], "trackSafety": 1}
mine = np.zeros(1000, frame_type(description))
mine["time"] = np.arange(1000) / 100
mine["pose"][:, 0] = np.eye(4)
mine["pose"][:, 0, 1, 3] = np.arange(1000)
mine["value"][:, 1] = 0.5
write_motion_data("theirs.mdf", description, mine)
assert (read_motion_data("theirs.mdf")[1] == mine).all()
)";
    WriteAll(folder / "check.py", script);
    const std::string command = "cd " + folder.path.string() + " && /usr/bin/python3 check.py 2>&1";
    ASSERT_EQ(std::system(command.c_str()), 0);

    VtCMotionDataReader reader(folder / "theirs.mdf");
    ASSERT_TRUE(reader.Open()) << base::Utf8(reader.GetError());
    EXPECT_EQ(reader.GetDescription()->poses[0], L"B\u00f6dy");
    EXPECT_EQ(reader.GetDescription()->instruments[0].unit, L"m");
    EXPECT_EQ(reader.GetDescription()->trackSafety, TRACK_SAFE_WITH_WARNING);
    const auto frames = reader.LoadFrames(nullptr, -1);
    ASSERT_NE(frames, nullptr);
    EXPECT_FALSE(reader.GetDamage().IsAny());
    float v[3];
    VtTInstrumentVariant value;
    VtCSimulationDataFrame* frame = frames->GetAtTime(7.77, 0);
    frame->GetSimulationData(0)->GetVector(v);
    EXPECT_EQ(v[1], 777.0F);
    EXPECT_NE(frame->GetSimulationData(2)->getInstrumentValue(value), 0);
    EXPECT_EQ(value.value, 0.5);
}

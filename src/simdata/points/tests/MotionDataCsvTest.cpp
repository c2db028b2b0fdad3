#include <cmath>
#include <random>

#include <gtest/gtest.h>

#include "base/Text.h"
#include "simdata/points/MotionDataCsv.h"
#include "simdata/points/MotionDataReader.h"
#include "simdata/points/PoseRotation.h"
#include "simdata/points/tests/TestRun.h"

using namespace SimulationDataPoints;

namespace
{

constexpr char carHeader[] = "time,Car.x,Car.y,Car.z,Car.roll,Car.pitch,Car.yaw";

std::unique_ptr<VtCSimulationDataFrames> Load(const std::filesystem::path& path)
{
    VtCMotionDataReader reader(path);
    return reader.Open() ? reader.LoadFrames(nullptr, -1) : nullptr;
}

/// Imports `text`; null, with the report's error, when that fails.
std::unique_ptr<VtCSimulationDataFrames> Import(const std::string& text, VtTConversionReport& report)
{
    const TestFolder folder;
    WriteAll(folder / "in.csv", text);
    return VtCMotionDataCsv::Import(folder / "in.csv", folder / "out.mdf", report) ? Load(folder / "out.mdf") : nullptr;
}

double Value(VtCSimulationDataFrames& frames, std::size_t frame, long channel)
{
    VtTInstrumentVariant value{-999.0, 0, 0};
    return frames.GetFrame(frame)->GetSimulationData(channel)->getInstrumentValue(value) ? value.value : -999.0;
}

} // namespace

TEST(MotionDataCsv, TurnsBodiesAsTheColumnsSay)
{
    // Where the body's axes point, by hand: yaw turns the nose (x) to the left (y), a positive pitch takes it down,
    // a positive roll takes the left side (y) up.
    struct Case
    {
        const char* name;
        const char* row; ///< roll, pitch, yaw
        float nose[3];
        float left[3];
    };
    const Case cases[] = {
        {"none", "0,0,0", {1, 0, 0}, {0, 1, 0}},
        {"yaw", "0,0,90", {0, 1, 0}, {-1, 0, 0}},
        {"pitch", "0,90,0", {0, 0, -1}, {0, 1, 0}},
        {"roll", "90,0,0", {1, 0, 0}, {0, 0, 1}},
        {"yaw, then pitch", "0,90,90", {0, 0, -1}, {-1, 0, 0}},
        {"yaw, then roll about the new nose", "90,0,90", {0, 1, 0}, {0, 0, 1}},
        {"all three", "90,90,90", {0, 0, -1}, {0, 1, 0}},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        VtTConversionReport report;
        const auto frames = Import(std::string(carHeader) + "\n0,1,2,3," + c.row + "\n", report);
        ASSERT_NE(frames, nullptr) << base::Utf8(report.error);
        float m[4][4];
        frames->GetFrame(0)->GetSimulationData(0)->GetMatrix4x4(m);
        for (int i = 0; i < 3; ++i)
        {
            EXPECT_NEAR(m[i][0], c.nose[i], 1e-6);
            EXPECT_NEAR(m[i][1], c.left[i], 1e-6);
            EXPECT_EQ(m[i][3], static_cast<float>(i + 1));
            EXPECT_EQ(m[3][i], 0.0F);
        }
        EXPECT_EQ(m[3][3], 1.0F);
    }

    // A quarter turn about each axis as a quaternion of length 5: twice.
    VtTConversionReport report;
    const auto frames = Import("time,B.x,B.y,B.z,B.qw,B.qx,B.qy,B.qz\n0,0,0,0,5,0,0,5\n1,0,0,0,0,5,0,0\n", report);
    ASSERT_NE(frames, nullptr);
    float m[3][3];
    frames->GetFrame(0)->GetSimulationData(0)->GetMatrix3x3(m);
    EXPECT_NEAR(m[1][0], 1.0F, 1e-6);
    EXPECT_NEAR(m[0][1], -1.0F, 1e-6);
    frames->GetFrame(1)->GetSimulationData(0)->GetMatrix3x3(m);
    EXPECT_NEAR(m[1][1], -1.0F, 1e-6);
    EXPECT_NEAR(m[2][2], -1.0F, 1e-6);
    ASSERT_EQ(report.warnings.size(), 1u);
    EXPECT_NE(report.warnings[0].find(L"2 quaternions don't have the length 1, first in line 2"), std::wstring::npos);
}

TEST(MotionDataCsv, TakesWhatLoggersWrite)
{
    using Streams = std::vector<VtTInstrumentStream>;
    struct Case
    {
        const char* name;
        std::string text;
        Streams streams;
        double first; ///< of the first stream, in the second frame at 0.5 s
    };
    const Case cases[] = {
        {"a mark, CRLF, empty lines, no last line end", "\xEF\xBB\xBFtime,v\r\n\r\n0,1\r\n0.5,2.5", {{L"v", L""}}, 2.5},
        {"semicolons and decimal commas", "Time;v [m];w, x\n0;1;0\n0,5;2,5;3.5\n", {{L"v", L"m"}, {L"w, x", L""}}, 2.5},
        {"tabs", "v\ttime\n1\t0\n2.5\t0.5\n", {{L"v", L""}}, 2.5},
        {"time with its unit", "time [s],v\n0,1\n0.5,2.5\n", {{L"v", L""}}, 2.5},
        {"a stream that looks like a pose", "time,a.x []\n0,1\n0.5,2.5\n", {{L"a.x", L""}}, 2.5},
        {"UTF-8",
         "time,\xC3\xB6l [\xC2\xB0"
         "C]\n0,1\n0.5,2.5\n",
         {{L"\u00f6l", L"\u00b0C"}},
         2.5},
        {"an empty field", "time,v\n0,\n0.5,\n", {{L"v", L""}}, -999.0},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        VtTConversionReport report;
        const auto frames = Import(c.text, report);
        ASSERT_NE(frames, nullptr) << base::Utf8(report.error);
        EXPECT_EQ(frames->GetDescription().instruments, c.streams);
        ASSERT_EQ(frames->GetCount(), 2);
        EXPECT_EQ(frames->GetFrame(1)->GetTimestamp(), 0.5);
        EXPECT_EQ(Value(*frames, 1, 0), c.first);
        EXPECT_TRUE(report.warnings.empty());
    }
}

TEST(MotionDataCsv, ErrorsNameThePlaceAndLeaveNoFile)
{
    const std::string car = carHeader;
    struct Case
    {
        const char* name;
        std::string text;
        const wchar_t* error;
    };
    const Case cases[] = {
        {"empty", "", L": the file is empty"},
        {"no time", "t,v\n0,1\n", L", line 1: there is no column \"time\""},
        {"a stream twice", "time,v,V [m]\n0,1,2\n", L", line 1: column 3 (V [m]): it stands twice"},
        {"no name", "time,,v\n0,1,2\n", L", line 1: column 2: it has no name"},
        {"no z", "time,a.x,a.y,a.roll,a.pitch,a.yaw\n", L", line 1: column 2 (a): the pose lacks the column \"a.z\""},
        {"no rotation", "time,a.x,a.y,a.z\n", L"column 2 (a): the pose has no rotation"},
        {"both rotations", car + ",Car.qw\n", L"column 2 (Car): the pose has angles and a quaternion"},
        {"text in a number", car + "\n0,1,2,3,0,0,0\n1,1,2,abc,0,0,0\n",
         L", line 3, column 4 (Car.z): \"abc\" is no finite number"},
        {"a decimal comma", "time,v\n0,1,5\n", L", line 2: column 3: the row has 3 columns, the header 2"},
        {"nan", "time,v\n0,nan\n", L", line 2, column 2 (v): \"nan\" is no finite number"},
        {"too large for a float", car + "\n0,1e300,0,0,0,0,0\n",
         L", line 2, column 2 (Car.x): the number is too large"},
        {"an empty place", car + "\n0,,0,0,0,0,0\n", L", line 2, column 2 (Car.x): there is no number"},
        {"an empty time", "time,v\n0,1\n,1\n", L", line 3, column 1 (time): there is no number"},
        {"a short row", "time,v,w\n0,1,2\n1,1\n", L", line 3: column 3: the row has 2 columns, the header 3"},
        {"an open quote", "time,v\n0,\"1\n", L", line 2: column 2: the quotes are wrong"},
        {"time decreases", "time,v\n0,1\n\n2,1\n1,1\n", L", line 5, column 1 (time): the time decreases, from 2"},
        {"a quaternion of nothing", "time,a.x,a.y,a.z,a.qw,a.qx,a.qy,a.qz\n0,0,0,0,0,0,0,0\n",
         L", line 2, column 5 (a.qw): the quaternion has the length 0"},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        const TestFolder folder;
        const auto path = folder / "in.csv";
        WriteAll(path, c.text);
        VtTConversionReport report;
        EXPECT_FALSE(VtCMotionDataCsv::Import(path, folder / "out.mdf", report));
        EXPECT_EQ(report.error.find(base::Wide(path.string())), 0u) << base::Utf8(report.error);
        EXPECT_NE(report.error.find(c.error), std::wstring::npos) << base::Utf8(report.error);
        EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path), {}), 1) << "a file stayed behind";
    }

    const TestFolder folder;
    VtTConversionReport report;
    EXPECT_FALSE(VtCMotionDataCsv::Import(folder / "none.csv", folder / "out.mdf", report));
    EXPECT_NE(report.error.find(L"none.csv: No such file"), std::wstring::npos);
    WriteAll(folder / "in.csv", "time,v\n0,1\n");
    EXPECT_FALSE(VtCMotionDataCsv::Import(folder / "in.csv", folder / "no/out.mdf", report));
    EXPECT_NE(report.error.find(L"no/out.mdf: No such file"), std::wstring::npos);
    EXPECT_FALSE(VtCMotionDataCsv::Export(folder / "in.csv", folder / "out.csv", report));
    EXPECT_NE(report.error.find(L"in.csv: this is no motion data file"), std::wstring::npos);
    EXPECT_FALSE(std::filesystem::exists(folder / "out.csv"));
}

TEST(MotionDataCsv, ExportReadsBackWithoutLoss)
{
    const TestFolder folder;
    auto channels = std::make_shared<VtTChannelDescription>();
    channels->poses = {L"a.x", L"Car, \"red\"", L" outer "};
    channels->instruments = {{L"time", L""}, {L"a.x", L""}, {L"a[1]", L""}, {L"b;c", L"m/s\u00b2"}};
    VtCMotionDataWriter writer(folder / "a.mdf", VtCMotionDataWriter::Manner::whole);
    ASSERT_TRUE(writer.Open() && writer.Begin(*channels));
    constexpr std::size_t count = 1000;
    VtCSimulationDataFrames frames(channels, count);
    std::mt19937 random(3);
    std::normal_distribution<double> normal;
    for (std::size_t i = 0; i < count; ++i)
    {
        VtCFrameRecord record = frames.Append(static_cast<double>(i) / 3.0);
        for (std::size_t pose = 0; pose < 3; ++pose)
        {
            // Half turns and quarter turns too, where conversions lose.
            VtTQuaternion q = {normal(random), normal(random), normal(random), normal(random)};
            if (i % 4 == 0)
                q = {static_cast<double>(random() % 2), 1, 1e-9 * normal(random), static_cast<double>(random() % 2)};
            const VtTRotation r = RotationFromQuaternion(q);
            float m[4][4] = {{0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 1}};
            for (std::size_t row = 0; row < 3; ++row)
            {
                std::copy(r[row].begin(), r[row].end(), m[row]);
                m[row][3] = static_cast<float>(normal(random) * std::pow(10.0, static_cast<int>(random() % 9) - 3));
            }
            record.SetPose(pose, m);
        }
        for (std::size_t stream = 0; stream < 4; ++stream)
            record.SetInstrument(stream, i == 5 ? NAN : normal(random) * 1e5);
        ASSERT_TRUE(writer.Write(frames.GetFrame(i)->GetRecord()));
    }
    ASSERT_TRUE(writer.Finish());

    VtTConversionReport report;
    ASSERT_TRUE(VtCMotionDataCsv::Export(folder / "a.mdf", folder / "a.csv", report)) << base::Utf8(report.error);
    ASSERT_EQ(report.warnings.size(), 1u) << "the values that are none";
    ASSERT_TRUE(VtCMotionDataCsv::Import(folder / "a.csv", folder / "b.mdf", report)) << base::Utf8(report.error);
    const auto back = Load(folder / "b.mdf");
    ASSERT_NE(back, nullptr);
    EXPECT_EQ(back->GetDescription(), *channels);
    ASSERT_EQ(back->GetCount(), static_cast<int>(count));
    for (std::size_t i = 0; i < count; ++i)
    {
        VtCSimulationDataFrame* a = frames.GetFrame(i);
        VtCSimulationDataFrame* b = back->GetFrame(i);
        ASSERT_EQ(a->GetTimestamp(), b->GetTimestamp());
        for (long pose = 0; pose < 3; ++pose)
            for (int k = 0; k < 16; ++k)
                ASSERT_NEAR(a->GetPose(pose)[k], b->GetPose(pose)[k], k % 4 == 3 ? 0.0 : 2.4e-7) << "frame " << i;
        for (long stream = 3; stream < 7; ++stream)
            ASSERT_EQ(Value(frames, i, stream), Value(*back, i, stream));
    }
}

TEST(MotionDataCsv, ExportRefusesWhatIsNoMotion)
{
    struct Case
    {
        const char* name;
        float m[4][4];
        bool good;
        std::size_t warnings;
    };
    const Case cases[] = {
        {"a motion", {{0, -1, 0, 5}, {1, 0, 0, 6}, {0, 0, 1, 7}, {0, 0, 0, 1}}, true, 0},
        {"drifted", {{1.0002F, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}, true, 1},
        {"scaled", {{1.01F, 0, 0, 0}, {0, 1.01F, 0, 0}, {0, 0, 1.01F, 0}, {0, 0, 0, 1}}, false, 0},
        {"mirrored", {{-1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}, false, 0},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        const TestFolder folder;
        const auto channels = CarChannels();
        VtCSimulationDataFrames frames(channels, 2);
        FillCar(frames, 1);
        frames.Append(1.0).SetPose(0, c.m);
        VtCFrameRecord last = frames.Append(2.0);
        last.SetPose(0, cases[0].m);
        last.SetPose(1, c.m);
        VtCMotionDataWriter writer(folder / "run.mdf", VtCMotionDataWriter::Manner::whole);
        ASSERT_TRUE(writer.Open() && writer.Begin(*channels) && writer.Write(frames.GetFrame(1)->GetRecord()) &&
                    writer.Finish());
        VtTConversionReport report;
        EXPECT_EQ(VtCMotionDataCsv::Export(folder / "run.mdf", folder / "run.csv", report), c.good);
        EXPECT_EQ(std::filesystem::exists(folder / "run.csv"), c.good);
        EXPECT_EQ(report.warnings.size(), c.warnings);
        EXPECT_EQ(report.error.find(L"the pose \"Wheel FL\" in frame 1 is no rigid motion") == std::wstring::npos,
                  c.good);
    }
}

TEST(MotionDataCsv, AFileWithoutTimeStampsStaysOne)
{
    const TestFolder folder;
    VtTConversionReport report;
    WriteAll(folder / "in.csv", "time,v\n,1\n,2\n");
    ASSERT_TRUE(VtCMotionDataCsv::Import(folder / "in.csv", folder / "a.mdf", report));
    EXPECT_FALSE(Load(folder / "a.mdf")->GetDescription().timeStamps);
    ASSERT_TRUE(VtCMotionDataCsv::Export(folder / "a.mdf", folder / "out.csv", report));
    EXPECT_EQ(ReadAll(folder / "out.csv"), "time,v\n,1\n,2\n");
}

// The data point as programs meet it: loaded as a module, driven through the interface of data points.
#include <cmath>
#include <cstring>
#include <dlfcn.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <limits>
#include <memory>
#include <stdexcept>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/ExportFactory.h"
#include "simdata/points/SimulationDataPoint.h"
#include "tests/support/HeapCount.h"

namespace
{

using namespace SimulationDataPoints;

struct Releasing
{
    void operator()(VtCSimulationDataPoint* point) const
    {
        point->Release();
        delete point;
    }
};
using Point = std::unique_ptr<VtCSimulationDataPoint, Releasing>;

Point MakePoint(const wchar_t* options = L"")
{
    static void* const module = []
    {
        const auto beside = std::filesystem::read_symlink("/proc/self/exe").parent_path();
        return dlopen((beside / "plugins" / "SimulationDataPointOffSimU.so").c_str(), RTLD_NOW | RTLD_LOCAL);
    }();
    if (module == nullptr)
        throw std::runtime_error(dlerror());
    const auto factory = reinterpret_cast<FactoryFunction>(dlsym(module, factoryName));
    if (factory == nullptr)
        throw std::runtime_error(dlerror());
    Point point(factory());
    if (point->Configure(L"OffSim", options, 1, 0) == 0)
        throw std::runtime_error("options refused");
    return point;
}

VtCSimulationDataFrame* FrameAt(VtCSimulationDataPoint& point, double time)
{
    unsigned long number = 0;
    point.SetSimulationTime(time);
    return point.GetCurrentFrame(number);
}

bool SameRecords(const VtCSimulationDataFrame& a, const VtCSimulationDataFrame& b)
{
    return std::memcmp(a.GetRecord(), b.GetRecord(), a.GetDescription().Stride()) == 0;
}

std::wstring TakeMessage(VtCSimulationDataPoint& point)
{
    if (point.GetMessageStack() == nullptr)
        return {};
    const std::wstring text = point.GetMessageStack()->GetMessages().back().text;
    point.ResetMessageStack();
    return text;
}

TEST(OffSimPoint, TellsWhatItIsBeforeAnyFrame)
{
    const Point point = MakePoint();
    EXPECT_EQ(point->GetName(), L"OffSim");
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=7");
    EXPECT_TRUE(point->IsSource());
    EXPECT_FALSE(point->IsSink());
    EXPECT_TRUE(point->IsTimeDriven());
    EXPECT_TRUE(point->GetTimestampsSupported());

    std::wstring poses;
    EXPECT_EQ(point->GetChannelNames(poses, 0), 5);
    EXPECT_EQ(poses, L"Vehicle|Vehicle.FL|Vehicle.FR|Vehicle.RL|Vehicle.RR");
    std::vector<std::wstring> streams;
    EXPECT_EQ(point->GetInstrumentChannelNames(streams, 0), 6);
    EXPECT_EQ(streams, (std::vector<std::wstring>{L"Speed", L"EngineSpeed", L"SteeringAngle", L"LateralAcceleration",
                                                  L"Gear", L"Brake"}));
    int message = -1;
    EXPECT_EQ(point->GetTrackSafety(message), TRACK_SAFE);
    EXPECT_EQ(message, 0);

    unsigned long number = 0;
    EXPECT_EQ(point->GetCurrentFrame(number), nullptr); // not connected
}

TEST(OffSimPoint, StandsAtTheStartWhenChosen)
{
    const Point point = MakePoint();
    EXPECT_TRUE(point->CanRefresh());
    EXPECT_TRUE(point->CanPreload());
    ASSERT_TRUE(point->FetchOnce());
    unsigned long number = 0;
    VtCSimulationDataFrame* frame = point->GetRecent(number);
    ASSERT_NE(frame, nullptr);
    EXPECT_EQ(number, 1U);
    EXPECT_EQ(frame->GetTimestamp(), 0.0);
    float place[3];
    frame->GetSimulationData(3)->GetVector(place);
    EXPECT_NEAR(place[0], -1.325, 1e-5);
    EXPECT_NEAR(place[1], 0.77, 1e-5);
    VtTInstrumentVariant gear;
    ASSERT_TRUE(frame->GetSimulationData(9)->getInstrumentValue(gear));
    EXPECT_EQ(gear.value, 1.0);

    // A run that was recorded is not what a refresh may throw away.
    ASSERT_TRUE(point->Connect());
    ASSERT_NE(FrameAt(*point, 1.0), nullptr);
    point->Disconnect();
    EXPECT_TRUE(point->FetchOnce());
    unsigned long count = 0;
    EXPECT_TRUE(point->GetBufferedFrames(count));
    EXPECT_EQ(count, 101U);
}

TEST(OffSimPoint, ShowsTheSameHoweverOftenItIsAsked)
{
    const Point often = MakePoint();
    const Point seldom = MakePoint();
    ASSERT_TRUE(often->Connect());
    ASSERT_TRUE(seldom->Connect());
    for (int i = 0; i <= 20000; ++i)
    {
        VtCSimulationDataFrame* frame = FrameAt(*often, i / 1000.0);
        ASSERT_NE(frame, nullptr);
        ASSERT_NEAR(frame->GetTimestamp(), std::floor(i / 10.0) / 100.0, 1e-9);
    }
    for (int i = 0; i <= 140; ++i)
        ASSERT_NE(FrameAt(*seldom, i / 7.0), nullptr);

    unsigned long count[2] = {};
    often->GetBufferedFrames(count[0]);
    seldom->GetBufferedFrames(count[1]);
    ASSERT_EQ(count[0], 2001U);
    ASSERT_EQ(count[1], 2001U);
    for (unsigned long number = 1; number <= 2001; ++number)
    {
        ASSERT_TRUE(often->SetRecent(number) && seldom->SetRecent(number));
        unsigned long at = 0;
        ASSERT_TRUE(SameRecords(*often->GetRecent(at), *seldom->GetRecent(at))) << number;
    }
}

TEST(OffSimPoint, CatchesUpAfterALongPauseWithoutHanging)
{
    const Point point = MakePoint();
    ASSERT_TRUE(point->Connect());
    for (const double reached : {60.0, 120.0, 180.0})
    {
        VtCSimulationDataFrame* frame = FrameAt(*point, 10.0 * 3600.0);
        ASSERT_NE(frame, nullptr);
        EXPECT_DOUBLE_EQ(frame->GetTimestamp(), reached);
    }
    const Point steady = MakePoint();
    ASSERT_TRUE(steady->Connect());
    VtCSimulationDataFrame* frame = nullptr;
    for (int i = 0; i <= 180; ++i)
        frame = FrameAt(*steady, i);
    unsigned long number = 0;
    EXPECT_TRUE(SameRecords(*frame, *point->GetRecent(number)));
    EXPECT_EQ(number, 10000U); // the ring is full and holds the newest

    for (const double odd : {std::numeric_limits<double>::quiet_NaN(), std::numeric_limits<double>::infinity(), 1.0})
        EXPECT_DOUBLE_EQ(FrameAt(*steady, odd)->GetTimestamp(), 180.0);
    EXPECT_DOUBLE_EQ(FrameAt(*steady, 1e300)->GetTimestamp(), 240.0);
}

// A looping clock takes a time above the latest back by whole spans. Made of 32-bit ticks it tells 4294967.295 s at
// most, so a latest time above that is never passed, neither in a first run nor with an old one in the buffer.
TEST(OffSimPoint, IsNeverWrappedByALoopingClock)
{
    const Point point = MakePoint();
    for (int run = 0; run < 2; ++run)
    {
        double earliest = -1.0;
        double latest = -1.0;
        ASSERT_TRUE(point->GetFrameBufferEarliestTime(earliest));
        ASSERT_TRUE(point->GetFrameBufferLatestTime(latest));
        EXPECT_EQ(earliest, 0.0);
        EXPECT_GT(latest, 4294967.295);

        ASSERT_TRUE(point->Connect());
        unsigned long count = 0;
        EXPECT_FALSE(point->GetBufferedFrames(count)); // each run begins anew
        EXPECT_EQ(FrameAt(*point, 0.0)->GetTimestamp(), 0.0);
        EXPECT_EQ(FrameAt(*point, 2.0)->GetTimestamp(), 2.0);
        point->Disconnect();
    }

    // The count of ticks starts over: the run goes on. (A call drives a minute, so it shows as progress.)
    ASSERT_TRUE(point->Connect());
    EXPECT_EQ(FrameAt(*point, 4294967.0)->GetTimestamp(), 60.0);
    EXPECT_EQ(FrameAt(*point, 0.5)->GetTimestamp(), 120.0);
}

TEST(OffSimPoint, KeepsItsRunForReplay)
{
    const Point point = MakePoint();
    ASSERT_TRUE(point->Connect());
    for (int i = 0; i <= 300; ++i)
        ASSERT_NE(FrameAt(*point, i / 100.0), nullptr);
    point->Disconnect();
    unsigned long number = 0;
    EXPECT_EQ(point->GetCurrentFrame(number), nullptr);

    ASSERT_NE(point->GetAtTime(1.234), nullptr);
    EXPECT_DOUBLE_EQ(point->GetAtTime(1.234)->GetTimestamp(), 1.23);
    point->SetFrameBufferRepeat(0);
    EXPECT_EQ(point->GetAtTime(3.5), nullptr);
    point->SetFrameBufferRepeat(1); // the clock doesn't wrap, so the buffer must
    ASSERT_NE(point->GetAtTime(3.5), nullptr);
    EXPECT_DOUBLE_EQ(point->GetAtTime(3.5)->GetTimestamp(), 0.5);

    // Taking the buffer away leaves nothing, and a run goes on without it.
    ASSERT_TRUE(point->Connect());
    ASSERT_NE(FrameAt(*point, 1.0), nullptr);
    const std::unique_ptr<VtCSimulationDataFrames> taken(point->RelinquishFrameBuffer());
    ASSERT_NE(taken, nullptr);
    EXPECT_EQ(taken->GetCount(), 101);
    VtCSimulationDataFrame* next = FrameAt(*point, 1.0);
    ASSERT_NE(next, nullptr);
    EXPECT_EQ(next->GetTimestamp(), 1.0);
}

TEST(OffSimPoint, FailsAndRecoversAsAsked)
{
    const Point point = MakePoint(L"fail=2.5;recover=4");
    ASSERT_TRUE(point->Connect());
    EXPECT_NE(FrameAt(*point, 2.499), nullptr);
    EXPECT_EQ(TakeMessage(*point), L"");
    EXPECT_EQ(FrameAt(*point, 2.5), nullptr);
    EXPECT_NE(TakeMessage(*point).find(L"failed at 2.5 s"), std::wstring::npos);
    EXPECT_EQ(FrameAt(*point, 3.9), nullptr); // a retry that finds it still failing
    EXPECT_EQ(TakeMessage(*point), L"");
    VtCSimulationDataFrame* back = FrameAt(*point, 7.5);
    ASSERT_NE(back, nullptr);
    EXPECT_EQ(back->GetTimestamp(), 7.5);
    EXPECT_DOUBLE_EQ(point->GetAtTime(3.0)->GetTimestamp(), 2.49); // a gap in the run

    // The same run as one without a failure: what can't be seen still drives.
    const Point sound = MakePoint();
    ASSERT_TRUE(sound->Connect());
    EXPECT_TRUE(SameRecords(*FrameAt(*sound, 7.5), *FrameAt(*point, 7.5)));

    const Point closed = MakePoint(L"fail=0");
    EXPECT_FALSE(closed->Connect());
    EXPECT_NE(TakeMessage(*closed), L"");
    EXPECT_FALSE(closed->FetchOnce());
    EXPECT_NE(TakeMessage(*closed), L"");
    EXPECT_EQ(FrameAt(*closed, 1.0), nullptr);

    const Point late = MakePoint(L"fail=0;recover=1");
    ASSERT_TRUE(late->Connect());
    EXPECT_EQ(FrameAt(*late, 0.0), nullptr);
    ASSERT_NE(FrameAt(*late, 1.0), nullptr);
    double first = 0.0;
    EXPECT_EQ(late->GetAtTime(0.5), nullptr);
    EXPECT_TRUE(late->SetRecent(1) && late->GetTimeStampOfCurrentElement(first));
    EXPECT_EQ(first, 1.0);
}

TEST(OffSimPoint, RefusesSourcesItDoesNotHave)
{
    const Point point = MakePoint(L"seed=11");
    struct Case
    {
        const char* name;
        const wchar_t* type;
        const wchar_t* path;
        int mode;
    };
    const Case cases[] = {
        {"another type", L"MDF", L"run.mdf", 1},
        {"unknown option", L"OffSim", L"pace=2", 1},
        {"writing", L"OffSim", L"seed=3", MotionDataWriteMode(10)},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        EXPECT_FALSE(point->Configure(c.type, c.path, c.mode, 0));
        EXPECT_NE(TakeMessage(*point), L"");
        EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=11");
    }

    ASSERT_TRUE(point->Connect());
    EXPECT_TRUE(point->Configure(L"offsim", L"seed=12", 1, 0));
    EXPECT_EQ(FrameAt(*point, 1.0), nullptr); // a new source ends the run of the old one

    point->Reset();
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=7");
    std::wstring names;
    EXPECT_EQ(point->GetChannelNames(names, 0), 5);
    EXPECT_TRUE(point->Connect());
    EXPECT_NE(FrameAt(*point, 0.0), nullptr);
}

TEST(OffSimPoint, AllocatesNothingWhileItRuns)
{
    heap::Count taken;
    const Point point = MakePoint();
    EXPECT_TRUE(taken.Stop() > 0 || !heap::CanCount()) << "the count does count";
    point->SetFrameBufferSize(50); // so that the ring turns over too
    ASSERT_TRUE(point->Connect());
    ASSERT_NE(FrameAt(*point, 0.0), nullptr);
    heap::Count allocations;
    for (int i = 0; i < 2000; ++i)
        FrameAt(*point, i / 60.0);
    EXPECT_EQ(allocations.Stop(), 0);
}

} // namespace

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
#include "simdata/points/SettingsPage.h"
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
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=7");
    EXPECT_TRUE(point->IsSource() && !point->IsSink() && point->IsTimeDriven() && point->GetTimestampsSupported());
    std::wstring poses;
    EXPECT_EQ(point->GetChannelNames(poses, 0), 5);
    EXPECT_EQ(poses, L"Vehicle|Vehicle.FL|Vehicle.FR|Vehicle.RL|Vehicle.RR");
    const std::vector<VtTInstrumentStream> streams = point->GetInstrumentStreams(0);
    ASSERT_EQ(streams.size(), 6U);
    EXPECT_EQ(streams[3], (VtTInstrumentStream{L"LateralAcceleration", L"m/s^2"}));
    int message = -1;
    EXPECT_EQ(point->GetTrackSafety(message), TRACK_SAFE);
    unsigned long number = 0;
    EXPECT_EQ(point->GetCurrentFrame(number), nullptr); // not connected
}

TEST(OffSimPoint, StandsAtTheStartWhenChosen)
{
    const Point point = MakePoint();
    EXPECT_TRUE(point->CanRefresh() && point->CanPreload());
    ASSERT_TRUE(point->FetchOnce());
    unsigned long number = 0;
    VtCSimulationDataFrame* frame = point->GetRecent(number);
    ASSERT_NE(frame, nullptr);
    EXPECT_EQ(frame->GetTimestamp(), 0.0);
    float place[3];
    frame->GetSimulationData(3)->GetVector(place);
    EXPECT_NEAR(place[0], -1.325, 1e-5);
    EXPECT_NEAR(place[1], 0.77, 1e-5);

    // A run that was recorded is not what a refresh may throw away.
    ASSERT_TRUE(point->Connect());
    ASSERT_NE(FrameAt(*point, 1.0), nullptr);
    point->Disconnect();
    EXPECT_TRUE(point->FetchOnce());
    point->SetFrameBufferRepeat(1); // the clock doesn't wrap, so the buffer must
    EXPECT_DOUBLE_EQ(point->GetAtTime(1.5)->GetTimestamp(), 0.5);
}

TEST(OffSimPoint, ShowsTheSameHoweverOftenItIsAsked)
{
    const Point often = MakePoint();
    const Point seldom = MakePoint();
    ASSERT_TRUE(often->Connect() && seldom->Connect());
    for (int i = 0; i <= 20000; ++i)
        ASSERT_NEAR(FrameAt(*often, i / 1000.0)->GetTimestamp(), std::floor(i / 10.0) / 100.0, 1e-9);
    for (int i = 0; i <= 140; ++i)
        ASSERT_NE(FrameAt(*seldom, i / 7.0), nullptr);
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
    unsigned long number = 0;
    point->GetRecent(number);
    EXPECT_EQ(number, 10000U); // the ring is full and holds the newest
    for (const double odd : {std::numeric_limits<double>::quiet_NaN(), std::numeric_limits<double>::infinity(), 1.0})
        EXPECT_DOUBLE_EQ(FrameAt(*point, odd)->GetTimestamp(), 180.0);
    EXPECT_DOUBLE_EQ(FrameAt(*point, 1e300)->GetTimestamp(), 240.0);
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
}

TEST(OffSimPoint, RefusesSourcesItDoesNotHave)
{
    const Point point = MakePoint(L"seed=11");
    struct Case
    {
        const wchar_t* type;
        const wchar_t* path;
        int mode;
    };
    for (const Case& c : {Case{L"MDF", L"run.mdf", 1}, {L"OffSim", L"pace=2", 1}, {L"OffSim", L"seed=3", 0x10002}})
    {
        EXPECT_FALSE(point->Configure(c.type, c.path, c.mode, 0));
        EXPECT_NE(TakeMessage(*point), L"");
        EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=11");
    }
    ASSERT_TRUE(point->Connect());
    EXPECT_TRUE(point->Configure(L"offsim", L"seed=12", 1, 0));
    EXPECT_EQ(FrameAt(*point, 1.0), nullptr); // a new source ends the run of the old one
    point->Reset();
    EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|seed=7");
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

TEST(OffSimPoint, HasItsOptionsOnAPage)
{
    struct Edit
    {
        const wchar_t* before;
        std::vector<std::pair<std::size_t, double>> changes; ///< field and value
        const wchar_t* after;
    };
    const Edit edits[] = {
        {L"", {}, L"seed=7"},
        {L"", {{0, 12.0}}, L"seed=12"},
        {L"seed=5", {{1, 12.5}}, L"seed=5;fail=12.5"},
        {L"fail=12.5", {{2, 7.5}}, L"seed=7;fail=12.5;recover=20"},
        {L"fail=0.1;recover=1", {{2, 0.2}}, L"seed=7;fail=0.1;recover=0.3"},
        {L"fail=2;recover=5", {{1, 10.0}}, L"seed=7;fail=10;recover=13"},
        {L"fail=2;recover=5", {{2, 0.0}}, L"seed=7;fail=2"},
        {L"fail=2;recover=5", {{1, -1.0}}, L"seed=7"},
    };
    for (const Edit& edit : edits)
    {
        SCOPED_TRACE(testing::PrintToString(std::wstring(edit.after)));
        const Point point = MakePoint(edit.before);
        const std::unique_ptr<VtCSettingsPage> page(point->CreatePropertyPage());
        const std::wstring before = point->GetConfigurationInfoText(0);
        for (const auto& [field, value] : edit.changes)
        {
            page->OnFieldChanged(field, value);
            EXPECT_EQ(page->GetFields()[field].value, value);
        }
        EXPECT_EQ(point->GetConfigurationInfoText(0), before) << "nothing before OK";
        page->OnOK();
        EXPECT_EQ(point->GetConfigurationInfoText(0), L"OffSim|OffSim|" + std::wstring(edit.after));
    }
}

} // namespace

#include <cmath>
#include <random>
#include <set>

#include <gtest/gtest.h>

#include "simdata/points/SimulationDataFrames.h"
#include "simdata/points/tests/TestRun.h"

using namespace SimulationDataPoints;

TEST(Frames, ATimeFindsTheLastFrameNotAboveIt)
{
    struct Case
    {
        const char* name;
        std::vector<double> times;
        int repeat;
        double t;
        int number; ///< 0: none
    };
    const std::vector<double> run = {1.0, 1.5, 1.5, 2.0, 4.0};
    const Case cases[] = {
        {"before the first", run, 0, 0.999, 0},
        {"the first exactly", run, 0, 1.0, 1},
        {"between two", run, 0, 1.2, 1},
        {"the last of equal ones", run, 0, 1.5, 3},
        {"the last exactly", run, 0, 4.0, 5},
        {"beyond the last", run, 0, 4.001, 0},
        {"less than half a microsecond early counts as reached", run, 0, 1.9999997, 4},
        {"one span beyond", run, 1, 4.2 + 3.0, 1},
        {"beyond the end wraps to behind the start", run, 1, 4.0 + 0.6, 3},
        {"many spans beyond", run, 1, 4.0 + 300.0 + 1.5, 4},
        {"a single frame", {2.0}, 0, 2.0, 1},
        {"beyond a single repeating frame", {2.0}, 1, 2.1, 1},
        {"no number", run, 1, std::nan(""), 0},
        {"nothing there", {}, 1, 1.0, 0},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        const auto frames = FramesAt(c.times);
        EXPECT_EQ(frames->PrepareForTimeSyncReplay(c.repeat, 0), c.times.empty() ? 0 : 1);
        VtCSimulationDataFrame* frame = frames->GetAtTime(c.t, 0);
        EXPECT_EQ(NumberIn(frame), c.number);
        if (frame)
        {
            EXPECT_EQ(frame->GetTimestamp(), c.times[static_cast<std::size_t>(c.number - 1)]);
        }
    }
}

TEST(Frames, TheSearchAgreesWithAWalkOverEvenAndUnevenTimes)
{
    std::mt19937 random(7);
    std::vector<double> even, late, off, nearly, squares, bursts = {0.0};
    for (int i = 0; i < 700; ++i)
    {
        even.push_back(i / 60.0);
        late.push_back(1.7e9 + i / 120.0);
        off.push_back(0.01 * i + (i == 650 ? 0.003 : 0.0));
        nearly.push_back(0.001 * i + 1e-6 * (random() % 2));
        bursts.push_back(bursts.back() + (random() % 50 == 0 ? 100.0 : random() % 3 * 1e-6));
        squares.push_back(1e-3 * i * i * i);
    }
    for (const auto& times : {even, late, off, nearly, bursts, squares})
    {
        // A full ring too: the oldest 300 are overwritten.
        for (const std::size_t capacity : {times.size(), times.size() - 300})
        {
            const auto frames = FramesAt(times, capacity);
            std::uniform_real_distribution<double> anywhere(times.front() - 0.1, times.back() + 0.1);
            for (int i = 0; i < 3000; ++i)
            {
                const double t = i % 2 == 0 ? VtCSimulationDataFrame::RoundTimeStamp(anywhere(random))
                                            : times[random() % times.size()];
                int expected = 0;
                for (std::size_t k = times.size() - capacity; k < times.size(); ++k)
                    if (std::llrint(times[k] * 1e6) <= std::llrint(t * 1e6))
                        expected = static_cast<int>(k) + 1;
                if (std::llrint(t * 1e6) > std::llrint(times.back() * 1e6))
                    expected = 0;
                VtCSimulationDataFrame* frame = frames->GetAtTime(t, 0);
                ASSERT_EQ(NumberIn(frame), expected) << "t " << t << " capacity " << capacity;
            }
        }
    }
}

TEST(Frames, AComputedTimeMeetsAStoredOne)
{
    // 0.1 + 0.2 is above 0.3 and 0.7 + 0.1 below 0.8, by the last bit.
    const auto frames = FramesAt({0.0, 0.1 + 0.2, 0.8, 1.0});
    EXPECT_EQ(NumberIn(frames->GetAtTime(0.3, 0)), 2);
    EXPECT_EQ(NumberIn(frames->GetAtTime(0.7 + 0.1, 0)), 3);
    EXPECT_EQ(frames->GetFrame(1)->GetTimestamp(), 0.3);

    for (const double t : {0.0, 1.0 / 3.0, -2.5000005, 86400.1234567, 1.7e9 + 0.1234567, 1e15, -1e300})
    {
        const double once = VtCSimulationDataFrame::RoundTimeStamp(t);
        EXPECT_EQ(VtCSimulationDataFrame::RoundTimeStamp(once), once) << t;
        EXPECT_NEAR(once, t, std::fabs(t) < 2e9 ? 1e-6 : 0.0) << t;
    }
}

TEST(Frames, AFullRingDropsTheOldest)
{
    const auto frames = FramesAt({1, 2, 3, 4, 5, 6, 7}, 4);
    EXPECT_EQ(frames->GetCount(), 4);
    EXPECT_EQ(frames->ComputeLatestTime(), 7.0);
    EXPECT_EQ(frames->GetAtTime(3.9, 0), nullptr);
    EXPECT_EQ(frames->GetAtTime(4.0, 0)->GetFrameId(), 1);

    // Walked once, then a repeating one starts over.
    for (const int repeat : {0, 1})
    {
        frames->PrepareForTimeSyncReplay(repeat, 0);
        unsigned long position = 0;
        int wrapped = 7;
        for (int number = 4; number <= 7; ++number)
        {
            EXPECT_EQ(NumberIn(frames->GetNext(position, &wrapped)), number);
            EXPECT_EQ(wrapped, 0);
        }
        EXPECT_EQ(frames->GetNext(position, &wrapped), nullptr);
        EXPECT_EQ(wrapped, repeat);
        EXPECT_EQ(NumberIn(frames->GetNext(position, nullptr)), repeat != 0 ? 4 : 0);
    }

    // The view that was handed out last is of the record that is overwritten now.
    EXPECT_EQ(NumberIn(frames->GetFrame(0)), 4);
    frames->Append(8.0);
    frames->Append(9.0).SetInstrument(0, 9);
    frames->Append(10.0).SetInstrument(0, 10);
    frames->Append(11.0).SetInstrument(0, 11);
    EXPECT_EQ(frames->GetFrame(0)->GetTimestamp(), 8.0);
    VtTInstrumentVariant value;
    EXPECT_NE(frames->GetFrame(0)->GetSimulationData(0)->getInstrumentValue(value), 0);
    EXPECT_EQ(value.value, 0.0) << "a record that wasn't filled holds nothing of an older frame";

    const auto copy = frames->Copy(3);
    EXPECT_EQ(copy->GetCount(), 3);
    EXPECT_EQ(NumberIn(copy->GetFrame(0)), 9);
    EXPECT_EQ(NumberIn(copy->GetFrame(2)), 11);
    EXPECT_EQ(copy->GetFrame(3), nullptr);
    EXPECT_EQ(NumberIn(frames->Copy(100)->GetAtTime(9.5, 0)), 9);
}

TEST(Frames, ChannelsStandInOrderAndKeepTheirKind)
{
    VtCSimulationDataFrames frames(CarChannels(), 3);
    FillCar(frames, 3);
    VtCSimulationDataFrame* frame = frames.GetFrame(2);
    ASSERT_EQ(frame->GetCount(), 3);
    EXPECT_FALSE(frame->IsEmpty());
    EXPECT_EQ(frame->GetSimulationData(-1), nullptr);
    EXPECT_EQ(frame->GetSimulationData(3), nullptr);

    float m[4][4];
    float v[3];
    VtTInstrumentVariant value{5.0, 1, 2};
    const VtCSimulationData* wheel = frame->GetSimulationData(1);
    EXPECT_FALSE(wheel->isInstrumentStream());
    wheel->GetVector(v);
    EXPECT_EQ(v[2], -2.0F);
    EXPECT_EQ(wheel->getInstrumentValue(value), 0);
    EXPECT_EQ(value.value, 5.0);

    const VtCSimulationData* speed = frame->GetSimulationData(2);
    EXPECT_TRUE(speed->isInstrumentStream());
    EXPECT_NE(speed->getInstrumentValue(value), 0);
    EXPECT_EQ(value.value, 102.0);
    EXPECT_EQ(value.type, 10);
    speed->GetMatrix4x4(m);
    EXPECT_EQ(m[0][0], 1.0F);
    EXPECT_EQ(m[0][3], 0.0F);

    // A time that runs back would break the search: it is held.
    frames.Append(-1.0).SetInstrument(0, INFINITY);
    EXPECT_EQ(frames.GetFrame(2)->GetTimestamp(), 0.02);
    EXPECT_EQ(frames.GetFrame(2)->GetSimulationData(2)->getInstrumentValue(value), 0);
}

TEST(Frames, AnglesRebuildTheRotation)
{
    // Turns of 30 degrees, their matrices by hand: cos 0.8660254, sin 0.5.
    struct Case
    {
        const char* name;
        float r[3][3];
        double euler[3];
        double kardan[3];
    };
    constexpr float c = 0.8660254F;
    const Case cases[] = {
        {"about x", {{1, 0, 0}, {0, c, -.5F}, {0, .5F, c}}, {0, 30, 0}, {30, 0, 0}},
        {"about z", {{c, -.5F, 0}, {.5F, c, 0}, {0, 0, 1}}, {30, 0, 0}, {0, 0, 30}},
        {"y by 90", {{0, 0, 1}, {0, 1, 0}, {-1, 0, 0}}, {90, 90, -90}, {0, 90, 0}},
        // Rx(90) Rz(90): x to z, y to -x, z to -y.
        {"z then x", {{0, -1, 0}, {0, 0, -1}, {1, 0, 0}}, {0, 90, 90}, {90, 0, 90}},
    };
    for (const Case& each : cases)
    {
        SCOPED_TRACE(each.name);
        float m[4][4] = {{0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 1}};
        for (int row = 0; row < 3; ++row)
            std::copy(each.r[row], each.r[row] + 3, m[row]);
        VtCSimulationDataFrames frames(CarChannels(), 1);
        frames.Append(0).SetPose(0, m);
        const VtCSimulationData* data = frames.GetFrame(0)->GetSimulationData(0);
        double angles[3];
        data->GetEulerAngles(angles[0], angles[1], angles[2], 1);
        for (int i = 0; i < 3; ++i)
            EXPECT_NEAR(angles[i], each.euler[i], 1e-4) << "Euler " << i;
        data->GetKardanAngles(angles[0], angles[1], angles[2], 1);
        for (int i = 0; i < 3; ++i)
            EXPECT_NEAR(angles[i], each.kardan[i], 1e-4) << "Kardan " << i;
        data->GetKardanAngles(angles[0], angles[1], angles[2], 0);
        EXPECT_NEAR(angles[0], each.kardan[0] / 57.29577951308232, 1e-6);
    }
}

TEST(Frames, AHandedOutFrameOutlivesLaterRequests)
{
    std::vector<double> times;
    for (int i = 0; i < 100; ++i)
        times.push_back(i);
    const auto frames = FramesAt(times);
    VtCSimulationDataFrame* first = frames->GetAtTime(10.0, 0);
    EXPECT_EQ(frames->GetAtTime(10.5, 0), first) << "the same frame again needs no other view";
    first->SetTrackID(3);

    std::set<VtCSimulationDataFrame*> others;
    for (std::size_t i = 1; i < VtCSimulationDataFrames::viewCount; ++i)
        others.insert(frames->GetFrame(20 + i));
    EXPECT_EQ(others.count(first), 0u);
    EXPECT_EQ(NumberIn(first), 11);
    EXPECT_EQ(first->GetTrackID(), 3u);
    EXPECT_EQ(frames->GetFrame(60)->GetTrackID(), 0u);
}

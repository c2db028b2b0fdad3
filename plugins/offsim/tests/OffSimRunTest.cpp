#include "offsim/OffSimRun.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <gtest/gtest.h>
#include <numbers>
#include <vector>

#include "offsim/OffSimOptions.h"

namespace
{

using offsim::OffSimRun;
using offsim::Sample;

constexpr double pi = std::numbers::pi;

bool Same(const Sample& a, const Sample& b)
{
    return std::memcmp(a.poses, b.poses, sizeof a.poses) == 0 &&
           std::memcmp(a.instruments, b.instruments, sizeof a.instruments) == 0;
}

double HeadingOf(const float (&pose)[4][4])
{
    return std::atan2(pose[1][0], pose[0][0]);
}

TEST(OffSimRun, KeepsToTheRoadForTenLaps)
{
    OffSimRun run(7);
    std::vector<offsim::CoursePoint> line;
    for (double station = 0.0; station < 1200.0; station += 0.5)
        line.push_back(run.Road().At(station));

    double worst = 0.0;
    std::vector<double> lapSeconds;
    std::int64_t lapStart = 0;
    while (lapSeconds.size() < 10 && run.Steps() < 100000)
    {
        run.Step();
        if (run.Steps() % 10 == 0)
        {
            double nearest = 1e9;
            for (const offsim::CoursePoint& point : line)
                nearest = std::min(nearest, std::hypot(point.x - run.Vehicle().X(), point.y - run.Vehicle().Y()));
            worst = std::max(worst, nearest);
        }
        if (run.Station() >= 1200.0 * static_cast<double>(lapSeconds.size() + 1))
        {
            lapSeconds.push_back(static_cast<double>(run.Steps() - lapStart) / 100.0);
            lapStart = run.Steps();
        }
    }
    ASSERT_EQ(lapSeconds.size(), 10U);
    EXPECT_LT(worst, 0.5);  // half a road less half a car leaves 3 m
    EXPECT_GT(worst, 0.02); // a driver, not a rail
    for (std::size_t lap = 1; lap < lapSeconds.size(); ++lap)
        EXPECT_NEAR(lapSeconds[lap], lapSeconds[1], 0.5);
    EXPECT_GT(lapSeconds[0], lapSeconds[1] + 2.0); // from rest
}

TEST(OffSimRun, StaysSoundForHours)
{
    OffSimRun run(3);
    Sample sample;
    while (run.Steps() < 3 * 3600 * 100)
    {
        run.Step();
        if (run.Steps() % 97 != 0)
            continue;
        run.Take(sample);
        ASSERT_LT(std::abs(run.Deviation()), 3.0) << run.Steps();
        ASSERT_GT(sample.instruments[Sample::speed], 0.0);
        ASSERT_LT(sample.instruments[Sample::speed], 140.0);
        for (const auto& pose : sample.poses)
            for (const auto& row : pose)
                for (const float value : row)
                    ASSERT_TRUE(std::isfinite(value)) << run.Steps();
    }
}

TEST(OffSimRun, IsTheSameForTheSameSeedOnly)
{
    OffSimRun first(7);
    OffSimRun second(7);
    OffSimRun other(8);
    for (int i = 0; i < 3000; ++i)
    {
        first.Step();
        second.Step();
        other.Step();
    }
    Sample a;
    Sample b;
    Sample c;
    first.Take(a);
    second.Take(b);
    other.Take(c);
    EXPECT_TRUE(Same(a, b));
    EXPECT_FALSE(Same(a, c));
    EXPECT_NEAR(a.poses[0][0][3], c.poses[0][0][3], 3.0);

    first.Restart(8);
    for (int i = 0; i < 3000; ++i)
        first.Step();
    first.Take(a);
    EXPECT_TRUE(Same(a, c));
}

TEST(OffSimRun, PlacesRigidBodiesWithWheelsAtTheirPlaces)
{
    const double places[4][2] = {{1.325, 0.77}, {1.325, -0.77}, {-1.325, 0.77}, {-1.325, -0.77}};
    OffSimRun run(7);
    Sample sample;
    double largestSteer = 0.0;
    for (int i = 0; i < 8000; ++i)
    {
        run.Step();
        if (i % 37 != 0)
            continue;
        SCOPED_TRACE(i);
        run.Take(sample);
        for (const auto& m : sample.poses)
        {
            for (int a = 0; a < 3; ++a)
                for (int b = 0; b < 3; ++b)
                    ASSERT_NEAR(m[0][a] * m[0][b] + m[1][a] * m[1][b] + m[2][a] * m[2][b], a == b ? 1.0 : 0.0, 1e-6);
            const double determinant = m[0][0] * (m[1][1] * m[2][2] - m[1][2] * m[2][1]) -
                                       m[0][1] * (m[1][0] * m[2][2] - m[1][2] * m[2][0]) +
                                       m[0][2] * (m[1][0] * m[2][1] - m[1][1] * m[2][0]);
            ASSERT_NEAR(determinant, 1.0, 1e-6);
            ASSERT_EQ(m[3][0] + m[3][1] + m[3][2], 0.0F);
            ASSERT_EQ(m[3][3], 1.0F);
        }

        // Wheels stand on the ground, so they keep the heading of the body but not its roll and pitch.
        const auto& body = sample.poses[Sample::chassis];
        const double heading = HeadingOf(body);
        EXPECT_EQ(body[2][3], 0.0F);
        for (std::size_t wheel = 0; wheel < 4; ++wheel)
        {
            const auto& hub = sample.poses[Sample::firstWheel + wheel];
            const auto [along, left] = places[wheel];
            EXPECT_NEAR(hub[0][3], body[0][3] + along * std::cos(heading) - left * std::sin(heading), 1e-3);
            EXPECT_NEAR(hub[1][3], body[1][3] + along * std::sin(heading) + left * std::cos(heading), 1e-3);
            EXPECT_FLOAT_EQ(hub[2][3], 0.31F);
            const double axle = std::atan2(-hub[0][1], hub[1][1]); // of the wheel's y axis, which is level
            const double steer = std::remainder(axle - heading, 2.0 * pi);
            EXPECT_NEAR(hub[2][1], 0.0, 1e-6);
            EXPECT_NEAR(steer, 0.0, wheel < 2 ? 0.2 : 1e-5);
            largestSteer = std::max(largestSteer, wheel < 2 ? std::abs(steer) : 0.0);
        }
    }
    EXPECT_GT(largestSteer, 0.08); // 2.65 m by the tightest radius of 29 m
}

TEST(OffSimRun, RollsItsWheelsByTheWayTheyGo)
{
    OffSimRun run(7);
    Sample sample;
    run.Take(sample);
    double angle[4] = {};
    double way[4] = {};
    float before[4][2];
    for (int wheel = 0; wheel < 4; ++wheel)
        for (int axis = 0; axis < 2; ++axis)
            before[wheel][axis] = sample.poses[1 + wheel][axis][3];
    for (int i = 0; i < 2500; ++i)
    {
        run.Step();
        run.Take(sample);
        for (int wheel = 0; wheel < 4; ++wheel)
        {
            const auto& hub = sample.poses[1 + wheel];
            const double rolled = std::atan2(-hub[2][0], hub[2][2]);
            angle[wheel] += std::remainder(rolled - angle[wheel], 2.0 * pi);
            way[wheel] += std::hypot(hub[0][3] - before[wheel][0], hub[1][3] - before[wheel][1]);
            before[wheel][0] = hub[0][3];
            before[wheel][1] = hub[1][3];
        }
    }
    for (int wheel = 0; wheel < 4; ++wheel)
    {
        EXPECT_GT(way[wheel], 250.0);
        // Slip angles make the way a little longer than what rolls off.
        EXPECT_NEAR(angle[wheel], way[wheel] / 0.31, 0.003 * way[wheel] / 0.31);
    }
}

TEST(OffSimRun, ShowsOnItsInstrumentsWhatThePosesDo)
{
    OffSimRun run(7);
    for (int i = 0; i < 1500; ++i)
        run.Step();
    double meanMeasured = 0.0;
    double meanShown = 0.0;
    int gears = 0;
    double brake = 0.0;
    for (int i = 0; i < 60; ++i)
    {
        Sample a;
        Sample b;
        run.Take(a);
        for (int part = 0; part < 100; ++part)
        {
            run.Step();
            run.Take(b);
            gears |= 1 << static_cast<int>(b.instruments[Sample::gear]);
            brake = std::max(brake, b.instruments[Sample::brake]);
            meanShown += b.instruments[Sample::lateralAcceleration] / 6000.0;
        }
        const double way = std::hypot(b.poses[0][0][3] - a.poses[0][0][3], b.poses[0][1][3] - a.poses[0][1][3]);
        const double mean = (a.instruments[Sample::speed] + b.instruments[Sample::speed]) / 7.2;
        EXPECT_NEAR(way, mean, 0.1 * mean + 0.5);
        meanMeasured += std::remainder(HeadingOf(b.poses[0]) - HeadingOf(a.poses[0]), 2.0 * pi) * mean / 60.0;
        EXPECT_GT(b.instruments[Sample::engineSpeed], 850.0);
        EXPECT_LT(b.instruments[Sample::engineSpeed], 6600.0);
    }
    EXPECT_NEAR(meanShown, meanMeasured, 0.05 * std::abs(meanMeasured));
    EXPECT_GE(__builtin_popcount(static_cast<unsigned>(gears)), 3);
    EXPECT_GT(brake, 10.0);
    EXPECT_LE(brake, 100.0);
}

TEST(OffSimOptions, ReadsWhatItWritesAndRefusesTheRest)
{
    struct Case
    {
        const wchar_t* text;
        const wchar_t* canonical; // null: refused
    };
    const Case cases[] = {
        {L"", L"seed=7"},
        {L" ; Seed = 12 ;", L"seed=12"},
        {L"fail=12.5;seed=0", L"seed=0;fail=12.5"},
        {L"recover=20;fail=0", L"seed=7;fail=0;recover=20"},
        {L"seed=-1", nullptr},
        {L"seed=7.5", nullptr},
        {L"seed", nullptr},
        {L"seed=", nullptr},
        {L"=7", nullptr},
        {L"fail=-1", nullptr},
        {L"fail=nan", nullptr},
        {L"fail=1e999", nullptr},
        {L"recover=5", nullptr},
        {L"fail=5;recover=5", nullptr},
        {L"seed=1;SEED=2", nullptr},
        {L"course=nowhere", nullptr},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(testing::PrintToString(std::wstring(c.text)));
        std::wstring fault;
        const auto options = offsim::OffSimOptions::Parse(c.text, fault);
        ASSERT_EQ(options.has_value(), c.canonical != nullptr);
        EXPECT_EQ(fault.empty(), c.canonical != nullptr);
        if (!options)
            continue;
        EXPECT_EQ(options->Text(), c.canonical);
        EXPECT_EQ(offsim::OffSimOptions::Parse(options->Text(), fault), options);
    }
}

} // namespace

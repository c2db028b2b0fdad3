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

TEST(OffSimRun, IsTheSameForTheSameSeedOnly)
{
    Sample samples[4];
    OffSimRun runs[] = {OffSimRun(7), OffSimRun(7), OffSimRun(8), OffSimRun(7)};
    runs[3].Step();
    runs[3].Restart(8);
    for (int i = 0; i < 4; ++i)
    {
        for (int step = 0; step < 3000; ++step)
            runs[i].Step();
        runs[i].Take(samples[i]);
    }
    EXPECT_TRUE(Same(samples[0], samples[1]));
    EXPECT_FALSE(Same(samples[0], samples[2]));
    EXPECT_TRUE(Same(samples[2], samples[3]));
}

TEST(OffSimRun, PutsItsWheelsUnderTheBodyAndRollsThem)
{
    const double places[4][2] = {{1.325, 0.77}, {1.325, -0.77}, {-1.325, 0.77}, {-1.325, -0.77}};
    OffSimRun run(7);
    Sample sample;
    double largestSteer = 0.0, rolled = 0.0, way = 0.0, x = -1.325, y = 0.77;
    for (int i = 0; i < 4000; ++i)
    {
        run.Step();
        run.Take(sample);
        const auto& body = sample.poses[Sample::chassis];
        const double heading = HeadingOf(body);
        for (std::size_t wheel = 0; wheel < 4; ++wheel)
        {
            const auto& hub = sample.poses[Sample::firstWheel + wheel];
            const auto [along, left] = places[wheel];
            ASSERT_NEAR(hub[0][3], body[0][3] + along * std::cos(heading) - left * std::sin(heading), 1e-3);
            ASSERT_NEAR(hub[1][3], body[1][3] + along * std::sin(heading) + left * std::cos(heading), 1e-3);
            ASSERT_FLOAT_EQ(hub[2][3], 0.31F);
            // The y axis of a wheel is level: wheels keep the heading of the body but not its roll and pitch.
            const double steer = std::remainder(std::atan2(-hub[0][1], hub[1][1]) - heading, 2.0 * pi);
            ASSERT_NEAR(hub[2][1], 0.0, 1e-6);
            ASSERT_NEAR(steer, 0.0, wheel < 2 ? 0.2 : 1e-5);
            largestSteer = std::max(largestSteer, std::abs(steer));
        }
        const auto& rear = sample.poses[Sample::firstWheel + 2];
        rolled += std::remainder(std::atan2(-rear[2][0], rear[2][2]) - rolled, 2.0 * pi);
        way += std::hypot(rear[0][3] - x, rear[1][3] - y);
        x = rear[0][3];
        y = rear[1][3];
    }
    EXPECT_GT(largestSteer, 0.08); // 2.65 m by the tightest radius of 29 m
    EXPECT_GT(way, 400.0);
    EXPECT_NEAR(rolled, way / 0.31, 0.003 * way / 0.31); // slip angles make the way a little longer
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
        {L"seed=0,fail=12.5", L"seed=0;fail=12.5"},
        {L"recover=20;fail=0", L"seed=7;fail=0;recover=20"},
        {L"seed=-1", nullptr},
        {L"fail=-1", nullptr},
        {L"fail=nan", nullptr},
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

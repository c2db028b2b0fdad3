#include <cmath>
#include <gtest/gtest.h>

#include "interaction/SmoothFollower.h"
#include "tests/support/FakeHost.h"

namespace
{

// Rotations about z whose angle tells which entry they came from.
VtCFollowData Turned(double degrees)
{
    VtCFollowData data;
    data.position.set(1, 2, 3);
    data.rotation.makeRotate(degrees * M_PI / 180, osg::Vec3d(0, 0, 1));
    return data;
}

double Degrees(const osg::Quat& rotation)
{
    return 2 * std::atan2(rotation.z(), rotation.w()) * 180 / M_PI;
}

struct RingTest : testing::Test
{
    fake::Clock clock;
    VtCTimedRingBuffer ring{clock};

    // One entry every `step` ms; entry k is turned by `perEntry * k` degrees.
    void Fill(int count, double step, double perEntry)
    {
        for (int k = 0; k < count; ++k)
        {
            ring.Add(Turned(perEntry * k));
            clock.Advance(step / 1000);
        }
    }

    // The angle found `delay` ms back, or -999 when the ring is too young.
    double Found(int delay) const
    {
        VtCFollowData out = Turned(-99.9);
        ring.GetDelayed(out, delay);
        EXPECT_EQ(out.position, osg::Vec3f(1, 2, 3)) << "the position is the caller's";
        const double angle = Degrees(out.rotation);
        return std::abs(angle + 99.9) < 1e-6 ? -999 : angle;
    }
};

} // namespace

TEST_F(RingTest, FindsTheEntryWhoseAgeFirstReachesTheDelay)
{
    Fill(100, 10, 1); // the newest, number 99, is 10 ms old; entry k is (100 - k) * 10 ms old, and ages start at 1
    EXPECT_NEAR(Found(11), 99, 1e-6);
    EXPECT_NEAR(Found(12), 98, 1e-6);
    EXPECT_NEAR(Found(500), 50, 1e-6);
    EXPECT_NEAR(Found(501), 50, 1e-6);
    EXPECT_NEAR(Found(502), 49, 1e-6);
    EXPECT_NEAR(Found(1001), 0, 1e-6);
    EXPECT_EQ(Found(1002), -999);
}

TEST_F(RingTest, ReachesBehindTheWrapButNotTheSlotThatIsWrittenNext)
{
    Fill(250, 10, 0.5); // slots 0..49 hold 200..249, slots 50..199 hold 50..199; slot 50 is written next
    EXPECT_NEAR(Found(501), 100, 1e-6);   // slot 0
    EXPECT_NEAR(Found(502), 99.5, 1e-6);  // slot 199
    EXPECT_NEAR(Found(1991), 25.5, 1e-6); // slot 51
    EXPECT_EQ(Found(1992), -999) << "slot 50 is passed over";
    EXPECT_NEAR(Found(1), 25, 1e-6) << "no delay: the slot that is written next";
}

TEST_F(RingTest, WithTheLastSlotNextNothingBehindTheWrapIsLookedAt)
{
    Fill(399, 10, 0.25); // slots 0..198 hold 200..398, slot 199 holds 199
    EXPECT_NEAR(Found(1991), 50, 1e-6);
    EXPECT_EQ(Found(1992), -999);
}

TEST_F(RingTest, ATickWrapCostsNothing)
{
    clock.startTicks = 0xFFFFFFFF - 250;
    Fill(100, 10, 1);
    EXPECT_NEAR(Found(502), 49, 1e-6);
}

TEST_F(RingTest, ForgetsAllWhenCleared)
{
    Fill(250, 10, 0.5);
    ring.Clear();
    EXPECT_EQ(Found(1), -999);
    Fill(10, 10, 1);
    EXPECT_EQ(Found(102), -999) << "the wrap of the earlier run is forgotten too";
}

TEST(SmoothFollower, LeansSevenPercentTowardsThePast)
{
    fake::Clock clock;
    VtCSmoothFollower follower(clock);
    VtCFollowData result = Turned(0);

    follower.Follow(Turned(40), result);
    EXPECT_NEAR(Degrees(result.rotation), 40 * 0.93, 1e-6) << "nothing is old enough yet: towards the identity";
    EXPECT_EQ(result.position, osg::Vec3f(1, 2, 3));

    clock.Advance(2.6);
    follower.Follow(Turned(60), result);
    EXPECT_NEAR(Degrees(result.rotation), 60 - 0.07 * 20, 1e-6) << "towards where it pointed 2.6 s ago";

    follower.Clear();
    follower.Follow(Turned(60), result);
    EXPECT_NEAR(Degrees(result.rotation), 60 * 0.93, 1e-6);
}

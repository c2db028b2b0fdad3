#include "offsim/Course.h"

#include <cmath>
#include <gtest/gtest.h>
#include <numbers>

namespace
{

constexpr double pi = std::numbers::pi;

TEST(Course, IsClosedAndNeverMeetsItself)
{
    const offsim::Course course = offsim::Course::Standard();
    EXPECT_DOUBLE_EQ(course.Length(), 1200.0);
    EXPECT_LT(course.ClosingGap(), 1e-6);
    EXPECT_NEAR(course.At(1200.0).heading, 2.0 * pi, 1e-9);

    // Two lanes of road and a verge of 4 m between any two places that aren't the same stretch.
    for (int a = 0; a < 1200; a += 2)
        for (int b = a + 60; b < 1200 && b < a + 1140; b += 2)
        {
            const offsim::CoursePoint p = course.At(a);
            const offsim::CoursePoint q = course.At(b);
            ASSERT_GT(std::hypot(p.x - q.x, p.y - q.y), 2 * offsim::Course::halfWidth + 4.0) << a << " and " << b;
        }
}

// Circle of 50 m to the left about (0, 50): everything is known in closed form, and no cell ends on a round number.
TEST(Course, FollowsACircleAndFindsOffsetsFromIt)
{
    const double radius = 50.0;
    const offsim::Course circle({{2.0 * pi * radius, 1.0 / radius, 1.0 / radius}});
    for (double turned = -1.0; turned < 8.0; turned += 0.37)
    {
        SCOPED_TRACE(turned);
        const offsim::CoursePoint at = circle.At(turned * radius);
        EXPECT_NEAR(at.x, radius * std::sin(turned), 1e-5);
        EXPECT_NEAR(at.y, radius - radius * std::cos(turned), 1e-5);
        EXPECT_NEAR(at.heading, turned, 1e-9);
        EXPECT_NEAR(at.curvature, 0.02, 1e-12);
        for (const double left : {-6.0, -0.5, 0.0, 3.0})
        {
            const double x = (radius - left) * std::sin(turned);
            const double y = radius - (radius - left) * std::cos(turned);
            const offsim::CourseOffset offset = circle.Project(x, y, turned * radius + 7.0);
            EXPECT_NEAR(offset.station, turned * radius, 1e-3);
            EXPECT_NEAR(offset.lateral, left, 1e-4);
        }
    }
}

} // namespace

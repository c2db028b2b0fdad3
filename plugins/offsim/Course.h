#pragma once

#include <cstddef>
#include <vector>

namespace offsim
{

/// A piece of the centre line whose curvature runs evenly from one value to the other: a straight (0, 0), an arc
/// (k, k) or a clothoid. Curvature in 1/m, positive to the left.
struct CourseElement
{
    double length;
    double startCurvature;
    double endCurvature;
};

/// A point of the centre line: scene axes (x east, y north), heading in radians counter-clockwise from east.
struct CoursePoint
{
    double x = 0.0;
    double y = 0.0;
    double heading = 0.0; ///< grows by 2 pi with every lap of a course that is driven counter-clockwise
    double curvature = 0.0;
};

/// Where a point lies against the centre line.
struct CourseOffset
{
    double station; ///< metres along the centre line, in the lap of the station that was the hint
    double lateral; ///< metres, positive to the left
};

/// A closed, level course, by its centre line. It begins at the origin and heads east.
///
/// Stations are metres along the centre line and go on from lap to lap: `At` takes any. The heading along an element is
/// the quadratic that its curvature integrates to; places are integrated from it once and kept in a table.
class Course
{
public:
    static constexpr double halfWidth = 4.0; ///< metres from the centre line to the edge of the road

    /// The elements must close: their turns add up to a full circle and their end meets their beginning.
    explicit Course(const std::vector<CourseElement>& elements);

    /// 1200 m with six straights between six curves of 29, 41 and 48 m radius, two of them to the right.
    static Course Standard();

    double Length() const { return length; }

    CoursePoint At(double station) const;

    /// The nearest point of the centre line, sought from the station `hint`, which must lie within some 10 m of it.
    CourseOffset Project(double x, double y, double hint) const;

    /// How far the end of the last element misses the beginning, metres; 0 but for rounding when the course closes.
    double ClosingGap() const { return closingGap; }

private:
    double length = 0.0;
    double cell = 0.0;   ///< metres between two entries of the table
    double turned = 0.0; ///< radians in one lap
    double closingGap = 0.0;
    std::vector<CoursePoint> table; ///< one more than there are cells: the last repeats the first, one lap on
};

} // namespace offsim

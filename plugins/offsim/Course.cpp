#include "offsim/Course.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace offsim
{

namespace
{

constexpr double wantedCell = 0.25;

/// A curve that turns by `degrees`: a clothoid of length `easing`, an arc, and the clothoid back.
void AddCurve(std::vector<CourseElement>& elements, double degrees, double easing, double arc)
{
    const double curvature = degrees * std::numbers::pi / 180.0 / (arc + easing);
    elements.push_back({easing, 0.0, curvature});
    elements.push_back({arc, curvature, curvature});
    elements.push_back({easing, curvature, 0.0});
}

void AddStraight(std::vector<CourseElement>& elements, double length)
{
    elements.push_back({length, 0.0, 0.0});
}

} // namespace

Course::Course(const std::vector<CourseElement>& elements)
{
    for (const CourseElement& element : elements)
        length += element.length;
    const auto cells = static_cast<std::size_t>(std::ceil(length / wantedCell));
    cell = length / static_cast<double>(cells);

    table.reserve(cells + 1);
    CoursePoint point;
    double elementStart = 0.0;
    std::size_t element = 0;
    for (std::size_t index = 0; index <= cells; ++index)
    {
        // Simpson's rule needs even curvature within a piece, so a cell is cut where an element ends in it.
        const double end = static_cast<double>(index) * cell;
        double at = index == 0 ? 0.0 : end - cell;
        while (at < end)
        {
            while (element + 1 < elements.size() && at >= elementStart + elements[element].length - 1e-9)
                elementStart += elements[element++].length;
            const CourseElement& here = elements[element];
            const double last = element + 1 < elements.size() ? elementStart + here.length : end;
            const double step = std::min(end, last) - at;
            const double slope = (here.endCurvature - here.startCurvature) / here.length;
            const double k = here.startCurvature + slope * (at - elementStart);
            const double middle = point.heading + (k + slope * step / 4.0) * step / 2.0;
            const double finish = point.heading + (k + slope * step / 2.0) * step;
            point.x += step / 6.0 * (std::cos(point.heading) + 4.0 * std::cos(middle) + std::cos(finish));
            point.y += step / 6.0 * (std::sin(point.heading) + 4.0 * std::sin(middle) + std::sin(finish));
            point.heading = finish;
            point.curvature = k + slope * step;
            at += step;
        }
        table.push_back(point);
    }
    closingGap = std::hypot(point.x, point.y);
    turned = point.heading;
}

Course Course::Standard()
{
    // Two like halves that turn by half a circle each: the second is the first turned about the middle, so the course
    // closes whatever the lengths are.
    std::vector<CourseElement> elements;
    for (int half = 0; half < 2; ++half)
    {
        AddStraight(elements, 170.0);
        AddCurve(elements, 105.0, 20.0, 55.0);
        AddStraight(elements, 79.0);
        AddCurve(elements, -60.0, 20.0, 30.0);
        AddStraight(elements, 60.0);
        AddCurve(elements, 135.0, 18.0, 50.0);
        AddStraight(elements, 40.0);
    }
    return Course(elements);
}

CoursePoint Course::At(double station) const
{
    const double laps = std::floor(station / length);
    const double within = (station - laps * length) / cell;
    const std::size_t index = std::min(static_cast<std::size_t>(within), table.size() - 2);
    const CoursePoint& from = table[index];
    const CoursePoint& to = table[index + 1];
    const double share = within - static_cast<double>(index);
    const double along = share * cell;

    CoursePoint point;
    point.curvature = from.curvature + (to.curvature - from.curvature) * share;
    const double middle = from.heading + (to.heading - from.heading) * share / 2.0;
    point.heading = from.heading + (to.heading - from.heading) * share + laps * turned;
    point.x = from.x + along * std::cos(middle);
    point.y = from.y + along * std::sin(middle);
    return point;
}

CourseOffset Course::Project(double x, double y, double hint) const
{
    // Newton's method on the distance along the tangent, which shrinks by 1 - k e towards the centre of a curve.
    constexpr int rounds = 3;
    CourseOffset offset{hint, 0.0};
    for (int round = 0; round <= rounds; ++round)
    {
        const CoursePoint on = At(offset.station);
        const double dx = x - on.x;
        const double dy = y - on.y;
        const double along = dx * std::cos(on.heading) + dy * std::sin(on.heading);
        offset.lateral = dy * std::cos(on.heading) - dx * std::sin(on.heading);
        if (round < rounds)
            offset.station += along / std::max(0.2, 1.0 - on.curvature * offset.lateral);
    }
    return offset;
}

} // namespace offsim

#include "offsim/Driver.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <numbers>

namespace offsim
{

namespace
{

constexpr double planCell = 1.0;
constexpr double speedGain = 1.5;      // 1/s
constexpr double speedPreview = 0.12;  // s, about the lag of the pedals
constexpr double steerPreview = 0.14;  // s, about the lag of steering and tyres
constexpr double steerFrequency = 1.8; // rad/s, how fast an offset is taken back
constexpr double steerDamping = 0.9;
constexpr double slowest = 4.0; // m/s; below, steering gains are those of this speed

/// The smallest difference between two headings, -pi to pi.
double Turned(double from, double to)
{
    return std::remainder(to - from, 2.0 * std::numbers::pi);
}

} // namespace

Driver::Driver(const Course& onCourse, const VehicleParameters& vehicle)
    : course(&onCourse),
      understeer((1.0 / vehicle.frontStiffness - 1.0 / vehicle.rearStiffness) / gravity),
      wheelbase(vehicle.wheelbase)
{
    const auto cells = static_cast<std::size_t>(std::ceil(course->Length() / planCell));
    cell = course->Length() / static_cast<double>(cells);
    allowed.resize(cells);
    for (std::size_t i = 0; i < cells; ++i)
    {
        const double curvature = std::abs(course->At(static_cast<double>(i) * cell).curvature);
        allowed[i] = curvature * topSpeed * topSpeed > lateralLimit ? std::sqrt(lateralLimit / curvature) : topSpeed;
    }
    // Twice round each way, for the course has no end where a limit could stop to act.
    for (std::size_t i = 0; i < 2 * cells; ++i)
    {
        double& next = allowed[(i + 1) % cells];
        next = std::min(next, std::sqrt(allowed[i % cells] * allowed[i % cells] + 2.0 * launchLimit * cell));
    }
    for (std::size_t i = 2 * cells; i > 0; --i)
    {
        double& before = allowed[(i - 1) % cells];
        before = std::min(before, std::sqrt(allowed[i % cells] * allowed[i % cells] + 2.0 * brakingLimit * cell));
    }
}

void Driver::Start(double newStation)
{
    station = newStation;
    deviation = 0.0;
}

double Driver::AllowedSpeed(double atStation) const
{
    const double within = (atStation / course->Length() - std::floor(atStation / course->Length())) * course->Length();
    const double at = within / cell;
    const std::size_t index = std::min(static_cast<std::size_t>(at), allowed.size() - 1);
    const double share = at - static_cast<double>(index);
    return allowed[index] * (1.0 - share) + allowed[(index + 1) % allowed.size()] * share;
}

Controls Driver::Drive(const VehicleModel& vehicle)
{
    const CourseOffset offset = course->Project(vehicle.X(), vehicle.Y(), station);
    station = offset.station;
    deviation = offset.lateral;

    const double speed = vehicle.Speed();
    const double gainSpeed = std::max(speed, slowest);
    Controls controls;

    // Side slip turns the course over ground away from the heading; what counts is where the car goes.
    const double overGround = vehicle.Heading() + std::atan2(vehicle.SideSpeed(), gainSpeed);
    const double leaving = std::sin(Turned(course->At(station).heading, overGround));
    const double seen = deviation + 2.0 * steerDamping / steerFrequency * speed * leaving;
    const double steerPerAcceleration = wheelbase / (gainSpeed * gainSpeed) + understeer;
    const double curvature = course->At(station + steerPreview * speed).curvature;
    controls.steer = curvature * (wheelbase + understeer * speed * speed) -
                     steerFrequency * steerFrequency * steerPerAcceleration * seen;

    const double ahead = station + speedPreview * speed;
    const double wanted = AllowedSpeed(ahead);
    const double next = AllowedSpeed(ahead + cell);
    const double planned = (next * next - wanted * wanted) / (2.0 * cell);
    const double acceleration = std::clamp(planned + speedGain * (wanted - speed), -1.5 * brakingLimit, launchLimit);
    const double force = vehicle.Parameters().mass * acceleration + vehicle.Resistance(speed);
    const double closed = vehicle.Drive().WheelForce(0.0, speed);
    const double open = vehicle.Drive().WheelForce(1.0, speed);
    if (force > closed)
        controls.throttle = open > closed ? (force - closed) / (open - closed) : vehicle.Throttle();
    else
        controls.brake = (closed - force) / (vehicle.Parameters().mass * vehicle.Parameters().fullBraking);
    return controls;
}

} // namespace offsim

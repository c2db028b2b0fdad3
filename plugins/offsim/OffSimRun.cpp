#include "offsim/OffSimRun.h"

#include <cmath>
#include <numbers>

namespace offsim
{

namespace
{

constexpr double stepSeconds = 1.0 / OffSimRun::stepsPerSecond;
constexpr double gustForce = 180.0; // N, standard deviation: a fresh breeze across the road
constexpr double gustLever = 0.25;  // m, from the centre of gravity forward to where the wind acts
constexpr double gustSeconds = 0.8; // correlation time
constexpr double degrees = 180.0 / std::numbers::pi;

struct Rotation
{
    double m[3][3];
};

/// Rz(heading) Ry(about the left axis) Rx(roll).
Rotation Turned(double heading, double pitch, double roll)
{
    const double cz = std::cos(heading);
    const double sz = std::sin(heading);
    const double cy = std::cos(pitch);
    const double sy = std::sin(pitch);
    const double cx = std::cos(roll);
    const double sx = std::sin(roll);
    return {{{cz * cy, cz * sy * sx - sz * cx, cz * sy * cx + sz * sx},
             {sz * cy, sz * sy * sx + cz * cx, sz * sy * cx - cz * sx},
             {-sy, cy * sx, cy * cx}}};
}

void Write(float (&pose)[4][4], const Rotation& rotation, double x, double y, double z)
{
    const double place[3] = {x, y, z};
    for (int row = 0; row < 3; ++row)
    {
        for (int column = 0; column < 3; ++column)
            pose[row][column] = static_cast<float>(rotation.m[row][column]);
        pose[row][3] = static_cast<float>(place[row]);
    }
    pose[3][0] = pose[3][1] = pose[3][2] = 0.0F;
    pose[3][3] = 1.0F;
}

} // namespace

OffSimRun::OffSimRun(std::uint64_t windSeed) : course(Course::Standard()), driver(course, vehicle.Parameters())
{
    Restart(windSeed);
}

void OffSimRun::Restart(std::uint64_t windSeed)
{
    const CoursePoint start = course.At(0.0);
    vehicle.Place(start.x, start.y, start.heading, 0.0);
    driver.Start(0.0);
    random.seed(windSeed);
    wind = 0.0;
    steps = 0;
}

double OffSimRun::Gust()
{
    // An Ornstein-Uhlenbeck process. The generator's own numbers are the same everywhere, the library's distributions
    // aren't; for sums of many the shape of the single one doesn't matter.
    const double even = static_cast<double>(random() >> 11) * 0x1p-53;
    const double unitVariance = (even - 0.5) * std::sqrt(12.0);
    const double kept = std::exp(-stepSeconds / gustSeconds);
    wind = wind * kept + std::sqrt(1.0 - kept * kept) * unitVariance;
    return wind;
}

void OffSimRun::Step()
{
    const double force = gustForce * Gust();
    vehicle.Step(driver.Drive(vehicle), {force, force * gustLever}, stepSeconds);
    ++steps;
}

void OffSimRun::Take(Sample& sample) const
{
    const VehicleParameters& parameters = vehicle.Parameters();
    const double heading = vehicle.Heading();
    const double x = vehicle.X();
    const double y = vehicle.Y();
    Write(sample.poses[Sample::chassis], Turned(heading, vehicle.Pitch(), vehicle.Roll()), x, y, 0.0);

    for (std::size_t index = 0; index < wheelCount; ++index)
    {
        const Wheel wheel = static_cast<Wheel>(index);
        const double along = (wheel < rearLeft ? 0.5 : -0.5) * parameters.wheelbase;
        const double left = (wheel == frontLeft || wheel == rearLeft ? 0.5 : -0.5) * parameters.track;
        const double turns = std::fmod(vehicle.WheelTravel(wheel) / parameters.wheelRadius, 2.0 * std::numbers::pi);
        Write(sample.poses[Sample::firstWheel + index], Turned(heading + vehicle.WheelSteer(wheel), turns, 0.0),
              x + along * std::cos(heading) - left * std::sin(heading),
              y + along * std::sin(heading) + left * std::cos(heading), parameters.wheelRadius);
    }

    sample.instruments[Sample::speed] = vehicle.Speed() * 3.6;
    sample.instruments[Sample::engineSpeed] = vehicle.Drive().EngineSpeed();
    sample.instruments[Sample::steeringAngle] = vehicle.Steer() * parameters.steeringRatio * degrees;
    sample.instruments[Sample::lateralAcceleration] = vehicle.LateralAcceleration();
    sample.instruments[Sample::gear] = vehicle.Drive().Gear();
    sample.instruments[Sample::brake] = vehicle.Brake() * 100.0;
}

} // namespace offsim

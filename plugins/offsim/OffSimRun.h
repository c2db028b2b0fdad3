#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <random>

#include "offsim/Course.h"
#include "offsim/Driver.h"
#include "offsim/VehicleModel.h"

namespace offsim
{

/// What a run shows at one moment.
struct Sample
{
    enum Pose : std::size_t
    {
        chassis,
        firstWheel, ///< the four wheels in the order of `Wheel`
        poseCount = firstWheel + wheelCount,
    };
    enum Instrument : std::size_t
    {
        speed,               ///< km/h
        engineSpeed,         ///< 1/min
        steeringAngle,       ///< degrees at the steering wheel, positive to the left
        lateralAcceleration, ///< m/s^2, positive to the left
        gear,                ///< 1 to 6
        brake,               ///< percent of the pedal
        instrumentCount,
    };

    /// Body to scene, `[row][column]`, rotation in the upper left and translation in the last column. The body axes are
    /// x forward, y left, z up. Chassis: origin on the ground under the middle of the wheelbase, heading, then pitch,
    /// then roll. Wheels: origin at the hub, upright on the ground, steered, then rolled about y.
    float poses[poseCount][4][4];
    double instruments[instrumentCount];
};

/// A vehicle on its course in time: from rest at the start, step by step, with a gusty side wind.
///
/// What it is after n steps depends on the seed of the wind and n alone.
class OffSimRun
{
public:
    static constexpr int stepsPerSecond = 100;

    explicit OffSimRun(std::uint64_t windSeed);
    OffSimRun(const OffSimRun&) = delete; // the driver looks at the course in here
    OffSimRun& operator=(const OffSimRun&) = delete;

    /// Back to rest at the start.
    void Restart(std::uint64_t windSeed);

    void Step();

    std::int64_t Steps() const { return steps; }
    const Course& Road() const { return course; }
    const VehicleModel& Vehicle() const { return vehicle; }

    /// Metres driven along the centre line, and metres to the left of it.
    double Station() const { return driver.Station(); }
    double Deviation() const { return driver.Deviation(); }

    void Take(Sample& sample) const;

private:
    double Gust();

    Course course;
    VehicleModel vehicle;
    Driver driver;
    std::mt19937_64 random;
    double wind = 0.0; ///< in standard deviations
    std::int64_t steps = 0;
};

} // namespace offsim

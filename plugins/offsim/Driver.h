#pragma once

#include <vector>

#include "offsim/Course.h"
#include "offsim/VehicleModel.h"

namespace offsim
{

/// Drives a vehicle along the centre line of a course, as fast as the curves allow.
///
/// Speed: at each metre no more than the curvature there allows at `lateralLimit`, no more than `topSpeed`, and such
/// that it is reached from the metre before by acceleration and left for the metre behind by braking within their
/// limits. Steering: the angle for the curvature a moment ahead, with the understeer of the vehicle, less a share of
/// the offset from the course that is seen ahead when the present course over ground is kept (preview after McRuer and
/// MacAdam: an offset acts like a spring, its growth like a damper).
class Driver
{
public:
    static constexpr double lateralLimit = 5.0; ///< m/s^2
    static constexpr double launchLimit = 3.0;  ///< m/s^2
    static constexpr double brakingLimit = 4.0; ///< m/s^2
    static constexpr double topSpeed = 36.0;    ///< m/s

    /// `onCourse` must outlive the driver; of the vehicle, wheelbase and cornering stiffness are noted down.
    Driver(const Course& onCourse, const VehicleParameters& vehicle);

    /// Begins at `newStation`.
    void Start(double newStation);

    Controls Drive(const VehicleModel& vehicle);

    /// Metres along the centre line, counted on over the laps, as of the last `Drive`.
    double Station() const { return station; }

    /// Metres to the left of the centre line, as of the last `Drive`.
    double Deviation() const { return deviation; }

    /// What the course allows there, m/s.
    double AllowedSpeed(double atStation) const;

private:
    const Course* course;
    double understeer; ///< rad per m/s^2
    double wheelbase;
    double cell = 1.0; ///< metres between two entries
    std::vector<double> allowed;
    double station = 0.0;
    double deviation = 0.0;
};

} // namespace offsim

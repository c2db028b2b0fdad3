#include "offsim/VehicleModel.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>

namespace
{

using offsim::Controls;
using offsim::VehicleModel;

constexpr double step = 0.01;

void DriveAt(VehicleModel& vehicle, double speed, double steer, double seconds)
{
    for (double t = 0.0; t < seconds; t += step)
        vehicle.Step({steer, 0.4 * (speed - vehicle.Speed()) + 0.05, 0.0}, {}, step);
}

// Linear single-track theory: yaw rate = v delta / (L + K v^2). With the cornering stiffness given by axle load, the
// understeer gradient is K = (1/13.0 - 1/15.5) / 9.81 = 0.0012647 rad per m/s^2.
TEST(Vehicle, TurnsAsSteadyStateTheorySays)
{
    for (const double speed : {8.0, 15.0, 25.0, 35.0})
    {
        SCOPED_TRACE(speed);
        const double lateral = 1.2; // m/s^2: the tyre curve is straight so far down
        const double steer = lateral * (2.65 + 0.0012647 * speed * speed) / (speed * speed);
        VehicleModel vehicle;
        vehicle.Place(0.0, 0.0, 0.0, speed);
        DriveAt(vehicle, speed, steer, 12.0);

        const double v = vehicle.Speed();
        const double yawRate = v * steer / (2.65 + 0.0012647 * v * v);
        EXPECT_NEAR(v, speed, 0.1 * speed);
        EXPECT_NEAR(vehicle.YawRate(), yawRate, 0.02 * yawRate);
        EXPECT_NEAR(vehicle.LateralAcceleration(), v * yawRate, 0.02 * v * yawRate);

        // The place says the same as the rates: a circle of radius v / yaw rate about a fixed centre.
        const double radius = std::hypot(v, vehicle.SideSpeed()) / vehicle.YawRate();
        const double x = vehicle.X();
        const double y = vehicle.Y();
        const double heading = vehicle.Heading();
        DriveAt(vehicle, speed, steer, 1.0);
        const double turned = vehicle.Heading() - heading;
        EXPECT_NEAR(std::hypot(vehicle.X() - x, vehicle.Y() - y), 2.0 * radius * std::sin(turned / 2.0), 0.01 * radius);
    }
}

TEST(Vehicle, SlidesInsteadOfExceedingTheFriction)
{
    VehicleModel vehicle;
    vehicle.Place(0.0, 0.0, 0.0, 25.0);
    double most = 0.0;
    for (int i = 0; i < 1000; ++i)
    {
        vehicle.Step({0.4, 0.3, 0.0}, {}, step);
        most = std::max(most, std::abs(vehicle.LateralAcceleration()));
    }
    EXPECT_LT(most, 9.81);
    EXPECT_GT(most, 8.0);

    // The tyre curve itself: odd, rising with the stiffness, ending at the friction.
    EXPECT_NEAR(offsim::TyreForce(0.001, 14.0, 0.9), 0.014, 1e-5);
    EXPECT_NEAR(offsim::TyreForce(0.08, 14.0, 0.9), 0.7831, 1e-4); // by hand with C = 1.35, E = -0.4
    EXPECT_DOUBLE_EQ(offsim::TyreForce(-0.08, 14.0, 0.9), -offsim::TyreForce(0.08, 14.0, 0.9));
    double peak = 0.0;
    for (double slip = 0.0; slip < 1.0; slip += 0.001)
        peak = std::max(peak, offsim::TyreForce(slip, 14.0, 0.9));
    EXPECT_NEAR(peak, 0.9, 1e-4);
    EXPECT_GT(offsim::TyreForce(1.0, 14.0, 0.9), 0.6);
}

// In sixth gear (0.80 * 3.7 = 2.96) the engine turns 91.18 / min for each m/s. Between 5500 and 6200 / min its torque
// falls from 225 to 198 N m, so the force at the wheels is 3840.1 - 30.895 v. Drag 0.396 v^2 and 164.8 N of rolling
// resistance meet it at 64.9 m/s.
TEST(Vehicle, ReachesTheSpeedWherePowerAndDragMeet)
{
    VehicleModel vehicle;
    vehicle.Place(0.0, 0.0, 0.0, 0.0);
    double hundred = 0.0;
    for (double t = 0.0; t < 150.0; t += step)
    {
        vehicle.Step({0.0, 1.0, 0.0}, {}, step);
        if (hundred == 0.0 && vehicle.Speed() > 100.0 / 3.6)
            hundred = t;
    }
    EXPECT_NEAR(vehicle.Speed(), 64.9, 0.3);
    EXPECT_EQ(vehicle.Drive().Gear(), 6);
    EXPECT_NEAR(vehicle.Drive().EngineSpeed(), 91.18 * vehicle.Speed(), 10.0);
    // 100 kW on average for 1400 kg take 5.4 s to 100 km/h, shifts and wheelspin the rest.
    EXPECT_GT(hundred, 5.4);
    EXPECT_LT(hundred, 11.0);
}

} // namespace

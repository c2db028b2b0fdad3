#include "offsim/Powertrain.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace offsim
{

namespace
{

struct TorquePoint
{
    double speed;  // 1/min
    double torque; // N m
};

constexpr TorquePoint torqueCurve[] = {{800, 120},  {1500, 185}, {2500, 222}, {3500, 236},
                                       {4500, 238}, {5500, 225}, {6200, 198}, {Powertrain::limitSpeed, 170}};

constexpr double dragTorqueAtRest = 12.0;     // N m, throttle closed
constexpr double dragTorquePerSpeed = 0.0075; // N m per 1/min
constexpr double launchSpeedGain = 1200.0;    // 1/min above idle, at full throttle, while the clutch slips
constexpr double shiftSeconds = 0.25;
constexpr double secondsBetweenShifts = 1.0;
constexpr double shiftThrottleLag = 0.6; // s
constexpr double engineLag = 0.08;       // s
constexpr double perMinute = 60.0 / (2.0 * std::numbers::pi);

// Shift points in 1/min by throttle. The gap between them is wider than any step of the gearbox, so it doesn't hunt.
double UpshiftSpeed(double throttle)
{
    return 2700.0 + 3100.0 * throttle;
}

double DownshiftSpeed(double throttle)
{
    return 1300.0 + 1500.0 * throttle;
}

void Follow(double& value, double target, double lag, double dt)
{
    value += (target - value) * (1.0 - std::exp(-dt / lag));
}

} // namespace

Powertrain::Powertrain(double wheelRadius) : radius(wheelRadius) {}

void Powertrain::Reset(double speed)
{
    *this = Powertrain(radius);
    while (gear < gearCount && DrivenEngineSpeed(speed, gear) > UpshiftSpeed(0.0))
        ++gear;
    engineSpeed = CoupledEngineSpeed(0.0, speed);
}

double Powertrain::FullTorque(double speed)
{
    if (speed > limitSpeed)
        return 0.0;
    const TorquePoint* above = torqueCurve;
    while (above != std::end(torqueCurve) - 1 && above->speed < speed)
        ++above;
    if (above == torqueCurve)
        return above->torque;
    const TorquePoint& below = above[-1];
    return below.torque + (above->torque - below.torque) * (speed - below.speed) / (above->speed - below.speed);
}

double Powertrain::DrivenEngineSpeed(double speed, int inGear) const
{
    return speed / radius * gearRatios[static_cast<std::size_t>(inGear - 1)] * finalDrive * perMinute;
}

double Powertrain::CoupledEngineSpeed(double throttle, double speed) const
{
    const double driven = DrivenEngineSpeed(speed, gear);
    return gear == 1 ? std::max(driven, idleSpeed + launchSpeedGain * throttle) : std::max(driven, idleSpeed);
}

double Powertrain::WheelForce(double throttle, double speed) const
{
    if (shiftLeft > 0.0)
        return 0.0;
    const double n = CoupledEngineSpeed(throttle, speed);
    const double ratio = gearRatios[static_cast<std::size_t>(gear - 1)] * finalDrive / radius;
    // While the clutch slips the engine can't brake the car: it would pull it backwards from rest.
    const double closed = DrivenEngineSpeed(speed, gear) >= idleSpeed ? dragTorqueAtRest + dragTorquePerSpeed * n : 0.0;
    const double torque = throttle * FullTorque(n) - (1.0 - throttle) * closed;
    return torque > 0.0 ? torque * ratio * efficiency : torque * ratio / efficiency;
}

void Powertrain::Update(double throttle, double speed, double dt)
{
    Follow(steadyThrottle, throttle, shiftThrottleLag, dt);
    Follow(engineSpeed, std::min(CoupledEngineSpeed(throttle, speed), limitSpeed), engineLag, dt);
    shiftLeft = std::max(0.0, shiftLeft - dt);
    sinceShift += dt;
    if (sinceShift < secondsBetweenShifts)
        return;

    const double driven = DrivenEngineSpeed(speed, gear);
    const bool up = gear < gearCount && driven > UpshiftSpeed(steadyThrottle);
    const bool down = gear > 1 && driven < DownshiftSpeed(steadyThrottle);
    if (!up && !down)
        return;
    gear += up ? 1 : -1;
    shiftLeft = shiftSeconds;
    sinceShift = 0.0;
}

} // namespace offsim

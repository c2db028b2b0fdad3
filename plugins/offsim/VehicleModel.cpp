#include "offsim/VehicleModel.h"

#include <algorithm>
#include <cmath>

namespace offsim
{

namespace
{

constexpr double shapeFactor = 1.35;     // C of the tyre curve
constexpr double curvatureFactor = -0.4; // E
constexpr double steerLag = 0.08;        // s, of the steering and the driver's arms
constexpr double throttleLag = 0.12;     // s
constexpr double brakeLag = 0.10;        // s
constexpr double bodyLag = 0.12;         // s, of the body on its springs
constexpr double restSpeed = 0.5;        // m/s; below, brakes and resistances fade so that they don't drive backwards

} // namespace

double TyreForce(double slipAngle, double stiffness, double friction)
{
    const double x = stiffness / (shapeFactor * friction) * slipAngle;
    return friction * std::sin(shapeFactor * std::atan(x - curvatureFactor * (x - std::atan(x))));
}

VehicleModel::VehicleModel(const VehicleParameters& vehicle) : parameters(vehicle), drive(vehicle.wheelRadius) {}

void VehicleModel::Place(double x, double y, double newHeading, double speed)
{
    const double toCentre = parameters.wheelbase / 2.0 - parameters.frontToCentre;
    state = {};
    state[centreX] = x + toCentre * std::cos(newHeading);
    state[centreY] = y + toCentre * std::sin(newHeading);
    state[heading] = newHeading;
    state[forward] = speed;
    drive.Reset(speed);
}

double VehicleModel::X() const
{
    return state[centreX] + (parameters.frontToCentre - parameters.wheelbase / 2.0) * std::cos(state[heading]);
}

double VehicleModel::Y() const
{
    return state[centreY] + (parameters.frontToCentre - parameters.wheelbase / 2.0) * std::sin(state[heading]);
}

double VehicleModel::WheelSteer(Wheel wheel) const
{
    if (wheel >= rearLeft)
        return 0.0;
    const double side = wheel == frontLeft ? 0.5 : -0.5;
    const double tangent = std::tan(state[steer]);
    return std::atan(parameters.wheelbase * tangent / (parameters.wheelbase - side * parameters.track * tangent));
}

double VehicleModel::Resistance(double speed) const
{
    return 0.5 * airDensity * parameters.dragArea * speed * speed +
           parameters.rollingResistance * parameters.mass * gravity;
}

VehicleModel::State VehicleModel::Derivative(const State& at, const Controls& controls, const SideWind& wind) const
{
    const VehicleParameters& p = parameters;
    const double u = at[forward];
    const double v = at[sideways];
    const double r = at[yawRate];
    const double cosSteer = std::cos(at[steer]);
    const double sinSteer = std::sin(at[steer]);

    const double shifted = at[longitudinal] * p.centreHeight;
    const double frontLoad = p.mass * std::max(0.0, gravity * p.CentreToRear() - shifted) / p.wheelbase;
    const double rearLoad = p.mass * std::max(0.0, gravity * p.frontToCentre + shifted) / p.wheelbase;

    const double moving = std::clamp(u / restSpeed, 0.0, 1.0);
    const double braking = at[brake] * p.mass * p.fullBraking * moving;
    const double rolling = p.rollingResistance * moving;
    const auto within = [&p](double force, double load)
    { return std::clamp(force, -p.friction * load, p.friction * load); };
    const double frontX = within(-braking * p.frontBrakeShare - rolling * frontLoad, frontLoad);
    const double rearX =
        within(drive.WheelForce(at[throttle], u) - braking * (1.0 - p.frontBrakeShare) - rolling * rearLoad, rearLoad);
    const auto sideForce = [&p](double slip, double stiffness, double load, double along)
    {
        const double used = load > 0.0 ? along / (p.friction * load) : 1.0;
        return -TyreForce(std::atan(slip), stiffness, p.friction) * load * std::sqrt(std::max(0.0, 1.0 - used * used));
    };
    const double frontY = sideForce(at[frontSlip], p.frontStiffness, frontLoad, frontX);
    const double rearY = sideForce(at[rearSlip], p.rearStiffness, rearLoad, rearX);

    const double drag = 0.5 * airDensity * p.dragArea * u * std::abs(u);
    const double accelerationX = (frontX * cosSteer - frontY * sinSteer + rearX - drag) / p.mass;
    const double turningFront = frontY * cosSteer + frontX * sinSteer;
    const double accelerationY = (turningFront + rearY + wind.force) / p.mass;

    // Velocities of the contact points across and along the wheels' planes, front axle steered.
    const double frontSide = v + p.frontToCentre * r;
    const double frontAlong = u * cosSteer + frontSide * sinSteer;
    const double frontAcross = frontSide * cosSteer - u * sinSteer;
    const double rearAcross = v - p.CentreToRear() * r;

    State rate;
    rate[centreX] = u * std::cos(at[heading]) - v * std::sin(at[heading]);
    rate[centreY] = u * std::sin(at[heading]) + v * std::cos(at[heading]);
    rate[heading] = r;
    rate[forward] = accelerationX + r * v;
    rate[sideways] = accelerationY - r * u;
    rate[yawRate] = (p.frontToCentre * turningFront - p.CentreToRear() * rearY + wind.moment) / p.yawInertia;
    rate[frontSlip] = (frontAcross - std::abs(frontAlong) * at[frontSlip]) / p.relaxationLength;
    rate[rearSlip] = (rearAcross - std::abs(u) * at[rearSlip]) / p.relaxationLength;
    rate[steer] = (controls.steer - at[steer]) / steerLag;
    rate[throttle] = (controls.throttle - at[throttle]) / throttleLag;
    rate[brake] = (controls.brake - at[brake]) / brakeLag;
    rate[longitudinal] = (accelerationX - at[longitudinal]) / bodyLag;
    rate[lateral] = (accelerationY - at[lateral]) / bodyLag;

    const double halfTrack = p.track / 2.0;
    const double frontTurn = r * halfTrack * cosSteer;
    rate[travel + frontLeft] = frontAlong - frontTurn;
    rate[travel + frontRight] = frontAlong + frontTurn;
    rate[travel + rearLeft] = u - r * halfTrack;
    rate[travel + rearRight] = u + r * halfTrack;
    return rate;
}

void VehicleModel::Step(const Controls& asked, const SideWind& wind, double dt)
{
    const Controls controls{std::clamp(asked.steer, -parameters.largestSteer, parameters.largestSteer),
                            std::clamp(asked.throttle, 0.0, 1.0), std::clamp(asked.brake, 0.0, 1.0)};
    const auto ahead = [this](const State& rate, double time)
    {
        State next = state;
        for (std::size_t i = 0; i < next.size(); ++i)
            next[i] += rate[i] * time;
        return next;
    };
    const State k1 = Derivative(state, controls, wind);
    const State k2 = Derivative(ahead(k1, dt / 2.0), controls, wind);
    const State k3 = Derivative(ahead(k2, dt / 2.0), controls, wind);
    const State k4 = Derivative(ahead(k3, dt), controls, wind);
    for (std::size_t i = 0; i < state.size(); ++i)
        state[i] += dt / 6.0 * (k1[i] + 2.0 * k2[i] + 2.0 * k3[i] + k4[i]);
    drive.Update(state[throttle], state[forward], dt);
}

} // namespace offsim

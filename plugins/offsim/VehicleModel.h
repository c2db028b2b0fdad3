#pragma once

#include <array>
#include <cstddef>

#include "offsim/Powertrain.h"

namespace offsim
{

/// A middle-sized passenger car with rear wheel drive. SI units; "front" and "rear" are whole axles.
struct VehicleParameters
{
    double mass = 1400.0;
    double yawInertia = 2200.0; ///< kg m^2
    double wheelbase = 2.65;
    double frontToCentre = 1.27; ///< front axle to centre of gravity
    double centreHeight = 0.54;  ///< of the centre of gravity
    double track = 1.54;         ///< between the left and the right wheel
    double wheelRadius = 0.31;
    double friction = 1.0;        ///< between tyre and road
    double frontStiffness = 13.0; ///< cornering stiffness by axle load, 1/rad
    double rearStiffness = 15.5;
    double relaxationLength = 0.5; ///< way in which a tyre builds up its side force
    double dragArea = 0.66;        ///< air drag coefficient times frontal area
    double rollingResistance = 0.012;
    double fullBraking = 9.0; ///< m/s^2 with the pedal down
    double frontBrakeShare = 0.64;
    double rollPerAcceleration = 0.0062;  ///< rad per m/s^2 of lateral acceleration: 3.5 degrees at 1 g
    double pitchPerAcceleration = 0.0036; ///< rad per m/s^2 of longitudinal acceleration: 2 degrees at 1 g
    double largestSteer = 0.6;            ///< rad at the front wheels
    double steeringRatio = 15.0;          ///< steering wheel to front wheels

    double CentreToRear() const { return wheelbase - frontToCentre; }
};

inline constexpr double gravity = 9.81;
inline constexpr double airDensity = 1.2; ///< kg/m^3

/// What the driver asks for: front wheel angle in rad, positive to the left, and pedals from 0 to 1.
struct Controls
{
    double steer = 0.0;
    double throttle = 0.0;
    double brake = 0.0;
};

/// Side wind: newtons to the left at the centre of gravity, and newton metres that turn left.
struct SideWind
{
    double force = 0.0;
    double moment = 0.0;
};

enum Wheel : std::size_t
{
    frontLeft,
    frontRight,
    rearLeft,
    rearRight,
    wheelCount,
};

/// Force of a tyre by its slip: D sin(C atan(B x - E (B x - atan(B x)))), with B such that the curve rises from 0 with
/// `stiffness`. The result, like the stiffness, is in parts of the wheel load.
///
/// Bakker, Nyborg and Pacejka, "Tyre Modelling for Use in Vehicle Dynamics Studies", SAE 870421.
double TyreForce(double slipAngle, double stiffness, double friction);

/// A single-track vehicle on a level road.
///
/// Lateral and yaw motion by the single-track model with slip angles at both axles (Riekert and Schunck 1940; as in
/// Pacejka, "Tire and Vehicle Dynamics", chapter 1.3), a saturating tyre curve whose force builds up over the
/// relaxation length (ibid., the single contact point model of chapter 7: no singularity at rest), and what braking or
/// driving takes of the side force by the friction ellipse. Longitudinal: powertrain, brakes, drag, rolling resistance,
/// and the load that acceleration shifts between the axles. Roll and pitch of the body follow its accelerations as the
/// springs would hold it at rest, with a short lag. Wheels roll without slip along their own planes.
///
/// Scene axes: x east, y north, z up. Vehicle axes: x forward, y left, z up, with the origin on the ground under the
/// middle of the wheelbase. One `Step` is one step of the classical Runge-Kutta method; good for steps up to 0.01 s.
class VehicleModel
{
public:
    explicit VehicleModel(const VehicleParameters& vehicle = {});

    /// Puts the vehicle down with its origin at (x, y), rolling straight ahead at `speed`; all wheels unturned.
    void Place(double x, double y, double heading, double speed);

    void Step(const Controls& controls, const SideWind& wind, double dt);

    const VehicleParameters& Parameters() const { return parameters; }
    const Powertrain& Drive() const { return drive; }

    double X() const; ///< of the origin of the vehicle axes
    double Y() const;
    double Heading() const { return state[heading]; } ///< rad, counter-clockwise from east; not wrapped
    double Roll() const { return parameters.rollPerAcceleration * state[lateral]; }
    double Pitch() const { return -parameters.pitchPerAcceleration * state[longitudinal]; }
    double Speed() const { return state[forward]; }      ///< m/s along the vehicle's x axis
    double SideSpeed() const { return state[sideways]; } ///< m/s along y, at the centre of gravity
    double YawRate() const { return state[yawRate]; }
    double Steer() const { return state[steer]; } ///< front wheel angle of the single track, rad
    double Brake() const { return state[brake]; } ///< 0 to 1
    double Throttle() const { return state[throttle]; }
    double LateralAcceleration() const { return state[lateral]; } ///< m/s^2 to the left, as the body follows it
    double LongitudinalAcceleration() const { return state[longitudinal]; }

    /// Metres that the wheel has rolled since `Place`; the angle it turned is that by its radius.
    double WheelTravel(Wheel wheel) const { return state[travel + wheel]; }

    /// About the vertical, rad: the wheels of the front axle point to one common centre (Ackermann).
    double WheelSteer(Wheel wheel) const;

    /// Forces against the motion at `speed`, without brakes and engine, N.
    double Resistance(double speed) const;

private:
    enum Index : std::size_t
    {
        centreX, // of gravity
        centreY,
        heading,
        forward,
        sideways,
        yawRate,
        frontSlip, // tangent of the slip angle that the tyres have built up
        rearSlip,
        steer,
        throttle,
        brake,
        longitudinal,
        lateral,
        bodyStates,
    };
    static constexpr std::size_t travel = bodyStates; // of the wheels, in their order
    static constexpr std::size_t stateCount = travel + wheelCount;
    using State = std::array<double, stateCount>;

    State Derivative(const State& at, const Controls& controls, const SideWind& wind) const;

    VehicleParameters parameters;
    Powertrain drive;
    State state{};
};

} // namespace offsim

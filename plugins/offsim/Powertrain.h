#pragma once

#include <array>

namespace offsim
{

/// Engine, gearbox and rear axle drive: a full load torque curve over engine speed, a drag torque with the throttle
/// closed, six forward gears with automatic shifts, and a clutch that slips while pulling away.
///
/// The driving resistances and the balance of forces at the wheel are those of longitudinal dynamics as in Mitschke and
/// Wallentowitz, "Dynamik der Kraftfahrzeuge", chapters A.II and A.III; rotating masses are left out.
class Powertrain
{
public:
    static constexpr int gearCount = 6;
    static constexpr std::array<double, gearCount> gearRatios = {3.60, 2.15, 1.48, 1.12, 0.92, 0.80};
    static constexpr double finalDrive = 3.7;
    static constexpr double efficiency = 0.92;
    static constexpr double idleSpeed = 850.0;   ///< 1/min
    static constexpr double limitSpeed = 6600.0; ///< 1/min; no torque above

    explicit Powertrain(double wheelRadius);

    /// Coupled at `speed`, in the gear that fits it.
    void Reset(double speed);

    /// At the driven wheels in newtons, for a throttle of 0 to 1 at `speed` in m/s. Negative: the engine brakes.
    double WheelForce(double throttle, double speed) const;

    /// Shifts as `speed` and throttle ask for it, and lets the engine follow.
    void Update(double throttle, double speed, double dt);

    int Gear() const { return gear; }
    double EngineSpeed() const { return engineSpeed; } ///< 1/min

    /// Full load torque in N m.
    static double FullTorque(double engineSpeed);

private:
    double DrivenEngineSpeed(double speed, int inGear) const;
    double CoupledEngineSpeed(double throttle, double speed) const;

    double radius;
    int gear = 1;
    double shiftLeft = 0.0;      ///< seconds until the present shift is done; no torque meanwhile
    double sinceShift = 0.0;     ///< seconds
    double steadyThrottle = 0.0; ///< what decides on shifts: a kick on the pedal alone doesn't
    double engineSpeed = idleSpeed;
};

} // namespace offsim

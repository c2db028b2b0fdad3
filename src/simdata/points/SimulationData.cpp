#include "simdata/points/SimulationData.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <numbers>

#include "simdata/points/SimulationDataFrame.h"

namespace SimulationDataPoints
{

namespace
{

/// Floats hold a sine to about 1e-7: below this the outer two angles turn about one axis and would be noise apart.
constexpr double smallestSine = 1e-6;

struct Angles
{
    double& a;
    double& b;
    double& c;

    void Give(double newA, double newB, double newC, bool inDegrees) const
    {
        const double unit = inDegrees ? 180.0 / std::numbers::pi : 1.0;
        a = newA * unit;
        b = newB * unit;
        c = newC * unit;
    }
};

} // namespace

void VtCSimulationData::GetMatrix4x4(float m[4][4]) const
{
    if (!instrument)
    {
        std::memcpy(m, frame->GetRecord() + offset, 16 * sizeof(float));
        return;
    }
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            m[row][column] = row == column ? 1.0F : 0.0F;
}

void VtCSimulationData::GetMatrix3x3(float m[3][3]) const
{
    float pose[4][4];
    GetMatrix4x4(pose);
    for (int row = 0; row < 3; ++row)
        std::copy(pose[row], pose[row] + 3, m[row]);
}

void VtCSimulationData::GetVector(float v[3]) const
{
    float pose[4][4];
    GetMatrix4x4(pose);
    for (int row = 0; row < 3; ++row)
        v[row] = pose[row][3];
}

// Differences from 0 and not signs below, since atan2 takes -0.0 for the other end of the circle.
//
// Multiplied out, Rz(a) Rx(b) Rz(c) has cos b in r22, the third column (sin a sin b, -cos a sin b, cos b) and the third
// row (sin b sin c, sin b cos c, cos b). At sin b = 0, with c = 0, the first column is (cos a, sin a, 0).
void VtCSimulationData::GetEulerAngles(double& a, double& b, double& c, int degrees) const
{
    float r[3][3];
    GetMatrix3x3(r);
    const Angles angles{a, b, c};
    const double sine = std::hypot(static_cast<double>(r[0][2]), static_cast<double>(r[1][2]));
    const double middle = std::atan2(sine, static_cast<double>(r[2][2]));
    if (sine < smallestSine)
        angles.Give(std::atan2(r[1][0], r[0][0]), middle, 0.0, degrees != 0);
    else
        angles.Give(std::atan2(r[0][2], 0.0F - r[1][2]), middle, std::atan2(r[2][0], r[2][1]), degrees != 0);
}

// Multiplied out, Rx(a) Ry(b) Rz(c) has the first row (cos b cos c, -cos b sin c, sin b) and the third column
// (sin b, -sin a cos b, cos a cos b). At cos b = 0, with c = 0, the second column is (0, cos a, sin a).
void VtCSimulationData::GetKardanAngles(double& a, double& b, double& c, int degrees) const
{
    float r[3][3];
    GetMatrix3x3(r);
    const Angles angles{a, b, c};
    const double cosine = std::hypot(static_cast<double>(r[0][0]), static_cast<double>(r[0][1]));
    const double middle = std::atan2(static_cast<double>(r[0][2]), cosine);
    if (cosine < smallestSine)
        angles.Give(std::atan2(r[2][1], r[1][1]), middle, 0.0, degrees != 0);
    else
        angles.Give(std::atan2(0.0F - r[1][2], r[2][2]), middle, std::atan2(0.0F - r[0][1], r[0][0]), degrees != 0);
}

int VtCSimulationData::getInstrumentValue(VtTInstrumentVariant& value) const
{
    if (!instrument)
        return 0;
    double number = 0.0;
    std::memcpy(&number, frame->GetRecord() + offset, sizeof number);
    if (!std::isfinite(number))
        return 0;
    value = {number, VtTInstrumentVariant::typeDouble, 0};
    return 1;
}

} // namespace SimulationDataPoints

#include "simdata/points/PoseRotation.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace SimulationDataPoints
{

VtTRotation RotationFromAngles(double yaw, double pitch, double roll)
{
    constexpr double radians = std::numbers::pi / 180.0;
    const double sy = std::sin(yaw * radians);
    const double cy = std::cos(yaw * radians);
    const double sp = std::sin(pitch * radians);
    const double cp = std::cos(pitch * radians);
    const double sr = std::sin(roll * radians);
    const double cr = std::cos(roll * radians);
    return {{{cy * cp, cy * sp * sr - sy * cr, cy * sp * cr + sy * sr},
             {sy * cp, sy * sp * sr + cy * cr, sy * sp * cr - cy * sr},
             {-sp, cp * sr, cp * cr}}};
}

VtTRotation RotationFromQuaternion(const VtTQuaternion& q)
{
    const double s = 2.0 / (q.w * q.w + q.x * q.x + q.y * q.y + q.z * q.z);
    return {{{1 - s * (q.y * q.y + q.z * q.z), s * (q.x * q.y - q.w * q.z), s * (q.x * q.z + q.w * q.y)},
             {s * (q.x * q.y + q.w * q.z), 1 - s * (q.x * q.x + q.z * q.z), s * (q.y * q.z - q.w * q.x)},
             {s * (q.x * q.z - q.w * q.y), s * (q.y * q.z + q.w * q.x), 1 - s * (q.x * q.x + q.y * q.y)}}};
}

// Shepperd's method: of the four squares that the diagonal gives, the largest is taken as divisor, so that nothing is
// lost near half a turn.
VtTQuaternion QuaternionFromRotation(const VtTRotation& r)
{
    const double trace = r[0][0] + r[1][1] + r[2][2];
    VtTQuaternion q;
    if (trace >= r[0][0] && trace >= r[1][1] && trace >= r[2][2])
        q = {1 + trace, r[2][1] - r[1][2], r[0][2] - r[2][0], r[1][0] - r[0][1]};
    else if (r[0][0] >= r[1][1] && r[0][0] >= r[2][2])
        q = {r[2][1] - r[1][2], 1 + 2 * r[0][0] - trace, r[0][1] + r[1][0], r[0][2] + r[2][0]};
    else if (r[1][1] >= r[2][2])
        q = {r[0][2] - r[2][0], r[0][1] + r[1][0], 1 + 2 * r[1][1] - trace, r[1][2] + r[2][1]};
    else
        q = {r[1][0] - r[0][1], r[0][2] + r[2][0], r[1][2] + r[2][1], 1 + 2 * r[2][2] - trace};
    const double length = std::sqrt(q.w * q.w + q.x * q.x + q.y * q.y + q.z * q.z);
    const double unit = (q.w < 0 ? -1.0 : 1.0) / length;
    return {q.w * unit, q.x * unit, q.y * unit, q.z * unit};
}

double RigidityError(const VtTRotation& r)
{
    double error = 0.0;
    for (int i = 0; i < 3; ++i)
        for (int j = i; j < 3; ++j)
        {
            const double product = r[0][i] * r[0][j] + r[1][i] * r[1][j] + r[2][i] * r[2][j];
            error = std::max(error, std::fabs(product - (i == j ? 1.0 : 0.0)));
        }
    const double determinant = r[0][0] * (r[1][1] * r[2][2] - r[1][2] * r[2][1]) -
                               r[0][1] * (r[1][0] * r[2][2] - r[1][2] * r[2][0]) +
                               r[0][2] * (r[1][0] * r[2][1] - r[1][1] * r[2][0]);
    return determinant > 0.0 ? error : std::max(error, 2.0);
}

} // namespace SimulationDataPoints

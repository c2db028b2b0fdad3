#include "scene/Placement.h"

#include "base/Maths.h"

#include <cmath>

osg::Vec3f FieldFromRecord(const VtTAxes& axes, const VtTFloatTupel3& stored)
{
    osg::Vec3f field;
    for (std::size_t i = 0; i < 3; ++i)
        field[static_cast<unsigned>(i)] = stored[axes.from[i]] * axes.factor[i];
    return field;
}

VtTFloatTupel3 RecordFromField(const VtTAxes& axes, const osg::Vec3f& field)
{
    VtTFloatTupel3 stored{};
    for (std::size_t i = 0; i < 3; ++i)
        // A turned zero is a zero, not "-0" in the file.
        stored[axes.from[i]] = field[static_cast<unsigned>(i)] / axes.factor[i] + 0.0F;
    return stored;
}

osg::Vec3f EulerAngles(const osg::Quat& rotation)
{
    const double x = rotation.x(), y = rotation.y(), z = rotation.z(), w = rotation.w();
    const double n = x * x + y * y + z * z + w * w;
    if (n == 0.0)
        return {};

    // With y at a quarter turn, x and z turn about one axis and the general formula finds only noise: z takes it all.
    const double sine = -2 * (z * x - y * w) / n;
    constexpr double quarterTurnSine = 1 - 1e-13;
    if (std::abs(sine) > quarterTurnSine)
        return osg::Vec3f(0, std::copysign(90.0f, static_cast<float>(sine)),
                          static_cast<float>(base::DegreesFromRadians(2 * std::atan2(z, w))));

    const float angleZ = static_cast<float>(std::atan2(2 * (w * z + x * y), w * w + x * x - y * y - z * z));
    const float angleY = static_cast<float>(std::asin(sine));
    const float angleX = static_cast<float>(std::atan2(2 * (z * y + x * w), w * w - x * x - y * y + z * z));
    return osg::Vec3f(static_cast<float>(base::DegreesFromRadians(angleX)),
                      static_cast<float>(base::DegreesFromRadians(angleY)),
                      static_cast<float>(base::DegreesFromRadians(angleZ)));
}

osg::Quat RotationFromEuler(double x, double y, double z)
{
    const osg::Quat aboutX(base::RadiansFromDegrees(x), osg::Vec3d(1, 0, 0));
    const osg::Quat aboutY(base::RadiansFromDegrees(y), osg::Vec3d(0, 1, 0));
    const osg::Quat aboutZ(base::RadiansFromDegrees(z), osg::Vec3d(0, 0, 1));
    return aboutZ * aboutY * aboutX;
}

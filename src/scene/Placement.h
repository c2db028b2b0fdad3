#pragma once

#include <array>
#include <cstddef>

#include <osg/Quat>
#include <osg/Vec3f>

#include "records/SceneAttribute.h"

/// How a vector of a record, which stands in the axes of the scene (z up), becomes a field of a body: component i of
/// the field is `factor[i]` times component `from[i]` of the record.
struct VtTAxes
{
    std::array<std::size_t, 3> from;
    std::array<float, 3> factor;
};

inline constexpr VtTAxes axesOfScene{{0, 1, 2}, {1, 1, 1}};
inline constexpr VtTAxes axesOfModels{{0, 2, 1}, {1, 1, -1}};          ///< y up
inline constexpr VtTAxes percentOfModels{{0, 2, 1}, {100, 100, 100}};  ///< y up, of factors; those have no sign
inline constexpr VtTAxes anglesOfMovableBodies{{0, 1, 2}, {1, -1, 1}}; ///< degrees

osg::Vec3f FieldFromRecord(const VtTAxes& axes, const VtTFloatTupel3& stored);
VtTFloatTupel3 RecordFromField(const VtTAxes& axes, const osg::Vec3f& field);

inline VtTFloatTupel3 TupelOf(const osg::Vec3f& vector)
{
    return {vector.x(), vector.y(), vector.z()};
}

inline osg::Vec3f VectorOf(const VtTFloatTupel3& tupel)
{
    return {tupel[0], tupel[1], tupel[2]};
}

/// The angles about x, y and z, in degrees, that turn like `rotation` when x acts first, then y, then z. The zero
/// quaternion gives no angles.
///
/// Not the inverse of `RotationFromEuler`, which turns in the other order: the two agree for a turn about one axis.
/// Stored scenes were written with the one and are placed by the other.
osg::Vec3f EulerAngles(const osg::Quat& rotation);

/// The turn by three angles in degrees in which z acts first, then y, then x: Qz * Qy * Qx of the scene graph library.
osg::Quat RotationFromEuler(double x, double y, double z);

#pragma once

#include <osg/Quat>
#include <osg/Vec3f>

/// The angles about x, y and z, in degrees, that turn like `rotation` when x acts first, then y, then z. The zero
/// quaternion gives no angles.
///
/// Not the inverse of `RotationFromEuler`, which turns in the other order: the two agree for a turn about one axis.
/// Stored scenes were written with the one and are placed by the other.
osg::Vec3f EulerAngles(const osg::Quat& rotation);

/// The turn by three angles in degrees in which z acts first, then y, then x: Qz * Qy * Qx of the scene graph library.
osg::Quat RotationFromEuler(double x, double y, double z);

#pragma once

namespace osg
{
class Group;
}

/// Lights a scene as on a clear day.
///
/// A scene by itself has switches for two lights and no lights: its atmospherics bring them. Without atmospherics
/// these stand in: light 1 is the sun, high in the south-west, light 0 a weak head light at the eye of every view, so
/// that no side is black.
void AddDayLight(osg::Group& environment);

#pragma once

#include <string>

#include <osg/Geometry>

/// Checks and mends one geometry of the stock reader, so that nothing that draws, cuts or merges it can run outside its
/// arrays: every index, every array's length, every number. Empty when it can be used, else what is wrong with it.
std::string CheckGeometry(osg::Geometry& geometry);

/// Drops a colour array that only repeats the material's `diffuse` colour, as the stock VRML reader makes them: with it
/// in place a change of the material would show nothing. True when colours remain.
bool DropPlainColours(osg::Geometry& geometry, const osg::Vec4& diffuse);

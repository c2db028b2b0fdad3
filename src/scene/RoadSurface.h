#pragma once

#include <string>

namespace osg
{
class Group;
}
class VtIModelLibrary;

/// The program of roads, whose parameters a model's description sets.
inline constexpr const wchar_t* roadShaderName = L"streetShader";

/// Draws markings and bumps over a road without flicker. The names of the geodes below `road` tell which is what:
/// "_bumpbase_geometry" marks the stencil buffer and comes first, "_bump_geometry" lies on the road, and
/// "_road_geometry" is left out where a bump base has marked. The shader files lie in "..\Assets\" behind
/// `moduleDirectory`; without them the state is set all the same.
void AssignRoadSurface(osg::Group& road, VtIModelLibrary& models, const std::wstring& moduleDirectory);

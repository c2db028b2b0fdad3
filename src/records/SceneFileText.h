#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include <osg/ref_ptr>

#include "records/SceneObject.h"

/// The text of a scene file (UTF-8) and the records in it. The form stands in docs/scene-file.md.

/// A text beyond this is no scene.
constexpr std::size_t largestSceneText = 512U << 20;

/// The records of a text in its order, or the reason why there are none.
struct VtTSceneRecords
{
    std::vector<osg::ref_ptr<VtISceneObject>> objects;
    std::string error; ///< "line 3: attribute "scale": ...", empty when all went well
};

/// Reads a whole file. Any bytes are safe: what isn't a scene gives the reason with its line and no records. Refused
/// are also two records of one id, a static body that is its own ancestor, and ancestors beyond 1000 levels. Records of
/// unknown types and unknown attributes are read like any other.
VtTSceneRecords ParseSceneText(std::string_view text);

/// The text that reads back as the same records in the same order; the same records always give the same bytes.
std::string WriteSceneText(const std::vector<osg::ref_ptr<VtISceneObject>>& objects);

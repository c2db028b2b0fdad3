#pragma once

#include <optional>
#include <string_view>

/// The crease angle in radians by which a model's normals are to be calculated anew, from the attribute
/// "recalc_normals" of its description; nothing when that isn't there or has no value.
std::optional<float> GetRecalculationAngle(std::string_view description);

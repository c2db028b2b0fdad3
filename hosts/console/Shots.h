#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "hosts/console/Arguments.h"

namespace console
{

/// A picture to be taken when the replay passes `time`.
struct Shot
{
    double time = 0.0;          ///< seconds of the data
    std::optional<Place> place; ///< none: what is shown anyway
    std::string name;           ///< of the picture's file, without its ending
};

/// The shots of a file, by time: in each line "time ex,ey,ez lx,ly,lz name", or "time name" to leave the eye
/// where it is. Blank lines and what follows a "#" are
/// passed over. An `ArgumentError` names file and line.
std::vector<Shot> ReadShots(const std::filesystem::path& file);

/// `count` shots at equal distances from `first` to `last`, both included, named by their time; a single one in the
/// middle.
std::vector<Shot> EquallySpacedShots(double first, double last, int count);

} // namespace console

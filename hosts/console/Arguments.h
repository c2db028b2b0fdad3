#pragma once

#include <array>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

/// What a user types, and what it means. All parsers are strict: an argument is right as a whole or wrong.
namespace console
{

/// A wrong argument, in words for the user (UTF-8).
class ArgumentError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

using Triple = std::array<double, 3>;

/// "x,y,z": exactly three finite numbers.
Triple ParseTriple(const std::string& text);

/// Where an eye is, and the point that it looks at: metres, in the axes of the scene, z up.
struct Place
{
    Triple eye{};
    Triple look{};
};

/// "x,y": exactly two numbers from 0 to 1.
std::array<double, 2> ParseFractions(const std::string& text);

struct Size
{
    int width = 1280;
    int height = 720;
};

/// "640x360", each 1 to `largestPicture`.
Size ParseSize(const std::string& text);
inline constexpr int largestPicture = 16384;

/// A body that stays: "road.dae", "road.dae@x,y,z" or "road.dae@x,y,z,rx,ry,rz". Metres and degrees in the axes of the
/// scene, z up.
struct StaticArgument
{
    std::filesystem::path model;
    Triple position{};
    Triple rotation{};
};
StaticArgument ParseStatic(const std::string& text);

/// A body that data move: "NAME=car.dae", "NAME=car.dae:CHANNEL". Without a channel it is bound to the one of its name.
struct MovableArgument
{
    std::string name;
    std::filesystem::path model;
    std::string channel;
};
MovableArgument ParseMovable(const std::string& text);

/// Replaces each "@FILE" by the arguments that FILE holds, one a line. Blank lines and lines that begin with "#" are
/// passed over, and a line "--option value" counts as two. Relative paths of models and data in it are relative to the
/// folder of FILE. An "@" within FILE has no meaning.
std::vector<std::string> ExpandArgumentFiles(const std::vector<std::string>& arguments);

/// The files that stood behind "@", since the start of the program.
const std::vector<std::filesystem::path>& ReadArgumentFiles();

} // namespace console

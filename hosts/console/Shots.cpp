#include "hosts/console/Shots.h"

#include <algorithm>
#include <fstream>
#include <set>
#include <sstream>

#include <fmt/format.h>

#include "base/Numbers.h"

namespace console
{

namespace
{

Shot ParseShot(const std::string& line)
{
    std::istringstream words(line);
    std::vector<std::string> fields;
    for (std::string word; words >> word;)
        fields.push_back(word);
    if (fields.size() != 2 && fields.size() != 4)
        throw ArgumentError("a shot is \"time ex,ey,ez lx,ly,lz name\" or \"time name\"");
    const auto seconds = base::ParseDouble(fields.front());
    if (!seconds)
        throw ArgumentError("\"" + fields.front() + "\" is not a time");
    Shot shot;
    shot.name = fields.back();
    if (shot.name.find('/') != std::string::npos || shot.name.front() == '.')
        throw ArgumentError("\"" + shot.name + "\" is no name for a picture");
    shot.time = *seconds;
    if (fields.size() == 4)
        shot.place = Place{ParseTriple(fields[1]), ParseTriple(fields[2])};
    if (shot.place && shot.place->eye == shot.place->look)
        throw ArgumentError("the eye looks at itself");
    return shot;
}

} // namespace

std::vector<Shot> ReadShots(const std::filesystem::path& file)
{
    std::ifstream in(file);
    if (!in || std::filesystem::is_directory(file))
        throw ArgumentError(file.string() + ": the file of shots can't be read");

    std::vector<Shot> shots;
    std::set<std::string> names;
    int number = 0;
    for (std::string line; std::getline(in, line);)
    {
        ++number;
        line.resize(std::min(line.size(), line.find('#')));
        if (line.find_first_not_of(" \t\r") == std::string::npos)
            continue;
        try
        {
            shots.push_back(ParseShot(line));
        }
        catch (const ArgumentError& error)
        {
            throw ArgumentError(fmt::format("{}, line {}: {}", file.string(), number, error.what()));
        }
        if (!names.insert(shots.back().name).second)
            throw ArgumentError(
                fmt::format("{}, line {}: there is a \"{}\" already", file.string(), number, shots.back().name));
    }
    if (shots.empty())
        throw ArgumentError(file.string() + ": it holds no shots");
    std::stable_sort(shots.begin(), shots.end(), [](const Shot& a, const Shot& b) { return a.time < b.time; });
    return shots;
}

std::vector<Shot> EquallySpacedShots(double first, double last, int count)
{
    std::vector<Shot> shots;
    for (int i = 0; i < count; ++i)
    {
        const double part = count == 1 ? 0.5 : static_cast<double>(i) / (count - 1);
        const double time = first + (last - first) * part;
        shots.push_back({time, std::nullopt, fmt::format("{:02}-{:.2f}s", i + 1, time)});
    }
    return shots;
}

} // namespace console

#include "hosts/console/Arguments.h"

#include <algorithm>
#include <fstream>
#include <string_view>

#include "base/Numbers.h"
#include "base/Text.h"

namespace console
{

namespace
{

std::vector<double> ParseNumbers(const std::string& text)
{
    std::vector<double> numbers;
    std::string_view rest = text;
    while (true)
    {
        const std::size_t comma = rest.find(',');
        const auto number = base::ParseDouble(rest.substr(0, comma));
        if (!number)
            throw ArgumentError("\"" + std::string(rest.substr(0, comma)) + "\" in \"" + text + "\" is not a number");
        numbers.push_back(*number);
        if (comma == std::string_view::npos)
            return numbers;
        rest.remove_prefix(comma + 1);
    }
}

// Where the model's own name ends: behind ".dae" or ".wrl", so that a folder or a channel may hold a colon.
std::size_t EndOfModel(const std::string& text)
{
    std::string lower = text;
    std::transform(lower.begin(), lower.end(), lower.begin(), [](unsigned char c) { return std::tolower(c); });
    for (const char* ending : {".dae:", ".wrl:"})
        if (const std::size_t at = lower.find(ending); at != std::string::npos)
            return at + 4;
    return lower.ends_with(".dae") || lower.ends_with(".wrl") ? text.size() : text.rfind(':');
}

// Options whose value is, or contains, the path of something that is read.
struct PathOption
{
    const char* name;
    bool behindEquals; ///< the path stands behind "NAME="
};
constexpr PathOption pathOptions[] = {
    {"--static", false}, {"--movable", true}, {"--data", false}, {"--shots", false}, {"--scene", false}};

const PathOption* FindPathOption(const std::string& name)
{
    for (const PathOption& option : pathOptions)
        if (name == option.name)
            return &option;
    return nullptr;
}

std::string Relocated(const std::string& value, const PathOption& option, const std::filesystem::path& folder)
{
    const std::size_t equals = option.behindEquals ? value.find('=') : std::string::npos;
    const std::size_t start = equals == std::string::npos ? 0 : equals + 1;
    if (folder.empty() || start >= value.size() || value[start] == '/')
        return value;
    return value.substr(0, start) + folder.string() + "/" + value.substr(start);
}

std::vector<std::filesystem::path> readFiles;

void AppendFile(const std::filesystem::path& path, std::vector<std::string>& arguments)
{
    readFiles.push_back(path);
    std::ifstream in(path);
    if (!in || std::filesystem::is_directory(path))
        throw ArgumentError(path.string() + ": the file of arguments can't be read");

    const std::filesystem::path folder = path.parent_path();
    const PathOption* pending = nullptr; // the option that waits for its value
    for (std::string line; std::getline(in, line);)
    {
        const std::string text(base::Trim(line));
        if (text.empty() || text.front() == '#')
            continue;
        if (!text.starts_with("--"))
        {
            arguments.push_back(pending ? Relocated(text, *pending, folder) : text);
            pending = nullptr;
            continue;
        }
        const std::size_t end = text.find_first_of("= \t");
        const std::string name = text.substr(0, end);
        pending = FindPathOption(name);
        arguments.push_back(name);
        if (end == std::string::npos)
            continue;
        const std::string value(base::Trim(std::string_view(text).substr(end + 1)));
        arguments.back() += "=" + (pending ? Relocated(value, *pending, folder) : value);
        pending = nullptr;
    }
}

} // namespace

Triple ParseTriple(const std::string& text)
{
    const std::vector<double> numbers = ParseNumbers(text);
    if (numbers.size() != 3)
        throw ArgumentError("\"" + text + "\" should be three numbers: x,y,z");
    return {numbers[0], numbers[1], numbers[2]};
}

std::array<double, 2> ParseFractions(const std::string& text)
{
    const std::vector<double> numbers = ParseNumbers(text);
    const auto isFraction = [](double number) { return number >= 0.0 && number <= 1.0; };
    if (numbers.size() != 2 || !isFraction(numbers[0]) || !isFraction(numbers[1]))
        throw ArgumentError("\"" + text + "\" should be two numbers from 0 to 1: x,y");
    return {numbers[0], numbers[1]};
}

Size ParseSize(const std::string& text)
{
    const std::size_t x = text.find_first_of("xX");
    const auto width = base::ParseInteger(std::string_view(text).substr(0, x));
    const auto height =
        x == std::string::npos ? std::nullopt : base::ParseInteger(std::string_view(text).substr(x + 1));
    if (!width || !height || *width < 1 || *height < 1 || *width > largestPicture || *height > largestPicture)
        throw ArgumentError("\"" + text + "\" is not a size: WIDTHxHEIGHT, each from 1 to " +
                            std::to_string(largestPicture));
    return {static_cast<int>(*width), static_cast<int>(*height)};
}

StaticArgument ParseStatic(const std::string& text)
{
    const std::size_t at = text.rfind('@');
    StaticArgument result;
    result.model = text.substr(0, at);
    if (result.model.empty())
        throw ArgumentError("\"" + text + "\" names no model");
    if (at == std::string::npos)
        return result;

    const std::vector<double> numbers = ParseNumbers(text.substr(at + 1));
    if (numbers.size() != 3 && numbers.size() != 6)
        throw ArgumentError("\"" + text + "\": a place is x,y,z or x,y,z,rx,ry,rz");
    std::copy_n(numbers.begin(), 3, result.position.begin());
    std::copy(numbers.begin() + 3, numbers.end(), result.rotation.begin());
    return result;
}

MovableArgument ParseMovable(const std::string& text)
{
    const std::size_t equals = text.find('=');
    MovableArgument result;
    if (equals != std::string::npos)
    {
        result.name = base::Trim(text.substr(0, equals));
        const std::string rest = text.substr(equals + 1);
        const std::size_t end = EndOfModel(rest);
        result.model = rest.substr(0, end);
        result.channel = end < rest.size() ? rest.substr(end + 1) : result.name;
    }
    if (result.name.empty() || result.model.empty() || result.channel.empty())
        throw ArgumentError("\"" + text + "\" should be NAME=model.dae or NAME=model.dae:CHANNEL");
    return result;
}

std::vector<std::string> ExpandArgumentFiles(const std::vector<std::string>& arguments)
{
    std::vector<std::string> expanded;
    for (const std::string& argument : arguments)
        if (argument.size() > 1 && argument.front() == '@')
            AppendFile(argument.substr(1), expanded);
        else
            expanded.push_back(argument);
    return expanded;
}

const std::vector<std::filesystem::path>& ReadArgumentFiles()
{
    return readFiles;
}

} // namespace console

#include <CLI/CLI.hpp>

#include <set>

#include "base/Text.h"
#include "hosts/console/Command.h"

namespace console
{

namespace
{

// The parser's own conversions are lenient; ours are not, and their words go to the user.
template <class Value, class Parse>
CLI::Option* AddParsed(CLI::App& command, const char* name, const char* type, const char* text, Value& value,
                       Parse parse)
{
    return command
        .add_option_function<std::string>(
            name,
            [&value, parse, name](const std::string& given)
            {
                try
                {
                    value = parse(given);
                }
                catch (const ArgumentError& error)
                {
                    throw CLI::ValidationError(name, error.what());
                }
            },
            text)
        ->type_name(type);
}

template <class Value, class Parse>
void AddParsedList(CLI::App& command, const char* name, const char* type, const char* text, std::vector<Value>& values,
                   Parse parse)
{
    command
        .add_option_function<std::vector<std::string>>(
            name,
            [&values, parse, name](const std::vector<std::string>& given)
            {
                try
                {
                    for (const std::string& one : given)
                        values.push_back(parse(one));
                }
                catch (const ArgumentError& error)
                {
                    throw CLI::ValidationError(name, error.what());
                }
            },
            text)
        ->type_name(type)
        ->allow_extra_args(false);
}

} // namespace

ViewOptions AddViewOptions(CLI::App& command, ViewArguments& arguments)
{
    AddParsedList(command, "--static", "MODEL[@x,y,z[,rx,ry,rz]]",
                  "A body that stays, with its place in metres and degrees (z up). May be given many times.",
                  arguments.scene.statics, ParseStatic);
    AddParsedList(command, "--movable", "NAME=MODEL[:CHANNEL]",
                  "A body that a channel of the data moves, by default the one of its name. May be given many times.",
                  arguments.scene.movables, ParseMovable);
    ViewOptions options{};
    options.data = command.add_option("--data", arguments.scene.data, "The motion data file that moves the bodies.")
                       ->type_name("RUN.mdf");
    options.eye =
        AddParsed(command, "--eye", "x,y,z", "Where the eye is, in metres, z up.", arguments.eye, ParseTriple);
    options.look = AddParsed(command, "--look", "x,y,z", "The point it looks at.", arguments.look, ParseTriple);
    AddParsed(command, "--size", "WxH", "Size of the picture in pixels. [1280x720]", arguments.size, ParseSize);
    command.add_flag("-v,--verbose", arguments.verbose, "Show log messages too.");
    return options;
}

void CheckViewArguments(const ViewArguments& arguments)
{
    if (arguments.eye == arguments.look)
        RejectArguments("--eye and --look are the same point");
    std::set<std::wstring> names;
    for (const MovableArgument& movable : arguments.scene.movables)
        if (!names.insert(base::ToLower(base::Wide(movable.name))).second)
            RejectArguments("two movable bodies are named \"" + movable.name + "\"");
}

void RejectArguments(const std::string& reason)
{
    throw CLI::ValidationError(reason);
}

} // namespace console

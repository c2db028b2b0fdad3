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

void AddDataOption(CLI::App& command, SceneArguments& scene)
{
    command.add_option("--data", scene.data, "The motion data file that moves the bodies.")->type_name("RUN.mdf");
}

void AddSceneOptions(CLI::App& command, SceneArguments& scene)
{
    AddParsedList(command, "--static", "MODEL[@x,y,z[,rx,ry,rz]]",
                  "A body that stays, with its place in metres and degrees (z up). May be given many times.",
                  scene.statics, ParseStatic);
    AddParsedList(command, "--movable", "NAME=MODEL[:CHANNEL]",
                  "A body that a channel of the data moves, by default the one of its name. May be given many times.",
                  scene.movables, ParseMovable);
    AddDataOption(command, scene);
}

void AddSceneFileOption(CLI::App& command, SceneArguments& scene)
{
    command.add_option("--scene", scene.file, "The scene file. It stands for --static and --movable.")
        ->type_name("SCENE.xml");
}

void AddPlaceOptions(CLI::App& command, ViewArguments& arguments)
{
    const auto parse = [](const std::string& text) { return std::optional(ParseTriple(text)); };
    CLI::Option* eye = AddParsed(command, "--eye", "x,y,z", "Where the eye is, in metres, z up.", arguments.eye, parse);
    CLI::Option* look = AddParsed(command, "--look", "x,y,z", "The point it looks at.", arguments.look, parse);
    eye->needs(look);
    look->needs(eye);
}

void AddViewOptions(CLI::App& command, ViewArguments& arguments)
{
    AddSceneFileOption(command, arguments.scene);
    AddSceneOptions(command, arguments.scene);
    command
        .add_option("--source", arguments.scene.source,
                    "A live data point in place of --data, with its options: OffSim:seed=7,fail=12.5.")
        ->type_name("POINT[:OPTIONS]")
        ->excludes("--data");
    AddPlaceOptions(command, arguments);
    CLI::Option* pane = command.add_option("--pane", arguments.pane, "Show this pane of the scene, 1 to 4, alone.")
                            ->type_name("N")
                            ->check(CLI::Range(1, 4));
    command
        .add_flag("--all", arguments.all,
                  "Show the panes together as the scene lays them out. That is the rule with --scene.")
        ->excludes(pane);
    command.add_option("--observer", arguments.observer, "Look through this observer, in the pane or alone.")
        ->type_name("NAME");
    CLI::Option* layout =
        command
            .add_option("--layout", arguments.layout,
                        "How the panes share the picture: 0 one pane, 1 two columns, 2 two rows, 3 four panes.")
            ->type_name("0..3")
            ->check(CLI::Range(0, 3));
    AddParsed(command, "--splitter", "X,Y",
              "Where the panes meet: fractions of the picture from the left and from the top.", arguments.splitter,
              [](const std::string& text) { return std::optional(ParseFractions(text)); })
        ->excludes(layout);
    AddParsed(command, "--size", "WxH", "Size of the picture in pixels. [1280x720]", arguments.size, ParseSize);
    command.add_flag("-v,--verbose", arguments.verbose, "Show log messages too.");
}

void CheckViewArguments(ViewArguments& arguments)
{
    const SceneArguments& scene = arguments.scene;
    if (!scene.file.empty() && !(scene.statics.empty() && scene.movables.empty()))
        RejectArguments("--scene stands for --static and --movable, so they can't be given together");
    if (arguments.eye && arguments.look)
        arguments.place = Place{*arguments.eye, *arguments.look};
    if (arguments.place && !arguments.observer.empty())
        RejectArguments("--observer and --eye are two ways to place the same eye");
    if (arguments.place && arguments.place->eye == arguments.place->look)
        RejectArguments("--eye and --look are the same point");
    std::set<std::wstring> names;
    for (const MovableArgument& movable : scene.movables)
        if (!names.insert(base::ToLower(base::Wide(movable.name))).second)
            RejectArguments("two movable bodies are named \"" + movable.name + "\"");
}

void RejectArguments(const std::string& reason)
{
    throw CLI::ValidationError(reason);
}

} // namespace console

#pragma once

#include <array>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "hosts/console/Arguments.h"
#include "hosts/console/SceneSetup.h"

namespace CLI
{
class App;
class Option;
} // namespace CLI

/// The subcommands of `panoramic`, one file each. Each `Add...` describes its arguments to the parser and has `status`
/// set by the command when it is the one that was asked for: 0 all went well, 1 an error message was shown.
namespace console
{

void AddSnapshotCommand(CLI::App& program, int& status);
void AddPlayCommand(CLI::App& program, int& status);
void AddMdfImportCommand(CLI::App& mdf, int& status);
void AddMdfExportCommand(CLI::App& mdf, int& status);
void AddMdfInfoCommand(CLI::App& mdf, int& status);
void AddPointsCommand(CLI::App& program, int& status);
void AddSceneInfoCommand(CLI::App& scene, int& status);
void AddSceneNewCommand(CLI::App& scene, int& status);
void AddSceneCopyCommand(CLI::App& scene, int& status);

/// Arguments that tell the scene and the view, the same for several commands.
struct ViewArguments
{
    SceneArguments scene;
    std::optional<Triple> eye;
    std::optional<Triple> look;
    std::optional<Place> place; ///< of both
    int pane = 0;               ///< 1 to 4; 0 the one that the scene has active
    bool all = false;           ///< the layout of the scene, as without any choice
    std::string observer;
    std::optional<std::int32_t> layout;
    std::optional<std::array<double, 2>> splitter;
    Size size;
    bool verbose = false;

    /// One pane over the whole picture is asked for, not the layout.
    bool ShowsOnePane() const { return !all && (pane != 0 || !observer.empty() || place); }
};

/// Bodies and the data that move them, given one by one or as a scene file.
void AddSceneOptions(CLI::App& command, SceneArguments& scene);
void AddDataOption(CLI::App& command, SceneArguments& scene);

/// `--scene`, which stands for the bodies.
void AddSceneFileOption(CLI::App& command, SceneArguments& scene);

void AddPlaceOptions(CLI::App& command, ViewArguments& arguments);

/// The scene, and what the picture shows of it.
void AddViewOptions(CLI::App& command, ViewArguments& arguments);

/// Makes `place` of the eye and its point. Throws what the parser makes "wrong arguments" of when the arguments
/// contradict each other: two bodies of one name, an eye that looks at itself, bodies beside a scene file.
void CheckViewArguments(ViewArguments& arguments);
[[noreturn]] void RejectArguments(const std::string& reason);

} // namespace console

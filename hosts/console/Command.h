#pragma once

#include <filesystem>
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

/// Arguments that tell the scene and the view, the same for several commands.
struct ViewArguments
{
    SceneArguments scene;
    Triple eye{};
    Triple look{};
    Size size;
    bool verbose = false;
};

struct ViewOptions
{
    CLI::Option* eye;
    CLI::Option* look;
    CLI::Option* data;
};

ViewOptions AddViewOptions(CLI::App& command, ViewArguments& arguments);

/// Throws what the parser makes "wrong arguments" of when two bodies have one name, or the eye looks at itself.
void CheckViewArguments(const ViewArguments& arguments);
[[noreturn]] void RejectArguments(const std::string& reason);

} // namespace console

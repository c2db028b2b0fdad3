#include <CLI/CLI.hpp>

#include <exception>
#include <iostream>

#include "hosts/console/Command.h"

namespace
{

constexpr int wrongArguments = 2;

// Help goes to standard output and is a success; anything else is told on standard error.
int Refuse(const CLI::App& program, const CLI::ParseError& error)
{
    if (error.get_exit_code() == 0)
        return program.exit(error);
    const auto chosen = program.get_subcommands();
    const CLI::App* command = chosen.empty() ? &program : chosen.front();
    const auto further = command->get_subcommands();
    if (!chosen.empty() && !further.empty())
        command = further.front();
    std::string name = command->get_name();
    for (const CLI::App* above = command->get_parent(); above; above = above->get_parent())
        name = above->get_name() + " " + name;
    std::cerr << "panoramic: wrong arguments: " << error.what() << "\nTry \"" << name << " --help\".\n";
    return wrongArguments;
}

int RunProgram(int argc, char** argv)
{
    CLI::App program("Panoramic replays recorded vehicle simulations in 3D.", "panoramic");
    program.require_subcommand(1);
    program.get_formatter()->column_width(38);
    program.footer("An argument @FILE stands for the arguments that FILE holds, one a line; \"#\" begins a comment,\n"
                   "and relative paths of models and data in it start from the folder of FILE.\n\n"
                   "Exit status: 0 when all went well, 1 when an error was shown, 2 for wrong arguments.");
    int status = 0;
    console::AddSnapshotCommand(program, status);
    console::AddPlayCommand(program, status);
    CLI::App* mdf = program.add_subcommand("mdf", "Make, read and look into motion data files.");
    mdf->require_subcommand(1);
    console::AddMdfImportCommand(*mdf, status);
    console::AddMdfExportCommand(*mdf, status);
    console::AddMdfInfoCommand(*mdf, status);
    console::AddPointsCommand(program, status);
    CLI::App* scene = program.add_subcommand("scene", "Make, copy and look into scene files.");
    scene->require_subcommand(1);
    console::AddSceneInfoCommand(*scene, status);
    console::AddSceneNewCommand(*scene, status);
    console::AddSceneCopyCommand(*scene, status);

    try
    {
        std::vector<std::string> arguments =
            console::ExpandArgumentFiles(std::vector<std::string>(argv + 1, argv + argc));
        std::reverse(arguments.begin(), arguments.end()); // as the parser wants them
        program.parse(std::move(arguments));
        return status;
    }
    catch (const CLI::ParseError& error)
    {
        return Refuse(program, error);
    }
    catch (const console::ArgumentError& error)
    {
        std::cerr << "panoramic: wrong arguments: " << error.what() << '\n';
        return wrongArguments;
    }
}

} // namespace

int main(int argc, char** argv)
{
    try
    {
        return RunProgram(argc, argv);
    }
    catch (const std::exception& error)
    {
        std::cerr << "panoramic: error: " << error.what() << '\n';
        return 1;
    }
}

#include <CLI/CLI.hpp>

#include <memory>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "hosts/console/Command.h"
#include "hosts/console/Outputs.h"
#include "hosts/console/Session.h"

namespace console
{

namespace
{

struct CopyArguments
{
    std::filesystem::path input;
    std::filesystem::path output;
    bool verbose = false;
};

int Run(const CopyArguments& arguments)
{
    Session session(arguments.verbose);
    VtCPanoramicDocument* document = session.OpenDocument(std::filesystem::absolute(arguments.input));
    if (!document || !CheckAgainstModels(session, {arguments.output}) ||
        !document->OnSaveDocument(base::InnerPath(std::filesystem::absolute(arguments.output))))
        return Session::failed;
    TellWritten(arguments.output);
    return session.GetExitStatus();
}

} // namespace

void AddSceneCopyCommand(CLI::App& scene, int& status)
{
    auto arguments = std::make_shared<CopyArguments>();
    CLI::App* command = scene.add_subcommand("copy", "Load a scene file and save it.");
    command->add_option("scene", arguments->input, "The scene file to load.")->type_name("IN.xml")->required();
    command->add_option("-o,--output", arguments->output, "The scene file to write.")->type_name("OUT.xml")->required();
    command->add_flag("-v,--verbose", arguments->verbose, "Show log messages too.");
    command->footer(
        "What is written is what Panoramic made of the scene: defaults that the file left out are in it,\n"
        "records and attributes that nobody here knows are as they were. A second copy is the same file.\n\n"
        "Example:\n"
        "  panoramic scene copy old.xml -o new.xml");
    command->callback(
        [arguments, &status]
        {
            CheckOutput(arguments->output, Content::scene, {arguments->input});
            status = Run(*arguments);
        });
}

} // namespace console

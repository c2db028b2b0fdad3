#include <CLI/CLI.hpp>

#include <memory>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleView.h"
#include "hosts/console/Outputs.h"
#include "hosts/console/Session.h"

namespace console
{

namespace
{

struct NewArguments
{
    ViewArguments view;
    std::filesystem::path output;
};

int Run(const NewArguments& arguments)
{
    Session session(arguments.view.verbose);
    VtCPanoramicDocument* document = OpenScene(session, arguments.view.scene);
    if (!document)
        return Session::failed;
    if (arguments.view.place)
        PlaceFreeObserver(*document, *arguments.view.place);
    if (!CheckAgainstModels(session, {arguments.output}) ||
        !document->OnSaveDocument(base::InnerPath(std::filesystem::absolute(arguments.output))))
        return Session::failed;
    TellWritten(arguments.output);
    return session.GetExitStatus();
}

} // namespace

void AddSceneNewCommand(CLI::App& scene, int& status)
{
    auto arguments = std::make_shared<NewArguments>();
    CLI::App* command = scene.add_subcommand("new", "Make a scene file of models.");
    AddSceneOptions(*command, arguments->view.scene);
    AddPlaceOptions(*command, arguments->view);
    command->add_option("-o,--output", arguments->output, "The scene file to write.")
        ->type_name("SCENE.xml")
        ->required();
    command->add_flag("-v,--verbose", arguments->view.verbose, "Show log messages too.");
    command->footer(
        "With --data the movable bodies are bound to the channels of that run; a scene without it binds its\n"
        "bodies by name when it is shown. --eye and --look place the observer Free1.\n\n"
        "Example:\n"
        "  panoramic scene new -o scene.xml --static road.dae --movable Car=car.dae:Chassis --data run.mdf");
    command->callback(
        [arguments, &status]
        {
            CheckViewArguments(arguments->view);
            CheckOutput(arguments->output, Content::scene, InputsOf(arguments->view.scene));
            status = Run(*arguments);
        });
}

} // namespace console

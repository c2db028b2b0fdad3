#include <CLI/CLI.hpp>

#include <memory>

#include "app/PanoramicDocument.h"
#include "base/Numbers.h"
#include "hosts/common/Picture.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleTexts.h"
#include "hosts/console/ConsoleView.h"
#include "hosts/console/Outputs.h"
#include "hosts/console/Session.h"

namespace console
{

namespace
{

struct Snapshot
{
    ViewArguments view;
    std::string timeText;
    std::optional<double> time;
    long frame = 0; ///< 0: by time
    std::filesystem::path output;
};

bool GoToMoment(Session& session, const Snapshot& snapshot)
{
    if (!snapshot.view.scene.source.empty())
        return RunSourceTo(session, *snapshot.time);
    if (snapshot.view.scene.data.empty())
        return true;
    return snapshot.time ? GoToTime(session, *snapshot.time, snapshot.view.scene.data)
                         : GoToFrame(session, snapshot.frame);
}

int Run(const Snapshot& snapshot)
{
    Session session(snapshot.view.verbose);
    ConsoleView::Prepare(session.GetHost(), snapshot.view.size);
    VtCPanoramicDocument* document = OpenScene(session, snapshot.view.scene);
    if (!document || !CheckAgainstModels(session, {snapshot.output}))
        return Session::failed;
    const std::unique_ptr<ConsoleView> view = ConsoleView::Create(session.GetHost(), *document, snapshot.view);
    if (!view || !GoToMoment(session, snapshot))
        return Session::failed;

    session.GetApp().RedrawNow();
    const osg::ref_ptr<osg::Image> picture = view->Read();
    if (!picture)
    {
        session.GetHost().ShowError(messagePictureNotRead);
        return session.GetExitStatus();
    }
    if (const std::string reason = hosts::WritePicture(*picture, snapshot.output); !reason.empty())
        session.GetHost().ShowError(messagePictureNotWritten, reason);
    else
        TellWritten(snapshot.output);
    return session.GetExitStatus();
}

void Check(Snapshot& snapshot)
{
    const bool hasMoment = !snapshot.timeText.empty() || snapshot.frame != 0;
    const bool live = !snapshot.view.scene.source.empty();
    if (live && (snapshot.timeText.empty() || snapshot.frame != 0))
        RejectArguments("--source needs --time");
    if (!live && snapshot.view.scene.data.empty() == hasMoment)
        RejectArguments(hasMoment ? "--time and --frame need --data" : "--data needs --time or --frame");
    if (!snapshot.timeText.empty())
    {
        snapshot.time = base::ParseDouble(snapshot.timeText);
        if (!snapshot.time)
            RejectArguments("--time: \"" + snapshot.timeText + "\" is not a number");
        if (live && *snapshot.time < 0.0)
            RejectArguments("--time: a live source begins at 0");
    }
    CheckViewArguments(snapshot.view);
    CheckOutput(snapshot.output, Content::picture, InputsOf(snapshot.view.scene));
    if (snapshot.view.scene.file.empty() && !snapshot.view.place)
        RejectArguments("--eye and --look are required without --scene");
}

} // namespace

void AddSnapshotCommand(CLI::App& program, int& status)
{
    auto snapshot = std::make_shared<Snapshot>();
    CLI::App* command = program.add_subcommand("snapshot", "Draw one picture of a scene at a moment of a run.");
    AddViewOptions(*command, snapshot->view);
    CLI::Option* time =
        command->add_option("--time", snapshot->timeText, "The moment, in seconds of the data.")->type_name("SECONDS");
    command->add_option("--frame", snapshot->frame, "The moment, as the number of a frame, from 1.")
        ->type_name("N")
        ->check(CLI::PositiveNumber)
        ->excludes(time);
    command->add_option("-o,--output", snapshot->output, "The picture to write: PNG, JPEG or TIFF by its ending.")
        ->type_name("PICTURE.png")
        ->required();
    command->footer(
        "Examples:\n"
        "  panoramic snapshot --scene scene.xml --data run.mdf --time 12.5 --observer Driver -o picture.png\n"
        "  panoramic snapshot --static road.dae --movable Car=car.dae:Chassis --data run.mdf \\\n"
        "      --time 12.5 --eye -8,-12,4 --look 0,0,1 --size 1280x720 -o picture.png");
    command->callback(
        [snapshot, &status]
        {
            Check(*snapshot);
            status = Run(*snapshot);
        });
}

} // namespace console

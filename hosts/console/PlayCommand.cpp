#include <CLI/CLI.hpp>

#include <csignal>
#include <iostream>
#include <memory>

#include "app/PanoramicDocument.h"
#include "base/Numbers.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleTexts.h"
#include "hosts/console/Playback.h"
#include "hosts/console/Session.h"

namespace console
{

namespace
{

struct Play
{
    ViewArguments view;
    PlaybackArguments playback;
    std::string speedText;
    double duration = 10.0; ///< seconds, of a live source
    bool headless = false;
};

volatile std::sig_atomic_t interrupted = 0;

extern "C" void OnInterrupt(int)
{
    interrupted = 1;
}

void WatchForInterrupt()
{
    struct sigaction action = {};
    action.sa_handler = OnInterrupt;
    action.sa_flags = SA_RESETHAND; // a second one ends the program the hard way
    sigaction(SIGINT, &action, nullptr);
    sigaction(SIGTERM, &action, nullptr);
}

int Run(const Play& play)
{
    WatchForInterrupt();
    Session session(play.view.verbose);
    if (!play.headless)
        session.GetHost().ShowInformation(messageAlwaysHeadless);
    ConsoleView::Prepare(session.GetHost(), play.view.size);
    VtCPanoramicDocument* document = OpenScene(session, play.view.scene);
    if (!document)
        return Session::failed;
    const std::unique_ptr<ConsoleView> view = ConsoleView::Create(session.GetHost(), *document, play.view);
    if (!view)
        return Session::failed;

    Playback playback(session, *view, play.view, play.playback);
    if (playback.Prepare())
        playback.Run(interrupted);
    return session.GetExitStatus();
}

void Check(Play& play)
{
    const bool live = !play.view.scene.source.empty();
    if (!play.speedText.empty())
    {
        const auto speed = base::ParseDouble(play.speedText);
        if (!speed || *speed <= 0.0)
            RejectArguments("--speed: \"" + play.speedText + "\" is not a positive number");
        if (live)
            RejectArguments("--speed: a live source sets its own pace");
        play.playback.speed = *speed;
    }
    if (live)
        play.playback.duration = play.duration;
    if (!play.playback.shotsFile.empty())
        play.playback.shots = ReadShots(play.playback.shotsFile);
    CheckViewArguments(play.view);
    if (play.view.scene.data.empty() && !live)
        RejectArguments("--data or --source is required");
    const bool hasScene = !play.view.scene.file.empty();
    if (!hasScene && !play.view.place && play.playback.shots.empty())
        RejectArguments("--eye and --look are required without --scene and --shots");
    for (const Shot& shot : play.playback.shots)
        if (!hasScene && !play.view.place && !shot.place)
            RejectArguments("--shots: \"" + shot.name + "\" has no eye, and there is neither --eye nor --scene");
    if (!hasScene && !play.view.place)
        play.view.place = play.playback.shots.front().place;
}

} // namespace

void AddPlayCommand(CLI::App& program, int& status)
{
    auto play = std::make_shared<Play>();
    CLI::App* command = program.add_subcommand(
        "play", "Replay a run, or show a live source, in real time; tell how many frames a second.");
    AddViewOptions(*command, play->view);
    command->add_option("--speed", play->speedText, "Seconds of the data in a second. [1]")->type_name("F");
    command->add_option("--duration", play->duration, "How long a live source runs, in seconds. [10]")
        ->type_name("SECONDS")
        ->check(CLI::PositiveNumber)
        ->needs("--source");
    command->add_option("--loop", play->playback.passes, "How many times the run is played. [1]")
        ->type_name("N")
        ->check(CLI::PositiveNumber);
    command->add_flag("--headless", play->headless,
                      "Draw off-screen. A console has no window, so this is what happens in any case.");
    CLI::Option* pictures = command
                                ->add_option("--pictures", play->playback.folder,
                                             "Write pictures of the run to this folder, and contact-sheet.png.")
                                ->type_name("FOLDER");
    CLI::Option* shots = command
                             ->add_option("--shots", play->playback.shotsFile,
                                          "When pictures are taken: a file of lines \"time ex,ey,ez lx,ly,lz name\" "
                                          "or \"time name\".")
                             ->type_name("FILE")
                             ->needs(pictures);
    command
        ->add_option("--count", play->playback.count,
                     "How many pictures are taken, at equal distances in time, when there are no shots. [6]")
        ->type_name("N")
        ->check(CLI::Range(1, 200))
        ->needs(pictures)
        ->excludes(shots);
    command->footer("Examples:\n"
                    "  panoramic play --scene scene.xml --data run.mdf --pictures out --headless\n"
                    "  panoramic play --static road.dae --movable Car=car.dae:Chassis --data run.mdf \\\n"
                    "      --eye -8,-12,4 --look 0,0,1 --headless\n"
                    "  panoramic play @scene.args --shots shots.txt --pictures out --headless\n"
                    "  panoramic play --static road.dae --movable Car=car.dae:Vehicle --source OffSim:seed=7 \\\n"
                    "      --eye -8,-12,4 --look 0,0,1 --duration 30 --headless\n"
                    "Ctrl-C ends it cleanly.");
    command->callback(
        [play, &status]
        {
            try
            {
                Check(*play);
            }
            catch (const ArgumentError& error)
            {
                RejectArguments(error.what());
            }
            status = Run(*play);
        });
}

} // namespace console

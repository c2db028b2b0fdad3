#include "hosts/console/Playback.h"

#include <algorithm>
#include <iostream>

#include <fmt/format.h>
#include <fmt/xchar.h>

#include "base/Text.h"
#include "hosts/common/Picture.h"
#include "hosts/console/ConsoleTexts.h"
#include "hosts/console/Outputs.h"
#include "hosts/console/Session.h"
#include "simdata/SimulationDataController.h"

namespace console
{

namespace
{

constexpr long activity = 9000;
constexpr std::uint32_t progressInterval = 100; // milliseconds
constexpr long progressSteps = 100;
constexpr int sheetCell = 480; // pixels
constexpr const char* sheetName = "contact-sheet.png";
constexpr double patience = 10.0; // seconds, beyond the duration of a run

} // namespace

Playback::Playback(Session& runningSession, ConsoleView& consoleView, const ViewArguments& viewed,
                   const PlaybackArguments& given)
    : session(runningSession), view(consoleView), viewArguments(viewed), arguments(given)
{
}

bool Playback::Prepare()
{
    if (arguments.folder.empty())
        return true;
    const std::optional<TimeSpan> span = Span();
    if (span && arguments.shots.empty())
        arguments.shots = EquallySpacedShots(span->first, span->last, arguments.count);
    // Without time stamps there is one shot's worth of message, and no shot.
    if (!span)
        return CheckTime(session, 0.0, viewArguments.scene.data);
    for (const Shot& shot : arguments.shots)
        if (!CheckTime(session, shot.time, *span))
            return false;

    std::vector<std::filesystem::path> outputs{arguments.folder / sheetName};
    for (const Shot& shot : arguments.shots)
        outputs.push_back(arguments.folder / (shot.name + ".png"));
    if (!CheckAgainstModels(session, outputs))
        return false;

    std::error_code failed;
    std::filesystem::create_directories(arguments.folder, failed);
    if (!failed)
        return true;
    session.GetHost().ShowError(messageFolderNotMade, arguments.folder.string() + ": " + failed.message());
    return false;
}

void Playback::Run(const volatile std::sig_atomic_t& interrupted)
{
    session.GetController().SetSpeed(arguments.speed);
    host::Progress& progress = *session.GetHost().GetProgress();

    progress.ConnectProgressActivity(activity, session.GetHost().GetTexts().GetText(textPlaying), {});
    start = session.GetHost().GetClock().Counter();
    for (int pass = 1; pass <= arguments.passes; ++pass)
        if (!PlayPass(pass, interrupted))
            break;
    const double seconds = SecondsSinceStart();
    session.GetController().StopPlay();
    progress.DisconnectProgressActivity(activity);

    if (interrupted)
        session.GetHost().ShowInformation(messageInterrupted);
    WriteContactSheet();
    PrintResult(seconds);
}

std::optional<TimeSpan> Playback::Span() const
{
    return arguments.duration ? TimeSpan{0.0, *arguments.duration} : GetTimeSpan(session);
}

bool Playback::Begin()
{
    VtCSimulationDataController& controller = session.GetController();
    if (arguments.duration)
    {
        controller.Start();
        return controller.IsOnline();
    }
    if (!controller.GotoFirst())
        return false;
    controller.PlayOnce();
    return true;
}

bool Playback::GoesOn() const
{
    const VtCSimulationDataController& controller = session.GetController();
    if (!arguments.duration)
        return controller.HasPlayState();
    // A source that has failed for good comes nowhere.
    return controller.IsOnline() && CurrentTime() < *arguments.duration &&
           SecondsSinceStart() - passStart < *arguments.duration + patience;
}

bool Playback::PlayPass(int pass, const volatile std::sig_atomic_t& interrupted)
{
    session.GetHost().GetProgress()->SetProgresStepCount(activity, Span() ? progressSteps : 0);
    shownSteps = 0;
    passStart = SecondsSinceStart();
    if (!Begin())
        return false;
    const double first = CurrentTime();
    const bool ended = session.GetHost().GetIdleLoop().Run(
        [&]
        {
            TakeDueShots();
            ShowProgress(pass);
            const bool goesOn = GoesOn() && !interrupted;
            frames += goesOn;
            return goesOn;
        });
    played += CurrentTime() - first;
    if (arguments.duration)
        session.GetController().Stop();
    return ended && !interrupted;
}

double Playback::SecondsSinceStart() const
{
    const host::Clock& clock = session.GetHost().GetClock();
    return static_cast<double>(clock.Counter() - start) / static_cast<double>(clock.CounterFrequency());
}

double Playback::CurrentTime() const
{
    return session.GetController().GetRouter().GetTimestampOfCurrent().value_or(0.0);
}

void Playback::TakeDueShots()
{
    if (nextShot >= arguments.shots.size() || arguments.shots[nextShot].time > CurrentTime())
        return;
    VtCSimulationDataController& controller = session.GetController();
    const auto shown = static_cast<long>(controller.GetRouter().GetRecent({}));
    const double now = CurrentTime();
    while (nextShot < arguments.shots.size() && arguments.shots[nextShot].time <= now)
        Take(arguments.shots[nextShot++]);
    controller.ShowFrame({}, shown);
}

void Playback::Take(const Shot& shot)
{
    // The replay has gone on a little; the picture is to be of the shot's own time, on any machine.
    GoToTime(session, shot.time, viewArguments.scene.data);
    if (shot.place)
        view.LookAt(*shot.place);
    session.GetApp().RedrawNow();
    const osg::ref_ptr<osg::Image> picture = view.Read();
    if (shot.place && viewArguments.place)
        view.LookAt(*viewArguments.place);
    if (!picture)
    {
        session.GetHost().ShowError(messagePictureNotRead);
        return;
    }
    const std::filesystem::path file = arguments.folder / (shot.name + ".png");
    if (const std::string reason = hosts::WritePicture(*picture, file); !reason.empty())
    {
        session.GetHost().ShowError(messagePictureNotWritten, reason);
        return;
    }
    pictures.push_back(picture);
    made.push_back(file);
}

void Playback::ShowProgress(int pass)
{
    const std::uint32_t now = session.GetHost().GetClock().TickCount();
    if (now - lastProgress < progressInterval)
        return;
    lastProgress = now;
    const std::optional<TimeSpan> span = Span();
    std::wstring text = arguments.passes > 1 ? fmt::format(L"pass {} of {}, ", pass, arguments.passes) : L"";
    host::Progress& progress = *session.GetHost().GetProgress();
    if (span && span->last > span->first)
    {
        const double time = CurrentTime();
        const auto steps = static_cast<long>((time - span->first) / (span->last - span->first) * progressSteps);
        for (; shownSteps < std::min(steps, progressSteps); ++shownSteps)
            progress.StepProgressActivity(activity);
        text += fmt::format(L"{:.1f} s of {:.1f} s", time - span->first, span->last - span->first);
    }
    else
        text += fmt::format(L"frame {}", session.GetController().GetRouter().GetRecent({}));
    const double seconds = SecondsSinceStart();
    progress.SetProgressDescription(
        activity, seconds > 0.0 ? fmt::format(L"{}, {:.1f} fps", text, static_cast<double>(frames) / seconds) : text);
}

void Playback::WriteContactSheet()
{
    if (pictures.empty())
        return;
    const auto count = static_cast<int>(pictures.size());
    const int columns = count > 4 && count % 4 == 0 ? 4 : std::min(count, 3); // the fewest empty cells
    const osg::ref_ptr<osg::Image> sheet = hosts::ComposeContactSheet(pictures, columns, sheetCell);
    if (!sheet)
        return;
    const std::filesystem::path file = arguments.folder / sheetName;
    if (const std::string reason = hosts::WritePicture(*sheet, file); !reason.empty())
        session.GetHost().ShowError(messagePictureNotWritten, reason);
    else
        made.push_back(file);
}

void Playback::PrintResult(double seconds) const
{
    std::cout << fmt::format("{} frames in {:.2f} s: {:.1f} fps; {:.2f} s of data\n", frames, seconds,
                             seconds > 0.0 ? static_cast<double>(frames) / seconds : 0.0, played);
    for (const std::filesystem::path& file : made)
        std::cout << file.string() << '\n';
}

} // namespace console

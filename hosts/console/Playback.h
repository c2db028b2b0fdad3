#pragma once

#include <csignal>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <vector>

#include "hosts/console/Command.h"
#include "hosts/console/ConsoleView.h"
#include "hosts/console/Shots.h"

namespace console
{

class Session;

struct PlaybackArguments
{
    double speed = 1.0;
    std::optional<double> duration; ///< seconds; of a live source, which has no end of its own
    int passes = 1;
    std::filesystem::path folder; ///< of the pictures; empty: none are taken
    std::filesystem::path shotsFile;
    std::vector<Shot> shots; ///< by time; empty: `count` at equal distances
    int count = 6;
};

/// A replay, or runs of a live source, through the idle loop, as a user at a window would see it, with pictures taken
/// in passing.
class Playback
{
public:
    /// All of them outlive this. The bodies are bound and the data loaded.
    Playback(Session& session, ConsoleView& view, const ViewArguments& viewArguments,
             const PlaybackArguments& arguments);

    /// Sees that the shots lie within the data and that their folder is there. False after an error message.
    bool Prepare();

    /// Plays all passes, unless `interrupted` becomes other than 0, and prints what was played and made.
    void Run(const volatile std::sig_atomic_t& interrupted);

private:
    /// One pass; false when it ended before its time.
    bool PlayPass(int pass, const volatile std::sig_atomic_t& interrupted);
    void TakeDueShots();
    void Take(const Shot& shot);
    void ShowProgress(int pass);
    void WriteContactSheet();
    void PrintResult(double seconds) const;
    double CurrentTime() const;
    std::optional<TimeSpan> Span() const;
    bool Begin();
    bool GoesOn() const;
    double SecondsSinceStart() const;

    Session& session;
    ConsoleView& view;
    const ViewArguments& viewArguments;
    PlaybackArguments arguments;
    std::size_t nextShot = 0;
    std::int64_t start = 0; ///< counter of the clock
    double passStart = 0.0; ///< seconds since `start`
    std::uint64_t frames = 0;
    double played = 0.0;
    std::uint32_t lastProgress = 0;
    long shownSteps = 0;
    std::vector<osg::ref_ptr<osg::Image>> pictures;
    std::vector<std::filesystem::path> made;
};

} // namespace console

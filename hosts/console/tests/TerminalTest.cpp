#include <gtest/gtest.h>

#include <unistd.h>

#include "hosts/console/ConsoleMessages.h"
#include "hosts/console/Terminal.h"
#include "hosts/console/TerminalProgress.h"
#include "tests/support/FakeHost.h"

namespace
{

using namespace console;

/// Standard error as a pipe, which is no terminal.
struct Piped : testing::Test
{
    Piped() { EXPECT_EQ(pipe(ends), 0); }
    ~Piped() override
    {
        close(ends[0]);
        close(ends[1]);
    }

    std::string Written()
    {
        std::string text(65536, '\0');
        EXPECT_EQ(write(ends[1], "|", 1), 1); // so that there is something to read in any case
        text.resize(static_cast<std::size_t>(read(ends[0], text.data(), text.size())) - 1);
        return text;
    }

    int ends[2] = {-1, -1};
    fake::Clock clock;
};

TEST_F(Piped, MessagesTellSeverityNumberAndText)
{
    fake::Texts texts;
    texts.known[496] = L"The file %1 is no scene: %2";
    Terminal terminal(clock, ends[1]);
    ConsoleMessages messages(terminal, texts);
    EXPECT_FALSE(messages.HasErrors());
    messages.Show({.number = 496, .first = L"a.xml", .second = L"\u00e4", .severity = host::Severity::warning});
    messages.Show({.text = L"its own words"});
    messages.Show({.number = 1, .interrupts = false});
    EXPECT_FALSE(messages.HasErrors());
    const auto shown = messages.Show({.number = 77, .first = L"run.mdf", .severity = host::Severity::error});
    EXPECT_TRUE(messages.HasErrors());
    EXPECT_EQ(shown->text, L"77: run.mdf");
    messages.ShowLog(true);
    messages.Show({.number = 1, .interrupts = false});
    EXPECT_EQ(Written(), "panoramic: warning 496: The file a.xml is no scene: \xc3\xa4\n"
                         "panoramic: information: its own words\n"
                         "panoramic: error 77: 77: run.mdf\n"
                         "panoramic: log 1: 1\n");
}

TEST_F(Piped, ProgressIsPlainLinesAndDoesNotFloodALog)
{
    Terminal terminal(clock, ends[1]);
    EXPECT_FALSE(terminal.IsInteractive());
    TerminalProgress progress(terminal);
    progress.ConnectProgressActivity(41, L"Loading", L"run.mdf");
    progress.SetProgresStepCount(41, 100);
    for (int step = 0; step < 50; ++step)
    {
        clock.Advance(0.1);
        progress.StepProgressActivity(41);
    }
    const std::string written = Written();
    EXPECT_EQ(std::count(written.begin(), written.end(), '\n'), 2) << written; // at 2 and 4 s
    EXPECT_EQ(written.find('\r'), std::string::npos);
    EXPECT_NE(written.find(" 20%  Loading: run.mdf\n"), std::string::npos) << written;
    EXPECT_NE(written.find(" 40%  Loading: run.mdf\n"), std::string::npos) << written;
}

TEST_F(Piped, AnInnerActivityIsShownUntilItEnds)
{
    Terminal terminal(clock, ends[1]);
    TerminalProgress progress(terminal);
    progress.ConnectProgressActivity(32, L"outer", {});
    progress.ConnectProgressActivity(44, L"inner", {});
    clock.Advance(3.0);
    progress.SetProgressDescription(32, L"of the outer"); // isn't the one that is shown
    clock.Advance(3.0);
    progress.DisconnectProgressActivity(44);
    progress.DisconnectProgressActivity(44); // twice is once
    clock.Advance(3.0);
    progress.SetProgressDescription(32, L"goes on");
    progress.StepProgressActivity(99); // unknown
    progress.CleanUp();
    progress.SetProgresStepCount(7, 0); // opens it without a title: nothing to show
    EXPECT_EQ(Written(), "inner\nouter: of the outer\nouter: goes on\n");
}

} // namespace

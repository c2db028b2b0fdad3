#pragma once

#include <string>
#include <vector>

#include "host/Progress.h"

namespace console
{

class Terminal;

/// Progress activities in the last line of the terminal: a bar for the innermost one that is open.
class TerminalProgress : public host::Progress
{
public:
    explicit TerminalProgress(Terminal& terminal);

    void ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text) override;
    void SetProgresStepCount(long id, long count) override;
    void StepProgressActivity(long id) override;
    void SetProgressDescription(long id, const std::wstring& text) override;
    void DisconnectProgressActivity(long id) override;
    void CleanUp() override;

private:
    struct Activity
    {
        long id;
        std::string title;
        std::string text;
        long count = 0;
        long steps = 0;
    };

    Activity* Find(long id);
    void Show(bool first = false);

    Terminal& terminal;
    std::vector<Activity> activities; ///< in the order they were opened
};

} // namespace console

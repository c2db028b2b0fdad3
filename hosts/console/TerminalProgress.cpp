#include "hosts/console/TerminalProgress.h"

#include <algorithm>

#include <fmt/format.h>

#include "base/Text.h"
#include "hosts/console/Terminal.h"

namespace console
{

namespace
{

constexpr long barWidth = 24;

} // namespace

TerminalProgress::TerminalProgress(Terminal& shown) : terminal(shown) {}

void TerminalProgress::ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text)
{
    DisconnectProgressActivity(id);
    activities.push_back({id, base::Utf8(title), base::Utf8(text)});
    Show(activities.size() == 1);
}

void TerminalProgress::SetProgresStepCount(long id, long count)
{
    Activity* activity = Find(id);
    if (!activity)
        activity = &activities.emplace_back(Activity{id, {}, {}});
    activity->count = std::max(count, 0L);
    activity->steps = 0;
    Show();
}

void TerminalProgress::StepProgressActivity(long id)
{
    Activity* activity = Find(id);
    if (!activity)
        return;
    if (activity->steps < activity->count)
        ++activity->steps;
    Show();
}

void TerminalProgress::SetProgressDescription(long id, const std::wstring& text)
{
    Activity* activity = Find(id);
    if (!activity)
        return;
    activity->text = base::Utf8(text);
    Show();
}

void TerminalProgress::DisconnectProgressActivity(long id)
{
    if (std::erase_if(activities, [id](const Activity& a) { return a.id == id; }) == 0)
        return;
    if (activities.empty())
        terminal.ClearStatus();
    else
        Show();
}

void TerminalProgress::CleanUp()
{
    activities.clear();
    terminal.ClearStatus();
}

TerminalProgress::Activity* TerminalProgress::Find(long id)
{
    const auto at = std::find_if(activities.begin(), activities.end(), [id](const Activity& a) { return a.id == id; });
    return at == activities.end() ? nullptr : &*at;
}

void TerminalProgress::Show(bool first)
{
    const Activity& shown = activities.back();
    std::string line = shown.title;
    if (!shown.text.empty() && shown.text != shown.title)
        line += (line.empty() ? "" : ": ") + shown.text;
    if (shown.count > 0)
    {
        const long filled = shown.steps * barWidth / shown.count;
        line = fmt::format("[{:#<{}}{:.<{}}] {:3}%  {}", "", filled, "", barWidth - filled,
                           shown.steps * 100 / shown.count, line);
    }
    if (!line.empty())
        terminal.Status(line, first);
}

} // namespace console

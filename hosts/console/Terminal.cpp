#include "hosts/console/Terminal.h"

#include <unistd.h>

#include "host/Clock.h"

namespace console
{

namespace
{

constexpr const char* startOfLine = "\r\x1b[K";
constexpr std::size_t longestStatus = 78; // a longer one would wrap, and couldn't be drawn over

// Cut between characters, not in the middle of one.
std::string Shortened(std::string text)
{
    if (text.size() <= longestStatus)
        return text;
    std::size_t end = longestStatus;
    while (end > 0 && (static_cast<unsigned char>(text[end]) & 0xC0) == 0x80)
        --end;
    text.resize(end);
    return text;
}

} // namespace

Terminal::Terminal(const host::Clock& ticker, int descriptor)
    : clock(ticker), file(descriptor), interactive(isatty(descriptor) == 1)
{
}

Terminal::~Terminal()
{
    ClearStatus();
}

void Terminal::Line(const std::string& text)
{
    ClearStatus();
    Put(text + "\n");
}

void Terminal::Status(const std::string& text, bool first)
{
    const std::uint32_t now = clock.TickCount();
    if (first ? !interactive : now - lastTime < (interactive ? drawInterval : plainInterval))
    {
        lastTime = first ? now : lastTime;
        return;
    }
    lastTime = now;
    if (!interactive)
    {
        Put(text + "\n");
        return;
    }
    Put(startOfLine + Shortened(text));
    drawn = true;
}

void Terminal::ClearStatus()
{
    if (drawn)
        Put(startOfLine);
    drawn = false;
}

void Terminal::Put(const std::string& text)
{
    for (std::size_t at = 0; at < text.size();)
    {
        const ssize_t written = write(file, text.data() + at, text.size() - at);
        if (written <= 0)
            return; // nobody reads any more; there is nobody to tell it to
        at += static_cast<std::size_t>(written);
    }
}

} // namespace console

#pragma once

#include <cstdint>
#include <string>

namespace host
{
class Clock;
}

namespace console
{

/// Standard error as the user sees it: lines that stay, and under them one line that shows how far work has come.
///
/// On a terminal that last line is drawn over again. Elsewhere (a file, a pipe) it is written as a plain line, at most
/// one in `plainInterval`, so that a log isn't flooded and short work says nothing.
class Terminal
{
public:
    static constexpr std::uint32_t drawInterval = 50;    ///< milliseconds between two drawings of the last line
    static constexpr std::uint32_t plainInterval = 2000; ///< milliseconds between two plain lines

    /// `file` is a descriptor, not owned.
    Terminal(const host::Clock& clock, int file);
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    /// Writes a line that stays (UTF-8, without a line end).
    void Line(const std::string& text);

    /// Shows `text` in the last line, unless one was shown just before. `first`: work begins with it.
    void Status(const std::string& text, bool first = false);

    /// Takes the last line away.
    void ClearStatus();

    bool IsInteractive() const { return interactive; }

private:
    void Put(const std::string& text);

    const host::Clock& clock;
    int file;
    bool interactive;
    bool drawn = false; ///< a last line stands on the terminal
    std::uint32_t lastTime = 0;
};

} // namespace console

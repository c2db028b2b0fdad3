#include "simdata/points/CsvLines.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "base/Text.h"

namespace SimulationDataPoints
{

namespace
{

constexpr std::size_t readBytes = 1 << 20;
constexpr std::size_t maxLineBytes = 64 << 20;
constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";

std::string_view WithoutBlanks(std::string_view text)
{
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t'))
        text.remove_prefix(1);
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t'))
        text.remove_suffix(1);
    return text;
}

/// Where the field in quotes that starts at `start` ends: the place of its last quote, npos without one.
std::size_t ClosingQuote(std::string_view line, std::size_t start, bool& doubled)
{
    std::size_t at = line.find('"', start + 1);
    while (at != std::string_view::npos && at + 1 < line.size() && line[at + 1] == '"')
    {
        doubled = true;
        at = line.find('"', at + 2);
    }
    return at;
}

} // namespace

VtCCsvLines::VtCCsvLines(const std::filesystem::path& path)
{
    file = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    struct stat status = {};
    if (file < 0 || fstat(file, &status) != 0)
        error = base::Wide(std::strerror(errno));
    else if (!S_ISREG(status.st_mode))
        error = L"this is no file";
    else
        fileBytes = static_cast<std::uint64_t>(status.st_size);
}

VtCCsvLines::~VtCCsvLines()
{
    if (file >= 0)
        close(file);
}

bool VtCCsvLines::Fill()
{
    if (begin > 0)
    {
        std::copy(buffer.begin() + static_cast<std::ptrdiff_t>(begin),
                  buffer.begin() + static_cast<std::ptrdiff_t>(end), buffer.begin());
        end -= begin;
        begin = 0;
    }
    const std::size_t room = std::min<std::uint64_t>(readBytes, fileBytes + 1);
    if (buffer.size() < end + room)
        buffer.resize(end + room);
    ssize_t got = 0;
    do
        got = read(file, buffer.data() + end, room);
    while (got < 0 && errno == EINTR);
    if (got < 0)
    {
        error = base::Wide(std::strerror(errno));
        return false;
    }
    ended = got == 0;
    bytesRead += static_cast<std::uint64_t>(got);
    end += static_cast<std::size_t>(got);
    return true;
}

bool VtCCsvLines::Next(std::string_view& line)
{
    if (!error.empty())
        return false;
    std::size_t searched = begin;
    const char* feed = nullptr;
    for (;;)
    {
        if (end > searched)
            feed = static_cast<const char*>(std::memchr(buffer.data() + searched, '\n', end - searched));
        if (feed != nullptr || ended)
            break;
        const std::size_t unread = end - begin;
        if (unread > maxLineBytes)
        {
            error = L"line " + std::to_wstring(number + 1) + L" is longer than " + std::to_wstring(maxLineBytes) +
                    L" bytes";
            return false;
        }
        if (!Fill())
            return false;
        searched = unread;
    }
    if (feed == nullptr && begin == end)
        return false;

    const std::size_t stop = feed != nullptr ? static_cast<std::size_t>(feed - buffer.data()) : end;
    line = std::string_view(buffer.data() + begin, stop - begin);
    begin = feed != nullptr ? stop + 1 : end;
    if (!line.empty() && line.back() == '\r')
        line.remove_suffix(1);
    if (++number == 1 && line.starts_with(byteOrderMark))
        line.remove_prefix(byteOrderMark.size());
    return true;
}

char FindSeparator(std::string_view header)
{
    bool quoted = false;
    char separator = ',';
    for (const char c : header)
    {
        if (c == '"')
            quoted = !quoted;
        else if (!quoted && c == ';')
            return ';';
        else if (!quoted && c == '\t')
            separator = '\t';
    }
    return separator;
}

std::size_t SplitFields(std::string_view line, char separator, std::vector<std::string_view>& fields,
                        std::string& unquoted)
{
    fields.clear();
    unquoted.clear();
    unquoted.reserve(line.size()); // views into it must not move
    std::size_t at = 0;
    for (;;)
    {
        std::size_t start = at;
        while (start < line.size() && line[start] == ' ')
            ++start;
        std::size_t stop = 0;
        if (start < line.size() && line[start] == '"')
        {
            bool doubled = false;
            const std::size_t closing = ClosingQuote(line, start, doubled);
            if (closing == std::string_view::npos)
                return fields.size() + 1;
            stop = std::min(line.find(separator, closing), line.size());
            if (!WithoutBlanks(line.substr(closing + 1, stop - closing - 1)).empty())
                return fields.size() + 1;
            std::string_view field = line.substr(start + 1, closing - start - 1);
            if (doubled)
            {
                const std::size_t from = unquoted.size();
                for (std::size_t i = 0; i < field.size(); i += field[i] == '"' ? 2 : 1)
                    unquoted += field[i];
                field = std::string_view(unquoted).substr(from);
            }
            fields.push_back(field);
        }
        else
        {
            stop = std::min(line.find(separator, at), line.size());
            fields.push_back(WithoutBlanks(line.substr(at, stop - at)));
        }
        if (stop >= line.size())
            return 0;
        at = stop + 1;
    }
}

std::string QuoteField(const std::string& text)
{
    const bool outerBlank = !text.empty() && (text.front() == ' ' || text.back() == ' ');
    if (!outerBlank && text.find_first_of("\",;\t") == std::string::npos)
        return text;
    std::string quoted = "\"";
    for (const char c : text)
        quoted.append(c == '"' ? "\"\"" : std::string(1, c));
    return quoted + '"';
}

} // namespace SimulationDataPoints

#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace SimulationDataPoints
{

/// Reads a text file line by line, without its line ends and its byte order mark.
class VtCCsvLines
{
public:
    explicit VtCCsvLines(const std::filesystem::path& path);
    ~VtCCsvLines();
    VtCCsvLines(const VtCCsvLines&) = delete;
    VtCCsvLines& operator=(const VtCCsvLines&) = delete;

    /// The next line, valid until the next call. False at the end and after an error.
    bool Next(std::string_view& line);

    /// Of the line that `Next` gave, from 1.
    std::uint64_t GetNumber() const { return number; }

    std::uint64_t GetBytesRead() const { return bytesRead; }
    std::uint64_t GetFileBytes() const { return fileBytes; }

    /// Why reading ended early, without the path; empty otherwise.
    const std::wstring& GetError() const { return error; }

private:
    bool Fill();

    int file = -1;
    std::uint64_t fileBytes = 0;
    std::uint64_t bytesRead = 0;
    std::uint64_t number = 0;
    std::vector<char> buffer;
    std::size_t begin = 0; ///< of what is still unread in `buffer`
    std::size_t end = 0;
    bool ended = false;
    std::wstring error;
};

/// The separator of a table with that first line: a semicolon or else a tab that stands outside of quotes, else a
/// comma.
char FindSeparator(std::string_view header);

/// Splits a line into `fields`, which view `line` or, where quotes were doubled inside, `unquoted`. Blanks around a
/// field without quotes are taken off. Returns 0, or the number (from 1) of the field whose quotes are wrong.
std::size_t SplitFields(std::string_view line, char separator, std::vector<std::string_view>& fields,
                        std::string& unquoted);

/// `text` in quotes where a table needs them.
std::string QuoteField(const std::string& text);

} // namespace SimulationDataPoints

#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace host
{

/// What a file dialog is asked for.
struct FileQuestion
{
    std::wstring title;
    std::wstring filter;           ///< "Motion Data file (*.mdf)|*.mdf||"
    std::wstring defaultExtension; ///< "mdf", appended to a name without one
    std::wstring initialName;
};

/// Which body takes the place of one that observers ride on and that the scene doesn't hold.
struct ReplacementQuestion
{
    std::wstring missing;
    std::vector<std::wstring> observers;  ///< names of those that ride on it
    std::vector<std::wstring> candidates; ///< names of the bodies there are
};

/// Questions to the user. Nothing as an answer means that the user declined, or that nobody is there to ask.
class Questions
{
public:
    virtual ~Questions() = default;

    /// A path to write to, in the inner form.
    virtual std::optional<std::wstring> AskSaveFile(const FileQuestion& question) = 0;

    /// A path of a file that exists, in the inner form.
    virtual std::optional<std::wstring> AskOpenFile(const FileQuestion& question) = 0;

    /// An index into the candidates.
    virtual std::optional<std::size_t> AskReplacement(const ReplacementQuestion& question) = 0;
};

} // namespace host

#pragma once

#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace hosts
{

/// A file of named values in sections, in UTF-8:
///
///     ; a comment
///     [Section]
///     Key = value
///
/// Names compare without regard to case. Saving keeps the order and the comments that stood there.
class IniFile
{
public:
    using Entries = std::vector<std::pair<std::string, std::string>>;

    /// A file that isn't there counts as an empty one. One that can't be read, or isn't a file of this form, gives an
    /// empty one too, with the reason in `Error`; it is not overwritten by `Save`.
    explicit IniFile(std::filesystem::path path);
    ~IniFile();
    IniFile(IniFile&&) noexcept;

    /// "settings.ini, line 3: neither a section nor a value", or empty.
    const std::string& Error() const { return error; }
    const std::filesystem::path& Path() const { return path; }

    std::optional<std::string> Find(const std::string& section, const std::string& key) const;

    /// All values of a section, in the order of the file; nothing without such a section.
    std::optional<Entries> FindSection(const std::string& section) const;

    void Set(const std::string& section, const std::string& key, const std::string& value);
    void Remove(const std::string& section, const std::string& key);

    /// Writes the whole file, with its folder if need be. Empty on success, else the reason with the path.
    std::string Save() const;

private:
    struct Content;

    std::filesystem::path path;
    std::string error;
    std::unique_ptr<Content> content;
};

} // namespace hosts

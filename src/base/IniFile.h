#pragma once

#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace base
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

    /// What becomes of a line that is neither a section, nor a value, nor a comment.
    enum class Faults
    {
        told,   ///< the file isn't taken, for a user has slipped in writing it
        skipped ///< the line is passed over, as older files want it
    };

    /// A file that isn't there counts as an empty one. One that can't be read, or isn't a file of this form, gives an
    /// empty one too, with the reason in `Error`; it is not overwritten by `Save`.
    explicit IniFile(std::filesystem::path path, Faults faults = Faults::told);
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

} // namespace base

/// Sectioned text of keys and values, as older settings and the default observers are kept, to one who only reads.
class VtISettingsReader
{
public:
    static constexpr int found = 0;
    static constexpr int missing = 1; ///< the section or the key isn't there; negative: the file can't be read

    virtual ~VtISettingsReader() = default;

    /// `value` changes only when the key is found.
    virtual int ReadText(const std::wstring& section, const std::wstring& key, std::wstring& value) const = 0;
};

class VtISettingsWriter
{
public:
    virtual ~VtISettingsWriter() = default;

    /// 0, or a negative value when it can't be written.
    virtual int WriteText(const std::wstring& section, const std::wstring& key, const std::wstring& value) = 0;
};

/// The settings in the file, read whole; null when it doesn't exist or can't be read.
std::unique_ptr<VtISettingsReader> OpenSettings(const std::filesystem::path& path);

#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <string_view>

namespace base
{

/// A file that appears under its name whole or not at all.
///
/// What is written goes to a temporary file in the same folder; `Commit` flushes it to the disk and renames it. Without
/// a commit (an error, an early return) the temporary file is removed and an older file of that name stays untouched.
/// The first failure is kept and everything after it does nothing.
///
/// A link is followed: the file that it leads to is replaced, with the rights it had. What is no ordinary file (a
/// device, a pipe, "/dev/stdout") can't be replaced; it gets the bytes at `Commit`. A folder is an error, and so is an
/// older file that may not be written.
class AtomicFile
{
public:
    explicit AtomicFile(std::filesystem::path path);
    ~AtomicFile();
    AtomicFile(const AtomicFile&) = delete;
    AtomicFile& operator=(const AtomicFile&) = delete;

    bool Write(const void* data, std::size_t size);
    bool Write(std::string_view text) { return Write(text.data(), text.size()); }

    /// Overwrites bytes written before, for a header that counts what follows it.
    bool WriteAt(std::size_t offset, const void* data, std::size_t size);

    bool Commit();

    /// "out/run.mdf: No space left on device", or empty while all went well.
    const std::string& Error() const { return error; }

private:
    bool Fail(const std::string& reason);
    bool FailBySystem();
    void OpenSpecial(const std::filesystem::path& target);
    void OpenTemporary();

    std::filesystem::path path;   ///< as given, for messages
    std::filesystem::path target; ///< behind all links
    bool isSpecial = false;
    std::string pending; ///< for a special file, which takes no corrections
    std::filesystem::path temporary;
    int file = -1;
    std::string error;
};

/// Whether `path` leads to something that can't be replaced by a file: a device, a pipe, a standard stream.
bool IsSpecialFile(const std::filesystem::path& path);

/// Whether both are one file, by whatever links and names; false when one of them isn't there.
bool IsSameFile(const std::filesystem::path& a, const std::filesystem::path& b);

/// Writes `content` as the whole of `path`. Empty on success, else the reason with the path.
std::string WriteWholeFile(const std::filesystem::path& path, std::string_view content);

/// Removes the temporary files that writers of `path` have left behind when they were killed. One that is still being
/// written stays.
void RemoveAbandoned(const std::filesystem::path& path);

} // namespace base

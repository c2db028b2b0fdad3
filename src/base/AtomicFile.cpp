#include "base/AtomicFile.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <optional>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "base/Numbers.h"

namespace base
{

namespace
{

// Between the name and the random letters: no backup that a user made is taken for a temporary file.
constexpr std::string_view temporaryMark = ".writing-";

// mkstemp() makes files that only the owner reads; a picture or a run should have the rights that any new file has.
mode_t UsualRights()
{
    const mode_t mask = umask(0);
    umask(mask);
    return 0666 & ~mask;
}

/// One of the open files of this process: "/proc/self/fd/1", where "/dev/stdout" leads to.
bool IsStream(const std::filesystem::path& path)
{
    const std::string folder = path.parent_path().string();
    return (folder == "/proc/self/fd" || folder == "/dev/fd") && ParseInteger(path.filename().string());
}

/// Where `path` leads to in the end, whether there is a file or not; nothing for links that lead in a circle.
std::optional<std::filesystem::path> BehindLinks(std::filesystem::path path)
{
    constexpr int most = 40; // as many as the system follows
    for (int i = 0; i < most; ++i)
    {
        std::error_code failed;
        if (IsStream(path) || !std::filesystem::is_symlink(path, failed))
            return path;
        const std::filesystem::path next = std::filesystem::read_symlink(path, failed);
        if (failed)
            return path;
        path = path.parent_path() / next; // an absolute one takes the place of the whole
    }
    return std::nullopt;
}

} // namespace

bool IsSpecialFile(const std::filesystem::path& path)
{
    std::error_code failed;
    const auto status = std::filesystem::status(path, failed);
    const std::optional<std::filesystem::path> end = BehindLinks(path);
    return (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status) &&
            !std::filesystem::is_directory(status)) ||
           (end && IsStream(*end));
}

bool IsSameFile(const std::filesystem::path& a, const std::filesystem::path& b)
{
    std::error_code failed;
    return std::filesystem::equivalent(a, b, failed) && !failed;
}

AtomicFile::AtomicFile(std::filesystem::path given) : path(std::move(given))
{
    const std::optional<std::filesystem::path> end = BehindLinks(path);
    struct stat status = {};
    const bool exists = ::stat(path.c_str(), &status) == 0;
    if (!end)
        Fail(std::strerror(ELOOP));
    else if (exists && S_ISDIR(status.st_mode))
        Fail("it is a folder");
    else if ((exists && !S_ISREG(status.st_mode)) || IsStream(*end))
        OpenSpecial(IsStream(*end) ? *end : path);
    else if (exists && access(path.c_str(), W_OK) != 0)
        FailBySystem();
    else
    {
        target = *end;
        OpenTemporary();
        if (file >= 0 && exists) // by name it stays the file it was
        {
            [[maybe_unused]] const int kept = fchown(file, status.st_uid, status.st_gid);
            fchmod(file, status.st_mode & 0777);
        }
    }
}

void AtomicFile::OpenSpecial(const std::filesystem::path& special)
{
    isSpecial = true;
    const std::string name = special.filename().string();
    // A stream of this process keeps its place and its manner, which opening it by name would not.
    const auto number = IsStream(special) ? ParseInteger(name) : std::nullopt;
    file = number ? dup(static_cast<int>(*number)) : open(special.c_str(), O_WRONLY | O_NOCTTY | O_CLOEXEC);
    if (file < 0)
        FailBySystem();
}

void AtomicFile::OpenTemporary()
{
    std::string name = target.string() + std::string(temporaryMark) + "XXXXXX";
    file = mkstemp(name.data());
    if (file < 0)
    {
        FailBySystem();
        return;
    }
    temporary = name;
    fchmod(file, UsualRights());
    flock(file, LOCK_EX | LOCK_NB); // tells `RemoveAbandoned` that somebody writes; a killed process loses it
}

AtomicFile::~AtomicFile()
{
    if (file >= 0)
        close(file);
    if (!temporary.empty())
        unlink(temporary.c_str());
}

bool AtomicFile::Fail(const std::string& reason)
{
    if (error.empty())
        error = path.string() + ": " + reason;
    return false;
}

bool AtomicFile::FailBySystem()
{
    return Fail(std::strerror(errno));
}

bool AtomicFile::Write(const void* data, std::size_t size)
{
    if (!error.empty())
        return false;
    const char* rest = static_cast<const char*>(data);
    if (isSpecial)
    {
        pending.append(rest, size);
        return true;
    }
    while (size > 0)
    {
        const ssize_t written = write(file, rest, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return FailBySystem();
        rest += written;
        size -= static_cast<std::size_t>(written);
    }
    return true;
}

bool AtomicFile::WriteAt(std::size_t offset, const void* data, std::size_t size)
{
    if (!error.empty())
        return false;
    if (isSpecial)
    {
        pending.replace(offset, size, static_cast<const char*>(data), size);
        return true;
    }
    if (lseek(file, static_cast<off_t>(offset), SEEK_SET) < 0)
        return FailBySystem();
    return Write(data, size) && (lseek(file, 0, SEEK_END) >= 0 || FailBySystem());
}

bool AtomicFile::Commit()
{
    if (!error.empty())
        return false;
    if (isSpecial)
    {
        isSpecial = false;
        const bool written = Write(pending);
        const int done = close(std::exchange(file, -1));
        return written && (done == 0 || FailBySystem());
    }
    if (fsync(file) != 0)
        return FailBySystem();
    if (rename(temporary.c_str(), target.c_str()) != 0) // still locked, so nobody takes it for abandoned
        return FailBySystem();
    temporary.clear();
    const int closed = close(file);
    file = -1;
    return closed == 0 || FailBySystem();
}

void RemoveAbandoned(const std::filesystem::path& path)
{
    const std::filesystem::path target = BehindLinks(path).value_or(path);
    const std::string start = target.filename().string() + std::string(temporaryMark);
    const std::filesystem::path folder = target.has_parent_path() ? target.parent_path() : ".";
    std::error_code failed;
    for (std::filesystem::directory_iterator at(folder, failed), end; !failed && at != end; at.increment(failed))
    {
        const std::string name = at->path().filename().string();
        if (!name.starts_with(start) || name.size() != start.size() + 6)
            continue;
        const int left = open(at->path().c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
        if (left < 0)
            continue;
        if (flock(left, LOCK_EX | LOCK_NB) == 0)
            unlink(at->path().c_str());
        close(left);
    }
}

std::string WriteWholeFile(const std::filesystem::path& path, std::string_view content)
{
    AtomicFile file(path);
    file.Write(content);
    file.Commit();
    return file.Error();
}

} // namespace base

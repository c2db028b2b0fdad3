#include "base/AtomicFile.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

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

} // namespace

AtomicFile::AtomicFile(std::filesystem::path target) : path(std::move(target))
{
    std::string name = path.string() + std::string(temporaryMark) + "XXXXXX";
    file = mkstemp(name.data());
    if (file < 0)
    {
        Fail("");
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

bool AtomicFile::Fail(const char* what)
{
    if (error.empty())
        error = path.string() + ": " + what + std::strerror(errno);
    return false;
}

bool AtomicFile::Write(const void* data, std::size_t size)
{
    if (!error.empty())
        return false;
    const char* rest = static_cast<const char*>(data);
    while (size > 0)
    {
        const ssize_t written = write(file, rest, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return Fail("");
        rest += written;
        size -= static_cast<std::size_t>(written);
    }
    return true;
}

bool AtomicFile::WriteAt(std::size_t offset, const void* data, std::size_t size)
{
    if (!error.empty())
        return false;
    if (lseek(file, static_cast<off_t>(offset), SEEK_SET) < 0)
        return Fail("");
    return Write(data, size) && (lseek(file, 0, SEEK_END) >= 0 || Fail(""));
}

bool AtomicFile::Commit()
{
    if (!error.empty())
        return false;
    if (fsync(file) != 0)
        return Fail("");
    if (rename(temporary.c_str(), path.c_str()) != 0) // still locked, so nobody takes it for abandoned
        return Fail("");
    temporary.clear();
    const int closed = close(file);
    file = -1;
    return closed == 0 || Fail("");
}

void RemoveAbandoned(const std::filesystem::path& path)
{
    const std::string start = path.filename().string() + std::string(temporaryMark);
    const std::filesystem::path folder = path.has_parent_path() ? path.parent_path() : ".";
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

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <functional>
#include <sched.h>
#include <string>
#include <sys/mman.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include "modelreader/Confinement.h"

namespace
{

constexpr int succeeded = 100; ///< no errno is this one on its own
constexpr int lacksRules = 101;

/// What a process gets that gives up its rights, but for reading below `readable`, and then tries `deed` (true when it
/// was done): `succeeded`, or the errno.
int TryConfined(const std::string& readable, bool needsRules, const std::function<bool()>& deed)
{
    const pid_t child = ::fork();
    if (child == 0)
    {
        const std::vector<std::string> lacking = Confine({readable});
        if (needsRules && !lacking.empty())
            ::_exit(lacksRules);
        errno = 0;
        ::_exit(deed() ? succeeded : errno);
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
}

bool CanOpen(const std::string& path, int how)
{
    return ::open(path.c_str(), how | O_CLOEXEC, 0600) >= 0;
}

} // namespace

TEST(Confinement, AParserThatIsTakenOverCanDoNothing)
{
    char name[] = "/tmp/panoramic-confinement-XXXXXX";
    ASSERT_TRUE(::mkdtemp(name));
    const std::string folder = name;
    const std::string inside = folder + "/inside";
    const std::string link = folder + "/link";
    ASSERT_EQ(::symlink("/etc/passwd", link.c_str()), 0);
    ASSERT_EQ(::close(::open(inside.c_str(), O_CREAT | O_WRONLY, 0600)), 0);

    struct Case
    {
        const char* name;
        std::function<bool()> deed;
        int outcome;
        bool needsRules = false; ///< for files by path, which older kernels don't have
    };
    const Case cases[] = {
        {"read below the folder", [&] { return CanOpen(inside, O_RDONLY); }, succeeded},
        {"memory",
         [] { return ::mmap(nullptr, 4096, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0) != MAP_FAILED; },
         succeeded},
        {"read elsewhere", [] { return CanOpen("/etc/passwd", O_RDONLY); }, EACCES, true},
        {"read elsewhere by a link", [&] { return CanOpen(link, O_RDONLY); }, EACCES, true},
        {"read elsewhere by the way up", [&] { return CanOpen(folder + "/../../etc/passwd", O_RDONLY); }, EACCES, true},
        {"start a program", [] { return ::execl("/bin/true", "true", nullptr) == 0; }, EPERM},
        {"start a process",
         []
         {
             const pid_t child = ::fork();
             if (child == 0)
                 ::_exit(0);
             return child > 0;
         },
         EPERM},
        {"open a socket", [] { return ::socket(AF_INET, SOCK_STREAM, 0) >= 0; }, EPERM},
        {"open a local socket", [] { return ::socket(AF_UNIX, SOCK_STREAM, 0) >= 0; }, EPERM},
        {"write over a file", [&] { return CanOpen(inside, O_WRONLY); }, EPERM},
        {"read and write a file", [&] { return CanOpen(inside, O_RDWR); }, EPERM},
        {"make a file", [&] { return CanOpen(folder + "/new", O_CREAT); }, EPERM},
        {"empty a file", [&] { return CanOpen(inside, O_TRUNC); }, EPERM},
        {"remove a file", [&] { return ::unlink(inside.c_str()) == 0; }, EPERM},
        {"rename a file", [&] { return ::rename(inside.c_str(), (inside + "2").c_str()) == 0; }, EPERM},
        {"make a link", [&] { return ::symlink("a", (folder + "/b").c_str()) == 0; }, EPERM},
        {"make code of memory",
         [] { return ::mmap(nullptr, 4096, PROT_READ | PROT_EXEC, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0) != MAP_FAILED; },
         EPERM},
        {"signal the parent", [] { return ::kill(::getppid(), 0) == 0; }, EPERM},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        const int outcome = TryConfined(folder, c.needsRules, c.deed);
        if (outcome == lacksRules)
            std::printf("not tried, for this kernel has no Landlock: %s\n", c.name);
        else
            EXPECT_EQ(outcome, c.outcome) << std::strerror(outcome);
    }
    ::unlink(inside.c_str());
    ::unlink(link.c_str());
    ::rmdir(folder.c_str());
}

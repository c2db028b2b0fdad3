#include "Confinement.h"

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fcntl.h>
#include <linux/landlock.h>
#include <seccomp.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace
{

// Newer than the headers that this is built with; the kernel says by its version which of them it knows.
constexpr std::uint64_t accessRefer = 1ULL << 13;    ///< from version 2
constexpr std::uint64_t accessTruncate = 1ULL << 14; ///< from version 3
constexpr std::uint64_t accessIoctl = 1ULL << 15;    ///< from version 5
constexpr std::uint64_t accessFirst = (1ULL << 13) - 1;
constexpr std::uint64_t accessRead = LANDLOCK_ACCESS_FS_READ_FILE | LANDLOCK_ACCESS_FS_READ_DIR;

/// Files by path: everything is forbidden but reading below `readable`.
std::string ConfineFiles(const std::vector<std::string>& readable)
{
    const long version = ::syscall(SYS_landlock_create_ruleset, nullptr, 0, LANDLOCK_CREATE_RULESET_VERSION);
    if (version < 1)
        return std::string("the kernel can't keep it from reading files elsewhere (") + std::strerror(errno) + ")";
    landlock_ruleset_attr all = {};
    all.handled_access_fs = accessFirst | (version >= 2 ? accessRefer : 0) | (version >= 3 ? accessTruncate : 0) |
                            (version >= 5 ? accessIoctl : 0);
    const int rules = static_cast<int>(::syscall(SYS_landlock_create_ruleset, &all, sizeof all.handled_access_fs, 0));
    if (rules < 0)
        return std::string("the kernel refuses rules for files (") + std::strerror(errno) + ")";
    for (const std::string& folder : readable)
    {
        const int file = ::open(folder.c_str(), O_PATH | O_CLOEXEC | O_DIRECTORY);
        if (file < 0)
            continue;
        landlock_path_beneath_attr below = {};
        below.allowed_access = accessRead;
        below.parent_fd = file;
        ::syscall(SYS_landlock_add_rule, rules, LANDLOCK_RULE_PATH_BENEATH, &below, 0);
        ::close(file);
    }
    const long failed = ::syscall(SYS_landlock_restrict_self, rules, 0);
    ::close(rules);
    return failed == 0 ? "" : std::string("the kernel refuses rules for files (") + std::strerror(errno) + ")";
}

/// What parsers ask the kernel for. Whatever isn't here fails with EPERM: it is refused, not fatal, for the libraries
/// also try things that they can do without.
constexpr int allowedCalls[] = {
    SCMP_SYS(read),
    SCMP_SYS(readv),
    SCMP_SYS(pread64),
    SCMP_SYS(write),
    SCMP_SYS(writev),
    SCMP_SYS(lseek),
    SCMP_SYS(close),
    SCMP_SYS(stat),
    SCMP_SYS(fstat),
    SCMP_SYS(lstat),
    SCMP_SYS(newfstatat),
    SCMP_SYS(statx),
    SCMP_SYS(statfs),
    SCMP_SYS(fstatfs),
    SCMP_SYS(access),
    SCMP_SYS(faccessat),
    SCMP_SYS(faccessat2),
    SCMP_SYS(readlink),
    SCMP_SYS(readlinkat),
    SCMP_SYS(getdents64),
    SCMP_SYS(getcwd),
    SCMP_SYS(chdir),
    SCMP_SYS(dup),
    SCMP_SYS(fadvise64),
    SCMP_SYS(munmap),
    SCMP_SYS(mremap),
    SCMP_SYS(madvise),
    SCMP_SYS(brk),
    SCMP_SYS(futex),
    SCMP_SYS(sched_yield),
    SCMP_SYS(rt_sigaction),
    SCMP_SYS(rt_sigprocmask),
    SCMP_SYS(rt_sigreturn),
    SCMP_SYS(sigaltstack),
    SCMP_SYS(getpid),
    SCMP_SYS(gettid),
    SCMP_SYS(getuid),
    SCMP_SYS(geteuid),
    SCMP_SYS(getgid),
    SCMP_SYS(getegid),
    SCMP_SYS(exit),
    SCMP_SYS(exit_group),
    SCMP_SYS(restart_syscall),
    SCMP_SYS(clock_gettime),
    SCMP_SYS(clock_getres),
    SCMP_SYS(gettimeofday),
    SCMP_SYS(time),
    SCMP_SYS(nanosleep),
    SCMP_SYS(clock_nanosleep),
    SCMP_SYS(getrandom),
    SCMP_SYS(uname),
    SCMP_SYS(sysinfo),
    SCMP_SYS(getrusage),
    SCMP_SYS(getrlimit),
    SCMP_SYS(sched_getaffinity),
    SCMP_SYS(rseq),
};

/// Files opened for reading only, memory that is no code, and signals to nobody else.
void AllowWithLimits(scmp_filter_ctx filter)
{
    constexpr std::uint64_t writing = O_ACCMODE | O_CREAT | O_TRUNC | O_APPEND | (O_TMPFILE & ~O_DIRECTORY);
    const auto self = static_cast<std::uint64_t>(::getpid());
    const auto allow = [&](int call, scmp_arg_cmp condition)
    { seccomp_rule_add_array(filter, SCMP_ACT_ALLOW, call, 1, &condition); };
    allow(SCMP_SYS(open), SCMP_A1(SCMP_CMP_MASKED_EQ, writing, O_RDONLY));
    allow(SCMP_SYS(openat), SCMP_A2(SCMP_CMP_MASKED_EQ, writing, O_RDONLY));
    allow(SCMP_SYS(mmap), SCMP_A2(SCMP_CMP_MASKED_EQ, PROT_EXEC, 0));
    allow(SCMP_SYS(mprotect), SCMP_A2(SCMP_CMP_MASKED_EQ, PROT_EXEC, 0));
    allow(SCMP_SYS(tgkill), SCMP_A0(SCMP_CMP_EQ, self)); // abort()
    allow(SCMP_SYS(kill), SCMP_A0(SCMP_CMP_EQ, self));
    allow(SCMP_SYS(prlimit64), SCMP_A2(SCMP_CMP_EQ, 0)); // asks, sets nothing
    allow(SCMP_SYS(fcntl), SCMP_A1(SCMP_CMP_EQ, F_GETFL));
    allow(SCMP_SYS(fcntl), SCMP_A1(SCMP_CMP_EQ, F_GETFD));
    allow(SCMP_SYS(fcntl), SCMP_A1(SCMP_CMP_EQ, F_SETFD));
    allow(SCMP_SYS(ioctl), SCMP_A1(SCMP_CMP_EQ, TCGETS)); // "is it a terminal?", of every printf
}

std::string ConfineCalls()
{
    scmp_filter_ctx filter = seccomp_init(SCMP_ACT_ERRNO(EPERM));
    if (!filter)
        return "no filter of system calls can be made";
    for (const int call : allowedCalls)
        seccomp_rule_add(filter, SCMP_ACT_ALLOW, call, 0);
    AllowWithLimits(filter);
    const int failed = seccomp_load(filter);
    seccomp_release(filter);
    return failed == 0 ? ""
                       : std::string("the kernel takes no filter of system calls (") + std::strerror(-failed) + ")";
}

} // namespace

std::vector<std::string> Confine(const std::vector<std::string>& readable)
{
    std::vector<std::string> lacking;
    ::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0);
    for (std::string& missing : std::vector<std::string>{ConfineFiles(readable), ConfineCalls()})
        if (!missing.empty())
            lacking.push_back(std::move(missing));
    return lacking;
}

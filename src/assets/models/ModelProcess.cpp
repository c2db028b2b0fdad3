#include "assets/models/ModelProcess.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <poll.h>
#include <spawn.h>
#include <string_view>
#include <sys/wait.h>
#include <unistd.h>

#include "base/Numbers.h"
#include "base/Text.h"

extern char** environ;

namespace
{

using Clock = std::chrono::steady_clock;

/// More than any model of sense; a process that writes for ever ends here.
constexpr std::size_t maxOutput = std::size_t{3} << 30;
constexpr std::size_t maxMessages = 64 * 1024;
constexpr int pipeBytes = 1 << 20;

/// The reading end of a pipe from the process.
class Pipe
{
public:
    Pipe() = default;
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;
    ~Pipe() { Close(); }

    /// The end for the process, to be closed once it runs; -1 when there are no pipes to be had.
    int Open()
    {
        int ends[2];
        if (::pipe2(ends, O_CLOEXEC) != 0)
            return -1;
        ::fcntl(ends[0], F_SETFL, O_NONBLOCK);
        ::fcntl(ends[0], F_SETPIPE_SZ, pipeBytes); // a wish: the default only costs more turns
        end = ends[0];
        return ends[1];
    }

    /// Takes what has come, up to `limit` bytes in all; false once `text` would grow beyond it.
    bool Take(std::string& text, std::size_t limit)
    {
        static thread_local std::vector<char> buffer(pipeBytes);
        for (;;)
        {
            const ssize_t got = ::read(end, buffer.data(), buffer.size());
            if (got < 0 && errno == EINTR)
                continue;
            if (got < 0 && errno == EAGAIN)
                return true;
            if (got <= 0)
            {
                Close();
                return true;
            }
            if (text.size() + static_cast<std::size_t>(got) > limit)
                return false;
            text.append(buffer.data(), static_cast<std::size_t>(got));
        }
    }

    void Close()
    {
        if (end >= 0)
            ::close(end);
        end = -1;
    }

    int End() const { return end; }

private:
    int end = -1;
};

std::string SignalName(int number)
{
    const char* name = ::sigabbrev_np(number);
    return name ? std::string("SIG") + name : "signal " + std::to_string(number);
}

class Job
{
public:
    Job(const std::filesystem::path& program, std::vector<std::string> arguments, const ModelLimits& modelLimits)
        : limits(modelLimits),
          deadline(Clock::now() +
                   std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(modelLimits.seconds)))
    {
        arguments.insert(arguments.begin(), program.string());
        arguments.push_back("limitSeconds=" + base::FormatDouble(limits.seconds));
        arguments.push_back("limitMegabytes=" + std::to_string(limits.megabytes));
        Start(arguments);
    }

    ~Job()
    {
        if (process > 0)
        {
            ::kill(process, SIGKILL);
            ::waitpid(process, nullptr, 0);
        }
    }

    bool IsDone() const { return process <= 0; }
    int OutputEnd() const { return output.End(); }
    int MessagesEnd() const { return messages.End(); }

    int MillisecondsLeft() const
    {
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now()).count();
        return static_cast<int>(std::clamp<long>(left, 0, 1000000));
    }

    /// Takes what the process wrote, and its end.
    void Step()
    {
        if (OutputEnd() >= 0 && !output.Take(result.output, maxOutput))
            Kill("it grows beyond every measure");
        // A flood of complaints must not block the process; what is over the limit just isn't kept.
        if (std::string more; MessagesEnd() >= 0 && messages.Take(more, 16 * maxMessages))
            text.append(more, 0, maxMessages - std::min(maxMessages, text.size()));
        if (process > 0 && MillisecondsLeft() == 0)
            Kill("it could not be read within " + base::FormatDouble(limits.seconds) + " s");

        int status = 0;
        if (process > 0 && OutputEnd() < 0 && ::waitpid(process, &status, WNOHANG) != 0)
            End(status);
    }

    ModelProcessResult Result() { return std::move(result); }

private:
    void Start(const std::vector<std::string>& arguments)
    {
        const int outputEnd = output.Open();
        const int messagesEnd = messages.Open();
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_adddup2(&actions, outputEnd, STDOUT_FILENO);
        posix_spawn_file_actions_adddup2(&actions, messagesEnd, STDERR_FILENO);

        std::vector<char*> argv;
        for (const std::string& argument : arguments)
            argv.push_back(const_cast<char*>(argument.c_str()));
        argv.push_back(nullptr);

        const int error = outputEnd < 0 || messagesEnd < 0
                              ? errno
                              : ::posix_spawn(&process, argv[0], &actions, nullptr, argv.data(), environ);
        posix_spawn_file_actions_destroy(&actions);
        for (const int end : {outputEnd, messagesEnd})
            if (end >= 0)
                ::close(end);
        if (error == 0)
            return;
        process = -1;
        result.failure = "the program " + arguments[0] + " that reads models does not start: " + std::strerror(error);
    }

    void Kill(const std::string& why)
    {
        result.failure = why;
        ::kill(process, SIGKILL);
        ::waitpid(process, nullptr, 0);
        process = -1;
    }

    void End(int status)
    {
        process = -1;
        if (WIFSIGNALED(status) && WTERMSIG(status) == SIGXCPU)
            result.failure = "it could not be read within " + base::FormatDouble(limits.seconds) + " s";
        else if (WIFSIGNALED(status))
            result.failure = "its content broke the reader (" + SignalName(WTERMSIG(status)) + ")";
        else if (WEXITSTATUS(status) != 0)
            result.failure = LastLine();
    }

    /// What a process that gave up said last.
    std::string LastLine() const
    {
        const std::string_view all = base::Trim(text);
        const std::size_t at = all.rfind('\n');
        const std::string_view last = at == std::string_view::npos ? all : all.substr(at + 1);
        return last.empty() ? "its reader gave up without a word" : std::string(last);
    }

    ModelLimits limits;
    Clock::time_point deadline;
    pid_t process = -1;
    Pipe output;
    Pipe messages;
    std::string text;
    ModelProcessResult result;
};

/// Sleeps until one of the jobs has something to say, or its time is over.
void Wait(const std::vector<std::unique_ptr<Job>>& jobs)
{
    std::vector<pollfd> ends;
    int milliseconds = 1000;
    for (const auto& job : jobs)
    {
        if (!job || job->IsDone())
            continue;
        milliseconds = std::min(milliseconds, job->MillisecondsLeft());
        if (job->OutputEnd() >= 0)
            ends.push_back({job->OutputEnd(), POLLIN, 0});
        else
            milliseconds = std::min(milliseconds, 1); // it has closed its output and is about to end
        if (job->MessagesEnd() >= 0)
            ends.push_back({job->MessagesEnd(), POLLIN, 0});
    }
    ::poll(ends.data(), ends.size(), std::max(milliseconds, 1));
}

} // namespace

std::vector<ModelProcessResult> RunModelProcesses(const std::filesystem::path& program,
                                                  const std::vector<std::vector<std::string>>& arguments,
                                                  const ModelLimits& limits, unsigned parallel)
{
    std::vector<std::unique_ptr<Job>> jobs(arguments.size());
    std::vector<ModelProcessResult> results(arguments.size());
    std::size_t started = 0;
    std::size_t running = 0;
    while (running > 0 || started < jobs.size())
    {
        for (; running < std::max(1u, parallel) && started < jobs.size(); ++started, ++running)
            jobs[started] = std::make_unique<Job>(program, arguments[started], limits);
        Wait(jobs);
        for (std::size_t i = 0; i < started; ++i)
        {
            if (!jobs[i])
                continue;
            jobs[i]->Step();
            if (!jobs[i]->IsDone())
                continue;
            results[i] = jobs[i]->Result();
            jobs[i].reset();
            --running;
        }
    }
    return results;
}

#include <algorithm>
#include <cmath>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <new>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <unistd.h>

#include <osg/Notify>

#include "ReadModel.h"

/// Reads one model file and writes it as a package to standard output, for the program that started it.
///
///     panoramic-model-reader PATH [KEY=VALUE ...]     a package
///     panoramic-model-reader --report PATH [...]      what there is to say of the model, as text
///
/// Parsers of old formats break down on damaged files; in here that harms nobody. So this program limits what it may
/// take and do (Confinement.h), leaves no core behind, and goes when its parent goes.

namespace
{

void SetLimit(decltype(RLIMIT_CORE) what, double value)
{
    const auto number = static_cast<rlim_t>(value);
    const rlimit limit = {number, number};
    ::setrlimit(what, &limit);
}

void SetLimits(const ModelRequest& request)
{
    SetLimit(RLIMIT_CORE, 0);
    SetLimit(RLIMIT_CPU, std::ceil(request.Number("limitSeconds").value_or(60)) + 1);
#if !defined(__SANITIZE_ADDRESS__) // its shadow memory alone would be over any limit
    SetLimit(RLIMIT_AS, request.Number("limitMegabytes").value_or(4096) * 1024 * 1024);
#endif
}

bool WriteAll(int file, const std::string& bytes)
{
    for (std::size_t at = 0; at < bytes.size();)
    {
        const ssize_t wrote = ::write(file, bytes.data() + at, bytes.size() - at);
        if (wrote <= 0)
            return false;
        at += static_cast<std::size_t>(wrote);
    }
    return true;
}

bool PrintReport(const std::string& package)
{
    const ModelReport report = UnpackModel(package).report;
    if (!report.error.empty())
        std::printf("not readable: %s\n", report.error.c_str());
    else
        std::printf("%lld polygons, %lld vertices, %u drawables, %lld bytes of textures\n",
                    static_cast<long long>(report.polygons), static_cast<long long>(report.vertices), report.drawables,
                    static_cast<long long>(report.textureBytes));
    for (const std::string& note : report.notes)
        std::printf("note: %s\n", note.c_str());
    for (const std::string& warning : report.warnings)
        std::printf("warning: %s\n", warning.c_str());
    for (const auto& [name, file] : report.parts)
        std::printf("part %s: %s\n", name.c_str(), file.c_str());
    std::fflush(stdout);
    return report.error.empty();
}

} // namespace

int main(int count, char** values)
{
    std::vector<std::string> arguments(values + 1, values + count);
    const bool reports = !arguments.empty() && arguments.front() == "--report";
    if (reports)
        arguments.erase(arguments.begin());
    if (arguments.empty())
    {
        std::fprintf(stderr, "usage: panoramic-model-reader [--report] PATH [KEY=VALUE ...]\n");
        return 2;
    }
    ModelRequest request = ModelRequest::FromArguments(arguments);
    request.path = std::filesystem::absolute(request.path).lexically_normal().string();
    std::filesystem::current_path("/"); // the library loads code from the working directory, too
    ::close_range(STDERR_FILENO + 1, ~0U, 0);
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    SetLimits(request);

    // The parsers read numbers by the locale and print what they like; the package goes out beside that.
    ::setenv("LC_ALL", "C", 1);
    if (!std::getenv("OSG_NOTIFY_LEVEL"))
        osg::setNotifyLevel(osg::FATAL);
    const int output = ::dup(STDOUT_FILENO);
    if (!reports)
        ::dup2(STDERR_FILENO, STDOUT_FILENO);

    try
    {
        const std::string package = ReadModel(request);
        const bool good = reports ? PrintReport(package) : WriteAll(output, package);
        std::_Exit(good ? 0 : 1); // the parsers' own clearing up is neither needed nor to be trusted
    }
    catch (const std::bad_alloc&)
    {
        std::fprintf(stderr, "it needs more than the %.0f MB of memory it may have\n",
                     request.Number("limitMegabytes").value_or(4096));
    }
    catch (const std::exception& e)
    {
        std::fprintf(stderr, "%s\n", e.what());
    }
    std::_Exit(1);
}

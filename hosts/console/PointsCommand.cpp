#include <CLI/CLI.hpp>

#include <iostream>

#include <fmt/format.h>

#include "base/Paths.h"
#include "base/Text.h"
#include "hosts/console/Command.h"
#include "hosts/console/Session.h"
#include "simdata/SimulationDataController.h"

namespace console
{

namespace
{

const char* KindOf(const SimulationDataPoints::VtCSimulationDataPoint& point)
{
    return point.IsSource() ? point.IsSink() ? "source and sink" : "source" : "sink";
}

std::string ConfigurationOf(const SimulationDataPoints::VtCSimulationDataPoint& point)
{
    std::wstring type, path;
    point.GetSourceType(type);
    point.GetSourcePath(path);
    return type.empty() && path.empty() ? "not configured" : base::Utf8(type + L" " + path);
}

int Run(bool verbose)
{
    Session session(verbose);
    const VtCSimulationDataRouter& router = session.GetController().GetRouter();
    for (const VtTDataPointPtr& point : router.GetPoints())
        std::cout << fmt::format("{:<16} kind {} ({})  {}\n", base::Utf8(point->GetName()), point->GetKind(),
                                 KindOf(*point), ConfigurationOf(*point));
    if (verbose)
        for (const VtTPluginFault& fault : router.GetPluginFaults())
            std::cout << fmt::format("{}: passed over: {}\n", base::NativePath(fault.path).string(),
                                     base::Utf8(fault.reason));
    return session.GetExitStatus();
}

} // namespace

void AddPointsCommand(CLI::App& program, int& status)
{
    auto verbose = std::make_shared<bool>(false);
    CLI::App* command = program.add_subcommand("points", "List the data points that could be loaded.");
    command->add_flag("-v,--verbose", *verbose, "Tell also which modules were passed over, and why.");
    command->footer("Modules are looked for in the folder plugins beside the program and in those of\n"
                    "$PANORAMIC_PLUGIN_PATH, separated by colons.");
    command->callback([verbose, &status] { status = Run(*verbose); });
}

} // namespace console

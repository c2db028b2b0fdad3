#include "hosts/console/Conversion.h"

#include <iostream>

#include <fmt/format.h>

#include "base/AtomicFile.h"
#include "base/Text.h"
#include "hosts/console/ConsoleHost.h"
#include "hosts/console/ConsoleTexts.h"
#include "simdata/LoadProgressDisplay.h"

namespace console
{

namespace
{

constexpr long activity = 41;

} // namespace

int Convert(const ConversionFiles& files, Converter converter)
{
    ConsoleHost host(false);
    SimulationDataPoints::VtTConversionReport report;
    {
        VtCLoadProgressDisplay display(*host.GetProgress());
        host.GetProgress()->ConnectProgressActivity(activity, base::Wide(files.from.filename().string()), {});
        converter(files.from, files.to, report, &display, activity);
        host.GetProgress()->CleanUp();
    }
    for (const std::wstring& warning : report.warnings)
        host.GetMessages().Show({.text = warning, .severity = host::Severity::warning});
    if (!report.error.empty())
    {
        host.ShowError(messageConversion, base::Utf8(report.error));
        return 1;
    }
    if (!base::IsSpecialFile(files.to))
        std::cout << fmt::format("{}: {} frames, {} poses, {} instruments\n", files.to.string(), report.frames,
                                 report.poses, report.instruments);
    return 0;
}

} // namespace console

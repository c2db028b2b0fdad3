#include "simdata/LoadProgressDisplay.h"

#include "host/Progress.h"
#include "simdata/points/SimulationDataPoint.h"

using SimulationDataPoints::VtCSimulationDataPoint;

namespace
{
constexpr long stepCount = 100;
}

VtCLoadProgressDisplay::VtCLoadProgressDisplay(host::Progress& hostProgress) : progress(hostProgress)
{
    VtCSimulationDataPoint::SetLoadProgress(this);
}

VtCLoadProgressDisplay::~VtCLoadProgressDisplay()
{
    VtCSimulationDataPoint::SetLoadProgress(nullptr);
}

void VtCLoadProgressDisplay::OnLoadProgress(long id, std::uint64_t done, std::uint64_t total)
{
    if (id < 0)
        return;
    const double part = total > 0 ? static_cast<double>(done) / static_cast<double>(total) : 1.0;
    const long reached = static_cast<long>(part * stepCount);
    const auto [at, opened] = shownSteps.try_emplace(id, 0);
    // Less than before is another load: the one that was shown broke off.
    if (opened || reached < at->second)
    {
        at->second = 0;
        progress.SetProgresStepCount(id, stepCount);
    }
    for (; at->second < reached; ++at->second)
        progress.StepProgressActivity(id);
    if (done >= total)
    {
        progress.DisconnectProgressActivity(id);
        shownSteps.erase(at);
    }
}

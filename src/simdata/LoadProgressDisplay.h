#pragma once

#include <map>

#include "simdata/points/LoadProgress.h"

namespace host
{
class Progress;
}

/// Shows how far the loads of data points are on the host's progress display, in hundredths.
///
/// The data point library keeps one such listener for the process; this is it as long as it lives.
class VtCLoadProgressDisplay : public SimulationDataPoints::VtILoadProgress
{
public:
    explicit VtCLoadProgressDisplay(host::Progress& hostProgress);
    ~VtCLoadProgressDisplay() override;
    VtCLoadProgressDisplay(const VtCLoadProgressDisplay&) = delete;
    VtCLoadProgressDisplay& operator=(const VtCLoadProgressDisplay&) = delete;

    /// Ids below 0 are loads that nobody wants to see. The activity is opened with the first report and closed with
    /// the last.
    void OnLoadProgress(long id, std::uint64_t done, std::uint64_t total) override;

private:
    host::Progress& progress;
    std::map<long, long> shownSteps; ///< by activity, while it is open
};

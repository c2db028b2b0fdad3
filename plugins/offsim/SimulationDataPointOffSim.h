#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "offsim/OffSimOptions.h"
#include "simdata/points/SimulationDataPoint.h"

namespace offsim
{
class OffSimRun;
}

namespace SimulationDataPoints
{

/// A live source without file or device: a car that drives round a course, 100 frames a second of data time.
///
/// Every `Connect` begins a new run at data time 0, the car at rest on the start line, and empties the buffer. Told a
/// time, the point drives on to it and buffers each frame on the way, so a recorded run has all its frames however
/// seldom it was asked, and the frame of a time is always the same. One call drives at most `stepsPerCall` steps; after
/// a longer pause the newest frame lags behind the time told and catches up over the next calls.
///
/// After `Disconnect` the buffer stays, to be replayed. `FetchOnce` shows the car at the start while there is nothing
/// else. Configured from the beginning, with the options' default.
///
/// Time has no end here: the bounds told for a replay clock are those of a clock that never wraps, even while the
/// buffer still holds an earlier, short run. A 32-bit tick count that starts over after 49.7 days is taken as going on.
class VtCSimulationDataPointOffSim : public VtCSimulationDataPoint
{
public:
    /// A minute of data. Takes some 10 ms.
    static constexpr std::int64_t stepsPerCall = 6000;

    VtCSimulationDataPointOffSim();
    ~VtCSimulationDataPointOffSim() override;

    void Disconnect() override;
    int Connect() override;

    void GetSourceType(std::wstring& type) const override;

    /// The options as text.
    void GetSourcePath(std::wstring& path) const override;

    /// `type` "OffSim" without regard to case; `path` the options, empty for the default ones; `mode` 1. Ends a run.
    int Configure(const std::wstring& type, const std::wstring& path, int mode, int flags) override;

    int CanRefresh() const override { return 1; }
    int CanPreload() const override { return 1; }
    int FetchOnce() override;
    VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) override;

    /// The options, to be changed; must go before the point.
    VtCSettingsPage* CreatePropertyPage() override;
    void OnDeselect() override { Disconnect(); }
    int IsTimeDriven() const override { return 1; }
    void Reset() override;

private:
    std::int64_t DueSteps();
    bool Begin();
    void Record();
    void ReportFailure(const std::wstring& what);

    offsim::OffSimOptions options;
    std::unique_ptr<offsim::OffSimRun> run; ///< made when first needed
    bool connected = false;
    bool failureReported = false;
    double toldTime = 0.0;
    double lostTime = 0.0; ///< what the clock has lost by starting over
};

} // namespace SimulationDataPoints

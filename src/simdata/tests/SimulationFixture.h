#pragma once

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "simdata/InstrumentFeed.h"
#include "simdata/points/SimulationDataPoint.h"
#include "simdata/SimulationDataChangeObject.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationServices.h"
#include "tests/support/FakeHost.h"

/// What the tests of the simulation data path share: a source in the test's hands, a listener, a scene.
namespace simtest
{

/// What happened, in the order it did: "connect", "apply 3", "frame 3 0.02".
using Log = std::vector<std::string>;

/// A data point whose frames the test makes. Frame n has the channel 0 at x = n, and the stream n.
class Point : public SimulationDataPoints::VtCSimulationDataPoint
{
public:
    explicit Point(const std::wstring& pointName, Log* shared = nullptr);

    /// Poses and streams of the frames to come.
    void SetChannels(std::vector<std::wstring> poses, std::vector<std::wstring> instruments = {}, bool stamped = true,
                     SimulationDataPoints::TRACK_SAFETY safety = SimulationDataPoints::TRACK_SAFE);

    /// A new buffer of a frame for each time.
    void Fill(const std::vector<double>& times);
    void AppendAt(double time);

    void Say(const std::wstring& text) { Messages().Add(SimulationDataPoints::VtEMessageSeverity::error, text); }
    using VtCSimulationDataPoint::AppendFrame;
    using VtCSimulationDataPoint::GetSimulationTime;
    using VtCSimulationDataPoint::StartBuffer;

    void Disconnect() override { Note("disconnect"); }
    int Connect() override;
    void GetSourceType(std::wstring& text) const override { text = type; }
    void GetSourcePath(std::wstring& text) const override { text = path; }
    int Configure(const std::wstring& newType, const std::wstring& newPath, int, int) override;
    int IsSource() const override { return source; }
    int IsSink() const override { return sink; }
    int CanRefresh() const override { return refreshes; }
    int CanPreload() const override { return preloads; }
    int GetChannelNames(std::wstring& names, int variant) const override;
    void GetBodyChannelNames(std::vector<std::wstring>& names, int flag) const override
    {
        stored.empty() ? VtCSimulationDataPoint::GetBodyChannelNames(names, flag) : void(names = stored);
    }
    int FetchOnce() override;
    SimulationDataPoints::VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) override;
    void OnSelect() override { Note("select"); }
    void OnDeselect() override { Note("deselect"); }
    int IsTimeDriven() const override { return timeDriven; }
    void Release() override { Note("release"); }

    bool connects = true;
    bool source = true;
    bool sink = false;
    bool refreshes = false;
    bool preloads = false;
    bool timeDriven = false;
    bool streams = true; ///< false: online there is no frame
    std::wstring type = L"TEST";
    std::wstring path = L"bench";
    std::vector<std::wstring> stored; ///< names of the poses at the source, where they are others
    mutable int channelQuestions = 0;

private:
    void Note(const std::string& what);

    Log* log;
};

/// Writes down what it is told.
class Listener : public VtCSimulationDataChangeObject
{
public:
    explicit Listener(Log& shared) : log(shared) {}

    void OnDataPointsChanged(int) override { log.push_back("points"); }
    void OnModeChanged(VtESimulationMode mode) override;
    void OnPlayStateChanged(const std::wstring& name, VtEPlayState state) override;
    void OnFrame(const std::wstring& name, SimulationDataPoints::VtCSimulationDataFrame* frame, int frameId,
                 const double* time) override;
    void OnDataPointSelected(const std::wstring& text) override;
    void OnDataPointCleared(const std::wstring& text) override;

    Log& log;
};

class Instrument : public VtIFedInstrument
{
public:
    Instrument(std::wstring name, std::int32_t number) : signal(std::move(name)), stream(number) {}

    const std::wstring& GetSignalName() const override { return signal; }
    std::int32_t GetStreamNumber() const override { return stream; }
    void SetValue(const SimulationDataPoints::VtTInstrumentVariant& newValue) override
    {
        value = newValue;
        ++writes;
        if (log)
            log->push_back("apply " + std::to_string(static_cast<int>(newValue.value)));
    }

    std::wstring signal;
    std::int32_t stream;
    SimulationDataPoints::VtTInstrumentVariant value{-1.0, 0, 0};
    int writes = 0;
    Log* log = nullptr;
};

class Instruments : public VtIInstrumentFeed
{
public:
    Instrument& Add(std::wstring signal, std::int32_t stream = 0);

    VtEInstrumentDataMode GetDataMode() const override { return mode; }
    void SetDataMode(VtEInstrumentDataMode newMode) override { mode = newMode; }
    const std::vector<VtIFedInstrument*>& GetFedInstruments() const override { return list; }

    VtEInstrumentDataMode mode = VtEInstrumentDataMode::LegacyStreams;
    std::vector<std::unique_ptr<Instrument>> owned;
    std::vector<VtIFedInstrument*> list;
};

class ActiveScene : public VtIActiveScene
{
public:
    VtCScene3D* GetActiveScene() const override { return scene; }
    VtIInstrumentFeed* GetActiveInstruments() const override { return instruments; }

    VtCScene3D* scene = nullptr;
    VtIInstrumentFeed* instruments = nullptr;
};

/// The services over fakes, without plug-ins.
class Services
{
public:
    VtTSimulationServices Make(std::vector<std::wstring> pluginFolders = {});

    fake::Clock clock;
    fake::MessageHandler messages;
    fake::Texts texts;
    fake::Variables variables;
    fake::Progress progress;
    fake::UserInterface userInterface;
    fake::Configuration configuration;
    fake::Questions questions;
    ActiveScene scene;
};

/// A controller with one point "Live" that holds the frames 1 to 4 at 1.00, 1.01, 1.02 and 1.04 s. It isn't selected.
class SimulationTest : public testing::Test, protected Services
{
protected:
    SimulationTest();

    Point& Add(const std::wstring& name);

    /// What was noted since the last call.
    Log Taken() { return std::exchange(log, {}); }

    Log log;
    VtCSimulationDataController controller;
    VtCSimulationDataRouter& router;
    Point& live;
};

} // namespace simtest

#include "offsim/SimulationDataPointOffSim.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "base/Numbers.h"
#include "base/Text.h"
#include "offsim/OffSimRun.h"
#include "simdata/points/ExportFactory.h"
#include "simdata/points/SettingsPage.h"

namespace SimulationDataPoints
{

namespace
{

using offsim::OffSimRun;
using offsim::Sample;

constexpr wchar_t sourceType[] = L"OffSim";
constexpr std::int64_t microsecondsPerStep = 1'000'000 / OffSimRun::stepsPerSecond;

std::shared_ptr<const VtTChannelDescription> Channels()
{
    VtTChannelDescription channels;
    channels.poses = {L"Vehicle", L"Vehicle.FL", L"Vehicle.FR", L"Vehicle.RL", L"Vehicle.RR"};
    channels.instruments = {{L"Speed", L"km/h"},
                            {L"EngineSpeed", L"1/min"},
                            {L"SteeringAngle", L"deg"},
                            {L"LateralAcceleration", L"m/s^2"},
                            {L"Gear", L""},
                            {L"Brake", L"%"}};
    return std::make_shared<const VtTChannelDescription>(std::move(channels));
}

double TimeOf(std::int64_t step)
{
    return static_cast<double>(step) / OffSimRun::stepsPerSecond;
}

/// The options of a point. The failure stands there with its length and not with its end, so that no two fields can
/// contradict each other.
class OptionsPage : public VtCSettingsPage
{
public:
    explicit OptionsPage(VtCSimulationDataPoint& owner, const offsim::OffSimOptions& options)
        : point(owner),
          seed(options.seed),
          fail(options.fail.value_or(never)),
          length(options.recover ? *options.recover - *options.fail : forGood)
    {
    }

    std::wstring GetTitle() const override { return point.GetName(); }

    std::vector<VtTSettingsField> GetFields() const override
    {
        return {{.label = L"Seed of the side wind",
                 .value = static_cast<double>(seed),
                 .editable = true,
                 .maximum = 999'999'999.0},
                {.label = L"The source fails at (s)",
                 .value = fail,
                 .editable = true,
                 .minimum = never,
                 .maximum = longest,
                 .decimals = 2,
                 .minimumText = L"never"},
                {.label = L"The failure lasts (s)",
                 .value = length,
                 .editable = true,
                 .minimum = forGood,
                 .maximum = longest,
                 .decimals = 2,
                 .minimumText = L"for good"}};
    }

    void OnFieldChanged(std::size_t field, double value) override
    {
        if (field == 0 && value >= 0.0)
            seed = static_cast<std::uint64_t>(value);
        else if (field == 1)
            fail = value;
        else if (field == 2)
            length = value;
    }

    void OnOK() override
    {
        offsim::OffSimOptions options;
        options.seed = seed;
        if (fail >= 0.0)
            options.fail = fail;
        if (options.fail && length > forGood)
            options.recover = VtCSimulationDataFrame::RoundTimeStamp(fail + length);
        // A run that goes on, and one that is recorded, don't end for a page that was only looked at.
        std::wstring present;
        point.GetSourcePath(present);
        if (options.Text() != present)
            point.Configure(sourceType, options.Text(), 1, 0);
    }

private:
    static constexpr double never = -1.0;
    static constexpr double forGood = 0.0;
    static constexpr double longest = 1'000'000.0;

    VtCSimulationDataPoint& point;
    std::uint64_t seed;
    double fail;
    double length;
};

} // namespace

VtCSimulationDataPointOffSim::VtCSimulationDataPointOffSim() : VtCSimulationDataPoint(sourceType)
{
    SetDescription(Channels());
    SetEndlessTime(true);
}

VtCSimulationDataPointOffSim::~VtCSimulationDataPointOffSim() = default;

void VtCSimulationDataPointOffSim::GetSourceType(std::wstring& type) const
{
    type = sourceType;
}

void VtCSimulationDataPointOffSim::GetSourcePath(std::wstring& path) const
{
    path = options.Text();
}

int VtCSimulationDataPointOffSim::Configure(const std::wstring& type, const std::wstring& path, int mode, int)
{
    std::wstring fault;
    std::optional<offsim::OffSimOptions> parsed;
    if (!base::EqualsNoCase(type, sourceType))
        fault = L"there is no source of type \"" + type + L"\" here";
    else if (mode != 1)
        fault = L"a simulation can't be written to";
    else
        parsed = offsim::OffSimOptions::Parse(path, fault);
    if (!parsed)
    {
        Messages().Add(VtEMessageSeverity::error, GetName() + L": " + fault);
        return 0;
    }
    Disconnect();
    options = *parsed;
    return 1;
}

VtCSettingsPage* VtCSimulationDataPointOffSim::CreatePropertyPage()
{
    return new OptionsPage(*this, options);
}

void VtCSimulationDataPointOffSim::Reset()
{
    VtCSimulationDataPoint::Reset();
    SetDescription(Channels());
    options = {};
}

bool VtCSimulationDataPointOffSim::Begin()
{
    if (!run)
        run = std::make_unique<OffSimRun>(options.seed);
    else
        run->Restart(options.seed);
    failureReported = false;
    toldTime = 0.0;
    lostTime = 0.0;
    ForgetSimulationTime();
    return StartBuffer();
}

int VtCSimulationDataPointOffSim::Connect()
{
    Disconnect();
    if (!options.CanOpen())
    {
        ReportFailure(L"the source can't be opened");
        return 0;
    }
    connected = Begin();
    return connected;
}

void VtCSimulationDataPointOffSim::Disconnect()
{
    connected = false;
}

int VtCSimulationDataPointOffSim::FetchOnce()
{
    unsigned long count = 0;
    if (connected || GetBufferedFrames(count))
        return GetBufferedFrames(count);
    if (options.FailsAt(0.0))
    {
        ReportFailure(L"the source has no data");
        return 0;
    }
    if (!Begin())
        return 0;
    Record();
    return 1;
}

std::int64_t VtCSimulationDataPointOffSim::DueSteps()
{
    const double* told = GetSimulationTime();
    if (told == nullptr || !std::isfinite(*told))
        return run->Steps();
    // A little backwards is a clock that was set to the time of the last frame; the newest frame stays. Far back is
    // a tick count that has started over.
    if (*told < toldTime - endlessTime / 2.0)
        lostTime += endlessTime;
    toldTime = *told;
    const double time = std::clamp(toldTime + lostTime, 0.0, 1e11);
    return std::llround(time * 1e6) / microsecondsPerStep;
}

void VtCSimulationDataPointOffSim::Record()
{
    Sample sample;
    run->Take(sample);
    VtCFrameRecord record = AppendFrame(TimeOf(run->Steps()));
    for (std::size_t pose = 0; pose < Sample::poseCount; ++pose)
        record.SetPose(pose, sample.poses[pose]);
    for (std::size_t stream = 0; stream < Sample::instrumentCount; ++stream)
        record.SetInstrument(stream, sample.instruments[stream]);
}

VtCSimulationDataFrame* VtCSimulationDataPointOffSim::GetCurrentFrame(unsigned long& frame)
{
    if (!connected || (GetBuffer() == nullptr && !StartBuffer()))
        return nullptr;

    unsigned long held = 0;
    if (!GetBufferedFrames(held) && !options.FailsAt(TimeOf(run->Steps())))
        Record();
    const std::int64_t due = std::min(DueSteps(), run->Steps() + stepsPerCall);
    while (run->Steps() < due)
    {
        run->Step();
        if (!options.FailsAt(TimeOf(run->Steps())))
            Record();
    }

    if (!options.FailsAt(TimeOf(run->Steps())))
    {
        failureReported = false;
        return NewestFrame(frame);
    }
    // Once an outage: the retries that follow would only repeat it.
    if (!failureReported)
        ReportFailure(L"the source has failed at " + base::Wide(base::FormatDouble(*options.fail)) + L" s");
    return nullptr;
}

void VtCSimulationDataPointOffSim::ReportFailure(const std::wstring& what)
{
    failureReported = true;
    Messages().Add(VtEMessageSeverity::error, GetName() + L": " + what + L", as the option \"fail\" asks for");
}

} // namespace SimulationDataPoints

SIMULATION_DATA_POINT_FACTORY
{
    return new (std::nothrow) SimulationDataPoints::VtCSimulationDataPointOffSim;
}

#include "simdata/tests/SimulationFixture.h"

#include <fmt/format.h>

#include "base/Text.h"

using namespace SimulationDataPoints;

namespace simtest
{

Point::Point(const std::wstring& pointName, Log* shared) : VtCSimulationDataPoint(pointName), log(shared) {}

void Point::SetChannels(std::vector<std::wstring> poses, std::vector<std::wstring> instruments, bool stamped,
                        TRACK_SAFETY safety)
{
    auto channels = std::make_shared<VtTChannelDescription>();
    channels->poses = std::move(poses);
    for (std::wstring& stream : instruments)
        channels->instruments.push_back({std::move(stream), L"m/s"});
    channels->timeStamps = stamped;
    channels->trackSafety = safety;
    SetDescription(channels);
}

void Point::Fill(const std::vector<double>& times)
{
    ASSERT_TRUE(StartBuffer());
    for (const double time : times)
        AppendAt(time);
}

void Point::AppendAt(double time)
{
    unsigned long count = 0;
    GetBufferedFrames(count);
    const float number = static_cast<float>(count + 1);
    VtCFrameRecord record = AppendFrame(time);
    const float pose[4][4] = {{1, 0, 0, number}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}};
    for (std::size_t i = 0; i < GetDescription()->poses.size(); ++i)
        record.SetPose(i, pose);
    for (std::size_t i = 0; i < GetDescription()->instruments.size(); ++i)
        record.SetInstrument(i, number);
}

int Point::Connect()
{
    Note("connect");
    if (!connects)
        Say(L"no cable");
    return connects;
}

int Point::Configure(const std::wstring& newType, const std::wstring& newPath, int, int)
{
    type = newType;
    path = newPath;
    return 1;
}

int Point::GetChannelNames(std::wstring& names, int variant) const
{
    ++channelQuestions;
    return VtCSimulationDataPoint::GetChannelNames(names, variant);
}

int Point::FetchOnce()
{
    Note("fetch");
    return StartBuffer() ? (AppendAt(5.0), 1) : 0;
}

VtCSimulationDataFrame* Point::GetCurrentFrame(unsigned long& frame)
{
    if (streams)
        return NewestFrame(frame);
    Say(L"no signal");
    return nullptr;
}

void Point::Note(const std::string& what)
{
    if (log)
        log->push_back(what + " " + base::Utf8(GetName()));
}

void Listener::OnModeChanged(VtESimulationMode mode)
{
    log.push_back(fmt::format("mode {}", static_cast<int>(mode)));
}

void Listener::OnPlayStateChanged(const std::wstring& name, VtEPlayState state)
{
    log.push_back(fmt::format("play {} {}", base::Utf8(name), static_cast<int>(state)));
}

void Listener::OnFrame(const std::wstring&, VtCSimulationDataFrame* frame, int frameId, const double* time)
{
    const std::string stamp = time ? fmt::format(" {}", *time) : "";
    log.push_back(frame ? fmt::format("frame {}{}", frameId, stamp) : "no frame" + stamp);
}

void Listener::OnDataPointSelected(const std::wstring& text)
{
    log.push_back("selected " + base::Utf8(text));
}

void Listener::OnDataPointCleared(const std::wstring& text)
{
    log.push_back("cleared " + base::Utf8(text));
}

Instrument& Instruments::Add(std::wstring signal, std::int32_t stream)
{
    owned.push_back(std::make_unique<Instrument>(std::move(signal), stream));
    list.push_back(owned.back().get());
    return *owned.back();
}

VtTSimulationServices Services::Make(std::vector<std::wstring> pluginFolders)
{
    return {clock,      messages,  texts,          scene,          std::move(pluginFolders),
            &variables, &progress, &userInterface, &configuration, &questions};
}

SimulationTest::SimulationTest() : controller(Make()), router(controller.GetRouter()), live(Add(L"Live"))
{
    live.SetChannels({L"Body", L"Wheel"}, {L"Speed"});
    live.Fill({1.00, 1.01, 1.02, 1.04});
}

Point& SimulationTest::Add(const std::wstring& name)
{
    return static_cast<Point&>(router.AddPoint(VtTDataPointPtr(new Point(name, &log))));
}

} // namespace simtest

#include "app/FrameCycle.h"

#include <cmath>
#include <iterator>

#include <fmt/format.h>
#include <fmt/xchar.h>

#include "base/FrameSuspension.h"
#include "host/Clock.h"
#include "host/Frame.h"

namespace
{

const std::wstring frameRateVariable = L"fps";

} // namespace

void VtCOnIdleSink::OnIdle(std::int32_t& handled)
{
    if (VtCFrameSuspension::AreStepsSuspended())
        return;
    handled = 1;
    cycle.IdleStep();
}

VtCFrameCycle::VtCFrameCycle(host::Clock& hostClock, VtIFrameWork& frameWork) : clock(hostClock), work(frameWork) {}

VtCFrameCycle::~VtCFrameCycle()
{
    DisconnectIdleSink();
}

std::int32_t VtCFrameCycle::IdleStep()
{
    if (retryStart == 0)
        retryStart = clock.Counter();

    const bool windowVisible = IsWindowVisible();
    if (windowVisible)
    {
        if (work.HasController())
            DataStep();
        if (work.HasGraphicsSession() && work.IsSceneLoaded())
        {
            work.RenderCurrentView();
            if (work.IsFrameDue())
                work.RenderViewerFrame();
        }
    }
    UpdateFrameRateDisplay();
    return 1;
}

bool VtCFrameCycle::IsWindowVisible()
{
    if (!hostMainWindow)
        return false;
    if (hostMainWindow->GetWindowState() != host::windowMinimised)
        return true;
    clock.Sleep(sleepWhenIdle);
    return false;
}

void VtCFrameCycle::DataStep()
{
    if (!work.IsOnline() && !work.HasPlayState())
    {
        clock.Sleep(sleepWhenIdle);
        dataStepArmed = 1;
        return;
    }
    if (dataStepArmed != 0)
    {
        dataStepArmed = work.Step();
        return;
    }
    const std::int64_t counter = clock.Counter();
    if (SecondsSinceRetry(counter) > retryInterval)
    {
        dataStepArmed = work.Step();
        retryStart = counter;
    }
}

float VtCFrameCycle::SecondsSinceRetry(std::int64_t counter) const
{
    return static_cast<float>(static_cast<double>(counter - retryStart) /
                              static_cast<double>(clock.CounterFrequency()));
}

void VtCFrameCycle::UpdateFrameRateDisplay()
{
    if (!work.HasGraphicsSession() || !work.IsSceneLoaded())
    {
        SetFrameRateText({});
        return;
    }
    if (++frameCounter % sampledPasses != 0)
        return;
    const float frameRate = static_cast<float>(work.GetFrameRate());
    if (!(std::fabs(frameRate - lastFrameRate) > frameRateHysteresis))
        return;
    frameRateText.clear(); // keeps its memory: a steady pass takes none
    fmt::format_to(std::back_inserter(frameRateText), L"{:04.1f}", frameRate);
    SetFrameRateText(frameRateText);
    lastFrameRate = frameRate;
}

void VtCFrameCycle::SetFrameRateText(const std::wstring& text)
{
    if (variables)
        variables->SetText(frameRateVariable, text);
}

void VtCFrameCycle::RedrawNow()
{
    if (VtCFrameSuspension::ArePicturesSuspended())
        return;
    work.RenderCurrentView();
    work.RenderViewerFrame();
}

void VtCFrameCycle::ConnectIdleSink()
{
    if (idleSinkConnected || !variables)
        return;
    idleSource = variables->GetIdleSource();
    if (!idleSource)
        return;
    idleCookie = idleSource->Advise(sink);
    idleSinkConnected = true;
}

void VtCFrameCycle::DisconnectIdleSink()
{
    if (idleSource && idleSinkConnected)
        idleSource->Unadvise(idleCookie);
    idleSinkConnected = false;
}

#pragma once

#include <cstdint>
#include <string>

#include "host/Idle.h"

namespace host
{
class Clock;
class MainWindow;
class Variables;
} // namespace host

class VtCFrameCycle;

/// Takes the host's idle events and makes one idle step of each. It holds no state of its own.
class VtCOnIdleSink : public host::IIdleProcessingEvents
{
public:
    explicit VtCOnIdleSink(VtCFrameCycle& frameCycle) : cycle(frameCycle) {}

    /// `handled` becomes 1, as the cycle wants every idle event it can get. While the cycle is suspended
    /// (`VtCFrameSuspension`) it stays as it is, and nothing happens.
    void OnIdle(std::int32_t& handled) override;

private:
    VtCFrameCycle& cycle;
};

/// What one idle step works on. The application object implements it.
class VtIFrameWork
{
public:
    virtual ~VtIFrameWork() = default;

    /// Is there a controller? The three behind it are asked only then.
    virtual bool HasController() const = 0;
    virtual bool IsOnline() const = 0;
    virtual bool HasPlayState() const = 0;
    virtual std::int32_t Step() = 0;

    virtual bool HasGraphicsSession() const = 0;
    virtual bool IsSceneLoaded() const = 0;
    virtual void RenderCurrentView() = 0;

    /// Would the next frame show something else than the last?
    virtual bool IsFrameDue() = 0;
    virtual void RenderViewerFrame() = 0;

    /// Frames a second, averaged; 0.0 while the viewer has none.
    virtual double GetFrameRate() const = 0;
};

/// The frame cycle: what happens in one short pass, each time the host's loop runs idle.
///
/// Bodies move first (the controller's step), observers follow (`RenderCurrentView`), the viewer draws last, and only a
/// frame that would show something new. A step that found no data is tried again after the retry interval, counted from
/// the last retry; pictures go on meanwhile. Everything runs on the thread that owns the windows. A steady pass
/// allocates nothing.
///
/// What must not be disturbed by a step or a picture takes a `VtCFrameSuspension` for as long as that lasts. What a
/// service throws leaves `IdleStep` with the cycle unchanged; the host shows it, and raises its next event as ever.
class VtCFrameCycle
{
public:
    static constexpr std::uint32_t sleepWhenIdle = 50; ///< milliseconds, when nothing is to be done
    static constexpr float retryInterval = 5.0F;       ///< seconds, strictly more than
    static constexpr std::int32_t sampledPasses = 10;  ///< the frame rate is looked at in every 10th pass
    static constexpr float frameRateHysteresis = 0.1F; ///< frames a second, strictly more than

    VtCFrameCycle(host::Clock& clock, VtIFrameWork& work);
    ~VtCFrameCycle();

    /// The host's services, not owned. Null while there is none; without a window nothing moves and nothing is drawn.
    void SetMainWindow(host::MainWindow* window) { hostMainWindow = window; }
    void SetVariables(host::Variables* service) { variables = service; }

    /// One pass; always 1. A main window that can't be asked for its state throws `host::InterfaceError` out of it,
    /// with the cycle unchanged.
    std::int32_t IdleStep();

    /// Publishes the frame rate in the host variable "fps": in every 10th pass, when it has changed by more than the
    /// hysteresis; an empty text in every pass while no scene is loaded.
    void UpdateFrameRateDisplay();

    /// A frame outside of the idle step, also when it would show nothing new; none while pictures are suspended.
    void RedrawNow();

    /// The host's start and end of the cycle, which don't count: one call undoes the other. Without idle events from
    /// the host nothing happens. Connecting doesn't end a suspension.
    void ConnectIdleSink();
    void DisconnectIdleSink();
    bool IsIdleSinkConnected() const { return idleSinkConnected; }

    std::int32_t GetDataStepArmed() const { return dataStepArmed; }
    std::int64_t GetRetryStart() const { return retryStart; }
    std::int32_t GetFrameCounter() const { return frameCounter; }

private:
    bool IsWindowVisible();
    void DataStep();
    float SecondsSinceRetry(std::int64_t counter) const;
    void SetFrameRateText(const std::wstring& text);

    host::Clock& clock;
    VtIFrameWork& work;
    host::MainWindow* hostMainWindow = nullptr;
    host::Variables* variables = nullptr;
    host::IdleSource* idleSource = nullptr;
    VtCOnIdleSink sink{*this}; ///< kept, as the cycle may be disconnected from within the sink's own event

    std::int32_t dataStepArmed = 1; ///< the last data step's result: 1 the next may follow at once, 0 it must wait
    std::int64_t retryStart = 0;    ///< counter at the last retry; 0 not taken yet
    std::int32_t frameCounter = 0;
    float lastFrameRate = 0.0F; ///< as last published
    std::wstring frameRateText;
    bool idleSinkConnected = false;
    std::uint32_t idleCookie = 0;
};

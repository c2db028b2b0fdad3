#pragma once

#include <cstdint>
#include <memory>
#include <string>

namespace host
{
class Clock;
class IdleSource;
class MainWindow;
class Variables;
} // namespace host

class VtCOnIdleSink;

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
    virtual void RenderViewerFrame() = 0;

    /// Frames a second, averaged; 0.0 while the viewer has none.
    virtual double GetFrameRate() const = 0;
};

/// The frame cycle: what happens in one short pass, each time the host's loop runs idle.
///
/// Bodies move first (the controller's step), observers follow (`RenderCurrentView`), the viewer draws last. A step
/// that found no data is tried again after the retry interval, counted from the last retry; pictures go on meanwhile.
/// Everything runs on the thread that owns the windows. A steady pass allocates nothing.
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

    /// A frame outside of the idle step; nothing while a redraw isn't allowed.
    void RedrawNow();
    void SetRedrawAllowed(bool allowed) { redrawAllowed = allowed; }
    bool IsRedrawAllowed() const { return redrawAllowed; }

    /// Starts the cycle, or takes it up again after `DisconnectIdleSink`. Without idle events from the host nothing
    /// happens. An operation that rebuilds the scene graph or handles the host's events suspends the cycle around it.
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
    std::unique_ptr<VtCOnIdleSink> sink;

    std::int32_t dataStepArmed = 1; ///< the last data step's result: 1 the next may follow at once, 0 it must wait
    std::int64_t retryStart = 0;    ///< counter at the last retry; 0 not taken yet
    std::int32_t frameCounter = 0;
    float lastFrameRate = 0.0F; ///< as last published
    std::wstring frameRateText;
    bool redrawAllowed = true;
    bool idleSinkConnected = false;
    std::uint32_t idleCookie = 0;
};

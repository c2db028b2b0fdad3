#pragma once

#include <cstdint>
#include <string>

namespace SimulationDataPoints
{
class VtCSimulationDataFrame;
}

/// Where the data come from: a source that streams, or the frames in the buffer.
enum class VtESimulationMode : std::int32_t
{
    Online = 0,
    Offline = 1,
};

/// What the replay does. Meaningful offline only.
enum class VtEPlayState : std::int32_t
{
    PlayStopped = 0,
    PlayOnce = 1,      ///< to the end of the buffer
    PlayLoop = 2,      ///< starts again at the end
    SpoolBackward = 3, ///< while the button is held down
    SpoolForward = 4,
};

/// A listener of the router: dialogs derive from it to learn what happened to data points, mode, play state and frame.
///
/// Registers itself with `AddChangeObject` and goes by `RemoveChangeObject`, also from within a call; the router
/// doesn't own it. Listeners never touch the scene. Texts are passed by reference, since `OnFrame` comes in every step
/// and must not allocate; they are good for the call only.
class VtCSimulationDataChangeObject
{
public:
    virtual ~VtCSimulationDataChangeObject() = default;

    /// The set of data points, or how they are listed, has changed: refill lists of them. Also sent to a listener as
    /// it registers.
    virtual void OnDataPointsChanged(int) {}

    virtual void OnModeChanged(VtESimulationMode) {}

    /// Sent while a point is active, with its name.
    virtual void OnPlayStateChanged(const std::wstring& /*name*/, VtEPlayState) {}

    /// A frame of the point `name` was delivered, or a step failed: then `frame` is null. `time` is null when the
    /// point has no time stamps.
    virtual void OnFrame(const std::wstring& /*name*/, SimulationDataPoints::VtCSimulationDataFrame* /*frame*/,
                         int /*frameId*/, const double* /*time*/)
    {
    }

    /// A point became the active one; the text is its configuration text.
    virtual void OnDataPointSelected(const std::wstring& /*text*/) {}

    /// No point is active any more; the text is empty.
    virtual void OnDataPointCleared(const std::wstring& /*text*/) {}

    /// The configuration of the point has changed. The router doesn't send it: listeners that treat selecting and
    /// clearing alike pass both on to it.
    virtual void OnConfigurationChanged(const std::wstring& /*text*/) {}
};

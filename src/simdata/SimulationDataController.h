#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "simdata/ControllerCommands.h"
#include "simdata/points/SimulationDataFrames.h"
#include "simdata/SimulationDataRouter.h"
#include "simdata/SimulationServices.h"

/// The one place where the state of the simulation lives: the mode, online or offline, and the play state.
///
/// Every command to start, stop, play and step goes through it, and the frame cycle calls its `Step` once per idle
/// pass. Online, time is what the newest frame says; offline, the frames lie in the buffer of the active point and the
/// replay follows the router's clock. Made once by the application object; owns the router.
///
/// Where an operation takes the name of a point, an empty one stands for the active point.
class VtCSimulationDataController
{
public:
    explicit VtCSimulationDataController(const VtTSimulationServices& hostServices);
    ~VtCSimulationDataController();
    VtCSimulationDataController(const VtCSimulationDataController&) = delete;
    VtCSimulationDataController& operator=(const VtCSimulationDataController&) = delete;

    VtCSimulationDataRouter& GetRouter() { return router; }
    const VtCSimulationDataRouter& GetRouter() const { return router; }

    // Simulation

    bool IsOnline() const { return mode == VtESimulationMode::Online; }
    bool IsPlaying() const { return playState == VtEPlayState::PlayOnce || playState == VtEPlayState::PlayLoop; }
    bool HasPlayState() const { return playState != VtEPlayState::PlayStopped; }
    VtESimulationMode GetMode() const { return mode; }
    VtEPlayState GetPlayState() const { return playState; }

    /// Goes online. Says nothing and does nothing without an active point; stays offline, with the point's messages
    /// shown, when it doesn't connect.
    void Start();
    void Stop();

    /// Called when the scene closes: nothing runs and no point is active.
    void Reset();

    /// One step of the frame cycle. False when the online source had nothing: the next step should wait.
    bool Step();
    void SetMode(VtESimulationMode newMode);

    /// Going offline leaves the connection as it is; going online makes it, as `Start` does.
    void SetModeQuietly(VtESimulationMode newMode);

    // Replay

    /// From the frame at the cursor to the end of the buffer.
    void PlayOnce();

    /// From the frame at the cursor, and from the first one at the end.
    void PlayLoop();
    void StopPlay();

    /// Nothing plays, and nobody is told.
    void ResetPlayState() { playState = VtEPlayState::PlayStopped; }

    /// For the spool: takes effect with a name and offline only.
    void SetPlayState(const std::wstring& name, VtEPlayState state);

    /// Plays by the scaled clock, whose time the video recorder sets.
    void PlayForRecording(double start, double speedFactor);

    /// Data seconds per wall-clock second. A clock that runs takes it up at once, from its start on.
    void SetSpeed(double factor);
    double GetSpeed() const { return speed; }
    void SetCurrentTime(double time) { router.SetCurrentTime(time); }

    // Frames

    bool GotoFirst(const std::wstring& name = {}) { return router.GotoFirst(name); }
    bool GotoLast(const std::wstring& name = {}) { return router.GotoLast(name); }

    /// These two only while nothing runs.
    bool GotoNext(const std::wstring& name = {});
    bool GotoPrevious(const std::wstring& name = {});
    bool GotoFrame(const std::wstring& name, long index) { return router.GotoFrame(name, index); }
    bool ShowFrame(const std::wstring& name, long index) { return router.ShowFrame(name, index); }
    bool BeginSpool(double speedFactor) { return router.BeginSpool(speedFactor); }

    /// One read while offline, shown to the listeners as a short run.
    void Refresh();

    // Buffers

    /// Capacity of the active point, 0 if there is none.
    int GetFrameBufferSize() const;

    /// Null without an active point or a buffer.
    std::unique_ptr<SimulationDataPoints::VtCSimulationDataFrames> CopyFrameBuffer() const;
    SimulationDataPoints::TRACK_SAFETY GetTrackSafety() const;

    static constexpr std::int32_t GetMinimumBufferFrames() { return 1000; }
    std::int32_t GetTrackBufferFrames() const { return trackBufferFrames; }
    std::int32_t GetSimulationBufferFrames() const { return simulationBufferFrames; }

    /// Keeps both sizes with the host; they take effect with the next controller. False if nothing changed.
    bool SetBufferSizes(std::int32_t simulationFrames, std::int32_t trackFrames);

    // Points and commands

    /// The user's choice in a list of points; an empty name is "none".
    void ChoosePoint(const std::wstring& name);

    /// Loads a motion data file (inner form) into the point "File", makes that the active point and shows the first
    /// frame. False, after a message, when the file can't be used: then the run that is loaded, the choice and a
    /// replay that plays stay as they were.
    bool LoadMotionData(const std::wstring& path);

    /// Who shows the customise sheet, not owned; null for nobody, and the command is disabled.
    void SetCustomizeSheet(VtICustomizeSheet* sheet) { customizeSheet = sheet; }

    /// Carries out a command if it is enabled. True for every command that is the controller's, enabled or not.
    bool OnCmdMsg(std::uint32_t command);

    /// What a control of that number shows for the point `name`; nothing enabled for a number that is no control's,
    /// such as what stands in menus alone.
    VtTCommandState IsCommandEnabled(const std::wstring& name, std::uint32_t command) const;

    /// All commands and controls of the controller.
    static const VtCControllerCommandTable& GetCommands();

    /// How a command shows in a menu, for the active point; nothing for what isn't the controller's.
    std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const;

private:
    void ReadBufferSettings();
    void Play(VtEPlayState state);
    bool StepReplay();
    void UpdateRunningIndicator() const;
    void Store();

    VtTSimulationServices services;
    VtCSimulationDataRouter router;
    VtESimulationMode mode = VtESimulationMode::Offline;
    VtEPlayState playState = VtEPlayState::PlayStopped;
    std::int32_t trackBufferFrames;
    std::int32_t simulationBufferFrames;
    double speed = 1.0;
    VtICustomizeSheet* customizeSheet = nullptr;
};

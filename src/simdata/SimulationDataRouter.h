#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "scene/SceneServices.h"
#include "simdata/DataPointPlugins.h"
#include "simdata/points/SimulationDataTracker.h"
#include "simdata/RegistrationList.h"
#include "simdata/ReplayClock.h"
#include "simdata/SimulationDataChangeObject.h"
#include "simdata/SimulationDataReceiver.h"
#include "simdata/SimulationServices.h"

class VtCLoadProgressDisplay;

/// Owns the data points and stands between them and everything that wants frames.
///
/// Loads the plug-ins, keeps the active point, runs the clock of the replay, and sends frames on their way. That way is
/// the same for all: a frame is taken from the active point, the frames of the delivery are collected, the receivers
/// get them, the listeners are told. It decides nothing about play state: the controller, which owns it, ticks the
/// clock and calls one of the frame operations in each step.
///
///     router.SelectPoint(L"OffSim");           // the one place where the choice is kept
///     router.GetClock().TickClock();
///     if (!router.GotoTime())                  // the frame for the clock's time, delivered and told
///         router.GotoLast();
///
/// Where an operation takes the name of a point, an empty one stands for the active point; names are compared without
/// regard to case. Frame operations are true if a frame was delivered. They must not be called from the destructor of
/// a scene object, since receivers may replace scene data. In steady state they allocate nothing.
class VtCSimulationDataRouter : public VtIChannelSource
{
public:
    using Point = SimulationDataPoints::VtCSimulationDataPoint;
    using Frame = SimulationDataPoints::VtCSimulationDataFrame;

    /// What `GetPointNames` takes in.
    enum NameFlags : unsigned
    {
        sources = 1,
        sinks = 2,
        scene = 4, ///< "Scene3D" at the end, provided there is a receiver
    };

    /// Loads the plug-ins; error message 303 if there is none.
    explicit VtCSimulationDataRouter(const VtTSimulationServices& hostServices);
    ~VtCSimulationDataRouter() override;
    VtCSimulationDataRouter(const VtCSimulationDataRouter&) = delete;
    VtCSimulationDataRouter& operator=(const VtCSimulationDataRouter&) = delete;

    // Plug-ins and points

    /// Unloads what is loaded, the active point included, and loads all kinds. Points that others made with
    /// `CreateFileDataPoint` live on.
    void LoadPlugins();

    /// False when the kind has no module. A module that gives no point counts as loaded; `GetPluginFaults` tells why.
    bool LoadPlugin(VtEDataPointKind kind);
    void UnloadPlugins();
    const std::vector<VtTPluginFault>& GetPluginFaults() const { return plugins.GetFaults(); }

    /// Takes a point whose code is the program's own.
    Point& AddPoint(VtTDataPointPtr point);

    /// A further point for motion data files; null without the File module.
    VtTDataPointPtr CreateFileDataPoint() { return plugins.MakePoint(VtEDataPointKind::File); }

    /// For all points, also those that come later.
    void SetFrameBufferSize(unsigned long frameCount);

    /// All points, in load order.
    const std::vector<VtTDataPointPtr>& GetPoints() const { return allPoints; }
    std::vector<std::wstring> GetPointNames(unsigned flags) const;

    /// Null for an empty or unknown name. Of several points with that name the last.
    Point* FindPoint(const std::wstring& name) const;

    /// The point that frames come from; null for none. At most one is active, with the index 0.
    Point* GetActivePoint(std::size_t index = 0) const { return index == 0 ? active : nullptr; }

    /// Its name, empty for none.
    const std::wstring& GetActivePointName(std::size_t index = 0) const;

    /// Makes a source the active point, and tells the point before it and the new one. Nothing happens for the active
    /// one, and for what isn't a source.
    void SelectPoint(const std::wstring& name);
    void DeselectPoint(const std::wstring& name);

    /// To be called after a point was configured: tells the listeners that the point of configuration `text` was
    /// selected, or with an empty text that there is none any more, and has channels and link states refreshed.
    void NotifyConfiguration(const std::wstring& text);

    // Channels

    /// Pose channel names of a point, asked and split anew.
    std::vector<std::wstring> GetChannels(const std::wstring& name, int variant) const;

    /// Pose channel names as they are stored at the source, and instrument streams, of the active point.
    VtTChannelLists GetChannelLists(int flag) const;

    /// Reads the channels of the active point anew and shows it on bodies. Where there are instrument streams, the
    /// instruments of the active scene go by name from now on.
    void RefreshChannelLists(int variant);

    /// The channels of the active point, kept between calls; empty lists without a point.
    const VtTChannelLists& GetActiveChannels() const;
    const std::vector<std::wstring>* GetCurrentChannels() const override;

    // Listeners and receivers, not owned

    void AddReceiver(VtCSimulationDataReceiver* receiver) { receivers.Add(receiver); }
    void RemoveReceiver(VtCSimulationDataReceiver* receiver) { receivers.Remove(receiver); }
    void AddChangeObject(VtCSimulationDataChangeObject* listener);
    void RemoveChangeObject(VtCSimulationDataChangeObject* listener) { changeObjects.Remove(listener); }
    void NotifyMode(VtESimulationMode mode);
    void NotifyPlayState(VtEPlayState state);

    // Frames

    /// The online step. True also without an active point; false when the source has nothing.
    bool FetchFrames();

    /// The replay step: the frame for the clock's time, or the next one of a point without time stamps. The clock must
    /// have been ticked before; likewise for `FetchFrames` and the spool.
    bool GotoTime(const std::wstring& name = {});
    bool GotoFirst(const std::wstring& name = {});
    bool GotoLast(const std::wstring& name = {});

    /// `index` from 1; one outside the buffer is taken to its end.
    bool GotoFrame(const std::wstring& name, long index);

    /// As it is: no clamping, and the clock stays.
    bool ShowFrame(const std::wstring& name, long index);
    bool GotoNext(const std::wstring& name = {});
    bool GotoPrevious(const std::wstring& name = {});
    bool StepBack(const std::wstring& name = {});

    /// The spool.
    bool RewindStep(const std::wstring& name = {});
    bool ForwardStep(const std::wstring& name = {});

    /// A single read while offline; whether the point had something.
    bool FetchOnce(const std::wstring& name = {});

    // Clock

    VtCReplayClock& GetClock() { return clock; }
    double GetCurrentTime() const { return clock.GetCurrentTime(); }
    void SetCurrentTime(double time) { clock.SetCurrentTime(time); }

    /// Starts the clock of a spool at the cursor; the spool ends at the ends of the data, also after a loop. False
    /// without an active point or a time there.
    bool BeginSpool(double speed);

    // Connection

    /// Connects the active point. False, and the listeners aren't told, if that failed.
    bool ConnectAll();
    void DisconnectAll();

    /// No active point, clock and frames back to the start.
    void Clear();

    // Messages of data points

    /// Of the active point; null without one, and while it has nothing to say.
    SimulationDataPoints::VtCMessageStack* GetMessageStack() const;
    void ResetMessageStack();

    /// Shows the messages of the active point, if there are any, and resets its stack.
    void ReportMessages();

    // What a point says

    /// 0 when nothing is buffered.
    unsigned long GetBufferedFrames(const std::wstring& name) const;

    /// Number of the frame at the cursor; 0 for none.
    unsigned long GetRecent(const std::wstring& name) const;

    /// Time of the frame at the cursor of the active point.
    std::optional<double> GetTimestampOfCurrent() const;
    std::wstring GetConfigurationText(const std::wstring& name, int variant) const;

    /// True if both its source type and its source path are set.
    bool IsConfigured(const std::wstring& name) const;

    /// Writes the buffer of the active point to a motion data file. `type` is "MDF".
    bool StoreFrameBuffer(const std::wstring& path, const std::wstring& type);

private:
    /// How a frame goes on once it is taken.
    enum class Way
    {
        online, ///< the clock is set to its time, and the listeners hear of it before the scene moves
        replay, ///< the clock is set to its time
        shown,  ///< the clock stays
    };

    /// A frame that was taken from a point.
    struct Taken
    {
        Point* point = nullptr;
        Frame* frame = nullptr; ///< null: the point had none
        unsigned long id = 0;
        std::optional<double> time; ///< nothing where times mean nothing
    };

    Point* Resolve(const std::wstring& name) const;
    void Activate(Point* point);
    void ReportMessages(Point& point);
    void ReadChannels(int variant) const;
    void RefreshReceivers();
    void ShowStatus();

    static Taken Timed(Point& point, Frame* frame, unsigned long id);
    static Taken TakeNewest(Point& point, double now);
    static Taken TakeAt(Point& point, double now);
    bool Send(const Taken& taken, Way way);
    void Collect(const Taken& taken);
    void Deliver();
    void Notify(const Taken& taken);
    bool SendNumbered(Point* point, long index, Way way);
    bool Spool(const std::wstring& name, bool backwards);

    VtTSimulationServices services;
    VtCDataPointPlugins plugins;
    VtCReplayClock clock;
    VtCRegistrationList<VtCSimulationDataReceiver> receivers;
    VtCRegistrationList<VtCSimulationDataChangeObject> changeObjects;
    std::vector<VtTDataPointPtr> allPoints;
    Point* active = nullptr;                               ///< also in `allPoints`
    SimulationDataPoints::VtCSimulationDataTracker frames; ///< of the present delivery
    unsigned long frameBufferSize = Point::defaultBufferFrames;
    std::unique_ptr<VtCLoadProgressDisplay> loadProgress;

    mutable VtTChannelLists channels;
    mutable bool channelsKnown = false;
    const void* deliveredLayout = nullptr; ///< of the last head frame: a new one means new channels
};

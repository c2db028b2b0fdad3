#pragma once

#include <cstddef>
#include <memory>
#include <string>
#include <vector>

#include "simdata/points/ChannelDescription.h"
#include "simdata/points/MessageStack.h"
#include "simdata/points/SimulationDataFrames.h"

namespace SimulationDataPoints
{

class VtCSettingsPage;
class VtCSimulationDataTracker;
class VtILoadProgress;

/// One source of frames: a motion data file, a live simulation, a network connection. Plug-ins derive from it.
///
/// The base keeps a frame buffer with a cursor and answers everything that can be told from it. A live point's buffer
/// is a ring of the size that `SetFrameBufferSize` gives; a point that loads a file holds all frames of the file.
/// Operations report failure by zero or null and put details on the message stack. User interface thread only; a
/// point with a thread of its own hides it behind these operations. Frame numbers count from 1. A frame that is handed
/// out stays valid as `VtCSimulationDataFrames` tells.
class VtCSimulationDataPoint
{
public:
    static constexpr std::size_t defaultBufferFrames = 10000;

    /// Seconds until a 32-bit count of milliseconds starts over: no clock made of one gets there.
    static constexpr double endlessTime = 4294967.296;

    /// `pointName` is unique among the loaded points without regard to case; it is the kind in configuration texts.
    explicit VtCSimulationDataPoint(std::wstring pointName);
    VtCSimulationDataPoint(const VtCSimulationDataPoint&) = delete;
    VtCSimulationDataPoint& operator=(const VtCSimulationDataPoint&) = delete;

    const std::wstring& GetName() const { return name; }

    /// "Name|Type|Path": the point's name, `GetSourceType` and `GetSourcePath`, the latter two empty when nothing is
    /// configured. In the first two "|" is written "%7C" and "%" "%25"; the path stands as it is, to the end.
    /// `variant` makes no difference here.
    std::wstring GetConfigurationInfoText(int variant) const;

    /// Splits such a text: the point's name, the type, the path. Any pointer may be null. Zero, and nothing is
    /// written, for a text that isn't one.
    static int ExtractConfigurationInfoText(const std::wstring& text, std::wstring* kind, std::wstring* type,
                                            std::wstring* source);

    /// Capacity of the buffer that the next connection fills, at least 1; frames already held move over, the newest
    /// where not all fit. The frames of a loaded file all stay: there the capacity is their number.
    void SetFrameBufferSize(unsigned long frames);
    int GetFrameBufferSizeEx() const;

    /// `count` is always set; non-zero if at least one frame is held.
    int GetBufferedFrames(unsigned long& count) const;

    /// Moves the cursor; zero, and it stays, if there is no such frame.
    int SetRecent(unsigned long frame);

    /// The frame at the cursor and its number; null without frames. After loading the cursor stands on 1; in a live
    /// point on the newest frame.
    VtCSimulationDataFrame* GetRecent(unsigned long& frame);

    /// As `VtCSimulationDataFrames::GetAtTime`; a found frame takes the cursor.
    VtCSimulationDataFrame* GetAtTime(double t);

    /// The frame at `start` minus `elapsed` times `speed`. `elapsed` comes from a clock that runs `speed` times as
    /// fast already; the second factor is meant so, and makes the spool faster the faster it is set.
    ///
    /// A repeating buffer goes on from its other end and sets `wrapped` to 1, which is 0 otherwise. A non-repeating
    /// one gives its first frame once when it passes it, and then null, which ends the spool: so the end is seen.
    VtCSimulationDataFrame* Rewind(double start, double elapsed, double speed, unsigned long& frame, int& wrapped);

    /// The same forwards, ending on the last frame.
    VtCSimulationDataFrame* FastForward(double start, double elapsed, double speed, unsigned long& frame, int& wrapped);

    /// Whether frames carry time stamps. Without them everything goes by frame number.
    int GetTimestampsSupported() const;
    void SetTimestampSupport(int supported);

    /// Time of the frame at the cursor; zero, and `t` stays, without frames or time stamps.
    int GetTimeStampOfCurrentElement(double& t) const;

    /// Bounds of the buffered time; zero, and `t` stays, without frames or time stamps. A point without an end of time
    /// tells 0 and `endlessTime`, so that a clock which loops between them never wraps it back into an earlier run.
    int GetFrameBufferEarliestTime(double& t) const;
    int GetFrameBufferLatestTime(double& t) const;

    /// 1: replay loops; 0: it stops at the end. Holds for later buffers too. Always non-zero.
    int SetFrameBufferRepeat(int repeat);

    /// The instrument streams, in the order of `GetInstrumentChannelNames`, with the units of their values where the
    /// description knows them.
    std::vector<VtTInstrumentStream> GetInstrumentStreams(int flag) const;

    /// Tells a time-driven point the present time, before it is asked for a frame.
    void SetSimulationTime(double t);

    /// A new buffer with copies of all frames, which the caller owns; null without a buffer.
    VtCSimulationDataFrames* CopySimulationFrameBuffer() const;

    /// Hands the buffer to the caller, who owns it from then on; null when there is none any more.
    VtCSimulationDataFrames* RelinquishFrameBuffer();

    /// The buffer's; 2 without one.
    TRACK_SAFETY GetFrameBufferTrackSafety() const;

    /// Whether opening the point starts to stream frames at once (1, as after creation). 0 is for a look at what a
    /// source holds without its frames.
    void SetInitialStreamMode(int mode) { streamMode = mode; }
    int GetInitialStreamMode() const { return streamMode; }

    /// Number under which a long load reports to the progress display, -1 for none.
    void SetProgressBarActivityID(long id) { progressActivity = id; }

    /// Null while there is nothing to say.
    VtCMessageStack* GetMessageStack() { return messages.IsEmpty() ? nullptr : &messages; }
    void ResetMessageStack() { messages.Reset(); }

    /// The progress display of all points of the process; not owned, null for none.
    static void SetLoadProgress(VtILoadProgress* progress);

    virtual ~VtCSimulationDataPoint();

    /// Stops streaming and closes the source. Buffered frames stay. Harmless when not connected.
    virtual void Disconnect() = 0;

    /// Opens the source and starts. Zero on failure.
    virtual int Connect() = 0;

    /// What is configured, both empty if nothing is. The path of a file point is in the backslash form.
    virtual void GetSourceType(std::wstring& type) const = 0;
    virtual void GetSourcePath(std::wstring& path) const = 0;

    /// Sets the source. With the type "MDF" the path is a motion data file: `mode` 1 reads it, and a mode made by
    /// `MotionDataWriteMode` writes it. Zero on failure.
    virtual int Configure(const std::wstring& type, const std::wstring& path, int mode, int flags) = 0;

    /// True if frames can be walked in a buffer.
    virtual int IsBuffered() const { return 1; }

    /// True if the point can be chosen as the active source.
    virtual int IsSource() const { return 1; }

    /// True if the point is an output only.
    virtual int IsSink() const { return 0; }

    /// True if `FetchOnce` may be called while offline.
    virtual int CanRefresh() const { return 0; }

    /// True if choosing the point should fetch its data at once when its buffer is empty.
    virtual int CanPreload() const { return 0; }

    /// Names of the pose channels with "|" between them. Their number: zero when the point has none yet.
    virtual int GetChannelNames(std::wstring& names, int variant) const;

    /// Reads whatever is there into the buffer; non-zero if there is something.
    virtual int FetchOnce() { return 0; }

    /// Moves the cursor one frame on or back. Null at the end, and the cursor stays; a repeat flag makes no difference.
    virtual VtCSimulationDataFrame* GetNextFrame(unsigned long& frame);
    virtual VtCSimulationDataFrame* GetPreviousFrame(unsigned long& frame);

    /// Output side: appends the frames. A point that writes nothing leaves it alone.
    virtual void WriteFrames(VtCSimulationDataTracker&) {}

    /// Online: the newest frame there is, and its number. Null when the source has nothing, which counts as failed.
    virtual VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) = 0;

    /// A page for the point's own settings, which the caller deletes; null for a point without any.
    virtual VtCSettingsPage* CreatePropertyPage() { return nullptr; }

    /// The point becomes the chosen one, or is no longer.
    virtual void OnSelect() {}
    virtual void OnDeselect() {}

    /// Replaces `names` by the names of the instrument streams; their number.
    virtual int GetInstrumentChannelNames(std::vector<std::wstring>& names, int flag) const;

    /// Replaces `names` by the names of the pose channels as they are stored at the source.
    virtual void GetBodyChannelNames(std::vector<std::wstring>& names, int flag) const;

    /// Output side: the channels of what is to be written.
    virtual void SetChannelNames(const std::vector<std::wstring>&) {}
    virtual void SetInstrumentChannelNames(const std::vector<std::wstring>&) {}
    virtual void SetBodyChannelNames(const std::vector<std::wstring>&) {}

    /// True if the point plays by time, so that it must be told the time.
    virtual int IsTimeDriven() const { return 0; }

    /// The buffer's safety; `messageId` is the message for the user, 0 when it is safe.
    virtual TRACK_SAFETY GetTrackSafety(int& messageId) const;
    virtual void SetTrackSafety(TRACK_SAFETY) {}

    /// Back to the state after creation; buffer size, repeat flag, activity and kind stay.
    virtual void Reset();

    virtual void SetKind(int newKind) { kind = newKind; }
    int GetKind() const { return kind; }

    /// Called once before deletion.
    virtual void Release() { Disconnect(); }

protected:
    /// The channels that the point has, known before there is a frame; null for none.
    void SetDescription(std::shared_ptr<const VtTChannelDescription> channels);
    const VtTChannelDescription* GetDescription() const { return description.get(); }

    /// An empty ring for frames of the present description; the old buffer goes. False, with a message, when there is
    /// no description, it has a fault, or there is no memory.
    bool StartBuffer();

    /// Adds a frame and moves the cursor to it. Only with a buffer.
    VtCFrameRecord AppendFrame(double time);

    /// Takes a loaded buffer, its description and its time stamp support; the cursor goes to frame 1.
    void TakeBuffer(std::unique_ptr<VtCSimulationDataFrames> loaded);

    VtCSimulationDataFrames* GetBuffer() const { return buffer.get(); }
    void DropBuffer();

    /// Moves the cursor to the frame of that index (from 0) and hands it out.
    VtCSimulationDataFrame* MoveTo(std::size_t index, unsigned long& frame);

    /// The newest frame, with the cursor on it; null without frames.
    VtCSimulationDataFrame* NewestFrame(unsigned long& frame);

    /// For a live point that is driven by time: with every connection its time starts at 0, and it has no end.
    void SetEndlessTime(bool endless) { timeEndless = endless; }

    /// The time that `SetSimulationTime` told; nothing since the last `ForgetSimulationTime`.
    const double* GetSimulationTime() const { return simulationTimeKnown ? &simulationTime : nullptr; }
    void ForgetSimulationTime() { simulationTimeKnown = false; }

    VtCMessageStack& Messages() { return messages; }
    long GetProgressBarActivityID() const { return progressActivity; }
    static VtILoadProgress* GetLoadProgress();

private:
    VtCSimulationDataFrame* Spool(double t, bool backwards, unsigned long& frame, int& wrapped);

    std::wstring name;
    int kind = 0;
    int streamMode = 1;
    long progressActivity = -1;
    std::size_t bufferFrames = defaultBufferFrames;
    bool bufferLoaded = false; ///< the buffer came whole, from a file, and isn't bound to `bufferFrames`
    bool repeat = false;
    bool timeStamps = true;
    bool timeEndless = false;
    double simulationTime = 0.0;
    bool simulationTimeKnown = false;
    std::shared_ptr<const VtTChannelDescription> description;
    std::unique_ptr<VtCSimulationDataFrames> buffer;
    std::size_t cursor = 0;
    VtCMessageStack messages;
};

/// The mode for `Configure` that writes a file of so many frames: 2 in the low 16 bits, the number in the high ones,
/// which end at 65535 and then mean that or more. Such a file appears under its name on `Disconnect`, whole. A plain 2
/// records for an unknown time: the file grows under its name frame by frame.
constexpr int MotionDataWriteMode(unsigned long frames)
{
    const unsigned long known = frames < 1 ? 1 : frames > 0xFFFF ? 0xFFFF : frames;
    return static_cast<int>(static_cast<unsigned>(known) << 16 | 2U);
}

} // namespace SimulationDataPoints

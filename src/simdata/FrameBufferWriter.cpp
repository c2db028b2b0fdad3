#include "simdata/FrameBufferWriter.h"

#include <algorithm>

#include "base/Text.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "simdata/points/SimulationDataPoint.h"
#include "simdata/points/SimulationDataTracker.h"

using namespace SimulationDataPoints;

namespace
{

constexpr long storeActivity = 32;
constexpr long frameActivity = 44;
constexpr std::uint32_t textStoring = 7008;
constexpr std::uint32_t textFrame = 7007; ///< %1: the number of the frame

bool HasErrors(VtCSimulationDataPoint& point)
{
    const VtCMessageStack* stack = point.GetMessageStack();
    return stack && std::any_of(stack->GetMessages().begin(), stack->GetMessages().end(),
                                [](const VtTMessage& m) { return m.severity == VtEMessageSeverity::error; });
}

/// The two activities, closed however the writing ends.
class StoreProgress
{
public:
    StoreProgress(const VtTSimulationServices& services, unsigned long count)
        : progress(services.progress), frameText(services.texts.GetText(textFrame))
    {
        if (!progress)
            return;
        progress->ConnectProgressActivity(storeActivity, {}, services.texts.GetText(textStoring));
        progress->SetProgresStepCount(storeActivity, 2);
        progress->ConnectProgressActivity(frameActivity, {}, {});
        progress->SetProgresStepCount(frameActivity, static_cast<long>(count));
        progress->StepProgressActivity(storeActivity);
    }
    ~StoreProgress()
    {
        if (!progress)
            return;
        progress->StepProgressActivity(storeActivity);
        progress->DisconnectProgressActivity(frameActivity);
        progress->DisconnectProgressActivity(storeActivity);
    }
    StoreProgress(const StoreProgress&) = delete;
    StoreProgress& operator=(const StoreProgress&) = delete;

    void Show(unsigned long frame) const
    {
        if (progress)
            progress->SetProgressDescription(frameActivity, base::Replace(frameText, L"%1", std::to_wstring(frame)));
    }
    void Step() const
    {
        if (progress)
            progress->StepProgressActivity(frameActivity);
    }

private:
    host::Progress* progress;
    std::wstring frameText;
};

} // namespace

bool VtCFrameBufferWriter::Write(VtCSimulationDataPoint& source, unsigned long count, VtCSimulationDataPoint& writer,
                                 const std::wstring& path, const std::wstring& type) const
{
    bool written = writer.Configure(type, path, MotionDataWriteMode(count), 0) && writer.Connect() &&
                   WriteFrames(source, count, writer);
    writer.Disconnect();
    // A full disk shows no earlier than here: frames are handed over without a result.
    return written && !HasErrors(writer);
}

bool VtCFrameBufferWriter::WriteFrames(VtCSimulationDataPoint& source, unsigned long count,
                                       VtCSimulationDataPoint& writer) const
{
    const StoreProgress progress(services, count);
    unsigned long cursor = 0;
    source.GetRecent(cursor);

    unsigned long number = 0;
    source.SetRecent(1);
    VtCSimulationDataFrame* frame = source.GetRecent(number);
    VtCSimulationDataTracker single;
    single.SetSimulationDataPoints(source.GetName());
    // Counted, since a source that starts over at its end would never stop.
    unsigned long done = 0;
    for (; frame && done < count; ++done)
    {
        progress.Show(number);
        single.RemoveAll();
        single.AddHead(frame);
        writer.WriteFrames(single);
        frame = source.GetNextFrame(number);
        progress.Step();
    }
    source.SetRecent(cursor);
    return done == count;
}

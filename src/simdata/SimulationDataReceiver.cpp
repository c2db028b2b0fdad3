#include "simdata/SimulationDataReceiver.h"

#include "base/Text.h"
#include "scene/MovableBodies.h"
#include "scene/Scene3D.h"
#include "simdata/InstrumentFeed.h"
#include "simdata/points/SimulationDataFrame.h"
#include "simdata/points/SimulationDataTracker.h"
#include "simdata/SimulationServices.h"

using namespace SimulationDataPoints;

namespace
{

void MoveBodies(VtCMovableBodies& bodies, VtCSimulationDataFrame& frame)
{
    // Data multiply a point from the right, the scene from the left: the rows of one are the other's columns.
    for (VtTBodyMotion* motion : bodies.GetMotions())
    {
        const std::int32_t index = motion->simulationDataIndex; // -1 for no channel, which no frame has
        if (const float* pose = frame.GetPose(index))
            motion->SetLastTransformColumns(pose);
        else if (const VtCSimulationData* data = frame.GetSimulationData(index))
        {
            float columns[4][4];
            data->GetMatrix4x4(columns);
            motion->SetLastTransformColumns(columns[0]);
        }
    }
}

/// The older addressing: twelve streams in the elements of one channel, which stand at the end of the frame.
constexpr int elementsPerChannel = 12;

void FeedByNumber(VtIFedInstrument& instrument, VtCSimulationDataFrame& head)
{
    VtTInstrumentVariant value;
    const std::int32_t stream = instrument.GetStreamNumber();
    // 13 and not 12: so stream 12 is the last of its channel, and stream 25 comes back to the first element of the
    // last one.
    const VtCSimulationData* data =
        stream > 0 ? head.GetSimulationData(head.GetCount() + stream / (elementsPerChannel + 1) - 2L) : nullptr;
    if (data)
    {
        float m[4][4];
        data->GetMatrix4x4(m);
        const int element = (stream - 1) % elementsPerChannel;
        value.value = m[element / 3][element % 3];
    }
    instrument.SetValue(value);
}

} // namespace

void VtCSimulationDataReceiver::ApplyFrames(const VtCSimulationDataTracker& frames, const VtTChannelLists& channels)
{
    VtCScene3D* scene = activeScene.GetActiveScene();
    VtCSimulationDataFrame* head = frames.GetHead();
    if (!scene || !head)
        return;

    for (auto position = frames.GetHeadPosition(); position != 0;)
    {
        VtCSimulationDataFrame* frame = frames.GetNext(position);
        VtCMovableBodies* bodies = scene->GetMovableBodies(static_cast<int>(frame->GetTrackID()));
        if (!bodies)
            break;
        MoveBodies(*bodies, *frame);
    }
    if (VtIInstrumentFeed* feed = activeScene.GetActiveInstruments())
        FeedInstruments(*feed, *head, channels);
}

void VtCSimulationDataReceiver::FeedInstruments(VtIInstrumentFeed& feed, VtCSimulationDataFrame& head,
                                                const VtTChannelLists& channels)
{
    const std::vector<VtIFedInstrument*>& instruments = feed.GetFedInstruments();
    if (!channels.instruments.empty())
        FeedByName(instruments, head, channels);
    else if (feed.GetDataMode() == VtEInstrumentDataMode::LegacyStreams)
        for (VtIFedInstrument* instrument : instruments)
            FeedByNumber(*instrument, head);
}

void VtCSimulationDataReceiver::FeedByName(const std::vector<VtIFedInstrument*>& instruments,
                                           VtCSimulationDataFrame& head, const VtTChannelLists& channels)
{
    if (boundRevision != channels.revision)
    {
        bindings.clear();
        boundRevision = channels.revision;
    }
    const long first = static_cast<long>(channels.poses.size());
    for (std::size_t i = 0; i < instruments.size(); ++i)
    {
        VtTInstrumentVariant value;
        const long stream = FindStream(i, *instruments[i], channels);
        const VtCSimulationData* data = stream < 0 ? nullptr : head.GetSimulationData(first + stream);
        if (data && data->isInstrumentStream())
            data->getInstrumentValue(value);
        instruments[i]->SetValue(value);
    }
}

long VtCSimulationDataReceiver::FindStream(std::size_t at, const VtIFedInstrument& instrument,
                                           const VtTChannelLists& channels)
{
    const std::wstring& signal = instrument.GetSignalName();
    if (at < bindings.size() && bindings[at].instrument == &instrument && bindings[at].signal == signal)
        return bindings[at].position;

    Binding found{&instrument, signal, -1};
    for (std::size_t i = 0; i < channels.instruments.size() && found.position < 0; ++i)
        if (base::EqualsNoCase(channels.instruments[i].name, signal))
            found.position = static_cast<long>(i);
    if (at >= bindings.size())
        bindings.resize(at + 1);
    bindings[at] = std::move(found);
    return bindings[at].position;
}

#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "simdata/points/ChannelDescription.h"

namespace SimulationDataPoints
{
class VtCSimulationDataFrame;
class VtCSimulationDataTracker;
} // namespace SimulationDataPoints

class VtIActiveScene;
class VtIFedInstrument;
class VtIInstrumentFeed;

/// The channels of the active data point, in the order they have in its frames: poses, then instrument streams.
struct VtTChannelLists
{
    std::vector<std::wstring> poses;
    std::vector<SimulationDataPoints::VtTInstrumentStream> instruments; ///< with the units of their values

    /// Another number after every reading of the lists, so that positions found in them can be kept until then.
    std::uint64_t revision = 0;
};

/// Carries a delivery into the scene: moves the bodies and sets the instruments' values.
///
/// Each document makes one, registers it with the router and removes it before it goes. It works on the scene of the
/// active document, whichever that is: with two documents open the active scene is served twice, with none nothing
/// happens.
class VtCSimulationDataReceiver
{
public:
    explicit VtCSimulationDataReceiver(const VtIActiveScene& scene) : activeScene(scene) {}

    /// Bodies first, each from the frame of its track: a body whose channel the frame doesn't have stays where it is.
    /// Then the instruments, from the head frame. `channels` are those of the active point.
    void ApplyFrames(const SimulationDataPoints::VtCSimulationDataTracker& frames, const VtTChannelLists& channels);

private:
    struct Binding
    {
        const VtIFedInstrument* instrument;
        std::wstring signal;
        long position; ///< among the instrument streams, -1 for none
    };

    void FeedInstruments(VtIInstrumentFeed& feed, SimulationDataPoints::VtCSimulationDataFrame& head,
                         const VtTChannelLists& channels);
    void FeedByName(const std::vector<VtIFedInstrument*>& instruments,
                    SimulationDataPoints::VtCSimulationDataFrame& head, const VtTChannelLists& channels);
    long FindStream(std::size_t at, const VtIFedInstrument& instrument, const VtTChannelLists& channels);

    const VtIActiveScene& activeScene;
    std::vector<Binding> bindings; ///< what was found by name, by place in the list of instruments
    std::uint64_t boundRevision = 0;
};

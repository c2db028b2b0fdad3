#include "simdata/points/SimulationDataFrame.h"

#include <utility>

#include "simdata/points/ChannelDescription.h"

namespace SimulationDataPoints
{

VtCSimulationDataFrame::VtCSimulationDataFrame(std::shared_ptr<const VtTChannelDescription> layout)
    : description(std::move(layout)), poseCount(description->poses.size())
{
    channels.reserve(description->ChannelCount());
    for (std::size_t pose = 0; pose < description->poses.size(); ++pose)
        channels.push_back({*this, static_cast<std::uint32_t>(description->PoseOffset(pose)), false});
    for (std::size_t stream = 0; stream < description->instruments.size(); ++stream)
        channels.push_back({*this, static_cast<std::uint32_t>(description->InstrumentOffset(stream)), true});
}

} // namespace SimulationDataPoints

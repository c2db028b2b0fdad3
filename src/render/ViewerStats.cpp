#include "render/ViewerStats.h"

VtCOsgViewerStats::VtCOsgViewerStats(const std::string& name) : osg::Stats(name) {}

void VtCOsgViewerStats::SetFrameValue(unsigned int frameNumber, const char* name, double value)
{
    const OpenThreads::ScopedLock<OpenThreads::Mutex> lock(_mutex);
    if (frameNumber > _latestFrameNumber)
        BeginFramesUpTo(frameNumber);

    const int index = getIndex(frameNumber);
    if (index < 0)
        return;

    AttributeMap& attributes = _attributeMapList[static_cast<std::size_t>(index)];
    const auto known = attributes.find(name);
    if (known != attributes.end())
        known->second = value;
    else if (spare.empty())
        attributes.emplace(name, value);
    else
    {
        AttributeMap::node_type node = std::move(spare.back());
        spare.pop_back();
        node.key() = name;
        node.mapped() = value;
        attributes.insert(std::move(node));
    }
}

void VtCOsgViewerStats::BeginFramesUpTo(unsigned int frameNumber)
{
    const auto frames = static_cast<unsigned int>(_attributeMapList.size());
    for (unsigned int frame = _latestFrameNumber + 1; frame <= frameNumber; ++frame)
    {
        AttributeMap& attributes = _attributeMapList[(frame - _baseFrameNumber) % frames];
        while (!attributes.empty())
            spare.push_back(attributes.extract(attributes.begin()));
    }
    if (frameNumber - _baseFrameNumber >= frames)
        _baseFrameNumber = frameNumber / frames * frames;
    _latestFrameNumber = frameNumber;
}

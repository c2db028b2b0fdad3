#pragma once

#include <vector>

#include <osg/Stats>

/// The viewer's statistics, written in every frame without touching the heap.
///
/// The base class throws away the values of the oldest frame and allocates those of the new one; here the new ones
/// move into the places of the old. Reading is the base class's.
class VtCOsgViewerStats : public osg::Stats
{
public:
    explicit VtCOsgViewerStats(const std::string& name);

    /// As `setAttribute`: the value of `name` in `frameNumber`, which may be new or one of the kept frames.
    void SetFrameValue(unsigned int frameNumber, const char* name, double value);

private:
    void BeginFramesUpTo(unsigned int frameNumber);

    std::vector<AttributeMap::node_type> spare;
};

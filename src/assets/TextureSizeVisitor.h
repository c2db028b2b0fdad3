#pragma once

#include <map>

#include <osg/NodeVisitor>

namespace osg
{
class StateSet;
class Texture2D;
} // namespace osg

/// The memory of the textures in the units 0 to 7 below a node; one that is used often counts once.
class VtCOsgTextureSizeVisitor : public osg::NodeVisitor
{
public:
    VtCOsgTextureSizeVisitor() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    using osg::NodeVisitor::apply;
    void apply(osg::Node& node) override;
    void apply(osg::Geode& geode) override;

    /// The sum of all sizes, in bytes for an `exponent` below 1, in KB for 1, in MB for 2.
    float getTotalSize(int exponent) const;

    std::map<const osg::Texture2D*, float> textureSizes; ///< bytes

private:
    void Examine(const osg::StateSet* state);
};

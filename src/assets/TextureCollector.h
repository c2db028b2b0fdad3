#pragma once

#include <string>
#include <unordered_set>
#include <vector>

#include <osg/NodeVisitor>

namespace osg
{
class StateSet;
}

/// The image files of the textures in unit 0 below a node: those of nodes, and of drawables.
class VtCOsgTextureCollector : public osg::NodeVisitor
{
public:
    VtCOsgTextureCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    using osg::NodeVisitor::apply;
    void apply(osg::Node& node) override;
    void apply(osg::Geode& geode) override; ///< its drawables; its own state set isn't looked at

    std::vector<std::wstring> fileNames; ///< each once, in order of first appearance

private:
    bool WasSeen(const osg::Node& node);
    void Examine(const osg::StateSet* state);

    std::unordered_set<const osg::Node*> shared; ///< below several parents: hundreds of bodies may show one model
};

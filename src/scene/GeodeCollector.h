#pragma once

#include <vector>

#include <osg/Geode>
#include <osg/NodeVisitor>

/// Lists every geode below a node, in traversal order.
class VtCOsgGeodeCollector : public osg::NodeVisitor
{
public:
    VtCOsgGeodeCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Geode& geode) override
    {
        geodes.push_back(&geode);
        traverse(geode);
    }

    std::vector<osg::Geode*> geodes;
};

#pragma once

#include <utility>
#include <vector>

#include <osg/NodeVisitor>
#include <osg/Program>
#include <osg/ref_ptr>
#include <osg/StateSet>

/// Lists the state sets below a node that hold a program, each with its program and only once.
class VtCOsgShaderCollector : public osg::NodeVisitor
{
public:
    VtCOsgShaderCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Node& node) override;

    std::vector<std::pair<osg::ref_ptr<osg::StateSet>, osg::ref_ptr<osg::Program>>> programs;
};

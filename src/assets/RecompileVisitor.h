#pragma once

#include <vector>

#include <osg/Geode>
#include <osg/NodeVisitor>

/// Has the display lists of all drawables below a node compiled anew, for another graphics context.
class VtCOsgRecompileVisitor : public osg::NodeVisitor
{
public:
    VtCOsgRecompileVisitor() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    using osg::NodeVisitor::apply;
    void apply(osg::Geode& geode) override
    {
        std::vector<osg::ref_ptr<osg::Drawable>> drawables;
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
            drawables.emplace_back(geode.getDrawable(i));
        for (const osg::ref_ptr<osg::Drawable>& drawable : drawables)
            drawable->dirtyDisplayList();
    }
};

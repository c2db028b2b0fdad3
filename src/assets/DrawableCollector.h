#pragma once

#include <vector>

#include <osg/Geode>
#include <osg/NodeVisitor>

#include "assets/AssetManager.h"

/// The drawables below a node, in visiting order; one that is used twice comes twice.
class VtCOsgAssetManager::VtCOsgDrawableCollector : public osg::NodeVisitor
{
public:
    VtCOsgDrawableCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    using osg::NodeVisitor::apply;
    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
            drawables.push_back(geode.getDrawable(i));
    }

    std::vector<osg::Drawable*> drawables;
};

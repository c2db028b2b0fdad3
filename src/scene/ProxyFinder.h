#pragma once

#include <vector>

#include <osg/NodeVisitor>
#include <osg/ProxyNode>

/// Lists every proxy node below a node, in traversal order.
class VtCOsgProxyFinder : public osg::NodeVisitor
{
public:
    VtCOsgProxyFinder() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::ProxyNode& proxy) override
    {
        proxies.push_back(&proxy);
        traverse(proxy);
    }

    std::vector<osg::ProxyNode*> proxies;
};

#pragma once

#include <map>
#include <utility>
#include <vector>

#include <osg/Geode>
#include <osg/Material>
#include <osg/NodeVisitor>
#include <osg/Program>
#include <osg/ProxyNode>
#include <osg/ref_ptr>
#include <osg/Referenced>
#include <osg/StateSet>
#include <osg/Vec4f>

/// What the bodies look for below their nodes: each visitor lists one kind of thing, in traversal order.

/// A material with the values that it had when the record was made.
class VtCOsgMatMapObject : public osg::Referenced
{
public:
    explicit VtCOsgMatMapObject(osg::Material& source);
    VtCOsgMatMapObject(const VtCOsgMatMapObject& other);

    osg::ref_ptr<osg::Material> material;
    osg::Vec4f diffuse;
    osg::Vec4f specular;
    osg::Vec4f ambient;
    float shininess;
};

/// Materials by the drawable whose own state set holds them. The model that holds the drawables outlives the map.
using VtTMaterialMap = std::map<osg::Drawable*, osg::ref_ptr<VtCOsgMatMapObject>>;

/// A map with records of its own, of the same materials.
VtTMaterialMap CopyRecords(const VtTMaterialMap& source);

/// Gathers the materials of every drawable of every geode below a node.
class VtCOsgNodeMaterialCollector : public osg::NodeVisitor
{
public:
    VtCOsgNodeMaterialCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Geode& geode) override;

    VtTMaterialMap materials;
};

/// Lists the state sets below a node that hold a program, each with its program and only once.
class VtCOsgShaderCollector : public osg::NodeVisitor
{
public:
    VtCOsgShaderCollector() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Node& node) override;

    std::vector<std::pair<osg::ref_ptr<osg::StateSet>, osg::ref_ptr<osg::Program>>> programs;
};

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

#pragma once

#include <map>

#include <osg/Geode>
#include <osg/Material>
#include <osg/NodeVisitor>
#include <osg/ref_ptr>
#include <osg/Referenced>
#include <osg/Vec4f>

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

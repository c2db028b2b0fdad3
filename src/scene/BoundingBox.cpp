#include "scene/BoundingBox.h"

#include <osg/ComputeBoundsVisitor>
#include <osg/Geode>
#include <osg/Geometry>
#include <osg/LineWidth>

namespace
{

// Corners of the faces; bit 0 of a corner is x, bit 1 y, bit 2 z.
constexpr unsigned faces[6][4] = {
    {0, 1, 3, 2}, {4, 5, 7, 6}, // bottom, top
    {0, 1, 5, 4}, {2, 3, 7, 6}, // front, back
    {0, 2, 6, 4}, {1, 3, 7, 5}, // left, right
};

} // namespace

osg::ref_ptr<osg::Node> MakeBoundingBox(osg::Group& node)
{
    osg::ComputeBoundsVisitor bounds(osg::NodeVisitor::TRAVERSE_ALL_CHILDREN);
    // Only what lies below the node: its own matrix will move the box along with it.
    node.traverse(bounds);
    const osg::BoundingBox box = bounds.getBoundingBox();
    if (!box.valid())
        return nullptr;

    osg::ref_ptr<osg::Vec3Array> vertices = new osg::Vec3Array;
    osg::ref_ptr<osg::Geometry> geometry = new osg::Geometry;
    for (const auto& face : faces)
    {
        geometry->addPrimitiveSet(new osg::DrawArrays(GL_LINE_LOOP, static_cast<int>(vertices->size()), 4));
        for (unsigned corner : face)
            vertices->push_back(box.corner(corner));
    }
    geometry->setVertexArray(vertices);

    osg::ref_ptr<osg::Vec3Array> normals = new osg::Vec3Array;
    normals->push_back(osg::Vec3(0, 0, 1));
    geometry->setNormalArray(normals, osg::Array::BIND_OVERALL);
    osg::ref_ptr<osg::Vec4Array> colours = new osg::Vec4Array;
    colours->push_back(osg::Vec4(1, 1, 1, 1));
    geometry->setColorArray(colours, osg::Array::BIND_OVERALL);

    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->setName(node.getName() + "_bbox");
    geode->addDrawable(geometry);
    geode->getOrCreateStateSet()->setAttributeAndModes(new osg::LineWidth(2.0F),
                                                       osg::StateAttribute::ON | osg::StateAttribute::PROTECTED);
    return geode;
}

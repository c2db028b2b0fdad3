#pragma once

#include <osg/Geode>
#include <osg/Geometry>
#include <osg/MatrixTransform>
#include <osg/Program>
#include <osg/ShapeDrawable>

/// Small scenes that the tests of the viewer draw.
namespace scenes
{

inline osg::ref_ptr<osg::Geode> Box(const osg::Vec3& centre, float size, const osg::Vec4& colour)
{
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    osg::ref_ptr<osg::ShapeDrawable> shape = new osg::ShapeDrawable(new osg::Box(centre, size));
    shape->setColor(colour);
    geode->addDrawable(shape);
    return geode;
}

/// Red, green and blue, side by side along x.
inline osg::ref_ptr<osg::Group> Boxes()
{
    osg::ref_ptr<osg::Group> scene = new osg::Group;
    scene->addChild(Box(osg::Vec3(-2, 0, 0), 1.5f, osg::Vec4(1, 0, 0, 1)));
    scene->addChild(Box(osg::Vec3(0, 0, 0), 1.5f, osg::Vec4(0, 1, 0, 1)));
    scene->addChild(Box(osg::Vec3(2, 0, 0), 1.5f, osg::Vec4(0, 0, 1, 1)));
    return scene;
}

/// An unlit upright square of the plane y = `depth`, `size` wide, around `centre` (x, z).
inline osg::ref_ptr<osg::Geode> Square(const osg::Vec2& centre, float depth, float size, const osg::Vec4& colour)
{
    const osg::Vec3 corner(centre.x() - size / 2, depth, centre.y() - size / 2);
    osg::ref_ptr<osg::Geometry> geometry =
        osg::createTexturedQuadGeometry(corner, osg::Vec3(size, 0, 0), osg::Vec3(0, 0, size));
    osg::ref_ptr<osg::Vec4Array> colours = new osg::Vec4Array(osg::Array::BIND_OVERALL);
    colours->push_back(colour);
    geometry->setColorArray(colours);
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->addDrawable(geometry);
    geode->getOrCreateStateSet()->setMode(GL_LIGHTING, osg::StateAttribute::OFF);
    return geode;
}

inline osg::ref_ptr<osg::Program> Program(const char* fragment)
{
    osg::ref_ptr<osg::Program> program = new osg::Program;
    program->addShader(new osg::Shader(osg::Shader::FRAGMENT, fragment));
    return program;
}

} // namespace scenes

#pragma once

#include <osg/BlendFunc>
#include <osg/Geode>
#include <osg/Geometry>
#include <osg/LightSource>
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

/// Something of everything that changes state and order: transparent boxes, boxes in bins of their own, programs that
/// use the frame's uniforms, two lights, a stateset at several depths. `moving` receives the transforms of its bodies.
inline osg::ref_ptr<osg::Group> Crowd(std::vector<osg::ref_ptr<osg::MatrixTransform>>& moving)
{
    osg::ref_ptr<osg::Group> scene = new osg::Group;
    osg::ref_ptr<osg::LightSource> lamp = new osg::LightSource;
    lamp->getLight()->setLightNum(1);
    lamp->getLight()->setPosition(osg::Vec4(5, -10, 10, 1));
    lamp->getLight()->setDiffuse(osg::Vec4(0.4f, 0.4f, 0.1f, 1));
    scene->addChild(lamp);
    scene->getOrCreateStateSet()->setMode(GL_LIGHT1, osg::StateAttribute::ON);

    const osg::ref_ptr<osg::Program> program =
        Program("#version 120\nuniform mat4 osg_ViewMatrix;\n"
                "void main() { gl_FragColor = vec4(abs(osg_ViewMatrix[3].xyz) / 40.0, 1.0); }");
    for (int index = 0; index < 60; ++index)
    {
        const osg::Vec4 colour(index % 3 / 2.0f, index % 5 / 4.0f, index % 7 / 6.0f, index % 4 == 0 ? 0.4f : 1.0f);
        const osg::ref_ptr<osg::Geode> box = Box(osg::Vec3(), 1.2f, colour);
        if (index % 4 == 0)
        {
            box->getOrCreateStateSet()->setAttributeAndModes(new osg::BlendFunc);
            box->getStateSet()->setRenderingHint(osg::StateSet::TRANSPARENT_BIN);
        }
        if (index % 11 == 3)
            box->getOrCreateStateSet()->setAttributeAndModes(program);
        if (index % 9 == 5)
            box->getOrCreateStateSet()->setRenderBinDetails(index % 2 ? -1 : 20, "RenderBin");

        moving.push_back(new osg::MatrixTransform);
        moving.back()->setDataVariance(osg::Object::DYNAMIC);
        moving.back()->addChild(box);
        osg::ref_ptr<osg::Group> group = new osg::Group;
        if (index % 6 == 1)
            group->getOrCreateStateSet()->setMode(GL_CULL_FACE, osg::StateAttribute::ON);
        group->addChild(moving.back());
        scene->addChild(group);
    }
    return scene;
}

/// Places the bodies of a crowd for `step`; some are always on their way into or out of the picture.
inline void MoveCrowd(std::vector<osg::ref_ptr<osg::MatrixTransform>>& moving, int step)
{
    for (std::size_t index = 0; index < moving.size(); ++index)
    {
        const auto column = static_cast<double>(index % 10);
        const auto row = static_cast<double>(index / 10);
        moving[index]->setMatrix(osg::Matrixd::rotate(0.1 * step + column, osg::Vec3d(0, 0, 1)) *
                                 osg::Matrixd::translate(3 * column - 13.5 + 4 * std::sin(0.2 * step + row),
                                                         2 * row - 5, std::sin(0.1 * step + column)));
    }
}

} // namespace scenes

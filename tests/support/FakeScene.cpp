#include "tests/support/FakeScene.h"

#include <osg/CopyOp>
#include <osg/Geometry>
#include <osg/Material>
#include <osg/Texture2D>

#include "scene/Scene3D.h"

namespace fake
{

osg::Group* ModelLibrary::loadModel(const std::wstring& path, bool useVrmlTransform)
{
    loads.emplace_back(path, useVrmlTransform);
    osg::ref_ptr<osg::Group>& model = models[path];
    if (!model)
        model = new osg::Group;
    return model;
}

osg::Node* ModelLibrary::clone(const osg::Node* node)
{
    using Copy = osg::CopyOp;
    if (!node)
        return nullptr;
    ++clones;
    const Copy copy(Copy::DEEP_COPY_OBJECTS | Copy::DEEP_COPY_NODES | Copy::DEEP_COPY_DRAWABLES |
                    Copy::DEEP_COPY_STATESETS | Copy::DEEP_COPY_STATEATTRIBUTES | Copy::DEEP_COPY_ARRAYS |
                    Copy::DEEP_COPY_PRIMITIVES | Copy::DEEP_COPY_UNIFORMS);
    return static_cast<osg::Node*>(node->clone(copy));
}

void ModelLibrary::assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                                const std::wstring& fragmentPath)
{
    shaders.push_back({node, shaderName, vertexPath, fragmentPath});
}

void ModelLibrary::assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName,
                                        const std::wstring& vertexPath, const std::wstring& fragmentPath)
{
    shaders.push_back({drawable, shaderName, vertexPath, fragmentPath});
}

void ModelLibrary::setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                                      const std::wstring& type, const std::wstring& value,
                                      const std::wstring& shaderName)
{
    parameters.push_back({node, kind, name, type, value, shaderName});
}

SceneDocument::SceneDocument()
    : services{store, models, paths, texts, messages, &channels, &configuration, &progress, &questions}
{
    RegisterSceneAttributes();
}

osg::ref_ptr<osg::Geode> MakeCube(const std::string& name, const osg::Vec4f& diffuse, bool textured)
{
    constexpr unsigned short indices[] = {
        0, 2, 3, 0, 3, 1, 4, 5, 7, 4, 7, 6, // bottom, top
        0, 1, 5, 0, 5, 4, 2, 6, 7, 2, 7, 3, // front, back
        0, 4, 6, 0, 6, 2, 1, 3, 7, 1, 7, 5, // left, right
    };
    osg::ref_ptr<osg::Vec3Array> vertices = new osg::Vec3Array;
    for (int corner = 0; corner < 8; ++corner)
        vertices->push_back(osg::Vec3((corner & 1) - 0.5F, ((corner >> 1) & 1) - 0.5F, ((corner >> 2) & 1) - 0.5F));
    osg::ref_ptr<osg::Geometry> geometry = new osg::Geometry;
    geometry->setVertexArray(vertices);
    geometry->addPrimitiveSet(new osg::DrawElementsUShort(GL_TRIANGLES, std::size(indices), indices));

    osg::ref_ptr<osg::Material> material = new osg::Material;
    material->setDiffuse(osg::Material::FRONT_AND_BACK, diffuse);
    material->setAmbient(osg::Material::FRONT_AND_BACK, osg::Vec4f(0.25F, 0.25F, 0.25F, 1));
    material->setSpecular(osg::Material::FRONT_AND_BACK, osg::Vec4f(0.125F, 0.125F, 0.125F, 1));
    material->setShininess(osg::Material::FRONT_AND_BACK, 30);
    osg::StateSet& state = *geometry->getOrCreateStateSet();
    state.setAttribute(material);
    if (textured)
        state.setTextureAttributeAndModes(0, new osg::Texture2D, osg::StateAttribute::ON);

    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->setName(name);
    geode->addDrawable(geometry);
    return geode;
}

osg::ref_ptr<osg::Group> MakeModel(osg::Node* node)
{
    osg::ref_ptr<osg::Group> group = new osg::Group;
    group->addChild(node);
    return group;
}

} // namespace fake

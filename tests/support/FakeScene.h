#pragma once

#include <map>
#include <string>
#include <vector>

#include <osg/Geode>
#include <osg/Group>
#include <osg/ref_ptr>
#include <osg/Vec4f>

#include "records/SceneObjectStore.h"
#include "scene/SceneServices.h"
#include "tests/support/FakeHost.h"

/// What a scene stands on, for tests: models in memory, channels from a list, a document that remembers.
namespace fake
{

/// Hands out the groups that a test put in; any other path gives a group without children.
class ModelLibrary : public VtIModelLibrary
{
public:
    struct Shader
    {
        const osg::Node* node;
        std::wstring name;
        std::wstring vertexPath;
        std::wstring fragmentPath;
    };
    struct Parameter
    {
        const osg::Node* node;
        std::wstring kind;
        std::wstring name;
        std::wstring type;
        std::wstring value;
        std::wstring shaderName;
    };

    osg::Group* loadModel(const std::wstring& path, bool useVrmlTransform) override;
    std::string getXmlAttributes(const std::wstring& path) override { return descriptions[path]; }

    /// As deep as the real one: everything but textures, images and shapes.
    osg::Node* clone(const osg::Node* node) override;

    void assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                      const std::wstring& fragmentPath) override;
    void assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName, const std::wstring& vertexPath,
                              const std::wstring& fragmentPath) override;
    void setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                            const std::wstring& type, const std::wstring& value,
                            const std::wstring& shaderName) override;
    std::wstring getShaderDirectory() const override { return L"\\app\\Assets\\"; }
    void emptyCache() override { ++emptied; }
    void preloadModels(const std::vector<std::wstring>& paths, bool useVrmlTransform) override
    {
        for (const std::wstring& path : paths)
            preloads.emplace_back(path, useVrmlTransform);
    }
    std::vector<std::wstring> collectTextureFiles(osg::Node&) const override { return textureFiles; }

    std::map<std::wstring, osg::ref_ptr<osg::Group>> models;
    std::map<std::wstring, std::string> descriptions;
    std::vector<std::pair<std::wstring, bool>> loads; ///< each path asked for, with `useVrmlTransform`
    std::vector<Shader> shaders;
    std::vector<Parameter> parameters;
    int clones = 0;
    int emptied = 0;
    std::vector<std::pair<std::wstring, bool>> preloads;
    std::vector<std::wstring> textureFiles;
};

class ChannelSource : public VtIChannelSource
{
public:
    const std::vector<std::wstring>* GetCurrentChannels() const override { return selected ? &channels : nullptr; }

    std::vector<std::wstring> channels;
    bool selected = true; ///< false: no data point
};

/// A document with services of its own. A scene in it must end before it does.
class SceneDocument : public VtISceneDocument
{
public:
    SceneDocument();

    VtCScene3D* GetScene() const override { return scene; }
    void SetScene(VtCScene3D* newScene) override { scene = newScene; }
    void SetModified(bool flag) override
    {
        modified = flag;
        ++modifications;
    }
    VtTSceneServices& GetServices() override { return services; }

    VtCSceneObjectStore store;
    ModelLibrary models;
    LibraryPaths paths;
    Texts texts;
    MessageHandler messages;
    ChannelSource channels;
    Configuration configuration;
    Progress progress;
    Questions questions;
    VtTSceneServices services;
    VtCScene3D* scene = nullptr;
    bool modified = false;
    int modifications = 0; ///< how often it was told so
};

/// A unit cube, from (-0.5, -0.5, -0.5) to (0.5, 0.5, 0.5), as one drawable with a material of its own and, if asked
/// for, a texture in unit 0.
osg::ref_ptr<osg::Geode> MakeCube(const std::string& name, const osg::Vec4f& diffuse = {0.5F, 0.5F, 0.5F, 1},
                                  bool textured = false);

/// The root of a model file: a group around `node`.
osg::ref_ptr<osg::Group> MakeModel(osg::Node* node);

} // namespace fake

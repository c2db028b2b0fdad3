#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

#include <osg/Group>
#include <osg/Program>
#include <osg/ref_ptr>
#include <osg/Shader>

#include "assets/models/ModelReaderSettings.h"
#include "scene/SceneServices.h"

class VtCModelReader;
namespace osgDB
{
class Options;
}

/// What the asset manager needs of the program around it. Both services outlive every instance.
struct VtTAssetServices
{
    host::LibraryPaths* paths = nullptr;
    host::MessageHandler* messages = nullptr;
    VtTModelReaderSettings reader;
};

/// The one place where model files become scene graphs and shader files become programs.
///
/// Models are kept by path as it is given: two spellings are two entries. All bodies that show a model share its
/// graph; a body that changes something takes a copy by `cloneNode`. There is one instance; `destroyInstance` ends it
/// with everything it keeps, and the next `getInstance` starts empty. Main thread only.
class VtCOsgAssetManager : public VtIModelLibrary
{
public:
    class VtCOsgDrawableCollector;

    /// Given once, before the first `getInstance`; an instance that stands keeps those it was made with.
    static void setServices(const VtTAssetServices& services);

    static VtCOsgAssetManager& getInstance();
    static void destroyInstance();

    /// The library for those who keep a reference beyond `destroyInstance`: it asks the instance of the moment.
    static VtIModelLibrary& getLibrary();

    /// The model from memory, or read when it isn't there or its file is newer by whole seconds.
    osg::Group* loadModel(const std::wstring& path, bool useVrmlTransform) override;

    /// Always reads, and replaces what was kept. A file that can't be read gives a group without a child and one error
    /// message; losses give one warning.
    osg::Group* readModel(const std::wstring& path, bool useVrmlTransform);

    /// Reads those of `paths` that aren't in memory all at once, so that `loadModel` finds them ready.
    void preloadModels(const std::vector<std::wstring>& paths, bool useVrmlTransform) override;

    std::string getXmlAttributes(const std::wstring& path) override;

    /// A copy without a reference, deep but for textures, images and shapes. Null gives null.
    static osg::Node* cloneNode(const osg::Node* node);
    osg::Node* clone(const osg::Node* node) override { return cloneNode(node); }

    /// Makes the program `name` of the two files. A name that has one keeps it, whatever the files.
    void createProgram(const std::wstring& name, const std::wstring& vertexPath, const std::wstring& fragmentPath);

    void assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                      const std::wstring& fragmentPath) override;
    void assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName, const std::wstring& vertexPath,
                              const std::wstring& fragmentPath) override;
    void setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                            const std::wstring& type, const std::wstring& value,
                            const std::wstring& shaderName) override;

    /// Has every program compiled anew, after a change of the graphics context.
    void dirtyPrograms();

    std::wstring getShaderDirectory() const override { return shaderDirectory; }

    /// Empties this instance. Those who hold `getLibrary` get a new one instead.
    void emptyCache() override;

    std::vector<std::wstring> collectTextureFiles(osg::Node& node) const override;

    /// Whether a model was made from this file, by whatever link or name: a model, a texture or a description.
    bool hasRead(const std::filesystem::path& file) const;

    /// Names of the attributes that hold a texture file.
    const std::vector<std::wstring>& getTextureAttributeNames() const { return textureAttributeNames; }

    /// The program of that name; null while there is none.
    osg::Program* getProgram(const std::wstring& name) const;

    /// Sums over all files read, as the reader reports them.
    std::int32_t getPolygonCount() const { return polygonCount; }
    std::int32_t getVertexCount() const { return vertexCount; }
    std::int32_t getTextureMemoryUsed() const { return textureMemoryUsed; }

private:
    explicit VtCOsgAssetManager(const VtTAssetServices& services);
    ~VtCOsgAssetManager() override;

    osg::ref_ptr<osgDB::Options> makeOptions(bool useVrmlTransform) const;
    void optimize(osg::Node& node, const std::wstring& lowerPath, osgDB::Options& options) const;
    osg::Shader* getShader(const std::wstring& path, osg::Shader::Type type);
    bool isCurrent(const std::wstring& path) const;

    host::MessageHandler& messages;
    osg::ref_ptr<VtCModelReader> reader;

    std::map<std::wstring, osg::ref_ptr<osg::Group>> models;
    std::map<std::wstring, std::uint32_t> modelTimes; ///< last write when it was read, whole seconds since 1970
    std::map<std::wstring, std::string> xmlAttributes;
    std::map<std::wstring, osg::ref_ptr<osg::Program>> programs;
    std::map<std::wstring, osg::ref_ptr<osg::Shader>> shaders;
    std::vector<std::wstring> noOptimizeFiles; ///< lower-case parts of paths
    std::vector<std::wstring> textureAttributeNames;
    bool toldProtection = false; ///< that this machine protects less, once is enough
    float maxTexAnisotropy = 8.0f;
    std::int32_t polygonCount = 0;
    std::int32_t vertexCount = 0;
    std::int32_t textureMemoryUsed = 0;
    std::wstring shaderDirectory;
    std::string customerPath;
    std::string objectsPath;
};

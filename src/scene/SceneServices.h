#pragma once

#include <string>
#include <vector>

#include <osg/Matrixd>

namespace host
{
class Clock;
class Configuration;
class LibraryPaths;
class MessageHandler;
class Progress;
class Questions;
class Texts;
} // namespace host

namespace osg
{
class Drawable;
class Group;
class Node;
} // namespace osg

class VtC3DMovableBody;
class VtCScene3D;
class VtISceneObjectStore;

/// Where bodies get their models and shaders from. The asset manager of the renderer implements it.
class VtIModelLibrary
{
public:
    virtual ~VtIModelLibrary() = default;

    /// The root group of the model file, shared by all bodies that show it and kept by the library. A file that can't
    /// be read gives a group without children. `useVrmlTransform` is true for movable bodies.
    virtual osg::Group* loadModel(const std::wstring& path, bool useVrmlTransform) = 0;

    /// The description that came with the model (UTF-8, the textual form of a record), empty without one.
    virtual std::string getXmlAttributes(const std::wstring& path) = 0;

    /// A private copy that shares textures, images and shapes with `node`; unreferenced. Null gives null.
    virtual osg::Node* clone(const osg::Node* node) = 0;

    /// Gives the node, or its drawables, the program `shaderName`; a missing shader file leaves them without.
    virtual void assignShader(osg::Node* node, const std::wstring& shaderName, const std::wstring& vertexPath,
                              const std::wstring& fragmentPath) = 0;

    /// The same for one drawable alone.
    virtual void assignDrawableShader(osg::Drawable* drawable, const std::wstring& shaderName,
                                      const std::wstring& vertexPath, const std::wstring& fragmentPath) = 0;

    /// One shader parameter of a model's description; combinations that aren't known are ignored.
    virtual void setShaderParameter(osg::Node* node, const std::wstring& kind, const std::wstring& name,
                                    const std::wstring& type, const std::wstring& value,
                                    const std::wstring& shaderName) = 0;

    /// Folder of the shader files, with a trailing backslash.
    virtual std::wstring getShaderDirectory() const = 0;

    /// Forgets every model and shader; bodies keep what they show. What is asked for from now on is read anew.
    virtual void emptyCache() = 0;

    /// Reads those of `paths` that aren't kept all at once, so that `loadModel` finds them ready.
    virtual void preloadModels(const std::vector<std::wstring>& paths, bool useVrmlTransform) = 0;

    /// The image files of the textures below `node`, each once.
    virtual std::vector<std::wstring> collectTextureFiles(osg::Node& node) const = 0;
};

/// The channels of the current data point. The data point router implements it.
class VtIChannelSource
{
public:
    virtual ~VtIChannelSource() = default;

    /// Pose channel names in the order of their indices; null while no data point is selected.
    /// Valid until the data point or its configuration changes.
    virtual const std::vector<std::wstring>* GetCurrentChannels() const = 0;
};

/// The observers as the scene's frame update sees them.
class VtISceneObservers
{
public:
    virtual ~VtISceneObservers() = default;

    /// Moves every observer to where its body is now, in collection order.
    virtual void UpdateObservers() = 0;

    /// A live run begins: what was remembered of an earlier one is forgotten.
    virtual void ClearFollowers() {}
};

/// What objects of a scene need from outside; made once by the application object.
struct VtTSceneServices
{
    VtISceneObjectStore& store;
    VtIModelLibrary& models;
    host::LibraryPaths& paths;
    host::Texts& texts;
    host::MessageHandler& messages;
    VtIChannelSource* channels = nullptr;         ///< null until a controller exists
    host::Configuration* configuration = nullptr; ///< null: no tracks
    host::Progress* progress = nullptr;           ///< null: no progress is shown
    host::Questions* questions = nullptr;         ///< null: nobody to ask
};

/// The document of a scene, as the scene and its objects see it.
class VtISceneDocument
{
public:
    virtual ~VtISceneDocument() = default;

    virtual VtCScene3D* GetScene() const = 0;

    /// Called by the scene's constructor, first of all, so that objects made in it find their scene. Null at its end.
    virtual void SetScene(VtCScene3D* scene) = 0;

    /// Marks the document as changed, or as saved.
    virtual void SetModified(bool flag) = 0;

    virtual VtTSceneServices& GetServices() = 0;
};

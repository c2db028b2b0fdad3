#pragma once

#include <string>
#include <unordered_map>
#include <vector>

#include <osg/ref_ptr>

#include "base/Text.h"
#include "records/SceneObject.h"

class VtC3DStaticBody;
class VtCGlidePanelAbstractNavigatorObject;
class VtCScene3D;
struct VtTSceneServices;

/// Builds a scene from the records of a scene file, in an order in which every record finds what it refers to: bodies,
/// then the observers that ride on them, then the views that look through those.
///
/// Records that nothing is built from (groups of movable bodies, clones and copies of observers without their track,
/// instruments, atmospherics, tracks, unknown types) stay in the store and are written again.
class VtCSceneLoader
{
public:
    explicit VtCSceneLoader(VtCScene3D& loadedScene);

    // What the operations of the scene of the like names do.

    bool Load(const std::wstring& path);
    void LoadBodies(const std::wstring& path);
    void LoadObjects(const std::wstring& path);
    static void ResolveObserverTargets(VtCScene3D& scene);

private:
    using Records = std::vector<osg::ref_ptr<VtISceneObject>>;

    struct ModelFile
    {
        std::wstring path;
        bool exists;
    };

    void Sort(const Records& records);
    bool IsBuilt(const VtISceneObject& record) const;
    void ApplyRenderSettings(const Records& all);
    void ApplyDefaultObservers();
    void PreloadModels();
    void BuildMovableBody(VtISceneObject& record);
    void BuildStaticBodies();
    void BuildStaticBody(VtISceneObject& record);
    void RememberStatic(VtCGlidePanelAbstractNavigatorObject& body);
    void BuildObserver(VtISceneObject& record);
    void ApplyViews();
    void ApplyLayout();

    const std::wstring& Needed(const VtISceneObject& record, const wchar_t* attribute) const;
    const ModelFile& FindModel(const std::wstring& stored);
    const std::wstring& FindModelOrReport(const std::wstring& name, const std::wstring& stored);
    void Describe(const std::wstring& name);
    void Step();

    VtCScene3D& scene;
    VtTSceneServices& services;
    std::wstring file;
    osg::ref_ptr<VtISceneObject> renderSettings;
    osg::ref_ptr<VtISceneObject> windowLayout;
    Records views;
    Records observers;
    Records defaultObservers;
    Records staticBodies;
    Records movableBodies;
    std::unordered_map<std::wstring, VtCGlidePanelAbstractNavigatorObject*, base::NoCaseHash, base::NoCaseEqual>
        staticById;
    std::unordered_map<std::wstring, ModelFile> modelFiles; ///< by the stored path; a scene shows few models often
};

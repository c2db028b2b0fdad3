#pragma once

#include <functional>
#include <string>

#include "scene/RecordBuilders.h"

/// Builds a scene from the records of a scene file, with the builders that the folders below have registered. It knows
/// none of the types itself.
///
///     VtCRecordBuilders builders;
///     RegisterSceneRecords(builders);
///     RegisterObserverRecords(builders, observers);
///     if (!VtCSceneLoader(scene, builders).Load(path))
///         Say(scene.GetFileError());
///
/// Records that nothing is built from (groups of movable bodies, clones and copies of observers without their track,
/// types without a builder) stay in the store and are written again where they stood. Paths in the inner form. A
/// record without an attribute that its object can't be without throws `VtCAttributeError`, which ends the load; what
/// was built until then stays.
class VtCSceneLoader
{
public:
    /// Both outlive this.
    VtCSceneLoader(VtCScene3D& loadedScene, const VtCRecordBuilders& recordBuilders);

    /// Everything that the file holds, models read anew. False when it can't be read; the scene is then as it was.
    bool Load(const std::wstring& path);

    // The bodies alone, or everything but the bodies, for a scene that is loaded anew from two files.

    void LoadBodies(const std::wstring& path);
    void LoadObjects(const std::wstring& path);

private:
    using Records = VtTRecordBuilder::Records;
    using Wanted = std::function<bool(const VtTRecordBuilder&)>;

    void Build(VtCSceneLoad& load, const std::wstring& path, const Records& records, const Wanted& wanted);
    bool IsOfBodies(const VtISceneObject& record) const;

    VtCScene3D& scene;
    const VtCRecordBuilders& builders;
    VtTSceneServices& services;
};

#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <unordered_map>
#include <vector>

#include <osg/ref_ptr>

#include "records/SceneObject.h"

class VtCScene3D;
struct VtTSceneServices;

/// One load of a scene file, as those see it who build objects from its records.
class VtCSceneLoad
{
public:
    /// `path` in the inner form. Not `isWhole`: a part of a file comes into a scene that has the rest.
    VtCSceneLoad(VtCScene3D& loadedScene, std::wstring path, bool isWhole);

    VtCScene3D& GetScene() const { return scene; }
    VtTSceneServices& GetServices() const { return services; }
    bool IsWhole() const { return whole; }

    // What the user sees of it.

    /// `name` is built now.
    void Describe(const std::wstring& name);

    /// A record is done.
    void Step();

    /// The text of an attribute that a record can't be without, and an id not empty; else throws `VtCAttributeError`,
    /// which ends the load.
    const std::wstring& Needed(const VtISceneObject& record, const wchar_t* attribute) const;

    // Model files. A scene shows few models often, so each stored path is looked for once.

    /// The complete path for a stored one; error 528 when there is no file.
    const std::wstring& FindModelOrReport(const std::wstring& name, const std::wstring& stored);

    /// Reads the models of `records` at once.
    void PreloadModels(const std::vector<osg::ref_ptr<VtISceneObject>>& records, bool useVrmlTransform);

private:
    struct ModelFile
    {
        std::wstring path;
        bool exists;
    };

    const ModelFile& FindModel(const std::wstring& stored);

    VtCScene3D& scene;
    VtTSceneServices& services;
    std::wstring file;
    bool whole;
    std::unordered_map<std::wstring, ModelFile> modelFiles; ///< by the stored path
};

/// When a kind of record is built: what a record refers to stands before it.
enum VtELoadPhase : int
{
    phaseSettings = 10,         ///< values of the whole scene
    phaseDefaultObservers = 20, ///< objects that every scene has
    phaseMovableBodies = 30,
    phaseStaticBodies = 40,
    phaseObservers = 50, ///< ride on bodies
    phaseViews = 60,     ///< look through observers
    phaseLayout = 70,    ///< of the windows of views
};

/// Who builds the records of one type.
struct VtTRecordBuilder
{
    using Records = std::vector<osg::ref_ptr<VtISceneObject>>;

    std::int32_t type = 0; ///< of records
    VtELoadPhase phase = phaseSettings;
    bool ofBodies = false; ///< of those that come alone when only bodies are read

    /// Gets all records of the type, in file order, and is called when there are none too. The store holds them
    /// already; one that nothing is built from stays there and is written again.
    std::function<void(VtCSceneLoad&, const Records&)> build;
};

/// The builders of a scene, registered by the folders that own the types. A record of which the type has no builder is
/// kept as it is.
///
///     builders.Register({.type = objectTypeView, .phase = phaseViews, .build = [&frame](VtCSceneLoad& load,
///         const VtTRecordBuilder::Records& records) { ... }});
class VtCRecordBuilders
{
public:
    /// In the place of a former one for that type.
    void Register(VtTRecordBuilder builder);

    /// By phase; those of one phase in the order of registration.
    const std::vector<VtTRecordBuilder>& GetAll() const { return builders; }

    /// Null for a type without one.
    const VtTRecordBuilder* Find(std::int32_t type) const;

private:
    std::vector<VtTRecordBuilder> builders;
};

/// Those of render settings, movable and static bodies.
void RegisterSceneRecords(VtCRecordBuilders& builders);

/// The value of an attribute, or what stands for a missing one.
std::wstring TextOf(const VtISceneObject& record, const wchar_t* attribute);
std::int32_t NumberOf(const VtISceneObject& record, const wchar_t* attribute, std::int32_t otherwise);

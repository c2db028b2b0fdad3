#pragma once

#include <cstdint>
#include <functional>
#include <list>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include <osg/ref_ptr>

#include "base/Text.h"
#include "records/SceneObject.h"

/// A record made from text, or the reason why there is none.
struct VtTParsedObject
{
    osg::ref_ptr<VtISceneObject> object; ///< null when the text isn't a record
    std::wstring error;                  ///< "line 3: attribute 'scale': ...", empty when all went well
};

/// What shows and edits records. The host's property grid implements it.
class VtIPropertyGrid
{
public:
    virtual ~VtIPropertyGrid() = default;

    /// Shows the objects of these ids anew.
    virtual void RefreshObjects(const std::vector<std::wstring>& ids) = 0;
};

/// The records of all objects, by their ids. Ids compare without regard to case.
class VtISceneObjectStore
{
public:
    virtual ~VtISceneObjectStore() = default;

    /// All records, in the order they came in.
    virtual std::vector<osg::ref_ptr<VtISceneObject>> GetObjects() const = 0;

    /// A record of its own from its textual form (docs/attribute-objects.md); it isn't in the store yet.
    virtual VtTParsedObject ParseObject(const std::wstring& text) const = 0;

    /// Null when there is none under `id`.
    virtual VtISceneObject* GetObject(const std::wstring& id) const = 0;

    virtual void RemoveObject(const std::wstring& id) = 0;
    virtual void Clear() = 0;

    /// Stores `object` under `id`, in the place of one that stood there. Null removes.
    virtual void AddObject(const std::wstring& id, VtISceneObject* object) = 0;

    /// The record under `id` is found under `newId` from now on, at the place where it stands; one that stood under
    /// `newId` goes. Nothing without a record under `id`.
    virtual void RenameObject(const std::wstring& id, const std::wstring& newId) = 0;

    /// The textual form of a new record of that type; empty for a type that has no default record.
    virtual std::wstring GetDefaultText(std::int32_t objectType) const = 0;

    /// The record that this text stands for, without the way through the text; null for a type that has none.
    virtual osg::ref_ptr<VtISceneObject> MakeDefaultObject(std::int32_t objectType) const = 0;

    // Scene files (docs/scene-file.md). Paths in the inner form.

    /// Which records of a file come in; none stands for all.
    using Wanted = std::function<bool(const VtISceneObject&)>;

    /// Takes the records of the file in, behind those that are there; one of the same id goes. False when the file
    /// can't be read; the store is then as it was.
    virtual bool LoadFile(const std::wstring& path) = 0;

    /// The same, with the records as the result; empty when the file can't be read.
    virtual std::vector<osg::ref_ptr<VtISceneObject>> ReadFile(const std::wstring& path, const Wanted& wanted) = 0;

    /// Writes all records. The file changes whole or not at all; false when it can't be written. Of several records
    /// that were given one `internal_id` only the one that is stored under it keeps it, for a file with both could not
    /// be read again. What saves of this file that were killed have left in its folder goes.
    virtual bool SaveFile(const std::wstring& path) = 0;

    /// Why the last of these three failed: "scene.xml, line 3: ..."; empty when it didn't.
    virtual const std::wstring& GetFileError() const = 0;

    /// Has the property grid show these objects anew; nothing without one.
    virtual void RefreshObjects(const std::vector<std::wstring>& ids) = 0;
};

/// The store of the component, in memory.
class VtCSceneObjectStore : public VtISceneObjectStore
{
public:
    std::vector<osg::ref_ptr<VtISceneObject>> GetObjects() const override;
    VtTParsedObject ParseObject(const std::wstring& text) const override;
    VtISceneObject* GetObject(const std::wstring& id) const override;
    void RemoveObject(const std::wstring& id) override;
    void Clear() override;
    void AddObject(const std::wstring& id, VtISceneObject* object) override;
    void RenameObject(const std::wstring& id, const std::wstring& newId) override;
    std::wstring GetDefaultText(std::int32_t objectType) const override;
    osg::ref_ptr<VtISceneObject> MakeDefaultObject(std::int32_t objectType) const override;
    bool LoadFile(const std::wstring& path) override;
    std::vector<osg::ref_ptr<VtISceneObject>> ReadFile(const std::wstring& path, const Wanted& wanted) override;
    bool SaveFile(const std::wstring& path) override;
    const std::wstring& GetFileError() const override { return fileError; }
    void RefreshObjects(const std::vector<std::wstring>& ids) override;

    /// Not owned, may be null.
    void SetPropertyGrid(VtIPropertyGrid* propertyGrid) { grid = propertyGrid; }

private:
    void PartIds();

    using Records = std::list<std::pair<std::wstring, osg::ref_ptr<VtISceneObject>>>;

    Records records;
    std::unordered_map<std::wstring, Records::iterator, base::NoCaseHash, base::NoCaseEqual> byId;
    std::wstring fileError;
    VtIPropertyGrid* grid = nullptr;
};

#pragma once

#include <cstdint>
#include <list>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include <osg/ref_ptr>

#include "scene/SceneObject.h"

/// A record made from text, or the reason why there is none.
struct VtTParsedObject
{
    osg::ref_ptr<VtISceneObject> object; ///< null when the text isn't a record
    std::wstring error;                  ///< "line 3: attribute 'scale': ...", empty when all went well
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

    /// The textual form of a new record of that type; empty for a type that has no default record.
    virtual std::wstring GetDefaultText(std::int32_t objectType) const = 0;
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
    std::wstring GetDefaultText(std::int32_t objectType) const override;

private:
    using Records = std::list<std::pair<std::wstring, osg::ref_ptr<VtISceneObject>>>;

    Records records;
    std::unordered_map<std::wstring, Records::iterator> byId; ///< keys in lower case
};

#include "scene/SceneObjectStore.h"

#include "base/Text.h"
#include "scene/ObjectText.h"
#include "scene/RecordTables.h"

std::vector<osg::ref_ptr<VtISceneObject>> VtCSceneObjectStore::GetObjects() const
{
    std::vector<osg::ref_ptr<VtISceneObject>> objects;
    objects.reserve(records.size());
    for (const auto& [key, object] : records)
        objects.push_back(object);
    return objects;
}

VtTParsedObject VtCSceneObjectStore::ParseObject(const std::wstring& text) const
{
    return ParseObjectText(text);
}

VtISceneObject* VtCSceneObjectStore::GetObject(const std::wstring& id) const
{
    const auto at = byId.find(base::ToLower(id));
    return at == byId.end() ? nullptr : at->second->second.get();
}

void VtCSceneObjectStore::RemoveObject(const std::wstring& id)
{
    const auto at = byId.find(base::ToLower(id));
    if (at == byId.end())
        return;
    records.erase(at->second);
    byId.erase(at);
}

void VtCSceneObjectStore::Clear()
{
    byId.clear();
    records.clear();
}

void VtCSceneObjectStore::AddObject(const std::wstring& id, VtISceneObject* object)
{
    if (!object)
    {
        RemoveObject(id);
        return;
    }
    const std::wstring key = base::ToLower(id);
    const auto at = byId.find(key);
    if (at != byId.end())
        at->second->second = object;
    else
        byId.emplace(key, records.emplace(records.end(), key, object));
}

std::wstring VtCSceneObjectStore::GetDefaultText(std::int32_t objectType) const
{
    const osg::ref_ptr<VtISceneObject> object = MakeDefaultObject(objectType);
    return object ? WriteObjectText(*object) : std::wstring();
}

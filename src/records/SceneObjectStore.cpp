#include "records/SceneObjectStore.h"
#include "records/AttributeNames.h"

#include "base/AtomicFile.h"
#include "base/Ids.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "records/ObjectText.h"
#include "records/RecordTables.h"
#include "records/SceneFileText.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <string>
#include <unordered_set>

namespace
{

// Empty on success, else the reason.
std::string ReadWhole(const std::filesystem::path& path, std::string& content)
{
    std::error_code failure;
    if (std::filesystem::is_directory(path, failure))
        return std::strerror(EISDIR);
    std::ifstream file(path, std::ios::binary);
    if (!file)
        return std::strerror(errno);
    const std::uintmax_t size = std::filesystem::file_size(path, failure);
    content.resize(failure ? 0 : static_cast<std::size_t>(std::min<std::uintmax_t>(size, largestSceneText)));
    file.read(content.data(), static_cast<std::streamsize>(content.size()));
    content.resize(static_cast<std::size_t>(file.gcount()));
    // Without a size (a pipe), or with a wrong one, it grows as it is read.
    char part[1 << 16];
    while (content.size() <= largestSceneText && (file.read(part, sizeof part) || file.gcount() > 0))
        content.append(part, static_cast<std::size_t>(file.gcount()));
    return file.bad() ? std::strerror(errno) : "";
}

} // namespace

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
    const auto at = byId.find(id);
    return at == byId.end() ? nullptr : at->second->second.get();
}

void VtCSceneObjectStore::RemoveObject(const std::wstring& id)
{
    const auto at = byId.find(id);
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
    const auto [at, isNew] = byId.try_emplace(id);
    if (isNew)
        at->second = records.emplace(records.end(), id, object);
    else
        at->second->second = object;
}

void VtCSceneObjectStore::RenameObject(const std::wstring& id, const std::wstring& newId)
{
    const auto at = byId.find(id);
    if (at == byId.end())
        return;
    const Records::iterator record = at->second;
    byId.erase(at);
    RemoveObject(newId);
    record->first = newId;
    byId.emplace(newId, record);
}

std::wstring VtCSceneObjectStore::GetDefaultText(std::int32_t objectType) const
{
    const osg::ref_ptr<VtISceneObject> object = MakeDefaultObject(objectType);
    return object ? WriteObjectText(*object) : std::wstring();
}

osg::ref_ptr<VtISceneObject> VtCSceneObjectStore::MakeDefaultObject(std::int32_t objectType) const
{
    return ::MakeDefaultObject(objectType);
}

bool VtCSceneObjectStore::LoadFile(const std::wstring& path)
{
    ReadFile(path, {});
    return fileError.empty();
}

std::vector<osg::ref_ptr<VtISceneObject>> VtCSceneObjectStore::ReadFile(const std::wstring& path, const Wanted& wanted)
{
    const std::filesystem::path file = base::NativePath(path);
    std::string text;
    const std::string reason = ReadWhole(file, text);
    fileError = reason.empty() ? std::wstring() : base::Wide(file.string() + ": " + reason);
    if (!fileError.empty())
        return {};

    VtTSceneRecords read = ParseSceneText(text);
    if (!read.error.empty())
    {
        fileError = base::Wide(file.string() + ", " + read.error);
        return {};
    }
    if (wanted)
        std::erase_if(read.objects, [&](const osg::ref_ptr<VtISceneObject>& object) { return !wanted(*object); });
    for (const osg::ref_ptr<VtISceneObject>& object : read.objects)
    {
        // A record without an id is nobody's, but it is written again.
        const auto* id = object->Find<std::wstring>(attribute::internalId);
        const std::wstring key = id && !id->empty() ? *id : base::NewId();
        RemoveObject(key);
        AddObject(key, object);
    }
    return std::move(read.objects);
}

bool VtCSceneObjectStore::SaveFile(const std::wstring& path)
{
    PartIds();
    const std::filesystem::path file = base::NativePath(path);
    fileError = base::Wide(base::WriteWholeFile(file, WriteSceneText(GetObjects())));
    if (fileError.empty())
        base::RemoveAbandoned(file);
    return fileError.empty();
}

// The attribute can be edited, the key that an object is stored under can't. So the first of those that share an id
// keeps it, unless an object lives under it, and the others get back their own.
void VtCSceneObjectStore::PartIds()
{
    const auto idOf = [](const VtISceneObject& object) -> const std::wstring&
    {
        static const std::wstring none;
        const auto* id = object.Find<std::wstring>(attribute::internalId);
        return id ? *id : none;
    };
    const auto isKept = [&](const std::wstring& key)
    {
        const auto at = byId.find(key);
        return at != byId.end() && base::EqualsNoCase(idOf(*at->second->second), key);
    };

    std::unordered_set<std::wstring, base::NoCaseHash, base::NoCaseEqual> edited;
    for (const auto& [key, object] : records)
    {
        const std::wstring& id = idOf(*object);
        if (id.empty() || base::EqualsNoCase(id, key))
            continue;
        if (!isKept(id) && edited.insert(id).second)
            continue;
        object->Write(attribute::internalId, edited.contains(key) ? base::NewId() : key);
    }
}

void VtCSceneObjectStore::RefreshObjects(const std::vector<std::wstring>& ids)
{
    if (grid)
        grid->RefreshObjects(ids);
}

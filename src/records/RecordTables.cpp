#include "records/RecordTables.h"

#include <algorithm>
#include <stdexcept>
#include <string>
#include <unordered_map>

#include "base/Text.h"
#include "records/AttributeNames.h"

namespace
{

std::size_t FixedLength(const VtTAttributeValue& value)
{
    const auto* list = std::get_if<std::vector<float>>(&value);
    return list ? list->size() : 0;
}

// Nothing is made from records of tracks yet. They are kept with these types, in whatever order a file has them.
const VtCAttributeTable& TrackTable()
{
    static const VtCAttributeTable table(
        objectTypeTrack, {IdentityRows(objectTypeTrack, KeptAttribute(attribute::name, L"", "").Optional()),
                          {
                              KeptAttribute(attribute::trackId, -1, "number of the track").Optional(),
                              KeptAttribute(L"mdf_file", L"", "motion data file").Optional(),
                              KeptAttribute(L"time_offset", 0.0F, "seconds").Optional(),
                              KeptAttribute(L"play_loop", false, "").Optional(),
                              KeptAttribute(L"data_source", 0, "").Optional(),
                              KeptAttribute(L"auto_update", false, "").Optional(),
                              KeptAttribute(L"active", false, "").Optional(),
                              KeptAttribute(L"buffer_empty", false, "").Optional(),
                          }});
    return table;
}

struct Registry
{
    std::vector<const VtCAttributeTable*> tables;
    std::unordered_map<std::wstring_view, const VtTAttributeRow*> byName;
    std::vector<const VtTAttributeRow*> partRows;

    Registry() { Add(TrackTable()); }

    void Add(const VtCAttributeTable& table)
    {
        const auto at = std::lower_bound(tables.begin(), tables.end(), table.GetObjectType(),
                                         [](const VtCAttributeTable* known, std::int32_t type)
                                         { return known->GetObjectType() < type; });
        if (at != tables.end() && (*at)->GetObjectType() == table.GetObjectType())
            return;
        for (const VtTAttributeRow& row : table.GetRows())
        {
            const VtTAttributeRow& known = *byName.try_emplace(*row.name, &row).first->second;
            if (known.GetType() != row.GetType() || FixedLength(known.defaultValue) != FixedLength(row.defaultValue))
                throw std::logic_error("attribute " + base::Utf8(*row.name) + " has two types");
            if (row.forParts)
                partRows.push_back(&row);
        }
        tables.insert(at, &table);
    }
};

Registry& Registered()
{
    static Registry registry;
    return registry;
}

const VtTAttributeRow* FindRow(std::wstring_view name)
{
    const auto& byName = Registered().byName;
    const auto at = byName.find(name);
    return at == byName.end() ? nullptr : at->second;
}

bool IsOfPart(std::wstring_view name, std::wstring_view rowName)
{
    return name.size() > rowName.size() && name.ends_with(rowName) && name[name.size() - rowName.size() - 1] == L'_';
}

} // namespace

void RegisterAttributeTable(const VtCAttributeTable& table)
{
    Registered().Add(table);
}

const std::vector<const VtCAttributeTable*>& GetAttributeTables()
{
    return Registered().tables;
}

std::optional<VtEAttributeType> FixedAttributeType(std::wstring_view name)
{
    const VtTAttributeRow* row = FindRow(name);
    return row ? std::optional(row->GetType()) : std::nullopt;
}

VtEAttributeType AssumedAttributeType(std::wstring_view name)
{
    if (const VtTAttributeRow* row = FindRow(name))
        return row->GetType();
    for (const VtTAttributeRow* row : Registered().partRows)
        if (IsOfPart(name, *row->name))
            return row->GetType();
    return VtEAttributeType::text;
}

std::optional<std::size_t> FixedListLength(std::wstring_view name)
{
    const VtTAttributeRow* row = FindRow(name);
    const std::size_t length = row ? FixedLength(row->defaultValue) : 0;
    return length > 0 ? std::optional(length) : std::nullopt;
}

osg::ref_ptr<VtISceneObject> MakeDefaultObject(std::int32_t objectType)
{
    for (const VtCAttributeTable* table : Registered().tables)
        if (table->GetObjectType() == objectType)
            return table->MakeRecord();
    return nullptr;
}

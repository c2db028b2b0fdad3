#include "records/AttributeTable.h"

#include <algorithm>

#include "base/Text.h"
#include "records/AttributeNames.h"

namespace
{

bool Fits(const VtTAttributeValue& value, const VtTAttributeValue& model)
{
    if (value.index() != model.index())
        return false;
    const auto* list = std::get_if<std::vector<float>>(&model);
    return !list || list->empty() || std::get<std::vector<float>>(value).size() == list->size();
}

} // namespace

std::size_t VtCAttributeTable::Hash::operator()(std::wstring_view name) const
{
    if (name.empty())
        return 0;
    // The case doesn't count: some tables find names in any.
    const auto letter = [&](std::size_t at) { return static_cast<std::size_t>(name[at]) & 0x1FU; };
    return name.size() + (letter(0) << 6U) + (letter(name.size() / 2) << 11U) + (letter(name.size() - 1) << 16U);
}

bool VtCAttributeTable::Equal::operator()(std::wstring_view a, std::wstring_view b) const
{
    if (a.size() != b.size())
        return false;
    // Mostly one shared text.
    return a.data() == b.data() || (anyCase ? base::EqualsNoCase(a, b) : a == b);
}

VtCAttributeTable::VtCAttributeTable(std::int32_t type, const std::vector<VtTAttributeRows>& parts, Names names)
    : objectType(type), byName(64, Hash(), Equal{names == Names::anyCase})
{
    for (const VtTAttributeRows& part : parts)
        rows.insert(rows.end(), part.begin(), part.end());
    for (std::size_t i = 0; i < rows.size(); ++i)
        byName.emplace(*rows[i].name, i);
}

const VtTAttributeRow* VtCAttributeTable::Find(std::wstring_view name) const
{
    const auto at = byName.find(name);
    return at == byName.end() ? nullptr : &rows[at->second];
}

bool VtCAttributeTable::Take(VtIRecordOwner& owner, std::wstring_view name, const VtTAttributeValue& value) const
{
    const VtTAttributeRow* row = Find(name);
    if (row && row->take && Fits(value, row->defaultValue))
        row->take(owner, value);
    return row != nullptr;
}

osg::ref_ptr<VtISceneObject> VtCAttributeTable::MakeRecord() const
{
    osg::ref_ptr<VtISceneObject> record = new VtISceneObject(objectType);
    for (const VtTAttributeRow& row : rows)
        if (row.inNewRecords)
            record->AddNewAttribute(row.name, row.defaultValue);
    return record->GetAttributes().empty() ? nullptr : record;
}

VtTAttributeRows IdentityRows(std::int32_t objectType, VtTAttributeRow name)
{
    VtTAttributeRows rows = {KeptAttribute(attribute::objectType, objectType, "the type of the record"),
                             KeptAttribute(attribute::internalId, L"", "the key of the object"), std::move(name)};
    for (VtTAttributeRow& row : rows)
        row.inNewRecords = rows.back().inNewRecords; // one without a name has none of them
    return rows;
}

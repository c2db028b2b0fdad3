#include "records/PGEventSink.h"

#include <string>
#include <utility>
#include <vector>

namespace
{

/// Gives a variable another value for as long as it lives, whatever is thrown.
template <class Type>
class During
{
public:
    During(Type& changed, Type value) : variable(changed), before(changed) { variable = value; }
    ~During() { variable = before; }
    During(const During&) = delete;
    During& operator=(const During&) = delete;

private:
    Type& variable;
    Type before;
};

} // namespace

void VTIPGEventSink::Connect(VtISceneObject* newObject)
{
    Disconnect();
    object = newObject;
    if (object)
        object->Advise(*this);
}

void VTIPGEventSink::Disconnect()
{
    if (object)
        object->Unadvise(*this);
    object = nullptr;
}

void VTIPGEventSink::Write(VtISceneObject* record, std::wstring_view name, VtTAttributeValue value)
{
    if (!record)
        return;
    // While a record is replayed, a value that it brings itself comes with it; what is worked out from another
    // attribute would only be in its way.
    if (replayed && replayed->GetAttribute(name))
        if (const VtTAttributeRow* row = owner.GetAttributeTable().Find(name))
            if (row > &owner.GetAttributeTable().GetRows()[replayedRow])
                return;

    const VtISceneAttribute* present = record->GetAttribute(name);
    const bool fits =
        present && (present->GetValue().index() == value.index() ||
                    (present->GetType() == VtEAttributeType::real && std::holds_alternative<std::int32_t>(value)));
    const OwnWrite write{name, fits ? present->GetChangeCount() + 1 : 0, ownWrites};
    const During<const OwnWrite*> guard(ownWrites, &write);
    if (present && !fits)
        record->AddAttribute(name, std::move(value));
    else
        record->Write(name, std::move(value));
}

void VTIPGEventSink::WriteBack(VtISceneObject* record, std::wstring_view name)
{
    const VtTAttributeRow* row = record ? owner.GetAttributeTable().Find(name) : nullptr;
    if (!row || !row->give)
        return;
    if (std::optional<VtTAttributeValue> value = row->give(owner); value && IsStorable(*value))
        Write(record, name, std::move(*value));
}

void VTIPGEventSink::Apply(VtISceneObject* record, const VtISceneObject& source)
{
    // Whoever is told may add attributes to the record that is being read.
    const VtISceneObject::Attributes attributes(source.GetAttributes());
    if (record == &source)
        record = nullptr;
    if (record)
        for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
            Write(record, attribute->GetName(), attribute->GetValue());

    const VtCAttributeTable& table = owner.GetAttributeTable();
    std::vector<const VtISceneAttribute*> byRow(table.GetRows().size());
    std::vector<const VtISceneAttribute*> others;
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
        if (const VtTAttributeRow* row = table.Find(attribute->GetName()))
            byRow[static_cast<std::size_t>(row - table.GetRows().data())] = attribute.get();
        else
            others.push_back(attribute.get());

    const auto replay = [&](const VtISceneAttribute& attribute)
    {
        // In the record it may have changed since, by somebody who heard of another change.
        const VtISceneAttribute* present = record ? record->GetAttribute(attribute.GetName()) : nullptr;
        const VtTAttributeValue value = present ? present->GetValue() : attribute.GetValue();
        owner.OnAttributeChanged(owner.GetRecordId(), attribute.GetName(), value);
    };
    {
        const During<const VtISceneObject*> guard(replayed, &source);
        for (replayedRow = 0; replayedRow < byRow.size(); ++replayedRow)
            if (byRow[replayedRow] && table.GetRows()[replayedRow].take)
                replay(*byRow[replayedRow]);
    }
    for (const VtISceneAttribute* attribute : others)
        replay(*attribute);
}

bool VTIPGEventSink::IsOwnWrite(const VtISceneAttribute& attribute) const
{
    for (const OwnWrite* write = ownWrites; write; write = write->outer)
        if (write->name == attribute.GetName() && write->change == attribute.GetChangeCount())
            return true;
    return false;
}

void VTIPGEventSink::OnPropertyChanged(VtISceneObject&, VtISceneAttribute& attribute)
{
    owner.OnRecordChanged();
    if (!IsOwnWrite(attribute))
        owner.OnAttributeChanged(owner.GetRecordId(), attribute.GetName(), attribute.GetValue());
}

void VTIPGEventSink::OnPropertyRemoved(VtISceneObject&, VtISceneAttribute& attribute)
{
    owner.OnRecordChanged();
    const VtTAttributeRow* row = owner.GetAttributeTable().Find(attribute.GetName());
    if (row && row->take)
        owner.OnAttributeChanged(owner.GetRecordId(), attribute.GetName(), row->defaultValue);
}

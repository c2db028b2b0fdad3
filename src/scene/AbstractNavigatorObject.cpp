#include "scene/AbstractNavigatorObject.h"

#include "base/Ids.h"
#include "base/Text.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/LibraryPath.h"
#include "scene/SceneServices.h"

#include <algorithm>
#include <utility>

namespace
{

// The record of a group is no body's when a scene is loaded again, so it outlives the body that it was made for.
bool OutlivesItsBody(const VtISceneObject& record)
{
    const std::int32_t* grouped = record.Find<std::int32_t>(attribute::isGrouped);
    return record.GetObjectType() == objectTypeMovableBody && grouped && *grouped != 0;
}

using Object = VtCGlidePanelAbstractNavigatorObject;

template <class Matches>
Object* FindDescendant(const Object& object, const Matches& matches)
{
    for (Object* child : object.GetChildren())
    {
        if (matches(*child))
            return child;
        if (Object* found = FindDescendant(*child, matches))
            return found;
    }
    return nullptr;
}

} // namespace

VtCGlidePanelAbstractNavigatorObject::VtCGlidePanelAbstractNavigatorObject(
    VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject* parentObject, const std::wstring& name,
    bool inTree, const std::wstring& id)
    : VtCGlidePanelAbstractObject(name, inTree),
      internalId(id.empty() ? base::NewId() : id),
      attributeSink(std::make_unique<VTIPGEventSink>(*this)),
      displayName(name),
      document(&owningDocument)
{
    if (parentObject)
    {
        parentObject->AddChild(*this);
        Release();
    }
}

VtCGlidePanelAbstractNavigatorObject::~VtCGlidePanelAbstractNavigatorObject()
{
    // Still with its parent only when a constructor has thrown: nobody gave the reference back.
    if (parent)
        parent->Forget(*this);

    while (!children.empty())
        RemoveChild(*children.back());

    attributeSink.reset();
    if (attributeObject && !OutlivesItsBody(*attributeObject))
        RemoveAttributeObject();
}

void VtCGlidePanelAbstractNavigatorObject::SetModified()
{
    document->SetModified(true);
}

VtTSceneServices& VtCGlidePanelAbstractNavigatorObject::GetServices() const
{
    return document->GetServices();
}

void VtCGlidePanelAbstractNavigatorObject::ApplyAttributes(VtISceneObject& source)
{
    // A loaded object takes `source` itself over afterwards, in place of the record that it was made with.
    attributeSink->Apply(loading ? nullptr : attributeObject.get(), source);
    if (attributeObject && !loading)
        GetServices().store.AddObject(internalId, attributeObject);
}

osg::ref_ptr<VtISceneObject> VtCGlidePanelAbstractNavigatorObject::CopyAttributes(const VtISceneObject& source) const
{
    osg::ref_ptr<VtISceneObject> destination = GetServices().store.MakeDefaultObject(source.GetObjectType());
    if (destination)
        for (const osg::ref_ptr<VtISceneAttribute>& attribute : source.GetAttributes())
            if (VtISceneAttribute* copy = destination->GetAttribute(attribute->GetName()))
                copy->SetValue(attribute->GetValue());
    return destination;
}

void VtCGlidePanelAbstractNavigatorObject::RemoveAttributeObject()
{
    if (attributeSink)
        attributeSink->Disconnect();
    VtISceneObjectStore& store = GetServices().store;
    if (attributeObject && store.GetObject(internalId) == attributeObject)
        store.RemoveObject(internalId);
}

void VtCGlidePanelAbstractNavigatorObject::OnAttributeChanged(const std::wstring&, const std::wstring& attributeName,
                                                              const VtTAttributeValue& value)
{
    GetAttributeTable().Take(*this, attributeName, value);
}

VtTAttributeRow VtCGlidePanelAbstractNavigatorObject::NameRow()
{
    using Self = VtCGlidePanelAbstractNavigatorObject;
    return Attribute<Self>(attribute::name, L"", &Self::SetDisplayName, &Self::displayName, "as the tree shows it")
        .ForParts();
}

const VtCAttributeTable& VtCGlidePanelAbstractNavigatorObject::GetAttributeTable() const
{
    static const VtCAttributeTable table(-1, {VtTAttributeRows{NameRow()}});
    return table;
}

void VtCGlidePanelAbstractNavigatorObject::AddChild(VtCGlidePanelAbstractNavigatorObject& child)
{
    child.AddRef();
    child.parent = this;
    children.push_back(&child);
}

void VtCGlidePanelAbstractNavigatorObject::RemoveChild(VtCGlidePanelAbstractNavigatorObject& child)
{
    if (child.parent != this)
        return;
    Forget(child);
    child.Release();
}

void VtCGlidePanelAbstractNavigatorObject::DetachFromParent()
{
    if (parent)
        parent->RemoveChild(*this);
}

void VtCGlidePanelAbstractNavigatorObject::Forget(VtCGlidePanelAbstractNavigatorObject& child)
{
    child.parent = nullptr;
    std::erase(children, &child);
    ChildRemoved(child);
}

void VtCGlidePanelAbstractNavigatorObject::ChildRemoved(VtCGlidePanelAbstractNavigatorObject&) {}

void VtCGlidePanelAbstractNavigatorObject::CollectDescendants(Objects& descendants) const
{
    descendants.clear();
    FindDescendant(*this,
                   [&](Object& object)
                   {
                       descendants.push_back(&object);
                       return false;
                   });
}

VtCGlidePanelAbstractNavigatorObject* VtCGlidePanelAbstractNavigatorObject::FindByName(std::wstring_view name) const
{
    return FindDescendant(*this, [&](const Object& object) { return base::EqualsNoCase(object.displayName, name); });
}

VtCGlidePanelAbstractNavigatorObject* VtCGlidePanelAbstractNavigatorObject::FindById(std::wstring_view id) const
{
    return FindDescendant(*this, [&](const Object& object) { return base::EqualsNoCase(object.internalId, id); });
}

void VtCGlidePanelAbstractNavigatorObject::RebindAttributes(const std::wstring& newId)
{
    VtISceneObjectStore& store = GetServices().store;
    // Looked up first: `newId` may be the present id.
    const osg::ref_ptr<VtISceneObject> taken = store.GetObject(newId);
    RemoveAttributeObject();
    internalId = newId;
    attributeObject = taken;
    if (!attributeObject)
        return;

    if (const std::wstring* path = attributeObject->Find<std::wstring>(attribute::filePath))
        WriteAttribute(attribute::filePath, ToPortablePath(*path, GetServices().paths));
    PublishAttributes();
}

void VtCGlidePanelAbstractNavigatorObject::WriteAttribute(std::wstring_view name, VtTAttributeValue value)
{
    attributeSink->Write(attributeObject.get(), name, std::move(value));
}

void VtCGlidePanelAbstractNavigatorObject::AddMissingAttribute(std::wstring_view name)
{
    AddMissingAttribute(name, GetAttributeTable().Find(name)->defaultValue);
}

void VtCGlidePanelAbstractNavigatorObject::AddMissingAttribute(std::wstring_view name, VtTAttributeValue value)
{
    if (attributeObject && !attributeObject->GetAttribute(name))
        WriteAttribute(name, std::move(value));
}

void VtCGlidePanelAbstractNavigatorObject::PublishAttributes()
{
    if (!attributeObject)
        return;
    attributeSink->Connect(attributeObject);
    GetServices().store.AddObject(internalId, attributeObject);
}

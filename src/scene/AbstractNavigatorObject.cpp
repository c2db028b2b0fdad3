#include "scene/AbstractNavigatorObject.h"

#include "base/Ids.h"
#include "base/Text.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/LibraryPath.h"
#include "scene/SceneServices.h"

#include <algorithm>
#include <utility>

using namespace std::string_view_literals;

namespace
{

/// Keeps the sink quiet for as long as it lives, whatever is thrown.
class OwnWrite
{
public:
    explicit OwnWrite(int& writingDepth) : depth(writingDepth) { ++depth; }
    ~OwnWrite() { --depth; }
    OwnWrite(const OwnWrite&) = delete;
    OwnWrite& operator=(const OwnWrite&) = delete;

private:
    int& depth;
};

// The record of a group is no body's when a scene is loaded again, so it outlives the body that it was made for.
bool OutlivesItsBody(const VtISceneObject& record)
{
    const std::int32_t* grouped = record.Find<std::int32_t>(L"is_grouped");
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
    // Handlers may add attributes to the record that is being read.
    const VtISceneObject::Attributes& stored = source.GetAttributes();
    const VtISceneObject::Attributes attributes(stored.begin(), stored.end());
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
    {
        const std::wstring& name = attribute->GetName();
        const VtTAttributeValue value = attribute->GetValue();
        // A loaded object takes `source` itself over afterwards, in place of the record that it was made with.
        if (!loading)
            MergeAttribute(name, value);
        OnAttributeChanged(internalId, name, value);
    }
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
    const std::wstring* text = std::get_if<std::wstring>(&value);
    if (attributeName != L"name" || !text)
        return;
    displayName = *text;
    SetModified();
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

    if (const std::wstring* path = attributeObject->Find<std::wstring>(L"file_path"))
        WriteAttribute(L"file_path", ToPortablePath(*path, GetServices().paths));
    PublishAttributes();
}

void VtCGlidePanelAbstractNavigatorObject::WriteAttribute(const std::wstring& name, VtTAttributeValue value)
{
    if (!attributeObject)
        return;
    const OwnWrite guard(writing);
    attributeObject->Write(name, std::move(value));
}

void VtCGlidePanelAbstractNavigatorObject::MergeAttribute(const std::wstring& name, const VtTAttributeValue& value)
{
    if (!attributeObject)
        return;
    const OwnWrite guard(writing);
    VtISceneAttribute* present = attributeObject->GetAttribute(name);
    if (present && present->GetValue().index() == value.index())
        present->SetValue(value);
    else
        attributeObject->AddAttribute(name, value);
}

void VtCGlidePanelAbstractNavigatorObject::AddMissingAttribute(std::wstring_view typeName, std::wstring_view valueText,
                                                               const std::wstring& name)
{
    if (!attributeObject || attributeObject->GetAttribute(name))
        return;
    const OwnWrite guard(writing);
    attributeObject->AddAttribute(typeName, valueText, name);
}

void VtCGlidePanelAbstractNavigatorObject::PublishAttributes()
{
    if (!attributeObject)
        return;
    if (!attributeSink)
        attributeSink = std::make_unique<VTIPGEventSink>(*this);
    attributeSink->Connect(attributeObject);
    GetServices().store.AddObject(internalId, attributeObject);
}

#include "scene/AbstractNavigatorObject.h"

#include "base/Ids.h"
#include "base/Text.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/LibraryPath.h"
#include "scene/Scene3D.h"
#include "scene/SceneObjects.h"
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
        sceneObjects = parentObject->sceneObjects;
    else if (VtCScene3D* scene = document->GetScene())
        sceneObjects = &scene->GetObjects();
    if (sceneObjects)
        sceneObjects->Enter(*this);
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

    if (life)
        life->object = nullptr;
    if (indexed)
        sceneObjects->Leave(*this);

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

void VtCGlidePanelAbstractNavigatorObject::SetDisplayName(const std::wstring& name)
{
    if (name == displayName)
        return;
    const std::wstring former = std::exchange(displayName, name);
    if (told)
        sceneObjects->Tell([&](VtISceneListener& listener) { listener.ObjectRenamed(*this, former); });
}

void VtCGlidePanelAbstractNavigatorObject::AddChild(VtCGlidePanelAbstractNavigatorObject& child)
{
    if (child.parent == this || &child == this || IsBelow(child))
        return;
    child.AddRef();
    VtCGlidePanelAbstractNavigatorObject* former = child.parent;
    const bool moves = former && child.told && IsInScene() && child.sceneObjects == sceneObjects;
    if (moves)
    {
        former->Forget(child);
        child.Release();
    }
    else if (former)
        former->RemoveChild(child);

    child.parent = this;
    children.push_back(&child);
    if (moves)
    {
        child.ParentChanged();
        child.SetModified();
        sceneObjects->Tell([&](VtISceneListener& listener) { listener.ObjectMoved(child, *former); });
    }
    else if (child.complete)
    {
        // A new object enters when it is complete; this one comes back.
        child.ParentChanged();
        child.sceneObjects = sceneObjects;
        child.EnterScene();
    }
}

void VtCGlidePanelAbstractNavigatorObject::RemoveChild(VtCGlidePanelAbstractNavigatorObject& child)
{
    if (child.parent != this)
        return;
    child.LeaveScene();
    Forget(child);
    child.Release();
}

void VtCGlidePanelAbstractNavigatorObject::EnterScene()
{
    complete = true;
    if (told || !sceneObjects || !parent || !parent->IsInScene())
        return;
    if (!indexed)
        sceneObjects->Enter(*this);
    told = true;
    sceneObjects->Tell([this](VtISceneListener& listener) { listener.ObjectAdded(*this); });
    for (std::size_t i = 0; i < children.size(); ++i)
        if (children[i]->complete)
        {
            children[i]->sceneObjects = sceneObjects;
            children[i]->EnterScene();
        }
}

void VtCGlidePanelAbstractNavigatorObject::LeaveScene()
{
    for (std::size_t i = children.size(); i-- > 0;)
        if (i < children.size()) // a listener may have removed others
            children[i]->LeaveScene();
    if (indexed)
        sceneObjects->Leave(*this);
    if (told)
    {
        told = false;
        sceneObjects->Tell([this](VtISceneListener& listener) { listener.ObjectRemoved(*this); });
    }
    if (life)
        life->object = nullptr;
    life.reset();
    sceneObjects = nullptr;
}

bool VtCGlidePanelAbstractNavigatorObject::IsBelow(const VtCGlidePanelAbstractNavigatorObject& other) const
{
    const VtCGlidePanelAbstractNavigatorObject* above = parent;
    while (above && above != &other)
        above = above->parent;
    return above != nullptr;
}

const std::shared_ptr<VtTObjectLife>& VtCGlidePanelAbstractNavigatorObject::GetLife()
{
    if (!life)
        life = std::make_shared<VtTObjectLife>(VtTObjectLife{this});
    return life;
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
    return indexed ? sceneObjects->FindBelow(*this, id) : SearchById(id);
}

VtCGlidePanelAbstractNavigatorObject* VtCGlidePanelAbstractNavigatorObject::SearchById(std::wstring_view id) const
{
    return FindDescendant(*this, [&](const Object& object) { return base::EqualsNoCase(object.internalId, id); });
}

void VtCGlidePanelAbstractNavigatorObject::RebindAttributes(const std::wstring& newId)
{
    VtISceneObjectStore& store = GetServices().store;
    // Looked up first: `newId` may be the present id.
    const osg::ref_ptr<VtISceneObject> taken = store.GetObject(newId);
    // One that stands there already keeps its place among the records.
    if (!taken || taken != attributeObject || !base::EqualsNoCase(newId, internalId))
        RemoveAttributeObject();
    const bool found = indexed;
    if (found)
        sceneObjects->Leave(*this);
    internalId = newId;
    if (found)
        sceneObjects->Enter(*this);
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

#include "scene/SceneObject.h"

#include <algorithm>
#include <utility>

VtISceneObject::~VtISceneObject()
{
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
        attribute->owner = nullptr;
}

VtISceneAttribute* VtISceneObject::GetAttribute(std::wstring_view name) const
{
    const auto at = byName.find(name);
    return at == byName.end() ? nullptr : at->second;
}

void VtISceneObject::AddAttribute(std::wstring_view typeName, std::wstring_view valueText, const std::wstring& name)
{
    AddAttribute(name, AttributeValueFromText(AttributeTypeFromName(typeName), valueText));
}

void VtISceneObject::AddAttribute(const std::wstring& name, VtTAttributeValue value)
{
    const osg::ref_ptr<VtISceneAttribute> attribute = new VtISceneAttribute(name, std::move(value));
    attribute->owner = this;
    if (VtISceneAttribute* old = GetAttribute(name))
    {
        byName.erase(old->GetName());
        old->owner = nullptr;
        *std::find(attributes.begin(), attributes.end(), old) = attribute;
    }
    else
        attributes.push_back(attribute);
    byName.emplace(attribute->GetName(), attribute.get());
    Fire(*attribute);
}

void VtISceneObject::RemoveAttribute(std::wstring_view name)
{
    const auto at = byName.find(name);
    if (at == byName.end())
        return;
    VtISceneAttribute* attribute = at->second;
    byName.erase(at);
    attribute->owner = nullptr;
    attributes.erase(std::find(attributes.begin(), attributes.end(), attribute));
}

void VtISceneObject::Write(const std::wstring& name, VtTAttributeValue value)
{
    if (VtISceneAttribute* attribute = GetAttribute(name))
        attribute->SetValue(std::move(value));
    else
        AddAttribute(name, std::move(value));
}

void VtISceneObject::Advise(IPropertyChangedCOMEvents& listener)
{
    listeners.push_back(&listener);
}

void VtISceneObject::Unadvise(IPropertyChangedCOMEvents& listener)
{
    const auto at = std::find(listeners.begin(), listeners.end(), &listener);
    if (at == listeners.end())
        return;
    if (firing > 0)
        *at = nullptr;
    else
        listeners.erase(at);
}

void VtISceneObject::Fire(VtISceneAttribute& attribute)
{
    if (listeners.empty())
        return;

    // What is told may drop the last reference to either.
    const osg::ref_ptr<VtISceneObject> keepObject(this);
    const osg::ref_ptr<VtISceneAttribute> keepAttribute(&attribute);
    struct Firing
    {
        VtISceneObject& object;
        explicit Firing(VtISceneObject& fired) : object(fired) { ++object.firing; }
        ~Firing()
        {
            if (--object.firing == 0)
                std::erase(object.listeners, nullptr);
        }
    } const guard(*this);

    const std::size_t count = listeners.size();
    for (std::size_t i = 0; i < count; ++i)
        if (listeners[i])
            listeners[i]->OnPropertyChanged(*this, attribute);
}

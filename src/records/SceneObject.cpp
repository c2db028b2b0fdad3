#include "records/SceneObject.h"

#include <algorithm>
#include <utility>

#include "base/Text.h"

namespace
{

// Most records have some twenty attributes. A table by name pays for the few that have thousands.
constexpr std::size_t fewAttributes = 40;
constexpr std::size_t usualAttributes = 24;

// Names are mostly one shared text, and those of equal length mostly end differently.
bool IsSameName(std::wstring_view a, std::wstring_view b)
{
    return a.size() == b.size() && (a.empty() || a.data() == b.data() || (a.back() == b.back() && a == b));
}

} // namespace

template <class Tell>
void VtISceneObject::ForEachListener(VtISceneAttribute& attribute, Tell tell)
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
        if (listeners[i] && !tell(*listeners[i]))
            return;
}

VtISceneObject::VtISceneObject(std::int32_t objectType) : type(objectType)
{
    attributes.reserve(usualAttributes);
}

VtISceneObject::~VtISceneObject()
{
    for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
        attribute->owner = nullptr;
}

VtISceneAttribute* VtISceneObject::GetAttribute(std::wstring_view name) const
{
    if (byName.empty())
    {
        for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
            if (IsSameName(attribute->GetName(), name))
                return attribute.get();
        return nullptr;
    }
    const auto at = byName.find(name);
    return at == byName.end() ? nullptr : at->second;
}

void VtISceneObject::Index()
{
    if (!byName.empty())
        byName.emplace(attributes.back()->GetName(), attributes.back().get());
    else if (attributes.size() > fewAttributes)
        for (const osg::ref_ptr<VtISceneAttribute>& attribute : attributes)
            byName.emplace(attribute->GetName(), attribute.get());
}

void VtISceneObject::AddAttribute(std::wstring_view typeName, std::wstring_view valueText, std::wstring_view name)
{
    AddAttribute(name, AttributeValueFromText(AttributeTypeFromName(base::Utf8(typeName)), valueText));
}

void VtISceneObject::AddAttribute(std::wstring_view name, VtTAttributeValue value)
{
    VtISceneAttribute* old = GetAttribute(name);
    if (!old)
    {
        Append(ShareAttributeName(name), std::move(value));
        return;
    }
    const osg::ref_ptr<VtISceneAttribute> attribute = new VtISceneAttribute(old->name, std::move(value));
    attribute->owner = this;
    old->owner = nullptr;
    if (byName.erase(name) > 0)
        byName.emplace(attribute->GetName(), attribute.get());
    *std::find(attributes.begin(), attributes.end(), old) = attribute;
    Fire(*attribute);
}

bool VtISceneObject::AddNewAttribute(VtTAttributeName name, VtTAttributeValue value)
{
    if (GetAttribute(*name))
        return false;
    Append(std::move(name), std::move(value));
    return true;
}

void VtISceneObject::Append(VtTAttributeName name, VtTAttributeValue value)
{
    const osg::ref_ptr<VtISceneAttribute> attribute = new VtISceneAttribute(std::move(name), std::move(value));
    attribute->owner = this;
    attributes.push_back(attribute);
    Index();
    Fire(*attribute);
}

void VtISceneObject::RemoveAttribute(std::wstring_view name)
{
    const osg::ref_ptr<VtISceneAttribute> attribute = GetAttribute(name);
    if (!attribute)
        return;
    byName.erase(name);
    attribute->owner = nullptr;
    attributes.erase(std::find(attributes.begin(), attributes.end(), attribute));
    ForEachListener(*attribute,
                    [&](IPropertyChangedCOMEvents& listener)
                    {
                        listener.OnPropertyRemoved(*this, *attribute);
                        return true;
                    });
}

void VtISceneObject::Write(std::wstring_view name, VtTAttributeValue value)
{
    if (VtISceneAttribute* attribute = GetAttribute(name))
        attribute->SetValue(std::move(value));
    else
        Append(ShareAttributeName(name), std::move(value));
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
    const std::uint32_t change = attribute.changes;
    ForEachListener(attribute,
                    [&](IPropertyChangedCOMEvents& listener)
                    {
                        listener.OnPropertyChanged(*this, attribute);
                        // A later change has told the rest already, or the attribute is gone.
                        return attribute.changes == change && attribute.owner == this;
                    });
}

#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include <osg/ref_ptr>
#include <osg/Referenced>

#include "records/SceneAttribute.h"

/// Told of every change of an attribute of the records it is advised to.
class IPropertyChangedCOMEvents
{
public:
    virtual ~IPropertyChangedCOMEvents() = default;

    /// `attribute` holds the new value. Called within `SetValue`, or within the call that added the attribute. When
    /// somebody who is told changes the same attribute again, those behind him are told of the last value only.
    virtual void OnPropertyChanged(VtISceneObject& object, VtISceneAttribute& attribute) = 0;

    /// `attribute`, with its last value, belongs to `object` no longer.
    virtual void OnPropertyRemoved(VtISceneObject& /*object*/, VtISceneAttribute& /*attribute*/) {}
};

/// One record: the persistent values of one object of a scene, in the order they were added. Names are unique.
class VtISceneObject : public osg::Referenced
{
public:
    using Attributes = std::vector<osg::ref_ptr<VtISceneAttribute>>;

    explicit VtISceneObject(std::int32_t objectType = 0);

    /// What kind of object the record describes: 0 atmospherics, 1 window layout, 2 render settings, 3 view,
    /// 4 instrument, 5 observer, 6 static body, 7 movable body, 8 track, 9 default observer.
    std::int32_t GetObjectType() const { return type; }

    /// Leaves the attribute `object_type` as it is.
    void SetObjectType(std::int32_t objectType) { type = objectType; }

    const Attributes& GetAttributes() const { return attributes; }

    /// Null when there is none of that name. Names compare exactly.
    VtISceneAttribute* GetAttribute(std::wstring_view name) const;

    /// Adds an attribute; one of that name gives up its type and value to it. Throws `VtCAttributeError` for an
    /// empty name, an unknown type or a text that isn't a value of it; the record then stays as it was.
    void AddAttribute(std::wstring_view typeName, std::wstring_view valueText, std::wstring_view name);
    void AddAttribute(std::wstring_view name, VtTAttributeValue value);

    /// The same, but one of that name stays as it is; false then.
    bool AddNewAttribute(VtTAttributeName name, VtTAttributeValue value);

    void RemoveAttribute(std::wstring_view name);

    /// Sets the attribute, or adds it with the type of `value` when there is none.
    void Write(std::wstring_view name, VtTAttributeValue value);

    /// The value of `name` if it is there and of that type, else null. Valid until the attribute changes.
    template <class Type>
    const Type* Find(std::wstring_view name) const
    {
        const VtISceneAttribute* attribute = GetAttribute(name);
        return attribute ? std::get_if<Type>(&attribute->GetValue()) : nullptr;
    }

    /// Connects `listener` (not owned). It may disconnect itself, or any other, while it is being told.
    void Advise(IPropertyChangedCOMEvents& listener);
    void Unadvise(IPropertyChangedCOMEvents& listener);

protected:
    ~VtISceneObject() override;

private:
    friend class VtISceneAttribute;

    void Append(VtTAttributeName name, VtTAttributeValue value); // one that isn't there
    void Index();
    void Fire(VtISceneAttribute& attribute);

    template <class Tell>
    void ForEachListener(VtISceneAttribute& attribute, Tell tell);

    std::int32_t type;
    Attributes attributes;
    std::unordered_map<std::wstring_view, VtISceneAttribute*> byName; ///< all, or none while they are few
    std::vector<IPropertyChangedCOMEvents*> listeners;                ///< null: left while being told
    int firing = 0;
};

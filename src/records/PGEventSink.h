#pragma once

#include <cstdint>
#include <string_view>

#include <osg/ref_ptr>

#include "records/AttributeTable.h"
#include "records/SceneObject.h"

/// Keeps an object and its record in step, whichever of the two changes first.
///
/// A change of the record reaches the object by `OnAttributeChanged`, and what the object changes by itself is written
/// by `WriteBack`. What it writes doesn't come back to it, for it has acted on it already; other listeners of the
/// record are told all the same, and what they write in turn, be it the same attribute, reaches the object.
///
///     void VtCLight::SetIntensity(float value)
///     {
///         intensity = value;
///         sink.WriteBack(record.get(), attribute::intensity);
///     }
class VTIPGEventSink : public IPropertyChangedCOMEvents
{
public:
    explicit VTIPGEventSink(VtIRecordOwner& sinkOwner) : owner(sinkOwner) {}
    ~VTIPGEventSink() override { Disconnect(); }
    VTIPGEventSink(const VTIPGEventSink&) = delete;
    VTIPGEventSink& operator=(const VTIPGEventSink&) = delete;

    /// Listens to `newObject` and to nothing else; null only disconnects.
    void Connect(VtISceneObject* newObject);
    void Disconnect();

    /// Sets or adds an attribute of `record` without hearing of it; nothing when `record` is null. A value of another
    /// type than the present one replaces the attribute.
    void Write(VtISceneObject* record, std::wstring_view name, VtTAttributeValue value);

    /// Writes what the owner's table gives for `name`; nothing when it gives nothing, or numbers that no record holds.
    void WriteBack(VtISceneObject* record, std::wstring_view name);

    /// Replays `source` into the owner: first what its table knows, in the order of the table, then the rest in the
    /// order of `source`. `record`, unless it is null, takes all values first.
    void Apply(VtISceneObject* record, const VtISceneObject& source);

    void OnPropertyChanged(VtISceneObject& changed, VtISceneAttribute& attribute) override;

    /// The object falls back to the default, as it would have it from a record without the attribute.
    void OnPropertyRemoved(VtISceneObject& changed, VtISceneAttribute& attribute) override;

private:
    /// One write of the owner that is under way: of this name, and of no later change of it.
    struct OwnWrite
    {
        std::wstring_view name;
        std::uint32_t change;
        const OwnWrite* outer;
    };

    bool IsOwnWrite(const VtISceneAttribute& attribute) const;

    VtIRecordOwner& owner;
    osg::ref_ptr<VtISceneObject> object;
    const OwnWrite* ownWrites = nullptr;
    const VtISceneObject* replayed = nullptr; ///< by `Apply`
    std::size_t replayedRow = 0;
};

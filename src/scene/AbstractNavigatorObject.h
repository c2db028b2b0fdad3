#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include <osg/ref_ptr>

#include "records/AttributeTable.h"
#include "records/PGEventSink.h"
#include "records/SceneObject.h"
#include "scene/AbstractObject.h"

class VtCGlidePanelAbstractNavigatorObject;
class VtCSceneObjects;
class VtISceneDocument;
struct VtTSceneServices;

/// How far a constructor brings an object: `ObjectAdded` is told of a complete one only.
enum class VtEBirth
{
    complete,      ///< told at the end of the constructor
    recordFollows, ///< a stored record is applied next; told by `FinishLoad`
    stepsFollow,   ///< told by the `EnterScene` of who makes it
};

/// What handles of an object share with it.
struct VtTObjectLife
{
    VtCGlidePanelAbstractNavigatorObject* object; ///< null once it has gone
};

/// An object with an identity, a place in the object tree and a record in the attribute store.
///
/// A parent holds the one lasting reference to each of its children; an object made without a parent belongs to who
/// made it. The table of a class says what it stores. A write to the record ends in `OnAttributeChanged`, loading is
/// the replaying of a stored record through the same handler, and a setter writes the record when it has set the field.
class VtCGlidePanelAbstractNavigatorObject : public VtCGlidePanelAbstractObject, public VtIRecordOwner
{
public:
    using Objects = std::vector<VtCGlidePanelAbstractNavigatorObject*>;

    virtual void SetModified();

    /// Format of the object's section in a settings file, empty for objects without one.
    virtual std::wstring GetSectionFormat() const { return {}; }

    /// Merges `source` into the object's own record and applies every attribute, in the order of the table. While
    /// `IsLoading` it only applies them, for the loader has the object take `source` over by `RebindAttributes`.
    virtual void ApplyAttributes(VtISceneObject& source);

    /// A new default record of the type of `source` with every value of `source` that it has room for; null when
    /// the type has no default record.
    virtual osg::ref_ptr<VtISceneObject> CopyAttributes(const VtISceneObject& source) const;

    virtual osg::ref_ptr<VtISceneObject> GetAttributeObject() const { return attributeObject; }

    /// Ends the event connection and takes the record out of the store; the object keeps its reference to it.
    virtual void RemoveAttributeObject();

    /// The one handler of attribute changes: what the table of the class knows. Other names are ignored, and so is a
    /// value of another type than the attribute's.
    void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                            const VtTAttributeValue& value) override;

    /// That of an object without a record of its own knows `name`.
    const VtCAttributeTable& GetAttributeTable() const override;
    const std::wstring& GetRecordId() const override { return internalId; }
    void OnRecordChanged() override { SetModified(); }

    /// The name shown in the tree, and its record's `name`.
    const std::wstring& GetName() const { return displayName; }
    const std::wstring& GetInternalId() const { return internalId; }

    /// Null at the top, and after the parent let go.
    VtCGlidePanelAbstractNavigatorObject* GetParent() const { return parent; }

    const Objects& GetChildren() const { return children; }

    /// Takes a reference. A child of somebody else moves here; an object doesn't move below itself.
    void AddChild(VtCGlidePanelAbstractNavigatorObject& child);

    /// Gives back the reference to `child`, which usually is its end. A stranger is ignored.
    void RemoveChild(VtCGlidePanelAbstractNavigatorObject& child);
    void DetachFromParent();

    /// The object is complete: from now on listeners of its scene hear of it. Told once its parent has been told.
    void EnterScene();

    /// Tells that this and all below it leave the scene, while they are whole; nothing when that has been told.
    /// `RemoveChild` and `Destroy` do so; who ends a whole tree in another way calls it first.
    void LeaveScene();

    /// Complete and in the tree of a scene. The collections at the top are.
    bool IsInScene() const { return parent ? told : indexed; }

    bool IsBelow(const VtCGlidePanelAbstractNavigatorObject& other) const;

    /// For handles (scene/ObjectHandle.h).
    const std::shared_ptr<VtTObjectLife>& GetLife();

    /// All objects below this one, each followed by its own descendants.
    void CollectDescendants(Objects& descendants) const;

    /// The first descendant of that name or id, depth first, without regard to case; null when there is none. An id
    /// is looked up in the index of the scene.
    VtCGlidePanelAbstractNavigatorObject* FindByName(std::wstring_view name) const;
    VtCGlidePanelAbstractNavigatorObject* FindById(std::wstring_view id) const;
    bool IsNameFree(std::wstring_view name) const { return !FindByName(name); }

    /// Lets go of the present record and takes over the one that the store holds under `newId`, with its id. Without
    /// such a record the object has none from then on.
    void RebindAttributes(const std::wstring& newId);

    /// True while a loader applies a stored record.
    bool IsLoading() const { return loading; }
    void SetLoading(bool flag) { loading = flag; }

    VtISceneDocument& GetDocument() const { return *document; }
    VtTSceneServices& GetServices() const;

protected:
    /// An empty `id` is replaced by a fresh one. With a parent, the reference of creation is given up to it.
    VtCGlidePanelAbstractNavigatorObject(VtISceneDocument& owningDocument,
                                         VtCGlidePanelAbstractNavigatorObject* parentObject, const std::wstring& name,
                                         bool inTree, const std::wstring& id);
    ~VtCGlidePanelAbstractNavigatorObject() override;

    /// The row of `name`, for the tables of the classes.
    static VtTAttributeRow NameRow();

    /// Sets or adds an attribute of the own record without hearing of it; nothing without a record.
    void WriteAttribute(std::wstring_view name, VtTAttributeValue value);

    /// Writes the field of the attribute, as the table gives it, to the own record.
    void WriteBack(std::wstring_view name) { attributeSink->WriteBack(attributeObject.get(), name); }

    /// Adds an attribute to the own record unless it is there: with the default of the table, or with `value`.
    void AddMissingAttribute(std::wstring_view name);
    void AddMissingAttribute(std::wstring_view name, VtTAttributeValue value);

    /// Listens to the record from now on and puts it into the store. Nothing without a record.
    void PublishAttributes();

    /// Called when a child has left the list; its derived parts may be gone.
    virtual void ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child);

    /// Called when a complete object has got another parent, or one again.
    virtual void ParentChanged() {}

    /// The one place where a name changes.
    void SetDisplayName(const std::wstring& name);

    /// Of the scene that the object belongs to; null without one.
    VtCSceneObjects* GetSceneObjects() const { return sceneObjects; }

    std::wstring internalId;
    std::unique_ptr<VTIPGEventSink> attributeSink; ///< null only at the very end
    osg::ref_ptr<VtISceneObject> attributeObject;  ///< null: writes to it are skipped

private:
    friend class VtCSceneObjects;

    VtCGlidePanelAbstractNavigatorObject* SearchById(std::wstring_view id) const;
    void Forget(VtCGlidePanelAbstractNavigatorObject& child);

    std::wstring displayName;
    bool loading = false;
    bool indexed = false;  ///< in the index of the scene
    bool complete = false; ///< `EnterScene` was called
    bool told = false;     ///< `ObjectAdded` was told, `ObjectRemoved` not yet
    VtISceneDocument* document;
    VtCSceneObjects* sceneObjects = nullptr;
    std::shared_ptr<VtTObjectLife> life; ///< made for the first handle
    VtCGlidePanelAbstractNavigatorObject* parent = nullptr;
    Objects children;
};

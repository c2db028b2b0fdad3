#pragma once

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "base/Text.h"

class VtC3DMovableBody;
class VtCBase3DView;
class VtCGlidePanelAbstractNavigatorObject;

/// Hears what happens to the objects of a scene. What isn't overridden isn't heard.
///
///     class Tree : public VtISceneListener
///     {
///         void ObjectAdded(VtCGlidePanelAbstractNavigatorObject& object) override { Insert(object); }
///         void ObjectRemoved(VtCGlidePanelAbstractNavigatorObject& object) override { Remove(object); }
///     };
///     scene.GetObjects().AddListener(tree);
///
/// A listener may come and go, and change the scene, while it is told; only the object of `ObjectAdded` and
/// `ObjectRemoved` itself has to outlive that call.
class VtISceneListener
{
public:
    virtual ~VtISceneListener() = default;

    /// The object is complete: of its final class, in its place in the tree, with its record, a loaded one with the
    /// stored values. An object is told before those below it. The collections at the top are never told.
    virtual void ObjectAdded(VtCGlidePanelAbstractNavigatorObject&) {}

    /// It is still whole and in its place, but no longer found by its id. Told after those below it.
    virtual void ObjectRemoved(VtCGlidePanelAbstractNavigatorObject&) {}

    virtual void ObjectRenamed(VtCGlidePanelAbstractNavigatorObject&, const std::wstring& /*formerName*/) {}

    /// It has another parent now, and those below it came with it.
    virtual void ObjectMoved(VtCGlidePanelAbstractNavigatorObject&,
                             VtCGlidePanelAbstractNavigatorObject& /*formerParent*/)
    {
    }

    /// `GetConnectionState` of the body has changed. Of a group its parts are told.
    virtual void ConnectionStateChanged(VtC3DMovableBody&) {}

    /// Another view has the focus, or that view looks through another observer. Null: there is none.
    virtual void ActiveViewChanged(VtCBase3DView*, VtCGlidePanelAbstractNavigatorObject* /*observer*/) {}
};

/// The objects of a scene by their ids, and those who hear of them.
///
/// Objects enter themselves when they are made and take themselves out when they leave their tree. Ids compare without
/// regard to case. Several objects may share one: the parts of two static groups of one model bear the ids of its file.
/// A search below an object then gives the first in depth-first order, a search of the whole scene the one that has had
/// the id longest.
class VtCSceneObjects
{
public:
    using Object = VtCGlidePanelAbstractNavigatorObject;

    VtCSceneObjects() = default;

    /// Objects that live on are in no scene from then on.
    ~VtCSceneObjects();
    VtCSceneObjects(const VtCSceneObjects&) = delete;
    VtCSceneObjects& operator=(const VtCSceneObjects&) = delete;

    /// Null when there is none.
    Object* FindById(std::wstring_view id) const;

    /// The same among those below `above`.
    Object* FindBelow(const Object& above, std::wstring_view id) const;

    /// Not owned. One that joins while an event is told hears the next one.
    void AddListener(VtISceneListener& listener);
    void RemoveListener(VtISceneListener& listener);

    /// Calls `tell` with each listener.
    template <class Call>
    void Tell(const Call& tell)
    {
        const Telling guard(*this);
        for (std::size_t i = 0, count = listeners.size(); i < count; ++i)
            if (listeners[i])
                tell(*listeners[i]);
    }

private:
    friend class VtCGlidePanelAbstractNavigatorObject;

    /// Leavers leave a hole while somebody is told; the last one out closes them.
    class Telling
    {
    public:
        explicit Telling(VtCSceneObjects& told) : objects(told) { ++objects.telling; }
        ~Telling()
        {
            if (--objects.telling == 0)
                std::erase(objects.listeners, nullptr);
        }
        Telling(const Telling&) = delete;
        Telling& operator=(const Telling&) = delete;

    private:
        VtCSceneObjects& objects;
    };

    void Enter(Object& object);
    void Leave(Object& object);

    std::unordered_map<std::wstring, std::vector<Object*>, base::NoCaseHash, base::NoCaseEqual> byId;
    std::vector<VtISceneListener*> listeners; ///< null: left while being told
    int telling = 0;
};

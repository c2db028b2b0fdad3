#include "scene/SceneObjects.h"

#include "scene/AbstractNavigatorObject.h"

#include <algorithm>

VtCSceneObjects::~VtCSceneObjects()
{
    for (const auto& [id, objects] : byId)
        for (Object* object : objects)
        {
            object->sceneObjects = nullptr;
            object->indexed = object->told = false;
        }
}

VtCSceneObjects::Object* VtCSceneObjects::FindById(std::wstring_view id) const
{
    const auto at = byId.find(std::wstring(id));
    return at == byId.end() ? nullptr : at->second.front();
}

VtCSceneObjects::Object* VtCSceneObjects::FindBelow(const Object& above, std::wstring_view id) const
{
    const auto at = byId.find(std::wstring(id));
    if (at == byId.end())
        return nullptr;
    // Of several the tree itself knows which is the first.
    if (at->second.size() > 1)
        return above.SearchById(id);
    return at->second.front()->IsBelow(above) ? at->second.front() : nullptr;
}

void VtCSceneObjects::AddListener(VtISceneListener& listener)
{
    if (std::find(listeners.begin(), listeners.end(), &listener) == listeners.end())
        listeners.push_back(&listener);
}

void VtCSceneObjects::RemoveListener(VtISceneListener& listener)
{
    if (telling > 0)
        std::replace(listeners.begin(), listeners.end(), &listener, static_cast<VtISceneListener*>(nullptr));
    else
        std::erase(listeners, &listener);
}

void VtCSceneObjects::Enter(Object& object)
{
    byId[object.internalId].push_back(&object);
    object.indexed = true;
}

void VtCSceneObjects::Leave(Object& object)
{
    object.indexed = false;
    const auto at = byId.find(object.internalId);
    if (at == byId.end())
        return;
    std::erase(at->second, &object);
    if (at->second.empty())
        byId.erase(at);
}

#include "interaction/Pick.h"

#include <algorithm>
#include <string_view>

#include <osgViewer/View>

#include "scene/MovableBody.h"
#include "scene/StaticBody.h"
#include "scene/UserData.h"

namespace
{

/// Nodes that are taken hold of, by their names.
struct Handle
{
    std::string_view name;
    VtEPickCode code;
    bool overviewOnly;
};

constexpr Handle handles[] = {
    {"_active_dragger_", VtEPickCode::activeDragger, false},
    {"_overview_move_", VtEPickCode::overviewMove, true},
    {"_overview_rotate_", VtEPickCode::overviewRotate, true},
};

VtC3DBody* AsBody(VtCGlidePanelAbstractNavigatorObject* object)
{
    if (auto* movable = dynamic_cast<VtC3DMovableBody*>(object))
        return movable;
    return dynamic_cast<VtC3DStaticBody*>(object);
}

} // namespace

VtCPick::VtCPick(osgViewer::View* view, double x, double y)
{
    // In the window of the camera: what the queue knows of pointer and window is that of the library's own windows.
    if (view && view->getCamera()->getViewport())
        view->computeIntersections(view->getCamera(), osgUtil::Intersector::WINDOW, x, y, hits);
}

VtCGlidePanelAbstractNavigatorObject* VtCPick::OwnerOf(const osg::NodePath& path)
{
    for (auto node = path.rbegin(); node != path.rend(); ++node)
        if (const auto* data = dynamic_cast<const VtCOsgUserData*>((*node)->getUserData()))
            return data->owner;
    return nullptr;
}

VtC3DBody* VtCPick::GetBody() const
{
    return IsEmpty() ? nullptr : AsBody(OwnerOf(hits.begin()->nodePath));
}

VtEPickCode VtCPick::FindHandle(bool inOverview) const
{
    for (const auto& hit : hits)
        for (auto node = hit.nodePath.rbegin(); node != hit.nodePath.rend(); ++node)
            for (const Handle& handle : handles)
                if ((*node)->getName() == handle.name && (inOverview || !handle.overviewOnly))
                    return handle.code;
    return VtEPickCode::nothing;
}

VtCPick::Picked VtCPick::GetEditable(bool inOverview) const
{
    if (const VtEPickCode handle = FindHandle(inOverview); handle != VtEPickCode::nothing)
        return {handle, nullptr};

    for (const auto& hit : hits)
    {
        VtC3DBody* body = AsBody(OwnerOf(hit.nodePath));
        if (!body || body->IsFixedToWorld() || !body->IsSelectable())
            continue;
        const bool isStatic = dynamic_cast<VtC3DStaticBody*>(body) != nullptr;
        if (isStatic || !body->IsGroupChild())
            return {isStatic ? VtEPickCode::staticBody : VtEPickCode::movableBody, body};
    }
    return {};
}

std::optional<osg::Vec3d> VtCPick::GetPoint() const
{
    const auto met = std::find_if(hits.begin(), hits.end(),
                                  [](const auto& hit)
                                  {
                                      const VtC3DBody* body = AsBody(OwnerOf(hit.nodePath));
                                      return body && body->IsSelectable();
                                  });
    return met == hits.end() ? std::nullopt : std::optional<osg::Vec3d>(met->getWorldIntersectPoint());
}

#pragma once

#include <cstdint>
#include <optional>

#include <osg/Vec3d>
#include <osgUtil/LineSegmentIntersector>

namespace osgViewer
{
class View;
}
class VtC3DBody;
class VtCGlidePanelAbstractNavigatorObject;

/// What a pointer in an editor view has met, by the numbers that editing tools know.
enum class VtEPickCode : std::int32_t
{
    nothing = -1,
    staticBody = 1,
    movableBody = 2,
    overviewMove = 3,   ///< the marker of the edit camera in the overview, by which it is moved
    overviewRotate = 4, ///< and by which it is turned
    activeDragger = 5,  ///< a handle of the dragger in use
};

/// Everything under one pixel of a view, and whom it belongs to.
///
///     const VtCPick pick(view, 120, 80);        // pixels from the lower left corner
///     if (const VtC3DBody* body = pick.GetBody())
///         selection.SelectOnly(body->GetInternalId());
///
/// The hits stand nearest first. Each is looked at from its leaf to the root, and the first node with a
/// `VtCOsgUserData` names its object. Hidden bodies aren't met, and neither are lines, such as those of a selection
/// box. To be read at once: it holds nothing of the graph that it has met.
class VtCPick
{
public:
    /// Looks along the ray of that pixel of the view's own camera. Null meets nothing.
    VtCPick(osgViewer::View* view, double x, double y);

    bool IsEmpty() const { return hits.empty(); }

    /// The body that the nearest hit belongs to, what may be done with it or not; null for nothing and for anything
    /// else. It is what a double click selects.
    VtC3DBody* GetBody() const;

    struct Picked
    {
        VtEPickCode code = VtEPickCode::nothing;
        VtC3DBody* body = nullptr; ///< with the codes of bodies
    };

    /// What an editor works on. A handle of the dragger, in the overview also the marker, answers through whatever
    /// stands in front of it. Else it is the nearest body that is selectable and not fixed; a part of a group isn't
    /// taken out of it, unless it is a static body.
    Picked GetEditable(bool inOverview) const;

    /// Where the nearest selectable object is met (scene, metres): the place at which something new is put.
    std::optional<osg::Vec3d> GetPoint() const;

private:
    using Hits = osgUtil::LineSegmentIntersector::Intersections;

    static VtCGlidePanelAbstractNavigatorObject* OwnerOf(const osg::NodePath& path);
    VtEPickCode FindHandle(bool inOverview) const;

    Hits hits;
};

#pragma once

#include <memory>
#include <string>
#include <vector>

#include "scene/Bodies.h"
#include "scene/MovableBody.h"

class VtCTrack;

/// The movable bodies of one source: of the simulation itself, or the clones of a track.
class VtCMovableBodies : public VtC3DBodies
{
public:
    /// `bodiesTrack` (not owned) is null for the bodies of the simulation.
    VtCMovableBodies(VtISceneDocument& owningDocument, osg::Group* collectionParent, const std::wstring& name,
                     VtCTrack* bodiesTrack = nullptr);

    std::wstring GetSectionFormat() const override { return L"MOVABLEBODY_%d"; }

    VtCTrack* GetTrack() const { return track; }

    /// The members, in collection order. A part of a grouped member isn't one.
    const std::vector<VtC3DMovableBody*>& GetBodies() const { return bodies; }

    /// What a frame moves: every member that is no group, and in the place of a group its parts. Valid until a body
    /// comes or goes.
    const std::vector<VtTBodyMotion*>& GetMotions();

    /// Destroys the body of that id and marks the document as changed; nothing when there is none.
    void RemoveBody(const std::wstring& id);

    /// Destroys all members and takes the collection out of the graph.
    void RemoveAllBodies();

protected:
    ~VtCMovableBodies() override = default;
    void ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child) override;

private:
    friend class VtC3DMovableBody;

    std::vector<VtC3DMovableBody*> bodies;
    std::shared_ptr<VtCMotionPool> pool = std::make_shared<VtCMotionPool>();
    std::vector<VtTBodyMotion*> motions;
    bool motionsStale = false;
    VtCTrack* track;
};

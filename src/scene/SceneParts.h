#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "records/SceneObject.h"

class VtC3DMovableBody;
class VtCGlidePanelAbstractNavigatorObject;

/// Observers that ride on a body that the scene doesn't hold.
struct VtTMissingTarget
{
    std::wstring bodyName;
    std::vector<VtCGlidePanelAbstractNavigatorObject*> observers; ///< not owned
};

/// The observers as the loading of a scene sees them. The collection of observers implements it.
class VtIObserverRecords
{
public:
    virtual ~VtIObserverRecords() = default;

    /// 0 "Free1", 1 "Free2"; null while they aren't made.
    virtual VtCGlidePanelAbstractNavigatorObject* GetDefaultObserver(int index) const = 0;

    virtual VtCGlidePanelAbstractNavigatorObject& MakeObserver(const std::wstring& name, const std::wstring& id) = 0;

    /// Those without a body that keep the name of one, grouped by it without regard to case, in the order of the
    /// collection. The default observers are none of them.
    virtual std::vector<VtTMissingTarget> GetMissingTargets() const = 0;

    /// The observers of `missing` ride on `body` from now on, and their records say so.
    virtual void SetTarget(const VtTMissingTarget& missing, VtC3DMovableBody& body) = 0;
};

/// The panes as the loading of a scene sees them. The child frame implements it.
class VtISceneViews
{
public:
    virtual ~VtISceneViews() = default;

    /// The view of pane 1 to 4 takes the values of `record` and then the record itself, which the store holds under
    /// `id`. Nothing for other panes.
    virtual void ApplyViewRecord(std::int32_t pane, VtISceneObject& record, const std::wstring& id) = 0;

    /// The splitter takes over the layout record that the store holds under `id`, and its position.
    virtual void ApplyLayoutRecord(const std::wstring& id) = 0;

    /// Marks the observer of the active view as looked through, and takes the head light there.
    virtual void ActivateObserver() = 0;
};

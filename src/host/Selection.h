#pragma once

#include <string>
#include <vector>

namespace host
{

/// Hears of a change of the selection.
class SelectionListener
{
public:
    virtual ~SelectionListener() = default;

    /// Called once for each change, when it has been made.
    virtual void SelectionChanged() = 0;
};

/// What the user has selected, by the `internal_id` of the objects, in the order in which they were added: one truth
/// for the panes, the tree, the property grid and everything else that shows it. Ids compare without regard to case.
///
///     host.GetSelection().SelectOnly(body.GetInternalId());
///
/// Objects that leave their scene leave the selection; the document sees to it.
class Selection
{
public:
    virtual ~Selection() = default;

    virtual void ClearSelection() = 0;
    virtual void AddToSelection(const std::wstring& id) = 0;
    virtual void RemoveFromSelection(const std::wstring& id) = 0;

    /// That object and no other; one change.
    virtual void SelectOnly(const std::wstring& id) = 0;

    virtual bool IsSelected(const std::wstring& id) const = 0;
    virtual const std::vector<std::wstring>& GetSelection() const = 0;

    /// Not owned. A listener may leave while it is told.
    virtual void AddListener(SelectionListener& listener) = 0;
    virtual void RemoveListener(SelectionListener& listener) = 0;
};

} // namespace host

#include "hosts/common/SelectionList.h"

#include "base/Text.h"

#include <algorithm>
#include <utility>

namespace hosts
{

void SelectionList::AddToSelection(const std::wstring& id)
{
    if (IsSelected(id))
        return;
    std::vector<std::wstring> more = selected;
    more.push_back(id);
    Take(std::move(more));
}

void SelectionList::RemoveFromSelection(const std::wstring& id)
{
    std::vector<std::wstring> left = selected;
    std::erase_if(left, [&](const std::wstring& present) { return base::EqualsNoCase(present, id); });
    Take(std::move(left));
}

bool SelectionList::IsSelected(const std::wstring& id) const
{
    return std::any_of(selected.begin(), selected.end(),
                       [&](const std::wstring& present) { return base::EqualsNoCase(present, id); });
}

void SelectionList::RemoveListener(host::SelectionListener& listener)
{
    if (telling > 0)
        std::replace(listeners.begin(), listeners.end(), &listener, static_cast<host::SelectionListener*>(nullptr));
    else
        std::erase(listeners, &listener);
}

void SelectionList::Take(std::vector<std::wstring> ids)
{
    if (ids == selected)
        return;
    selected = std::move(ids);
    ++telling;
    for (std::size_t i = 0, count = listeners.size(); i < count; ++i)
        if (listeners[i])
            listeners[i]->SelectionChanged();
    if (--telling == 0)
        std::erase(listeners, nullptr);
}

} // namespace hosts

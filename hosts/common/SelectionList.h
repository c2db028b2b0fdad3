#pragma once

#include "host/Selection.h"

namespace hosts
{

/// The selection of any host: a list in memory.
class SelectionList : public host::Selection
{
public:
    void ClearSelection() override { Take({}); }
    void AddToSelection(const std::wstring& id) override;
    void RemoveFromSelection(const std::wstring& id) override;
    void SelectOnly(const std::wstring& id) override { Take({id}); }
    bool IsSelected(const std::wstring& id) const override;
    const std::vector<std::wstring>& GetSelection() const override { return selected; }
    void AddListener(host::SelectionListener& listener) override { listeners.push_back(&listener); }
    void RemoveListener(host::SelectionListener& listener) override;

private:
    void Take(std::vector<std::wstring> ids);

    std::vector<std::wstring> selected;
    std::vector<host::SelectionListener*> listeners; ///< null: left while being told
    int telling = 0;
};

} // namespace hosts

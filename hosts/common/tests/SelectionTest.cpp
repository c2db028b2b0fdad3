#include <gtest/gtest.h>

#include "hosts/common/SelectionList.h"

namespace
{

using Ids = std::vector<std::wstring>;

struct Counter : host::SelectionListener
{
    void SelectionChanged() override
    {
        ++changes;
        if (leaves)
            leaves->RemoveListener(*this);
    }
    host::Selection* leaves = nullptr;
    int changes = 0;
};

TEST(Selection, TellsEachChangeOnceAndKeepsTheOrder)
{
    hosts::SelectionList selection;
    Counter once, counter;
    once.leaves = &selection;
    selection.AddListener(once);
    selection.AddListener(counter);
    selection.ClearSelection();
    EXPECT_EQ(counter.changes, 0) << "nothing has changed";
    selection.AddToSelection(L"car");
    selection.AddToSelection(L"house");
    selection.AddToSelection(L"CAR");
    EXPECT_EQ(selection.GetSelection(), (Ids{L"car", L"house"}));
    EXPECT_TRUE(selection.IsSelected(L"House"));
    selection.RemoveFromSelection(L"Car");
    selection.RemoveFromSelection(L"nobody");
    selection.SelectOnly(L"eye");
    selection.SelectOnly(L"eye");
    EXPECT_EQ(selection.GetSelection(), Ids{L"eye"});
    selection.ClearSelection();
    EXPECT_TRUE(selection.GetSelection().empty());
    EXPECT_EQ(counter.changes, 5);
    EXPECT_EQ(once.changes, 1);
    selection.RemoveListener(counter);
    selection.AddToSelection(L"car");
    EXPECT_EQ(counter.changes, 5);
}

} // namespace

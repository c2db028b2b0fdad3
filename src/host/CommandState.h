#pragma once

#include <string>

/// What a button or menu entry of a command shows.
struct VtTCommandState
{
    bool enabled = false;
    bool checked = false;
};

/// How a command shows in a menu.
struct VtTMenuState : VtTCommandState
{
    std::wstring text; ///< empty: the menu's own
};

#pragma once

#include <string>

/// Lets the user change the settings of the controller and of the data points. The layer of the dialogs implements it.
class VtICustomizeSheet
{
public:
    virtual ~VtICustomizeSheet() = default;

    /// Is there somebody to show sheets?
    virtual bool CanCustomize() const = 0;

    /// The sheet with all pages: the controller's, then those of the data points.
    virtual void Customize() = 0;

    /// Has the point of that name settings to show? Asks the point, so not for every frame.
    virtual bool CanCustomizePoint(const std::wstring& name) const = 0;

    /// One point alone: a question for the file of the point "File", its own page for any other.
    virtual void CustomizePoint(const std::wstring& name) = 0;
};

#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace SimulationDataPoints
{

/// A number on a page of settings.
struct VtTSettingsField
{
    std::wstring label;
    double value = 0.0;
    bool editable = false; ///< the rest is for fields that the user can change
    double minimum = 0.0;
    double maximum = 0.0;
    double step = 1.0;
    int decimals = 0;
    std::wstring minimumText = {}; ///< shown in place of the minimum, which then means something of its own: "never"
};

/// A page of settings without the toolkit that draws it: whoever shows it asks for the fields, tells the edits, and
/// shows the fields anew after each. Nothing takes effect before `OnOK`.
class VtCSettingsPage
{
public:
    virtual ~VtCSettingsPage() = default;

    /// For the tab of the page.
    virtual std::wstring GetTitle() const = 0;

    /// Top to bottom. Their number and order stay as long as the page lives.
    virtual std::vector<VtTSettingsField> GetFields() const = 0;

    /// The user changed an editable field. A value that the page doesn't take leaves its fields as they were.
    virtual void OnFieldChanged(std::size_t field, double value) = 0;

    /// The sheet was closed with OK.
    virtual void OnOK() = 0;
};

} // namespace SimulationDataPoints

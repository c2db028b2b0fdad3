#pragma once

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/PropertySheets.h"
#include "simdata/ControllerCommands.h"
#include "simdata/points/SettingsPage.h"
#include "simdata/tests/SimulationFixture.h"
#include "ui/SimulationDataControllerDialog.h"
#include "ui/SimulationDataCustomizeSheet.h"

/// The controller's dialog over a window that remembers what it shows.
namespace uitest
{

class View : public VtIControllerDialogView
{
public:
    void StartTimer(std::uint32_t newPeriod) override { period = newPeriod; }
    void ShowPoints(const std::vector<std::wstring>& newEntries, std::size_t newChosen) override
    {
        entries = newEntries;
        chosen = newChosen;
    }
    void ShowFrame(const VtTShownFrame& newFrame, const std::wstring& newTime) override
    {
        frame = newFrame;
        time = newTime;
        ++updates;
    }
    void ShowSpeed(std::uint32_t newPosition, const std::wstring& newText) override
    {
        position = newPosition;
        speed = newText;
    }
    void ShowCommand(std::uint32_t command, const VtTCommandState& state) override { commands[command] = state; }
    void OnDialogGone() override { gone = true; }

    bool Enabled(std::uint32_t command) const { return commands.at(command).enabled; }
    bool Checked(std::uint32_t command) const { return commands.at(command).checked; }

    std::uint32_t period = 0;
    std::vector<std::wstring> entries;
    std::size_t chosen = 99;
    VtTShownFrame frame;
    std::wstring time;
    int updates = 0;
    std::uint32_t position = 99;
    std::wstring speed;
    std::map<std::uint32_t, VtTCommandState> commands;
    bool gone = false;
};

/// Answers for the user, and lets the test change a field first.
class Sheets : public host::PropertySheets
{
public:
    bool ShowPropertySheet(const std::wstring& newTitle,
                           const std::vector<SimulationDataPoints::VtCSettingsPage*>& pages,
                           std::size_t newStart) override
    {
        title = newTitle;
        start = newStart;
        titles.clear();
        for (SimulationDataPoints::VtCSettingsPage* page : pages)
            titles.push_back(page->GetTitle());
        if (edit)
            pages[0]->OnFieldChanged(0, *edit);
        ++shown;
        return confirm;
    }

    bool confirm = true;
    std::optional<double> edit;
    std::wstring title;
    std::size_t start = 99;
    std::vector<std::wstring> titles;
    int shown = 0;
};

/// A controller with "Live" (frames 1 to 4 at 1.00, 1.01, 1.02 and 1.04 s) selected, and the dialog in a shown pane.
class DialogTest : public simtest::SimulationTest
{
protected:
    DialogTest() : sheet(controller, {texts, &messageService, &sheets, &questions})
    {
        userInterface.shownPanes[6247] = true;
        router.SelectPoint(L"Live");
        dialog = std::make_unique<VtCSimulationDataControllerDialog>(controller, &sheet, &userInterface);
        dialog->OnInitDialog(view);
        log.clear();
    }
    ~DialogTest() override { dialog.reset(); }

    void Hide() { userInterface.shownPanes.clear(); }

    fake::MessageService messageService;
    Sheets sheets;
    VtCSimulationDataCustomizeSheet sheet;
    View view;
    std::unique_ptr<VtCSimulationDataControllerDialog> dialog;
};

} // namespace uitest

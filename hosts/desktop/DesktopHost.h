#pragma once

#include <filesystem>
#include <map>
#include <memory>

#include "base/IniFile.h"
#include "host/Frame.h"
#include "host/Host.h"
#include "hosts/common/DocumentList.h"
#include "hosts/common/FileStorage.h"
#include "hosts/common/HostTexts.h"
#include "hosts/common/IdleLoop.h"
#include "hosts/common/SelectionList.h"
#include "hosts/common/System.h"
#include "hosts/desktop/FileQuestions.h"
#include "hosts/desktop/IdlePump.h"
#include "hosts/desktop/MessageBoxes.h"
#include "hosts/desktop/PaneGraphics.h"
#include "hosts/desktop/ProgressBox.h"
#include "hosts/desktop/PropertySheets.h"

namespace desktop
{

/// What of the host belongs to the main window. That implements it.
class WindowServices : public host::MainWindow, public host::UserInterface
{
public:
    /// The text of a status line field has changed.
    virtual void ShowVariable(const std::wstring& name, const std::wstring& value) = 0;
};

/// Values by name that the status line shows.
class DesktopVariables : public host::Variables
{
public:
    explicit DesktopVariables(host::IdleSource& source) : idleSource(source) {}

    /// Shows the present values in `newWindow` and every change from now on.
    void SetWindow(WindowServices* newWindow);

    void SetText(const std::wstring& name, const std::wstring& value) override;
    void SetBool(const std::wstring&, bool) override {} // idle events are paced, never thinned out
    host::IdleSource* GetIdleSource() override { return &idleSource; }

    /// Empty when it was never set.
    std::wstring GetText(const std::wstring& name) const;

private:
    host::IdleSource& idleSource;
    WindowServices* window = nullptr;
    std::map<std::wstring, std::wstring> values;
};

/// The program around the component on a desktop. The services of the window come with the main window, which is made
/// after this and goes before it.
class DesktopHost : public host::Host
{
public:
    DesktopHost();
    ~DesktopHost() override;

    host::Clock& GetClock() override { return clock; }
    host::Texts& GetTexts() override { return texts; }
    host::LibraryPaths& GetLibraryPaths() override { return paths; }
    host::Selection& GetSelection() override { return selection; }
    host::MainWindow* GetMainWindow() override { return window; }
    host::Variables* GetVariables() override { return &variables; }
    host::UserInterface* GetUserInterface() override { return window; }
    host::DocumentManager* GetDocumentManager() override { return &documents; }
    host::MessageService* GetMessageService() override { return &messages; }
    host::Progress* GetProgress() override { return &progress; }
    host::Configuration* GetConfiguration() override { return &configuration; }
    host::Settings* GetSettings() override { return &settings; }
    host::Questions* GetQuestions() override { return &questions; }
    host::Graphics* GetGraphics() override { return &graphics; }
    host::ViewWindows* GetViewWindows() override { return viewWindows; }
    host::PropertySheets* GetPropertySheets() override { return &sheets; }

    void SetWindow(WindowServices* services, host::ViewWindows* windows);

    IdlePump& GetPump() { return pump; }
    MessageBoxes& GetMessages() { return messages; }
    ProgressBox& GetProgressBox() { return progress; }
    FileQuestions& GetFileQuestions() { return questions; }
    DesktopVariables& GetDesktopVariables() { return variables; }

    /// The program's own state in a file: windows, recent files. Empty path without a home.
    std::filesystem::path GetStateFile() const;

private:
    PausedClock clock;
    std::filesystem::path module;
    std::filesystem::path data;
    hosts::IniTexts texts;
    MessageBoxes messages;
    base::IniFile configurationFile;
    hosts::FileConfiguration configuration;
    hosts::FileSettings settings;
    hosts::SystemPaths paths;
    hosts::IdleLoop loop;
    IdlePump pump;
    ProgressBox progress;
    DesktopVariables variables;
    FileQuestions questions;
    PropertySheets sheets;
    PaneGraphics graphics;
    hosts::SelectionList selection; // documents take their objects out of it
    hosts::DocumentList documents;
    WindowServices* window = nullptr;
    host::ViewWindows* viewWindows = nullptr;
};

} // namespace desktop

#pragma once

#include <filesystem>
#include <memory>
#include <string>

#include "base/IniFile.h"
#include "host/Frame.h"
#include "host/Host.h"
#include "host/Questions.h"
#include "hosts/common/DocumentList.h"
#include "hosts/common/EglGraphics.h"
#include "hosts/common/FileStorage.h"
#include "hosts/common/HostTexts.h"
#include "hosts/common/IdleLoop.h"
#include "hosts/common/OffscreenViews.h"
#include "hosts/common/SelectionList.h"
#include "hosts/common/System.h"
#include "hosts/console/ConsoleMessages.h"
#include "hosts/console/Terminal.h"
#include "hosts/console/TerminalProgress.h"

namespace console
{

/// A main window that is always there: a console program has nothing to minimise, but nothing moves without one.
class ConsoleWindow : public host::MainWindow
{
public:
    std::int32_t GetWindowState() const override { return state; }
    void SetWindowState(std::int32_t newState) override { state = newState; }
    void Hide() override {} // nobody sees it either way
    void ShowMaximised() override {}

private:
    std::int32_t state = host::windowNormal;
};

/// A console has no status line, so what the component publishes for it goes nowhere.
class ConsoleVariables : public host::Variables
{
public:
    explicit ConsoleVariables(host::IdleSource& source) : idleSource(source) {}

    void SetText(const std::wstring&, const std::wstring&) override {}
    void SetBool(const std::wstring&, bool) override {}
    host::IdleSource* GetIdleSource() override { return &idleSource; }

private:
    host::IdleSource& idleSource;
};

/// Nobody is there to ask, so every question stays without an answer.
class ConsoleQuestions : public host::Questions
{
public:
    std::optional<std::wstring> AskSaveFile(const host::FileQuestion&) override { return std::nullopt; }
    std::optional<std::wstring> AskOpenFile(const host::FileQuestion&) override { return std::nullopt; }
    std::optional<std::size_t> AskReplacement(const host::ReplacementQuestion&) override { return std::nullopt; }
};

/// The program around the component on a console: messages and progress on standard error, settings under the XDG
/// folder, pictures off-screen. It has no menus and tool bars, so there is no user interface service.
class ConsoleHost : public host::Host
{
public:
    /// `showLog`: log messages are shown too.
    explicit ConsoleHost(bool showLog);
    ~ConsoleHost() override;

    host::Clock& GetClock() override { return clock; }
    host::Texts& GetTexts() override { return texts; }
    host::LibraryPaths& GetLibraryPaths() override { return paths; }
    host::Selection& GetSelection() override { return selection; }
    host::MainWindow* GetMainWindow() override { return &window; }
    host::Variables* GetVariables() override { return &variables; }
    host::UserInterface* GetUserInterface() override { return nullptr; }
    host::DocumentManager* GetDocumentManager() override { return &documents; }
    host::MessageService* GetMessageService() override { return &messages; }
    host::Progress* GetProgress() override { return &progress; }
    host::Configuration* GetConfiguration() override { return &configuration; }
    host::Settings* GetSettings() override { return &settings; }
    host::Questions* GetQuestions() override { return &questions; }
    host::Graphics* GetGraphics() override { return &graphics; }
    host::ViewWindows* GetViewWindows() override { return &views; }

    hosts::IdleLoop& GetIdleLoop() { return loop; }
    hosts::OffscreenViews& GetViews() { return views; }
    ConsoleMessages& GetMessages() { return messages; }
    Terminal& GetTerminal() { return terminal; }

    /// Messages of the command itself, by their number in the texts; paths come in their own form.
    void ShowError(std::uint32_t number, const std::string& first = {}, const std::string& second = {});
    void ShowInformation(std::uint32_t number, const std::string& first = {}, const std::string& second = {});

private:
    hosts::SystemClock clock;
    Terminal terminal;
    std::filesystem::path module;
    std::filesystem::path data;
    hosts::IniTexts texts;
    ConsoleMessages messages;
    TerminalProgress progress;
    base::IniFile configurationFile;
    hosts::FileConfiguration configuration;
    hosts::FileSettings settings;
    hosts::SystemPaths paths;
    hosts::IdleLoop loop;
    ConsoleWindow window;
    ConsoleVariables variables;
    ConsoleQuestions questions;
    hosts::EglGraphics graphics;
    hosts::OffscreenViews views{clock};
    hosts::SelectionList selection; // documents take their objects out of it
    hosts::DocumentList documents;
};

} // namespace console

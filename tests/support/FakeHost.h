#pragma once

#include <algorithm>
#include <map>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "host/Clock.h"
#include "host/Documents.h"
#include "host/Frame.h"
#include "host/Host.h"
#include "host/Idle.h"
#include "host/InterfaceError.h"
#include "host/LibraryPaths.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "host/Questions.h"
#include "host/Selection.h"
#include "host/Storage.h"

/// A host for tests: it answers and remembers, and expects nothing by itself.
namespace fake
{

/// Stands still until a test moves it; `Sleep` moves it too, so that no test waits.
class Clock : public host::Clock
{
public:
    std::uint32_t TickCount() const override { return startTicks + static_cast<std::uint32_t>(microseconds / 1000); }
    std::int64_t Counter() const override { return 1 + microseconds; }
    std::int64_t CounterFrequency() const override { return 1000000; }
    void Sleep(std::uint32_t milliseconds) override
    {
        sleeps.push_back(milliseconds);
        microseconds += std::int64_t{milliseconds} * 1000;
    }

    void Advance(double seconds) { microseconds += static_cast<std::int64_t>(seconds * 1e6 + 0.5); }

    std::uint32_t startTicks = 1000; ///< near 0xFFFFFFFF for a test of the wrap
    std::int64_t microseconds = 0;
    std::vector<std::uint32_t> sleeps;
};

class MainWindow : public host::MainWindow
{
public:
    std::int32_t GetWindowState() const override
    {
        if (fails)
            throw host::InterfaceError(-1, "MainWindow");
        return state;
    }
    void SetWindowState(std::int32_t newState) override { state = newState; }
    void Hide() override { shown = false; }
    void ShowMaximised() override { shown = true; }

    std::int32_t state = host::windowNormal;
    bool shown = true;
    bool fails = false;
};

class IdleSource : public host::IdleSource
{
public:
    std::uint32_t Advise(host::IIdleProcessingEvents& sink) override
    {
        sinks[++lastCookie] = &sink;
        return lastCookie;
    }
    void Unadvise(std::uint32_t cookie) override { sinks.erase(cookie); }

    /// One idle event to every sink; the out flag of the last.
    std::int32_t Raise();

    std::uint32_t lastCookie = 0;
    std::map<std::uint32_t, host::IIdleProcessingEvents*> sinks;
};

class Variables : public host::Variables
{
public:
    void SetText(const std::wstring& name, const std::wstring& value) override
    {
        texts[name] = value;
        ++writes;
    }
    void SetBool(const std::wstring& name, bool value) override { bools[name] = value; }
    host::IdleSource* GetIdleSource() override { return hasIdle ? &idle : nullptr; }

    std::map<std::wstring, std::wstring> texts;
    std::map<std::wstring, bool> bools;
    int writes = 0;
    bool hasIdle = true;
    IdleSource idle;
};

class UserInterface : public host::UserInterface
{
public:
    void AddMenuResource(std::uint32_t resource) override { menus.push_back(resource); }
    void SetToolBarEvents(host::ToolBarEvents* events) override { toolBar = events; }
    bool IsPaneShown(std::uint32_t pane) const override { return shownPanes.contains(pane); }
    void BeginWaitCursor() override { ++waitCursors; }
    void EndWaitCursor() override { --waitCursors; }

    std::vector<std::uint32_t> menus;
    host::ToolBarEvents* toolBar = nullptr;
    std::map<std::uint32_t, bool> shownPanes;
    int waitCursors = 0;
};

/// Gives the number as the text, and what a test put in for it.
class Texts : public host::Texts
{
public:
    std::wstring GetText(std::uint32_t number) const override
    {
        const auto at = known.find(number);
        return at == known.end() ? std::to_wstring(number) : at->second;
    }

    std::map<std::uint32_t, std::wstring> known;
};

class MessageService : public host::MessageService
{
public:
    std::shared_ptr<const host::ShownMessage> Show(const host::Message& message) override
    {
        shown.push_back(message);
        auto result = std::make_shared<host::ShownMessage>();
        result->number = message.number;
        result->severity = message.severity;
        result->text = message.number == 0 ? message.text : std::to_wstring(message.number);
        return result;
    }

    std::vector<host::Message> shown;
};

/// A message handler for what stands below the application object.
class MessageHandler : public host::MessageHandler
{
public:
    struct Entry
    {
        host::Severity severity;
        std::uint32_t number;
        std::wstring first;
        std::wstring second;
        bool interrupts;
    };

    Shown Log(std::uint32_t number, const std::wstring& first, const std::wstring& second) override
    {
        return Add({host::Severity::information, number, first, second, false});
    }
    Shown ShowInformation(std::uint32_t number, const std::wstring& first, const std::wstring& second) override
    {
        return Add({host::Severity::information, number, first, second, true});
    }
    Shown ShowWarning(std::uint32_t number, const std::wstring& first, const std::wstring& second) override
    {
        return Add({host::Severity::warning, number, first, second, true});
    }
    Shown ShowError(std::uint32_t number, const std::wstring& first, const std::wstring& second) override
    {
        return Add({host::Severity::error, number, first, second, true});
    }
    void ReportStack(const SimulationDataPoints::VtCMessageStack& stack, const std::wstring&) override
    {
        stacks.push_back(&stack);
    }

    bool Has(host::Severity severity, std::uint32_t number) const;

    std::vector<Entry> shown;
    std::vector<const SimulationDataPoints::VtCMessageStack*> stacks; ///< addresses only: a stack may be gone

private:
    Shown Add(Entry entry);
};

class Progress : public host::Progress
{
public:
    struct Activity
    {
        std::wstring title;
        std::wstring text;
        long count = 0;
        long steps = 0;
        bool connected = false;
    };

    void ConnectProgressActivity(long id, const std::wstring& title, const std::wstring& text) override
    {
        activities[id] = {title, text, 0, 0, true};
    }
    void SetProgresStepCount(long id, long count) override { activities[id].count = count; }
    void StepProgressActivity(long id) override { ++activities[id].steps; }
    void SetProgressDescription(long id, const std::wstring& text) override { activities[id].text = text; }
    void DisconnectProgressActivity(long id) override { activities[id].connected = false; }
    void CleanUp() override { activities.clear(); }

    std::map<long, Activity> activities;
};

class Configuration : public host::Configuration
{
public:
    std::int32_t GetTrackBufferFrames() const override { return trackBufferFrames; }
    void SetTrackBufferFrames(std::int32_t frames) override { trackBufferFrames = frames; }
    std::int32_t GetSimulationBufferFrames() const override { return simulationBufferFrames; }
    void SetSimulationBufferFrames(std::int32_t frames) override { simulationBufferFrames = frames; }
    std::int32_t GetMaxTracks() const override { return maxTracks; }

    std::int32_t trackBufferFrames = 20000;
    std::int32_t simulationBufferFrames = 10000;
    std::int32_t maxTracks = 4;
};

class Settings : public host::Settings
{
public:
    bool Store(const host::SettingsNode& node) override
    {
        nodes[node.name] = node;
        return true;
    }
    std::optional<host::SettingsNode> Load(const std::wstring& name) const override
    {
        const auto at = nodes.find(name);
        return at == nodes.end() ? std::nullopt : std::optional(at->second);
    }

    std::map<std::wstring, host::SettingsNode> nodes;
};

class Questions : public host::Questions
{
public:
    std::optional<std::wstring> AskSaveFile(const host::FileQuestion& question) override
    {
        asked.push_back(question);
        return answer;
    }
    std::optional<std::wstring> AskOpenFile(const host::FileQuestion& question) override
    {
        asked.push_back(question);
        return answer;
    }

    std::optional<std::size_t> AskReplacement(const host::ReplacementQuestion& question) override
    {
        replacements.push_back(question);
        return chosen;
    }

    std::optional<std::wstring> answer;
    std::optional<std::size_t> chosen;
    std::vector<host::FileQuestion> asked;
    std::vector<host::ReplacementQuestion> replacements;
};

class LibraryPaths : public host::LibraryPaths
{
public:
    std::wstring GetObjectsPath() const override { return objects; }
    std::wstring GetObjectsSubfolder() const override { return subfolder; }
    std::wstring GetCustomerPath() const override { return customer; }
    std::wstring GetModuleDirectory() const override { return module; }

    std::wstring objects = L"\\lib\\Vantor Objects\\advanced";
    std::wstring subfolder = L"\\advanced";
    std::wstring customer = L"\\lib\\Customer_Objects";
    std::wstring module = L"\\app\\bin\\";
};

/// Ids as they are given; nobody is told.
class Selection : public host::Selection
{
public:
    void ClearSelection() override { selected.clear(); }
    void AddToSelection(const std::wstring& id) override { selected.push_back(id); }
    void RemoveFromSelection(const std::wstring& id) override { std::erase(selected, id); }
    void SelectOnly(const std::wstring& id) override { selected = {id}; }
    bool IsSelected(const std::wstring& id) const override
    {
        return std::find(selected.begin(), selected.end(), id) != selected.end();
    }
    const std::vector<std::wstring>& GetSelection() const override { return selected; }
    void AddListener(host::SelectionListener&) override {}
    void RemoveListener(host::SelectionListener&) override {}

    std::vector<std::wstring> selected;
};

class DocumentManager : public host::DocumentManager
{
public:
    void RegisterTemplate(host::DocumentTemplate documentTemplate) override
    {
        registered = std::move(documentTemplate);
    }
    void ReleaseTemplate() override { registered = {}; }
    host::ManagedDocument* NewDocument() override { return Keep(registered.make(), nullptr); }
    host::ManagedDocument* OpenDocument(const std::wstring& path) override { return Keep(registered.make(), &path); }
    void CloseActiveDocument() override;
    host::ManagedDocument* GetActiveDocument() const override
    {
        return documents.empty() ? nullptr : documents.back().get();
    }

    host::DocumentTemplate registered;
    std::vector<std::unique_ptr<host::ManagedDocument>> documents;

private:
    host::ManagedDocument* Keep(std::unique_ptr<host::ManagedDocument> document, const std::wstring* path);
};

/// All of them together. A test that leaves a service out sets its pointer to null.
class Host : public host::Host
{
public:
    host::Clock& GetClock() override { return clock; }
    host::Texts& GetTexts() override { return texts; }
    host::LibraryPaths& GetLibraryPaths() override { return paths; }
    host::Selection& GetSelection() override { return selection; }
    host::MainWindow* GetMainWindow() override { return mainWindowService; }
    host::Variables* GetVariables() override { return variablesService; }
    host::UserInterface* GetUserInterface() override { return &userInterface; }
    host::DocumentManager* GetDocumentManager() override { return &documentManager; }
    host::MessageService* GetMessageService() override { return &messages; }
    host::Progress* GetProgress() override { return progressService; }
    host::Configuration* GetConfiguration() override { return configurationService; }
    host::Settings* GetSettings() override { return &settings; }
    host::Questions* GetQuestions() override { return &questions; }
    host::Graphics* GetGraphics() override { return graphics; }
    host::ViewWindows* GetViewWindows() override { return viewWindows; }

    Clock clock;
    Texts texts;
    LibraryPaths paths;
    MainWindow mainWindow;
    Variables variables;
    UserInterface userInterface;
    Selection selection;
    DocumentManager documentManager;
    MessageService messages;
    Progress progress;
    Configuration configuration;
    Settings settings;
    Questions questions;

    host::MainWindow* mainWindowService = &mainWindow;
    host::Variables* variablesService = &variables;
    host::Progress* progressService = &progress;
    host::Configuration* configurationService = &configuration;
    host::Graphics* graphics = nullptr;       ///< none unless a test draws
    host::ViewWindows* viewWindows = nullptr; ///< none unless a test has panes
};

} // namespace fake

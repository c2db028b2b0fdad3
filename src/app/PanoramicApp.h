#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "app/FrameCycle.h"
#include "app/PanoramicDocument.h"
#include "app/PanoramicMessageHandler.h"
#include "app/VisualizationPPGSettings.h"
#include "host/Commands.h"

namespace host
{
class Configuration;
class DocumentManager;
class Graphics;
class Progress;
class Questions;
class UserInterface;
} // namespace host

class VtCBase3DView;
class VtCGlidePanelToolBarEventsSink;
class VtCSceneObjectStore;
class VtCSimulationDataControllerDialog;
class VtCSimulationDataCustomizeSheet;
class VtISceneListener;

/// The application object: what the host drives, and what everything outermost reaches the others by.
///
/// The component has no `main` and no loop. A host makes one of these, calls the stages below in the order they stand
/// here, on the thread that owns its windows, and raises idle events in between. Documents come and go after
/// `FinalizeInitialization` and are closed before `StartShutdown`. A call of the host that fails throws
/// `host::InterfaceError` through here; the host catches and shows it.
class VtCPanoramicApp : public VtIDocumentApplication,
                        public host::CommandTarget,
                        private VtIFrameWork,
                        private VtISettingsEffects
{
public:
    /// `programAround` outlives this.
    explicit VtCPanoramicApp(host::Host& programAround);
    ~VtCPanoramicApp() override;
    VtCPanoramicApp(const VtCPanoramicApp&) = delete;
    VtCPanoramicApp& operator=(const VtCPanoramicApp&) = delete;

    // Stages, in the host's order

    void InitInstance();
    void Connect();
    void ConnectToOtherComponents();
    void InsertGUIElements();
    void StartupCompleted();

    /// The frame cycle is live from here on.
    void FinalizeInitialization();

    /// `allowed` becomes 1, or 0 with message 499 while a run or a replay is on.
    void ShutDownRequest(std::int32_t& allowed);

    /// `refused` becomes 0.
    void StartShutdown(std::int32_t& refused);
    void RemoveGUIElements();
    void RemoveComponentConnections();
    void Disconnect();

    // The automation face

    /// The application's name, the title of its messages.
    const std::wstring& GetName() const { return applicationName; }
    void StartSimulation();
    void StopSimulation();

    // The frame cycle

    std::int32_t IdleStep() { return cycle.IdleStep(); }
    void RedrawNow() { cycle.RedrawNow(); }
    void ConnectIdleSink() override { cycle.ConnectIdleSink(); }
    void DisconnectIdleSink() override { cycle.DisconnectIdleSink(); }
    VtCFrameCycle& GetFrameCycle() { return cycle; }

    /// Does an active document hold a scene?
    bool IsSceneLoaded() const override { return GetActiveScene() != nullptr; }

    /// Prepares the scene of the active view for a frame: its observers go where their bodies are now.
    void RenderCurrentView() override;

    // Commands: the views' of the active document, then the controller's. Without a scene those of the views have no
    // state.

    std::vector<host::CommandLook> GetCommands() const override;
    std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const override;

    /// A frame number that was typed into the controller's dialog counts before its commands.
    bool OnCmdMsg(std::uint32_t command) override;

    // What others ask for

    /// Null while there is none, and for a document of another kind.
    VtCPanoramicDocument* GetActiveDocument() const;
    VtCScene3D* GetActiveScene() const override;

    /// `listener` (not owned) hears of the scene of every document: of the active one from now on, of later ones from
    /// their first object on.
    void AddSceneListener(VtISceneListener& listener);
    void RemoveSceneListener(VtISceneListener& listener);
    const std::vector<VtISceneListener*>& GetSceneListeners() const override { return sceneListeners; }

    /// The view that has the focus in the active document; null in a host without windows for views.
    VtCBase3DView* GetActiveView() const;
    VtIInstrumentFeed* GetActiveInstruments() const override;

    /// Null before `StartupCompleted` and after `StartShutdown`.
    VtCSimulationDataController* GetController() const override { return controller.get(); }

    /// As long as the controller, in a host with a user interface; null otherwise.
    VtCSimulationDataControllerDialog* GetControllerDialog() const { return controllerDialog.get(); }

    /// Folder of the program with a trailing backslash; empty when it can't be told.
    std::wstring GetModuleDirectory() const override;
    void SetApplicationVariable(const std::wstring& name, const std::wstring& value);

    /// The controller exists and is online, or a replay or spool is on.
    bool IsRunning() const;

    /// May a scene be made or opened? Asked before each.
    bool CanOpenScene() const override;

    host::Host& GetHost() const override { return host; }
    VtCPanoramicMessageHandler& GetMessageHandler() override { return messageHandler; }

    /// What objects of scenes need; from `ConnectToOtherComponents` to `RemoveComponentConnections`.
    VtTSceneServices& GetSceneServices() override { return *sceneServices; }

    /// Null when the host keeps no settings.
    VtCVisualizationPPGSettings* GetSettings() const { return settings.get(); }

    /// Read by the camera manipulator.
    std::uint32_t GetMouseSensitivity() const override { return mouseSensitivity; }

    /// Is anti-aliasing by several samples on? Read by the next viewer that is made.
    bool IsMultisampling() const { return multisampling; }
    void SetRendererMode(std::uint32_t mode) override;

private:
    bool HasController() const override { return controller != nullptr; }
    bool IsOnline() const override;
    bool HasPlayState() const override;
    std::int32_t Step() override;
    bool HasGraphicsSession() const override;
    bool IsFrameDue() override;
    void RenderViewerFrame() override;
    double GetFrameRate() const override;

    void SetMouseSensitivity(std::uint32_t sensitivity) override { mouseSensitivity = sensitivity; }
    void ConnectAssets();
    void ConnectViewer();
    void MakeController();
    void MakeControllerDialog();
    std::vector<std::wstring> PluginFolders() const;

    host::Host& host;
    std::wstring applicationName;
    VtCPanoramicMessageHandler messageHandler;
    VtCFrameCycle cycle;

    // The host's services, null while the component isn't connected or the host has none.
    host::Variables* variables = nullptr;
    host::Progress* progress = nullptr;
    host::DocumentManager* documentManager = nullptr;
    host::UserInterface* userInterface = nullptr;
    host::Configuration* configuration = nullptr;
    host::Questions* questions = nullptr;

    std::unique_ptr<VtCSceneObjectStore> attributeStore;
    std::unique_ptr<VtTSceneServices> sceneServices;
    std::unique_ptr<VtCGlidePanelToolBarEventsSink> toolBarSink;
    std::unique_ptr<VtCVisualizationPPGSettings> settings;
    std::unique_ptr<VtCSimulationDataController> controller;
    std::unique_ptr<VtCSimulationDataCustomizeSheet> customizeSheet;
    std::unique_ptr<VtCSimulationDataControllerDialog> controllerDialog;

    std::vector<VtISceneListener*> sceneListeners;

    bool multisampling = false;
    std::uint32_t mouseSensitivity = 5;
};

/// Tells the attributes of all classes, so that records of theirs can be made and read. The application object does it;
/// who reads records without one does it by himself.
void RegisterAllAttributes();

#include "app/PanoramicApp.h"

#include <cstdlib>
#include <filesystem>

#include "app/GlidePanelToolBarEventsSink.h"
#include "app/PanoramicDocument.h"
#include "assets/AssetManager.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "host/Documents.h"
#include "host/Frame.h"
#include "host/Host.h"
#include "host/LibraryPaths.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "host/Storage.h"
#include "interaction/Observers.h"
#include "records/SceneObjectStore.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/ViewCommandsHandler.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationServices.h"
#include "ui/SimulationDataControllerDialog.h"
#include "ui/SimulationDataCustomizeSheet.h"

namespace
{

// Texts and messages.
constexpr std::uint32_t textApplicationName = 101;
constexpr std::uint32_t messageReady = 1;
constexpr std::uint32_t messageStillRunning = 499;

// Resources of the host.
constexpr std::uint32_t documentResource = 6663;
constexpr std::uint32_t menuResource = 6201;

// The program beside this one that parses model files.
constexpr const wchar_t* modelReader = L"panoramic-model-reader";

constexpr const wchar_t* sceneFilter = L"Scene Config Files (*.xml)|*.xml||";
constexpr const wchar_t* sceneExtension = L".xml";

} // namespace

VtCPanoramicApp::VtCPanoramicApp(host::Host& programAround)
    : host(programAround), messageHandler(applicationName), cycle(programAround.GetClock(), *this)
{
    RegisterAllAttributes();
}

void RegisterAllAttributes()
{
    RegisterSceneAttributes();
    RegisterInteractionAttributes();
    RegisterViewAttributes();
}

VtCPanoramicApp::~VtCPanoramicApp() = default;

void VtCPanoramicApp::InitInstance()
{
    applicationName = host.GetTexts().GetText(textApplicationName);
}

void VtCPanoramicApp::Connect()
{
    variables = host.GetVariables();
    // The cycle paces itself; a host that thins out idle events would make the picture stutter.
    if (variables)
        variables->SetBool(L"harborFrame.ReduceIdleTimeProcessing", false);
    cycle.SetVariables(variables);
    cycle.SetMainWindow(host.GetMainWindow());
    progress = host.GetProgress();
    if (const host::Settings* stored = host.GetSettings())
    {
        settings = std::make_unique<VtCVisualizationPPGSettings>(static_cast<VtISettingsEffects&>(*this));
        settings->Load(*stored);
    }
}

void VtCPanoramicApp::ConnectToOtherComponents()
{
    attributeStore = std::make_unique<VtCSceneObjectStore>();
    messageHandler.SetMessageService(host.GetMessageService());
    configuration = host.GetConfiguration();
    ConnectAssets();
    sceneServices = std::make_unique<VtTSceneServices>(VtTSceneServices{.store = *attributeStore,
                                                                        .models = VtCOsgAssetManager::getLibrary(),
                                                                        .paths = host.GetLibraryPaths(),
                                                                        .texts = host.GetTexts(),
                                                                        .messages = messageHandler,
                                                                        .configuration = configuration,
                                                                        .progress = progress,
                                                                        .questions = host.GetQuestions()});
    ConnectViewer();
}

void VtCPanoramicApp::ConnectAssets()
{
    const std::filesystem::path reader = base::NativePath(GetModuleDirectory() + modelReader);
    VtTAssetServices services;
    services.paths = &host.GetLibraryPaths();
    services.messages = &messageHandler;
    services.reader = VtTModelReaderSettings::FromEnvironment(reader);
    VtCOsgAssetManager::setServices(services);
}

void VtCPanoramicApp::ConnectViewer()
{
    VtTViewerServices services;
    services.graphics = host.GetGraphics();
    services.clock = &host.GetClock();
    services.moduleDirectory = GetModuleDirectory();
    services.multisampling = [this] { return multisampling; };
    services.hasScene = [this] { return IsSceneLoaded(); };
    services.activeView = [this]() -> osgViewer::View*
    {
        const VtCBase3DView* view = GetActiveView();
        return view ? view->getView() : nullptr;
    };
    setViewerServices(std::move(services));
}

void VtCPanoramicApp::InsertGUIElements()
{
    documentManager = host.GetDocumentManager();
    if (documentManager)
        documentManager->RegisterTemplate(
            {.resource = documentResource, .filter = sceneFilter, .extension = sceneExtension, .make = [this] {
                 return std::make_unique<VtCPanoramicDocument>(*this);
             }});
    userInterface = host.GetUserInterface();
    if (userInterface)
    {
        userInterface->AddMenuResource(menuResource);
        toolBarSink = std::make_unique<VtCGlidePanelToolBarEventsSink>();
        userInterface->SetToolBarEvents(toolBarSink.get());
    }
    SetApplicationVariable(L"fps", L"");
    SetApplicationVariable(L"simulationDatapointInfo", L"No SimulationDataPoint");
}

void VtCPanoramicApp::StartupCompleted()
{
    questions = host.GetQuestions();
    MakeController();
    if (settings)
        mouseSensitivity = settings->GetMouseSensitivity();
    messageHandler.Log(messageReady);
}

void VtCPanoramicApp::MakeController()
{
    controller = std::make_unique<VtCSimulationDataController>(VtTSimulationServices{.clock = host.GetClock(),
                                                                                     .messages = messageHandler,
                                                                                     .texts = host.GetTexts(),
                                                                                     .activeScene = *this,
                                                                                     .pluginFolders = PluginFolders(),
                                                                                     .variables = variables,
                                                                                     .progress = progress,
                                                                                     .userInterface = userInterface,
                                                                                     .configuration = configuration,
                                                                                     .questions = questions});
    if (sceneServices)
        sceneServices->channels = &controller->GetRouter();
    if (toolBarSink)
        toolBarSink->SetController(controller.get());
    MakeControllerDialog();
}

void VtCPanoramicApp::MakeControllerDialog()
{
    if (!userInterface)
        return;
    customizeSheet = std::make_unique<VtCSimulationDataCustomizeSheet>(
        *controller, VtTCustomizeServices{.texts = host.GetTexts(),
                                          .messages = host.GetMessageService(),
                                          .sheets = host.GetPropertySheets(),
                                          .questions = questions});
    controllerDialog =
        std::make_unique<VtCSimulationDataControllerDialog>(*controller, customizeSheet.get(), userInterface);
}

std::vector<std::wstring> VtCPanoramicApp::PluginFolders() const
{
    std::vector<std::wstring> folders;
    if (const std::wstring module = GetModuleDirectory(); !module.empty())
        folders.push_back(module + L"plugins");
    if (const char* further = std::getenv("PANORAMIC_PLUGIN_PATH"))
        for (const std::wstring& folder : base::Split(base::Wide(further), L':'))
            if (!folder.empty())
                folders.push_back(base::InnerPath(base::Utf8(folder)));
    return folders;
}

void VtCPanoramicApp::FinalizeInitialization()
{
    cycle.ConnectIdleSink();
}

void VtCPanoramicApp::ShutDownRequest(std::int32_t& allowed)
{
    allowed = 1;
    if (!IsRunning())
        return;
    messageHandler.ShowInformation(messageStillRunning);
    allowed = 0;
}

void VtCPanoramicApp::StartShutdown(std::int32_t& refused)
{
    if (controller)
        controller->Stop();
    if (sceneServices)
        sceneServices->channels = nullptr;
    if (toolBarSink)
        toolBarSink->SetController(nullptr);
    controllerDialog.reset();
    customizeSheet.reset();
    controller.reset();
    graphicsSession.reset();
    refused = 0;
}

void VtCPanoramicApp::RemoveGUIElements()
{
    if (userInterface)
        userInterface->SetToolBarEvents(nullptr);
    toolBarSink.reset();
    userInterface = nullptr;
    if (documentManager)
        documentManager->ReleaseTemplate();
    documentManager = nullptr;
}

void VtCPanoramicApp::RemoveComponentConnections()
{
    cycle.DisconnectIdleSink();
    if (progress)
        progress->CleanUp();
    if (host::Settings* stored = host.GetSettings(); stored && settings)
        settings->StoreChanges(*stored);
    settings.reset();
    setViewerServices({});
    VtCOsgAssetManager::destroyInstance();
    sceneServices.reset();
    attributeStore.reset();
    progress = nullptr;
    configuration = nullptr;
    questions = nullptr;
    messageHandler.SetMessageService(nullptr);
}

void VtCPanoramicApp::Disconnect()
{
    cycle.SetMainWindow(nullptr);
    cycle.SetVariables(nullptr);
    variables = nullptr;
}

void VtCPanoramicApp::StartSimulation()
{
    if (controller)
        controller->Start();
}

void VtCPanoramicApp::StopSimulation()
{
    if (controller)
        controller->Stop();
}

void VtCPanoramicApp::RenderCurrentView()
{
    const VtCBase3DView* view = GetActiveView();
    VtCScene3D* scene = view ? view->GetDocument().GetScene() : nullptr;
    if (scene)
        scene->UpdateFrame();
}

VtCPanoramicDocument* VtCPanoramicApp::GetActiveDocument() const
{
    return documentManager ? dynamic_cast<VtCPanoramicDocument*>(documentManager->GetActiveDocument()) : nullptr;
}

VtCScene3D* VtCPanoramicApp::GetActiveScene() const
{
    const VtCPanoramicDocument* document = GetActiveDocument();
    return document ? document->GetScene() : nullptr;
}

void VtCPanoramicApp::AddSceneListener(VtISceneListener& listener)
{
    sceneListeners.push_back(&listener);
    if (VtCScene3D* scene = GetActiveScene())
        scene->GetObjects().AddListener(listener);
}

void VtCPanoramicApp::RemoveSceneListener(VtISceneListener& listener)
{
    std::erase(sceneListeners, &listener);
    if (VtCScene3D* scene = GetActiveScene())
        scene->GetObjects().RemoveListener(listener);
}

VtCBase3DView* VtCPanoramicApp::GetActiveView() const
{
    const VtCPanoramicDocument* document = GetActiveDocument();
    const VtCChildFrame* frame = document ? document->GetChildFrame() : nullptr;
    return frame ? frame->GetActiveView() : nullptr;
}

std::vector<host::CommandLook> VtCPanoramicApp::GetCommands() const
{
    std::vector<host::CommandLook> looks;
    VtCVisualizationViewCommandsHandler::GetCommands().AddTo(looks);
    VtCSimulationDataController::GetCommands().AddTo(looks);
    return looks;
}

std::optional<VtTCommandState> VtCPanoramicApp::GetMenuState(std::uint32_t command) const
{
    const VtCPanoramicDocument* document = GetActiveDocument();
    if (document && document->GetChildFrame())
        if (std::optional<VtTCommandState> state = document->GetChildFrame()->getCommands().GetState(command))
            return state;
    return controller ? controller->GetMenuState(command) : std::nullopt;
}

bool VtCPanoramicApp::OnCmdMsg(std::uint32_t command)
{
    requestViewerRedraw(); // most of them change the picture
    const VtCPanoramicDocument* document = GetActiveDocument();
    if (document && document->GetChildFrame() && document->GetChildFrame()->getCommands().Execute(command))
        return true;
    if (!controller || !controller->GetMenuState(command))
        return false;
    if (controllerDialog)
        controllerDialog->OnCommand(command);
    else
        controller->OnCmdMsg(command);
    return true;
}

VtIInstrumentFeed* VtCPanoramicApp::GetActiveInstruments() const
{
    return nullptr; // a scene holds no instruments
}

std::wstring VtCPanoramicApp::GetModuleDirectory() const
{
    return host.GetLibraryPaths().GetModuleDirectory();
}

void VtCPanoramicApp::SetApplicationVariable(const std::wstring& name, const std::wstring& value)
{
    if (variables)
        variables->SetText(name, value);
}

bool VtCPanoramicApp::IsRunning() const
{
    return controller && (controller->IsOnline() || controller->HasPlayState());
}

bool VtCPanoramicApp::CanOpenScene() const
{
    return true; // any graphics card counts as valid and supported
}

void VtCPanoramicApp::SetRendererMode(std::uint32_t mode)
{
    if (mode == rmePerformance)
        multisampling = false;
    else if (mode == rmeQuality)
        multisampling = true;
}

bool VtCPanoramicApp::IsOnline() const
{
    return controller->IsOnline();
}

bool VtCPanoramicApp::HasPlayState() const
{
    return controller->HasPlayState();
}

std::int32_t VtCPanoramicApp::Step()
{
    return controller->Step() ? 1 : 0;
}

bool VtCPanoramicApp::HasGraphicsSession() const
{
    return graphicsSession != nullptr;
}

bool VtCPanoramicApp::IsFrameDue()
{
    return IsRunning() || isViewerFrameDue();
}

void VtCPanoramicApp::RenderViewerFrame()
{
    ::RenderViewerFrame();
}

double VtCPanoramicApp::GetFrameRate() const
{
    return getFrameRate();
}

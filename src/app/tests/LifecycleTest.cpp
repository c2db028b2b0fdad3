#include "app/tests/AppFixture.h"

#include <fstream>

#include "app/GlidePanelToolBarEventsSink.h"
#include "base/Paths.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"

namespace
{

struct Lifecycle : AppFixture
{
};

TEST_F(Lifecycle, EachStageTakesWhatItsCounterpartGivesBack)
{
    host.texts.known[101] = L"Panoramic";
    app.InitInstance();
    EXPECT_EQ(app.GetName(), L"Panoramic");
    EXPECT_EQ(app.GetController(), nullptr);
    EXPECT_EQ(app.GetActiveDocument(), nullptr);

    app.Connect();
    ASSERT_TRUE(host.variables.bools.contains(L"harborFrame.ReduceIdleTimeProcessing"));
    EXPECT_FALSE(host.variables.bools[L"harborFrame.ReduceIdleTimeProcessing"]);

    app.ConnectToOtherComponents();
    app.InsertGUIElements();
    EXPECT_EQ(host.documentManager.registered.resource, 6663U);
    EXPECT_EQ(host.documentManager.registered.extension, L".xml");
    EXPECT_EQ(host.userInterface.menus, std::vector<std::uint32_t>{6201});
    EXPECT_NE(host.userInterface.toolBar, nullptr);
    ASSERT_TRUE(host.variables.texts.contains(L"fps"));
    EXPECT_EQ(host.variables.texts[L"fps"], L"");
    EXPECT_EQ(host.variables.texts[L"simulationDatapointInfo"], L"No SimulationDataPoint");

    app.StartupCompleted();
    ASSERT_NE(app.GetController(), nullptr);
    EXPECT_NE(app.GetControllerDialog(), nullptr);
    EXPECT_TRUE(WasShown(host::Severity::error, 303)) << "this host has no modules of data points";
    ASSERT_FALSE(host.messages.shown.empty());
    EXPECT_EQ(host.messages.shown.back().number, 1U);
    EXPECT_EQ(host.messages.shown.back().category, L"Panoramic");
    EXPECT_EQ(host.messages.shown.back().title, L"Panoramic");
    EXPECT_FALSE(host.messages.shown.back().interrupts);
    EXPECT_TRUE(host.variables.idle.sinks.empty()) << "no frame may run on a half-built component";

    app.FinalizeInitialization();
    EXPECT_EQ(host.variables.idle.sinks.size(), 1U);
    host.variables.idle.Raise();

    host.messages.shown.clear();
    std::int32_t answer = -1;
    app.ShutDownRequest(answer);
    EXPECT_EQ(answer, 1);
    EXPECT_TRUE(host.messages.shown.empty());

    app.StartShutdown(answer);
    EXPECT_EQ(app.GetControllerDialog(), nullptr);
    EXPECT_EQ(answer, 0);
    EXPECT_EQ(app.GetController(), nullptr);
    app.RemoveGUIElements();
    EXPECT_EQ(host.userInterface.toolBar, nullptr);
    EXPECT_FALSE(host.documentManager.registered.make);
    host.progress.ConnectProgressActivity(30, L"left open", {});
    app.RemoveComponentConnections();
    EXPECT_TRUE(host.progress.activities.empty());
    EXPECT_TRUE(host.variables.idle.sinks.empty());
    EXPECT_EQ(app.GetMessageHandler().ShowError(1), nullptr);
    app.Disconnect();
    EXPECT_EQ(app.IdleStep(), 1);
}

TEST_F(Lifecycle, AHostWithoutServicesIsNoReasonToFail)
{
    struct BareHost : fake::Host
    {
        host::UserInterface* GetUserInterface() override { return nullptr; }
        host::DocumentManager* GetDocumentManager() override { return nullptr; }
        host::MessageService* GetMessageService() override { return nullptr; }
        host::Settings* GetSettings() override { return nullptr; }
        host::Questions* GetQuestions() override { return nullptr; }
    } bare;
    bare.mainWindowService = nullptr;
    bare.variablesService = nullptr;
    bare.progressService = nullptr;
    bare.configurationService = nullptr;
    VtCPanoramicApp lonely(bare);
    lonely.InitInstance();
    lonely.Connect();
    lonely.ConnectToOtherComponents();
    lonely.InsertGUIElements();
    lonely.StartupCompleted();
    lonely.FinalizeInitialization();
    EXPECT_EQ(lonely.IdleStep(), 1);
    EXPECT_FALSE(lonely.IsSceneLoaded());
    EXPECT_EQ(lonely.GetSettings(), nullptr);
    std::int32_t answer = -1;
    lonely.ShutDownRequest(answer);
    EXPECT_EQ(answer, 1);
    lonely.StartShutdown(answer);
    lonely.RemoveGUIElements();
    lonely.RemoveComponentConnections();
    lonely.Disconnect();
}

TEST_F(Lifecycle, TheShutdownOfAComponentThatNeverStartedDoesNotFail)
{
    std::int32_t answer = -1;
    app.StartShutdown(answer);
    EXPECT_EQ(answer, 0);
}

TEST_F(Lifecycle, ARunHasToBeStoppedBeforeTheHostCanClose)
{
    Start();
    AddPoint({0.0, 1.0, 2.0});
    const auto refused = [&]
    {
        host.messages.shown.clear();
        std::int32_t allowed = -1;
        app.ShutDownRequest(allowed);
        EXPECT_EQ(WasShown(host::Severity::information, 499), allowed == 0);
        EXPECT_EQ(host.messages.shown.size(), allowed == 0 ? 1U : 0U);
        return allowed == 0;
    };
    EXPECT_FALSE(refused());
    app.StartSimulation();
    EXPECT_TRUE(app.IsRunning());
    EXPECT_TRUE(refused());
    app.StopSimulation();
    EXPECT_FALSE(app.IsRunning());
    EXPECT_FALSE(refused());
    app.GetController()->PlayLoop();
    EXPECT_TRUE(refused()) << "a replay counts too";
    app.GetController()->StopPlay();
    EXPECT_FALSE(refused());
    Stop();
}

TEST_F(Lifecycle, SettingsComeFromTheHostAndGoBackToIt)
{
    host.settings.nodes[L"Visualisation"] = {L"Visualisation", {{L"MouseSensitivity", 9U}, {L"RendererMode", 1U}}};
    Start();
    EXPECT_EQ(app.GetMouseSensitivity(), 9U);
    EXPECT_FALSE(app.IsMultisampling()) << "reading sets the fields only";
    ASSERT_NE(app.GetSettings(), nullptr);
    EXPECT_EQ(app.GetSettings()->GetRendererMode(), 1U);

    app.GetSettings()->PutRendererMode(1);
    EXPECT_TRUE(app.IsMultisampling());
    app.GetSettings()->PutRendererMode(2);
    EXPECT_TRUE(app.IsMultisampling()) << "an unknown mode is stored and changes nothing";
    EXPECT_EQ(app.GetSettings()->GetRendererMode(), 2U);
    app.GetSettings()->PutRendererMode(0);
    EXPECT_FALSE(app.IsMultisampling());
    app.GetSettings()->PutMouseSensitivity(3);
    EXPECT_EQ(app.GetMouseSensitivity(), 3U);
    Stop();
    EXPECT_EQ(host.settings.nodes[L"Visualisation"].Find<std::uint32_t>(L"MouseSensitivity"), 3U);
}

TEST_F(Lifecycle, TheToolBarOffersTheSourcesWithTheirAmpersandsDoubled)
{
    Start();
    simtest::Point& point = AddPoint({0.0});
    point.path = L"R&D bench";
    host::ToolBarEvents& events = *host.userInterface.toolBar;
    EXPECT_EQ(events.OnDropDown(38718), std::vector<std::wstring>{L"Bench|TEST|R&&D bench"});
    EXPECT_TRUE(events.OnDropDown(38719).empty());
    point.source = false;
    EXPECT_TRUE(events.OnDropDown(38718).empty());
    Stop();
}

TEST_F(Lifecycle, ADocumentBringsItsSceneAndTakesItAway)
{
    Start();
    EXPECT_EQ(graphicsSession, nullptr);
    EXPECT_FALSE(app.IsSceneLoaded());
    VtCPanoramicDocument* first = NewDocument();
    ASSERT_NE(first, nullptr);
    EXPECT_NE(graphicsSession, nullptr);
    EXPECT_TRUE(app.IsSceneLoaded());
    EXPECT_EQ(app.GetActiveScene(), first->GetScene());
    EXPECT_EQ(&first->GetScene()->GetDocument(), first);
    EXPECT_FALSE(first->IsModified());
    EXPECT_EQ(app.GetActiveInstruments(), nullptr);

    VtCPanoramicDocument* second = NewDocument();
    EXPECT_EQ(app.GetActiveDocument(), second);
    createViewer();
    host.documentManager.CloseActiveDocument();
    EXPECT_FALSE(viewerReady) << "the viewer goes with a document";
    EXPECT_EQ(app.GetActiveDocument(), first);
    host.documentManager.CloseActiveDocument();
    EXPECT_FALSE(app.IsSceneLoaded());
    EXPECT_NE(graphicsSession, nullptr) << "it stays until the shutdown";
    AddPoint({0.0, 1.0});
    EXPECT_TRUE(app.GetController()->ShowFrame({}, 2)) << "no receiver is left behind";
    Stop();
    EXPECT_EQ(graphicsSession, nullptr);
}

TEST_F(Lifecycle, AFileThatCannotBeTakenIsToldWithItsPath)
{
    Start();
    VtCPanoramicDocument* before = NewDocument();
    EXPECT_EQ(host.documentManager.OpenDocument(L"\\no\\such\\scene.xml"), nullptr);
    ASSERT_EQ(host.messages.shown.size(), 1U);
    EXPECT_TRUE(WasShown(host::Severity::warning, 417));
    EXPECT_EQ(host.messages.shown[0].first, L"/no/such/scene.xml");
    EXPECT_EQ(app.GetActiveDocument(), before);

    const std::filesystem::path file = std::filesystem::path(testing::TempDir()) / "panoramic_scene.XML";
    std::ofstream(file) << "<not_a_scene/>";
    host.messages.shown.clear();
    EXPECT_EQ(host.documentManager.OpenDocument(base::InnerPath(file)), nullptr);
    ASSERT_EQ(host.messages.shown.size(), 1U);
    EXPECT_TRUE(WasShown(host::Severity::error, 496));
    EXPECT_EQ(host.messages.shown[0].first, file.wstring());
    EXPECT_EQ(app.GetActiveDocument(), before);
    std::filesystem::remove(file);

    // A folder is no file.
    EXPECT_EQ(host.documentManager.OpenDocument(base::InnerPath(testing::TempDir())), nullptr);
    EXPECT_TRUE(WasShown(host::Severity::warning, 417));
    Stop();
}

} // namespace

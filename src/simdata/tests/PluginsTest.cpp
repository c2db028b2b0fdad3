#include <csignal>
#include <filesystem>
#include <fstream>
#include <sys/resource.h>

#include "base/Paths.h"
#include "base/Text.h"
#include "simdata/points/MotionDataInfo.h"
#include "simdata/tests/SimulationFixture.h"

using namespace simtest;

namespace
{

// The folder of the modules made for this test, and that of the plug-ins themselves.
const std::wstring testModules = base::InnerPath(SIMDATA_TEST_MODULES);
const std::wstring realModules = base::InnerPath(SIMDATA_PLUGINS);

/// A folder that goes with the test.
class Plugins : public testing::Test, protected Services
{
protected:
    Plugins()
    {
        std::string name = (std::filesystem::temp_directory_path() / "panoramic.XXXXXX").string();
        folder = mkdtemp(name.data());
    }
    ~Plugins() override { std::filesystem::remove_all(folder); }

    std::filesystem::path folder;
};

TEST_F(Plugins, LoadWhatIsThereAndTellWhatIsWrong)
{
    // The first folder has a module of the kind Smart, so the good one of the second folder isn't looked at.
    std::ofstream(folder / "SimulationDataPointSmartU.so") << "not a library";
    VtCSimulationDataRouter router(Make({base::InnerPath(folder), testModules}));

    ASSERT_EQ(router.GetPoints().size(), 1U);
    EXPECT_EQ(router.GetPointNames(VtCSimulationDataRouter::sources), (std::vector<std::wstring>{L"From a module"}));
    EXPECT_EQ(router.GetConfigurationText(L"from a module", 0), L"From a module|KIND|6") << "the kind NetConnection";
    EXPECT_FALSE(messages.Has(host::Severity::error, 303));

    struct Expected
    {
        const wchar_t* module;
        const wchar_t* reason; ///< a part of it
    };
    // In the order of loading.
    const Expected expected[] = {
        {L"SimulationDataPointFileU.so", L"DllCreateSimulationDataPointFactory"},
        {L"SimulationDataPointNetworkU.so", L"gave no data point"},
        {L"SimulationDataPointOffSimU.so",
         L"built with version 2 of the data point interface, and this program has version 1"},
        {L"SimulationDataPointHardwareU.so", L"no licence"},
        {L"SimulationDataPointSmartU.so", L"SimulationDataPointSmartU.so"},
    };
    const auto& faults = router.GetPluginFaults();
    ASSERT_EQ(faults.size(), std::size(expected));
    for (std::size_t i = 0; i < faults.size(); ++i)
    {
        EXPECT_EQ(faults[i].module, expected[i].module);
        EXPECT_NE(faults[i].reason.find(expected[i].reason), std::wstring::npos) << base::Utf8(faults[i].reason);
        EXPECT_TRUE(faults[i].path.ends_with(L"\\" + faults[i].module)) << base::Utf8(faults[i].path);
    }
    EXPECT_TRUE(faults[4].path.starts_with(base::InnerPath(folder)));
    EXPECT_TRUE(messages.Has(host::Severity::warning, 9032)) << "another version is the user's to know";
    EXPECT_EQ(messages.shown.size(), 1U);

    EXPECT_TRUE(router.LoadPlugin(VtEDataPointKind::File)) << "a module without the factory is loaded all the same";
    EXPECT_FALSE(router.LoadPlugin(VtEDataPointKind::Smart));
    EXPECT_EQ(router.CreateFileDataPoint(), nullptr);
}

TEST_F(Plugins, LoadAnewAndStayLoadedAsLongAsAPointOfTheirsLives)
{
    VtTDataPointPtr point;
    {
        VtCSimulationDataRouter router(Make({realModules}));
        router.SelectPoint(L"File");
        router.LoadPlugins();
        EXPECT_EQ(router.GetActivePoint(), nullptr) << "the point of before is gone";
        point = router.CreateFileDataPoint();
    }
    ASSERT_NE(point, nullptr);
    EXPECT_EQ(point->IsSource(), 1);
}

TEST_F(Plugins, PlayWhatTheyStored)
{
    VtCSimulationDataController controller(Make({realModules}));
    VtCSimulationDataRouter& router = controller.GetRouter();
    auto made = std::make_unique<Point>(L"Live");
    made->SetChannels({L"Body", L"Wheel"}, {L"Speed"}, true, SimulationDataPoints::TRACK_SAFE_WITH_WARNING);
    made->Fill({1.00, 1.01, 1.02, 1.04});
    made->SetRecent(3);
    made->stored = {L"body_1", L"wheel_2"};
    router.AddPoint(VtTDataPointPtr(made.release()));
    router.SelectPoint(L"Live");

    texts.known[7007] = L"Frame %1";
    const std::filesystem::path file = folder / "run.mdf";
    questions.answer = base::InnerPath(file);
    EXPECT_TRUE(controller.OnCmdMsg(38743));
    EXPECT_TRUE(messages.Has(host::Severity::information, 529));
    EXPECT_EQ(messages.shown.back().first, base::InnerPath(file));
    EXPECT_EQ(router.GetRecent(L"Live"), 3UL) << "the cursor is back";
    EXPECT_EQ(progress.activities[44].count, 4);
    EXPECT_EQ(progress.activities[44].steps, 4);
    EXPECT_EQ(progress.activities[44].text, L"Frame 4");
    EXPECT_EQ(progress.activities[32].steps, 2);
    EXPECT_FALSE(progress.activities[32].connected || progress.activities[44].connected);

    const SimulationDataPoints::VtTMotionDataInfo info = SimulationDataPoints::ReadMotionDataInfo(file);
    EXPECT_EQ(info.channels.poses, (std::vector<std::wstring>{L"Body", L"Wheel"}));
    EXPECT_EQ(info.channels.storedPoses, (std::vector<std::wstring>{L"body_1", L"wheel_2"}));
    EXPECT_EQ(info.channels.instruments, (std::vector<SimulationDataPoints::VtTInstrumentStream>{{L"Speed", L"m/s"}}));
    EXPECT_EQ(info.channels.trackSafety, SimulationDataPoints::TRACK_SAFE_WITH_WARNING);
    EXPECT_TRUE(info.channels.timeStamps);
    EXPECT_EQ(info.lastTime, 1.04);
    router.FindPoint(L"Live")->SetTimestampSupport(0);
    EXPECT_TRUE(controller.OnCmdMsg(38743));
    EXPECT_FALSE(SimulationDataPoints::ReadMotionDataInfo(file).channels.timeStamps);
    router.FindPoint(L"Live")->SetTimestampSupport(1);
    EXPECT_TRUE(controller.OnCmdMsg(38743));

    ASSERT_TRUE(controller.LoadMotionData(base::InnerPath(file)));
    EXPECT_EQ(progress.activities[41].steps, progress.activities[41].count) << "the load was shown to its end";
    EXPECT_GT(progress.activities[41].count, 0);
    EXPECT_FALSE(controller.LoadMotionData(base::InnerPath(folder / "none.mdf")));
    EXPECT_EQ(*router.GetCurrentChannels(), (std::vector<std::wstring>{L"Body", L"Wheel"})) << "still loaded";
    controller.PlayOnce();
    clock.Advance(0.025);
    controller.Step();
    EXPECT_EQ(router.GetRecent({}), 3UL);
}

/// As long as it stands no file grows beyond a few bytes, as on a full disk.
class FullDisk
{
public:
    FullDisk()
    {
        getrlimit(RLIMIT_FSIZE, &before);
        rlimit full = before;
        full.rlim_cur = 64;
        handler = std::signal(SIGXFSZ, SIG_IGN);
        setrlimit(RLIMIT_FSIZE, &full);
    }
    ~FullDisk()
    {
        setrlimit(RLIMIT_FSIZE, &before);
        std::signal(SIGXFSZ, handler);
    }

private:
    rlimit before{};
    void (*handler)(int);
};

TEST_F(Plugins, SayThatAFileCannotBeStored)
{
    VtCSimulationDataController controller(Make({realModules}));
    auto made = std::make_unique<Point>(L"Live");
    made->SetChannels({L"Body"});
    made->Fill({0.0});
    controller.GetRouter().AddPoint(VtTDataPointPtr(made.release()));
    controller.GetRouter().SelectPoint(L"Live");

    questions.answer = base::InnerPath(folder / "missing" / "run.mdf");
    controller.OnCmdMsg(38743);
    EXPECT_TRUE(messages.Has(host::Severity::error, 530));
    EXPECT_FALSE(messages.stacks.empty()) << "with the reason";

    questions.answer = base::InnerPath(folder / "run.mdf");
    messages.shown.clear();
    {
        const FullDisk full;
        controller.OnCmdMsg(38743);
    }
    EXPECT_TRUE(messages.Has(host::Severity::error, 530));
    EXPECT_FALSE(messages.Has(host::Severity::information, 529));
    EXPECT_TRUE(std::filesystem::is_empty(folder)) << "no half of a file";
}

} // namespace

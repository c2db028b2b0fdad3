#include "CommandFixture.h"

namespace
{

struct Program : CommandFixture
{
};

TEST_F(Program, EveryCommandExplainsItself)
{
    const std::vector<std::string> commands[] = {{},      {"snapshot"},      {"play"},          {"points"},
                                                 {"mdf"}, {"mdf", "import"}, {"mdf", "export"}, {"mdf", "info"}};
    for (std::vector<std::string> command : commands)
    {
        command.push_back("--help");
        const Result result = Run(command);
        EXPECT_EQ(result.status, 0);
        EXPECT_NE(result.out.find("Usage: panoramic"), std::string::npos);
        EXPECT_EQ(result.error, "");
    }
}

TEST_F(Program, WrongArgumentsAreToldOnStandardErrorWithTheStatus2)
{
    const std::vector<std::string> scene{"--eye", "1,2,3", "--look", "0,0,0", "-o", "p.png"};
    const auto with = [&](std::vector<std::string> arguments)
    {
        std::vector<std::string> all{"snapshot"};
        all.insert(all.end(), scene.begin(), scene.end());
        all.insert(all.end(), arguments.begin(), arguments.end());
        return all;
    };
    const std::vector<std::string> wrong[] = {
        {},
        {"fly"},
        {"points", "now"},
        {"mdf"},
        {"mdf", "info"},
        {"mdf", "import", "a.csv"},
        {"snapshot"},
        {"@missing.args"},
        with({"--static", "a.dae@1,2"}),
        with({"--movable", "car.dae"}),
        with({"--movable", "Car=a.dae", "--movable", "CAR=b.dae"}),
        with({"--size", "640"}),
        with({"--time", "1"}),                                      // of which data?
        with({"--data", "run.mdf"}),                                // when?
        with({"--data", "run.mdf", "--time", "1", "--frame", "1"}), // which?
        with({"--data", "run.mdf", "--time", "soon"}),
        with({"--data", "run.mdf", "--frame", "0"}),
        {"snapshot", "--eye", "1,2,3", "--look", "1,2,3", "-o", "p.png"},
        {"play", "--eye", "1,2,3", "--look", "0,0,0"},
        {"play", "--data", "run.mdf"},
        {"play", "--data", "run.mdf", "--eye", "1,2,3", "--look", "0,0,0", "--speed", "0"},
        {"play", "--data", "run.mdf", "--eye", "1,2,3", "--look", "0,0,0", "--loop", "0"},
        {"play", "--data", "run.mdf", "--eye", "1,2,3", "--look", "0,0,0", "--count", "3"},
        {"play", "--data", "run.mdf", "--pictures", "out", "--shots", "missing.txt"},
    };
    for (const std::vector<std::string>& arguments : wrong)
    {
        const Result result = Run(arguments);
        EXPECT_EQ(result.status, 2) << testing::PrintToString(arguments);
        EXPECT_EQ(result.error.rfind("panoramic: wrong arguments: ", 0), 0U) << result.error;
        EXPECT_EQ(result.out, "");
    }
    EXPECT_FALSE(HasFileLike("p.png"));
}

TEST_F(Program, PointsListsWhatLoadedAndTellsWhyOthersDidNot)
{
    const Result result = Run({"points"});
    EXPECT_EQ(result.status, 0) << result.error;
    EXPECT_NE(result.out.find("File "), std::string::npos);
    EXPECT_NE(result.out.find("kind 1"), std::string::npos);
    EXPECT_NE(result.out.find("OffSim"), std::string::npos);
    EXPECT_NE(result.out.find("kind 5"), std::string::npos);
    EXPECT_EQ(result.error, "");

    folder.Write("modules/SimulationDataPointHardwareU.so", "not a library");
    const Environment path{{"PANORAMIC_PLUGIN_PATH", "/nowhere:" + (folder.path / "modules").string()}};
    const Result quiet = Run({"points"}, path);
    EXPECT_EQ(quiet.status, 0);
    EXPECT_EQ(quiet.out, result.out) << "passed over in silence";
    const Result verbose = Run({"points", "-v"}, path);
    EXPECT_EQ(verbose.status, 0);
    EXPECT_NE(verbose.out.find("SimulationDataPointHardwareU.so: passed over: "), std::string::npos) << verbose.out;
    EXPECT_NE(verbose.error.find("panoramic: log 1: Panoramic is ready"), std::string::npos) << verbose.error;
}

TEST_F(Program, ADamagedConfigurationIsToldAndDefaultsAreUsed)
{
    folder.Write("config/panoramic/configuration.ini", "not an ini file\n");
    const Result result = Run({"points"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.error.rfind("panoramic: warning ", 0), 0U) << result.error;
    EXPECT_NE(result.error.find("configuration.ini"), std::string::npos);
    EXPECT_EQ(TemporaryFolder::Read(folder.path / "config/panoramic/configuration.ini"), "not an ini file\n");
    std::filesystem::remove_all(folder.path / "config");
    EXPECT_EQ(Run({"points"}).error, "");
    EXPECT_FALSE(std::filesystem::exists(folder.path / "config")) << "nothing is written unless something is set";
}

TEST_F(Program, WithoutTextsMessagesShowTheirNumbers)
{
    const Result result = Run({"mdf", "info", "missing.mdf"}, {{"PANORAMIC_DATA", folder.path.string()}});
    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.error.find("panoramic: warning "), std::string::npos);
    EXPECT_NE(result.error.find("missing.mdf"), std::string::npos) << result.error;
}

} // namespace

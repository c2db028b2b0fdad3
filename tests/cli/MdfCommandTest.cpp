#include "CommandFixture.h"

#include <nlohmann/json.hpp>

namespace
{

struct MdfCommand : CommandFixture
{
};

TEST_F(MdfCommand, ARunGoesFromTableToFileAndBack)
{
    WriteRun();
    const Result info = Run({"mdf", "info", "run.mdf", "--json"});
    EXPECT_EQ(info.status, 0);
    EXPECT_EQ(info.error, "");
    const auto json = nlohmann::json::parse(info.out);
    EXPECT_EQ(json["frames"], 101);
    EXPECT_EQ(json["firstTime"], 0.0);
    EXPECT_EQ(json["lastTime"], 1.0);
    EXPECT_DOUBLE_EQ(json["rate"].get<double>(), 100.0);
    EXPECT_EQ(json["poses"], (std::vector<std::string>{"Car", "Van"}));
    EXPECT_EQ(json["instruments"][0]["name"], "speed");
    EXPECT_EQ(json["instruments"][0]["unit"], "km/h");
    EXPECT_TRUE(json["damage"].empty());

    const Result text = Run({"mdf", "info", "run.mdf"});
    for (const char* part : {"101 frames from 0 s to 1 s", "Car", "Van", "speed [km/h]", "no damage"})
        EXPECT_NE(text.out.find(part), std::string::npos) << part;

    EXPECT_EQ(Run({"mdf", "export", "run.mdf", "-o", "back.csv"}).status, 0);
    EXPECT_EQ(Run({"mdf", "import", "back.csv", "-o", "back.mdf"}).status, 0);
    EXPECT_EQ(Run({"mdf", "export", "back.mdf", "-o", "again.csv"}).status, 0);
    EXPECT_EQ(TemporaryFolder::Read(folder.path / "again.csv"), TemporaryFolder::Read(folder.path / "back.csv"));
    auto back = nlohmann::json::parse(Run({"mdf", "info", "back.mdf", "--json"}).out);
    back["file"] = json["file"];
    EXPECT_EQ(back, json);
}

struct BadTable
{
    const char* content;
    const char* place;
};

TEST_F(MdfCommand, AFaultOfATableIsToldByLineAndColumnAndLeavesNoFile)
{
    const BadTable tables[] = {
        {"time,Car.x,Car.y,Car.z,Car.roll,Car.pitch\n0,1,2,3,4,5\n", "Car"},
        {"time,a\n0,1\n0.1,two\n", "line 3"},
        {"time,a\n0,1\n0.1\n", "line 3"},
        {"time,a\n", "bad.csv"},
        {"", "bad.csv"},
    };
    for (const BadTable& table : tables)
    {
        SCOPED_TRACE(table.content);
        folder.Write("bad.csv", table.content);
        const Result result = Run({"mdf", "import", "bad.csv", "-o", "bad.mdf"});
        EXPECT_EQ(result.status, 1);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.error.rfind("panoramic: error ", 0), 0U) << result.error;
        EXPECT_NE(result.error.find(table.place), std::string::npos) << result.error;
        EXPECT_FALSE(HasFileLike("bad.mdf"));
    }
}

TEST_F(MdfCommand, FilesThatCannotBeUsedAreToldWithPathAndReason)
{
    WriteRun();
    const std::string good = TemporaryFolder::Read(folder.path / "run.mdf");
    folder.Write("empty.mdf", "");
    folder.Write("foreign.mdf", std::string(1000, 'x'));
    std::string version = good;
    version[8] = 9; // the version follows the eight bytes of the magic
    folder.Write("version.mdf", version);
    for (const char* name : {"missing.mdf", "empty.mdf", "foreign.mdf", "version.mdf"})
    {
        SCOPED_TRACE(name);
        const Result result = Run({"mdf", "info", name});
        EXPECT_EQ(result.status, 1);
        EXPECT_NE(result.error.find(name), std::string::npos) << result.error;
        EXPECT_EQ(Run({"mdf", "export", name, "-o", "x.csv"}).status, 1);
        EXPECT_FALSE(HasFileLike("x.csv"));
    }

    folder.Write("cut.mdf", good.substr(0, good.size() - 10));
    const Result cut = Run({"mdf", "info", "cut.mdf"});
    EXPECT_EQ(cut.status, 0) << cut.error;
    EXPECT_NE(cut.out.find("100 frames"), std::string::npos) << cut.out;
    EXPECT_NE(cut.out.find("damage: "), std::string::npos) << cut.out;

    const Result nowhere = Run({"mdf", "import", "run.csv", "-o", "no/such/folder/run.mdf"});
    EXPECT_EQ(nowhere.status, 1);
    EXPECT_NE(nowhere.error.find("no/such/folder"), std::string::npos);
}

} // namespace

#include "CommandFixture.h"

#include <filesystem>
#include <map>

#include <nlohmann/json.hpp>

namespace
{

struct SceneCommand : CommandFixture
{
    SceneCommand()
    {
        WriteRun();
        EXPECT_EQ(Run({"scene", "new", "-o", "scene.xml", "--movable", "Auto=car.dae:Car", "--static",
                       "ground.dae@0,0,-1", "--data", "run.mdf", "--eye", "5,0,10", "--look", "5,0,0"})
                      .status,
                  0);
    }

    Result Snapshot(const std::vector<std::string>& further) const
    {
        std::vector<std::string> all{"snapshot", "--data",  "run.mdf", "--time", "0.5",
                                     "--size",   "640x480", "-o",      "p.png"};
        all.insert(all.end(), further.begin(), further.end());
        return Run(all);
    }

    std::string Read(const char* name) const { return TemporaryFolder::Read(folder.path / name); }

    /// The scene file with a record put in before its end.
    void WriteSceneWith(const char* name, const std::string& record) const
    {
        std::string text = Read("scene.xml");
        text.insert(text.rfind("</vtattr:Scene>"), record);
        folder.Write(name, text);
    }

    static std::string Attribute(const std::string& name, const std::string& type, const std::string& value)
    {
        return "<vtattr:Attribute name=\"" + name + "\" type=\"" + type + "\"><vtattr:value>" + value +
               "</vtattr:value></vtattr:Attribute>";
    }

    static std::string Observer(const std::string& name, int mode, const std::string& body,
                                const std::string& translation)
    {
        return "<vtattr:Object type=\"5\">" + Attribute("object_type", "int", "5") +
               Attribute("internal_id", "string", "id-" + name) + Attribute("name", "string", name) +
               Attribute("behaviour", "int", std::to_string(mode)) + Attribute("attached_to", "string", body) +
               Attribute("translation", "floatTupel3", translation) + "</vtattr:Object>\n";
    }

    osg::ref_ptr<osg::Image> Picture() const { return ReadPicture(folder.path / "p.png"); }
};

TEST_F(SceneCommand, ASceneOfModelsShowsWhatTheModelsShow)
{
    const std::vector<std::string> place{"--eye", "5,0,10", "--look", "5,0,0"};
    std::vector<std::string> byModels{"--movable", "Auto=car.dae:Car", "--static", "ground.dae@0,0,-1"};
    byModels.insert(byModels.end(), place.begin(), place.end());
    ASSERT_EQ(Snapshot(byModels).status, 0);
    const std::string expected = Read("p.png");
    EXPECT_TRUE(IsRed(At(*Picture(), 0.5, 0.5)));

    std::vector<std::string> byScene{"--scene", "scene.xml"};
    byScene.insert(byScene.end(), place.begin(), place.end());
    ASSERT_EQ(Snapshot(byScene).status, 0);
    EXPECT_TRUE(Read("p.png") == expected);

    // Free1 was stored at the same place. Its angles are rounded, so colours are compared, not bytes.
    ASSERT_EQ(Snapshot({"--scene", "scene.xml", "--observer", "fREE1"}).status, 0);
    EXPECT_TRUE(IsRed(At(*Picture(), 0.5, 0.5)));
    EXPECT_TRUE(IsGreen(At(*Picture(), 0.9, 0.5)));
}

TEST_F(SceneCommand, PanesShareThePictureAsAskedFor)
{
    // One observer that sees the car and green ground, one that looks away into the sky.
    WriteSceneWith("views.xml", Observer("Car", 2, "Auto", "-6 0 2") + Observer("Far", 1, "", "0 0 -50"));
    const auto regions = [this](const std::vector<std::string>& arguments)
    {
        std::vector<std::string> all{"--scene", "views.xml"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        const Result result = Snapshot(all);
        EXPECT_EQ(result.status, 0) << result.error;
        return Picture();
    };
    const auto isGap = [](const Colour& c) { return c.red == 96 && c.green == 96 && c.blue == 96; };

    constexpr double rowGap = 238.0 / 480; // 4 pixels below the upper half
    osg::ref_ptr<osg::Image> picture = regions({});
    ASSERT_TRUE(picture);
    EXPECT_EQ(picture->s(), 640);
    EXPECT_TRUE(isGap(At(*picture, 322.0 / 640, 0.25))) << "four panes by default";
    EXPECT_TRUE(isGap(At(*picture, 0.25, rowGap)));

    picture = regions({"--splitter", "0.75,0.4"});
    EXPECT_TRUE(isGap(At(*picture, 482.0 / 640, 0.9)));
    EXPECT_FALSE(isGap(At(*picture, 322.0 / 640, 0.25)));

    picture = regions({"--layout", "1"});
    EXPECT_TRUE(isGap(At(*picture, 322.0 / 640, 0.9)));
    EXPECT_FALSE(isGap(At(*picture, 0.25, rowGap))) << "columns have no row";

    for (const char* pane : {"1", "4"})
    {
        picture = regions({"--pane", pane, "--observer", "Car"});
        EXPECT_TRUE(IsRed(At(*picture, 0.5, 0.2))) << "the car ahead of the camera that rides behind it";
        EXPECT_FALSE(isGap(At(*picture, 322.0 / 640, 0.25)));
    }
    picture = regions({"--all", "--observer", "Car"});
    EXPECT_TRUE(isGap(At(*picture, 322.0 / 640, 0.25))) << "in its pane, beside the others";
    EXPECT_TRUE(IsRed(At(*picture, 0.25, 0.6)));
}

TEST_F(SceneCommand, WhatCannotBeShownIsToldWithItsReason)
{
    folder.Write("broken.xml", "<?xml version=\"1.0\"?>\n<vtattr:Scene xmlns:vtattr=\"urn:panoramic:attributes\" "
                               "version=\"1\">\n<vtattr:Object type=\"six\"/></vtattr:Scene>\n");
    folder.Write("scene.txt", Read("scene.xml"));
    struct Case
    {
        std::vector<std::string> arguments;
        int status;
        std::vector<std::string> told;
    };
    const Case cases[] = {
        {{"--scene", "none.xml"}, 1, {"417", "none.xml"}},
        {{"--scene", "broken.xml"}, 1, {"error 496", "broken.xml", "line 3"}},
        {{"--scene", "scene.txt"}, 1, {"error 496", "scene.txt", ".xml"}},
        {{"--scene", "scene.xml", "--observer", "Nobody"}, 1, {"Nobody", "Free1, Free2"}},
        {{"--scene", "scene.xml", "--static", "ground.dae"}, 2, {"--scene"}},
        {{"--scene", "scene.xml", "--pane", "5"}, 2, {"--pane"}},
        {{"--scene", "scene.xml", "--pane", "1", "--all"}, 2, {"--pane"}},
        {{"--scene", "scene.xml", "--layout", "4"}, 2, {"--layout"}},
        {{"--scene", "scene.xml", "--splitter", "0.5"}, 2, {"x,y"}},
        {{"--scene", "scene.xml", "--splitter", "0.5,1.5"}, 2, {"from 0 to 1"}},
        {{"--movable", "Auto=car.dae:Car"}, 2, {"--eye"}},
    };
    for (const Case& one : cases)
    {
        const Result result = Snapshot(one.arguments);
        EXPECT_EQ(result.status, one.status) << one.arguments[1] << ": " << result.error;
        for (const std::string& part : one.told)
            EXPECT_NE(result.error.find(part), std::string::npos) << part << " in " << result.error;
        EXPECT_FALSE(HasFileLike("p.png"));
    }
}

TEST_F(SceneCommand, ACopyKeepsEverythingAndCopiesToItself)
{
    const std::string unknown = "<vtattr:Object type=\"77\">" + Attribute("object_type", "int", "77") +
                                Attribute("internal_id", "string", "odd") + Attribute("colour", "string", " plaid ") +
                                "</vtattr:Object>\n";
    WriteSceneWith("more.xml", Observer("Car", 4, "Auto", "-6 0 2") + unknown);
    ASSERT_EQ(Run({"scene", "copy", "more.xml", "-o", "one.xml"}).status, 0);
    ASSERT_EQ(Run({"scene", "copy", "one.xml", "-o", "two.xml"}).status, 0);
    EXPECT_TRUE(Read("one.xml") == Read("two.xml"));
    EXPECT_NE(Read("one.xml").find(" plaid "), std::string::npos) << "records that nobody here knows are kept";
    EXPECT_EQ(std::system(("xmllint --nonet --noout --schema '" PANORAMIC_SCENE_SCHEMA "' '" +
                           (folder.path / "one.xml").string() + "' 2>/dev/null")
                              .c_str()),
              0);

    for (const char* place : {"no/such/folder/c.xml", "/proc/c.xml"})
    {
        const Result refused = Run({"scene", "copy", "more.xml", "-o", place});
        EXPECT_EQ(refused.status, 1);
        EXPECT_NE(refused.error.find("error 525"), std::string::npos) << refused.error;
        EXPECT_NE(refused.error.find(place), std::string::npos) << refused.error;
    }
}

TEST_F(SceneCommand, AModelOfALibraryIsStoredAsOneByAnyName)
{
    std::filesystem::create_directories(folder.path / "library" / "Cars" / "$Box");
    std::filesystem::rename(folder.path / "car.dae", folder.path / "library" / "Cars" / "$Box" / "Box.dae");
    std::filesystem::create_directory_symlink(folder.path / "library", folder.path / "link");
    const Environment libraries{{"PANORAMIC_CUSTOMER_OBJECTS", (folder.path / "library").string()}};
    for (const char* model : {"library/Cars/$Box/Box.dae", "link/Cars/$Box/Box.dae"})
    {
        const Result result = Run({"scene", "new", "-o", "l.xml", "--static", model}, libraries);
        EXPECT_EQ(result.status, 0) << result.error;
        EXPECT_NE(Read("l.xml").find("%Customer_Objects%\\Cars\\$Box\\Box.dae"), std::string::npos) << model;
    }
}

TEST_F(SceneCommand, InfoTellsRecordsModelsObserversAndViews)
{
    WriteSceneWith("more.xml", Observer("Ride", 3, "Auto", "0 0 1") + Observer("Lost", 5, "Truck", "0 0 1"));
    std::filesystem::remove(folder.path / "ground.dae");
    const Result result = Run({"scene", "info", "more.xml", "--json"});
    ASSERT_EQ(result.status, 0) << result.error;
    const auto info = nlohmann::json::parse(result.out);

    std::map<int, int> counts;
    for (const auto& record : info["records"])
        counts[record["type"].get<int>()] = record["count"].get<int>();
    const std::map<int, int> expected{{1, 1}, {2, 1}, {3, 4}, {5, 2}, {6, 1}, {7, 1}, {9, 2}};
    EXPECT_EQ(counts, expected);

    std::map<std::string, bool> found;
    for (const auto& model : info["models"])
        found[model["body"].get<std::string>()] = model["found"].get<bool>();
    EXPECT_EQ(found, (std::map<std::string, bool>{{"Auto", true}, {"ground", false}}));

    std::map<std::string, nlohmann::json> observers;
    for (const auto& observer : info["observers"])
        observers[observer["name"].get<std::string>()] = observer;
    EXPECT_EQ(observers["Ride"]["mode"], 3);
    EXPECT_EQ(observers["Ride"]["body"], "Auto");
    EXPECT_EQ(observers["Ride"]["bodyMissing"], false);
    EXPECT_EQ(observers["Lost"]["bodyMissing"], true);
    EXPECT_EQ(info["views"].size(), 4U);
    EXPECT_EQ(info["views"][3]["pane"], 4);

    const Result text = Run({"scene", "info", "more.xml"});
    for (const char* part : {"movable body", "MISSING: ", "heading follow, on Auto", "on Truck (MISSING)", "pane 4"})
        EXPECT_NE(text.out.find(part), std::string::npos) << part << " in " << text.out;
    const Result broken = Run({"scene", "info", "run.mdf"});
    EXPECT_EQ(broken.status, 1);
    EXPECT_NE(broken.error.find("error 496"), std::string::npos) << broken.error;
}

TEST_F(SceneCommand, AReplayOfASceneGivesPicturesOfItsPanes)
{
    WriteSceneWith("ride.xml", Observer("Car", 2, "Auto", "-6 0 2"));
    folder.Write("panes.shots", "0.25 early\n0.75 late\n");
    const Result result = Run({"play", "--scene", "ride.xml", "--data", "run.mdf", "--observer", "Car", "--size",
                               "160x120", "--shots", "panes.shots", "--pictures", "out", "--headless"});
    ASSERT_EQ(result.status, 0) << result.error;
    for (const char* name : {"early", "late"})
    {
        const osg::ref_ptr<osg::Image> picture = ReadPicture(folder.path / "out" / (std::string(name) + ".png"));
        ASSERT_TRUE(picture);
        EXPECT_TRUE(IsRed(At(*picture, 0.5, 0.2))) << "the camera rides along";
    }
    EXPECT_TRUE(std::filesystem::exists(folder.path / "out" / "contact-sheet.png"));
}

} // namespace

#include "CommandFixture.h"

namespace
{

struct SnapshotCommand : CommandFixture
{
    SnapshotCommand() { WriteRun(); }

    /// Straight from above: x to the right, y up, 16 m across the picture around (5, 0).
    Result Snapshot(const std::vector<std::string>& further, const Environment& environment = {}) const
    {
        std::vector<std::string> all{"snapshot", "--eye",  "5,0,10", "--look", "5,0,0",
                                     "--size",   "160x90", "-o",     "p.png"};
        all.insert(all.end(), further.begin(), further.end());
        return Run(all, environment);
    }

    osg::ref_ptr<osg::Image> Picture() const { return ReadPicture(folder.path / "p.png"); }
};

// 80 degrees of view across at 10 m: 16.8 m, less 0.5 m of the car's height.
constexpr double metresAcross = 16.8;

double AcrossOf(double x)
{
    return 0.5 + (x - 5.0) / metresAcross;
}

struct Moment
{
    std::vector<std::string> arguments;
    double x;
};

TEST_F(SnapshotCommand, TheCarIsWhereTheDataSay)
{
    const Moment moments[] = {
        {{"--time", "0"}, 0.0},     {{"--time", "0.5"}, 5.0}, {{"--time", "0.999"}, 9.9},
        {{"--frame", "101"}, 10.0}, {{"--frame", "1"}, 0.0},
    };
    for (const Moment& moment : moments)
    {
        SCOPED_TRACE(moment.arguments[1]);
        std::vector<std::string> arguments{"--movable", "Auto=car.dae:cAR", "--data", "run.mdf"};
        arguments.insert(arguments.end(), moment.arguments.begin(), moment.arguments.end());
        const Result result = Snapshot(arguments);
        EXPECT_EQ(result.status, 0) << result.error;
        EXPECT_EQ(result.out, "p.png\n");
        const osg::ref_ptr<osg::Image> picture = Picture();
        ASSERT_TRUE(picture);
        EXPECT_EQ(picture->s(), 160);
        EXPECT_EQ(picture->t(), 90);
        for (const double x : {0.0, 5.0, 9.9})
        {
            const bool here = std::abs(x - moment.x) < 0.5;
            const Colour colour = At(*picture, AcrossOf(x), 0.5);
            EXPECT_EQ(IsRed(colour), here) << "at x = " << x;
            EXPECT_EQ(IsSky(colour), !here) << "at x = " << x;
        }
    }
}

TEST_F(SnapshotCommand, AStaticBodyStandsAndTurnsInTheAxesOfTheScene)
{
    // Two metres along x, moved to y = 3 and turned upright: then along y.
    EXPECT_EQ(Snapshot({"--static", "car.dae@5,3,0,0,0,90", "--static=ground.dae@0,0,-1"}).status, 0);
    const osg::ref_ptr<osg::Image> picture = Picture();
    ASSERT_TRUE(picture);
    const double up = 90.0 / 160.0; // of the picture's width
    const auto at = [&](double x, double y) { return At(*picture, AcrossOf(x), 0.5 + y / metresAcross / up); };
    EXPECT_TRUE(IsRed(at(5.0, 3.0)));
    EXPECT_TRUE(IsRed(at(5.0, 2.5)));
    EXPECT_TRUE(IsGreen(at(5.9, 3.0))) << "it would reach here unturned";
    EXPECT_TRUE(IsGreen(at(5.0, -3.0)));
}

TEST_F(SnapshotCommand, ArgumentsOfAFileAreOfItsFolder)
{
    std::filesystem::create_directories(folder.path / "scene");
    for (const char* name : {"car.dae", "run.mdf"})
        std::filesystem::rename(folder.path / name, folder.path / "scene" / name);
    folder.Write("scene/scene.args", "# a scene\n--movable\nCar=car.dae\n--data\nrun.mdf\n");
    const Result result = Snapshot({"@scene/scene.args", "--time", "0.5"});
    EXPECT_EQ(result.status, 0) << result.error;
    EXPECT_TRUE(IsRed(At(*Picture(), 0.5, 0.5)));
}

TEST_F(SnapshotCommand, WhatTheDataDontHaveIsToldWithWhatTheyHave)
{
    struct Case
    {
        std::vector<std::string> arguments;
        std::vector<std::string> told;
    };
    const Case cases[] = {
        {{"--movable", "Car=car.dae:Truck", "--time", "0"}, {"Truck", "Car, Van"}},
        {{"--movable", "Car=car.dae", "--time", "1.5"}, {"1.5 s", "from 0 s to 1 s"}},
        {{"--movable", "Car=car.dae", "--time", "-0.1"}, {"-0.1 s", "from 0 s to 1 s"}},
        {{"--movable", "Car=car.dae", "--frame", "102"}, {"102", "from 1 to 101"}},
    };
    for (const Case& one : cases)
    {
        std::vector<std::string> arguments{"--data", "run.mdf"};
        arguments.insert(arguments.end(), one.arguments.begin(), one.arguments.end());
        const Result result = Snapshot(arguments);
        EXPECT_EQ(result.status, 1);
        for (const std::string& part : one.told)
            EXPECT_NE(result.error.find(part), std::string::npos) << part << " in " << result.error;
        EXPECT_FALSE(HasFileLike("p.png"));
    }
}

TEST_F(SnapshotCommand, BadDataAreToldAndWholeFramesOfADamagedFileAreUsed)
{
    const Result missing = Snapshot({"--data", "none.mdf", "--frame", "1"});
    EXPECT_EQ(missing.status, 1);
    EXPECT_NE(missing.error.find("none.mdf"), std::string::npos) << missing.error;
    EXPECT_FALSE(HasFileLike("p.png"));

    const std::string good = TemporaryFolder::Read(folder.path / "run.mdf");
    folder.Write("cut.mdf", good.substr(0, good.size() - 10));
    const Result cut = Snapshot({"--movable", "Car=car.dae", "--data", "cut.mdf", "--frame", "51"});
    EXPECT_EQ(cut.status, 0) << cut.error;
    EXPECT_NE(cut.error.find("panoramic: warning"), std::string::npos);
    EXPECT_NE(cut.error.find("100"), std::string::npos) << "counts the frames: " << cut.error;
    EXPECT_TRUE(IsRed(At(*Picture(), 0.5, 0.5)));
}

TEST_F(SnapshotCommand, AModelThatCannotBeReadCostsItsBodyOnly)
{
    folder.Write("broken.dae", "<COLLADA><library_geo");
    for (const char* model : {"none.dae", "broken.dae"})
    {
        SCOPED_TRACE(model);
        std::filesystem::remove(folder.path / "p.png");
        const Result result = Snapshot({"--movable", std::string("Van=") + model, "--movable", "Car=car.dae", "--data",
                                        "run.mdf", "--time", "0.5"});
        EXPECT_EQ(result.status, 1);
        EXPECT_NE(result.error.find("panoramic: error "), std::string::npos);
        EXPECT_NE(result.error.find(model), std::string::npos) << result.error;
        ASSERT_TRUE(Picture());
        EXPECT_TRUE(IsRed(At(*Picture(), 0.5, 0.5)));
    }
}

TEST_F(SnapshotCommand, APictureThatCannotBeWrittenLeavesNothing)
{
    const Result result = Snapshot({"-o", "no/such/folder/p.png", "--static", "car.dae"});
    EXPECT_EQ(result.status, 2) << "one picture at a time";
    const Result nowhere = Run({"snapshot", "--eye", "5,0,10", "--look", "5,0,0", "--size", "16x9", "-o", "no/p.png"});
    EXPECT_EQ(nowhere.status, 1);
    EXPECT_NE(nowhere.error.find("no/p.png"), std::string::npos) << nowhere.error;
    const Result full =
        Run({"snapshot", "--eye", "5,0,10", "--look", "5,0,0", "--size", "16x9", "-o", "/dev/full/p.png"});
    EXPECT_EQ(full.status, 1);
}

// Content that was written under a wrong name, or over what the user still needs, is lost for good.
TEST_F(SnapshotCommand, AnOutputCostsNothingThatWasThere)
{
    namespace fs = std::filesystem;
    ASSERT_EQ(Run({"scene", "new", "-o", "scene.xml", "--static", "ground.dae"}).status, 0);
    folder.Write("models/Imported.xml", "<a/>");
    fs::copy_file(folder.path / "car.dae", folder.path / "models/car.dae");
    fs::create_directories(folder.path / "folder.png");
    fs::create_symlink("run.mdf", folder.path / "link.png");
    fs::create_hard_link(folder.path / "scene.xml", folder.path / "hard.xml");
    folder.Write("place.args", "--eye\n5,0,10\n--look\n5,0,0\n--size\n16x9\n");
    folder.Write("scene.args", "--eye\n5,0,10\n--look\n5,0,0\n");
    folder.Write("old.png", "old");
    fs::create_symlink("old.png", folder.path / "to_old.png");

    struct Case
    {
        std::vector<std::string> arguments;
        int status;
        const char* word; ///< of the message, or the beginning of what is printed
    };
    const std::vector<std::string> moment{"snapshot", "@place.args", "--data", "run.mdf", "--frame", "1", "-o"};
    const auto snapshot = [&](const char* output)
    {
        std::vector<std::string> all = moment;
        all.emplace_back(output);
        return all;
    };
    const Case refused[] = {
        {snapshot("link.png"), 2, "run.mdf"},
        {snapshot("folder.png"), 2, "folder"},
        {snapshot("p.xml"), 2, ".png, .jpg or .tif"},
        {snapshot("p.bmp"), 2, ".png, .jpg or .tif"},
        {{"scene", "copy", "scene.xml", "-o", "scene.xml"}, 2, "scene.xml"},
        {{"scene", "copy", "scene.xml", "-o", "hard.xml"}, 2, "scene.xml"},
        {{"scene", "copy", "scene.xml", "-o", "p.png"}, 2, ".xml"},
        {{"scene", "new", "@scene.args", "-o", "scene.args"}, 2, "scene.args"},
        {{"scene", "new", "--static", "models/car.dae", "-o", "models/Imported.xml"}, 1, "Imported.xml"},
        {{"mdf", "export", "run.mdf", "-o", "run.mdf"}, 2, ".csv"},
        {{"mdf", "export", "run.mdf", "-o", "car.dae"}, 2, ".csv"},
    };
    const auto contents = [&]
    {
        std::string all;
        for (const char* file : {"run.mdf", "scene.xml", "scene.args", "car.dae", "models/Imported.xml"})
            all += TemporaryFolder::Read(folder.path / file) + "\n";
        return all;
    };
    const std::string before = contents();
    for (const Case& c : refused)
    {
        SCOPED_TRACE(c.arguments.back());
        const Result result = Run(c.arguments);
        EXPECT_EQ(result.status, c.status);
        EXPECT_NE(result.error.find(c.word), std::string::npos) << result.error;
        EXPECT_EQ(contents(), before);
    }
    const Case written[] = {
        {snapshot("/dev/stdout"), 0, "\x89PNG"},
        {snapshot("to_old.png"), 0, "to_old.png"},
        {snapshot("p.jpg"), 0, "p.jpg"},
        {snapshot("p.tif"), 0, "p.tif"},
    };
    for (const Case& c : written)
    {
        SCOPED_TRACE(c.arguments.back());
        const Result result = Run(c.arguments);
        EXPECT_EQ(result.status, c.status) << result.error;
        EXPECT_TRUE(result.out.starts_with(c.word)) << result.out.substr(0, 100);
    }
    EXPECT_TRUE(fs::is_symlink(folder.path / "to_old.png"));
    const std::pair<const char*, const char*> signatures[] = {
        {"old.png", "\x89PNG"}, {"p.jpg", "\xFF\xD8\xFF"}, {"p.tif", "II*"}};
    for (const auto& [file, signature] : signatures)
        EXPECT_TRUE(TemporaryFolder::Read(folder.path / file).starts_with(signature)) << file;
}

TEST_F(SnapshotCommand, WithoutAGraphicsContextTheReasonIsTold)
{
    // A loader that finds no vendor is what a machine without any driver has.
    folder.Write("vendors/none.json", "{}");
    const Result result =
        Snapshot({"--static", "car.dae"}, {{"__EGL_VENDOR_LIBRARY_DIRS", (folder.path / "vendors").string()}});
    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.error.find("panoramic: error 532: "), std::string::npos) << result.error;
    EXPECT_FALSE(HasFileLike("p.png"));
}

TEST_F(SnapshotCommand, TheSameSceneGivesTheSamePicture)
{
    const std::vector<std::string> scene{"--movable", "Car=car.dae", "--static", "ground.dae@0,0,-1",
                                         "--data",    "run.mdf",     "--time",   "0.3"};
    ASSERT_EQ(Snapshot(scene).status, 0);
    const std::string first = TemporaryFolder::Read(folder.path / "p.png");
    ASSERT_EQ(Snapshot(scene).status, 0);
    EXPECT_EQ(TemporaryFolder::Read(folder.path / "p.png"), first);
}

} // namespace

#include <gtest/gtest.h>

#include "hosts/console/Arguments.h"
#include "hosts/console/Shots.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

using namespace console;

// What was refused, or "taken".
template <class Parse>
std::string Refusal(Parse parse)
{
    try
    {
        parse();
        return "taken";
    }
    catch (const ArgumentError& error)
    {
        return error.what();
    }
}

TEST(Arguments, WrongNumbersAreRefusedAndNotGuessedAt)
{
    EXPECT_EQ(ParseTriple("1,-2.5,3e2"), (Triple{1.0, -2.5, 300.0}));
    for (const char* wrong : {"", "1,2", "1,2,3,4", "1,2,", "1;2;3", "1,2,3x", "a,b,c", "1,,3", "nan,0,0", "0x10,1,1"})
        EXPECT_NE(Refusal([&] { ParseTriple(wrong); }), "taken") << wrong;

    EXPECT_EQ(ParseSize("640x360").width, 640);
    EXPECT_EQ(ParseSize("640X360").height, 360);
    for (const char* wrong :
         {"", "640", "640x", "x360", "0x10", "-1x10", "640x360x2", "6.5x3", "16385x1", "99999999999x1"})
        EXPECT_NE(Refusal([&] { ParseSize(wrong); }), "taken") << wrong;
}

TEST(Arguments, StaticBodiesHaveAPlaceOrNone)
{
    const StaticArgument plain = ParseStatic("roads/road.dae");
    EXPECT_EQ(plain.model, "roads/road.dae");
    EXPECT_EQ(plain.position, Triple{});
    const StaticArgument placed = ParseStatic("a@b/road.dae@1,2,3");
    EXPECT_EQ(placed.model, "a@b/road.dae");
    EXPECT_EQ(placed.position, (Triple{1, 2, 3}));
    EXPECT_EQ(placed.rotation, Triple{});
    const StaticArgument turned = ParseStatic("road.dae@1,2,3,0,0,-90");
    EXPECT_EQ(turned.rotation, (Triple{0, 0, -90}));
    for (const char* wrong : {"", "@1,2,3", "road.dae@", "road.dae@1,2", "road.dae@1,2,3,4", "road.dae@1,2,3,4,5,6,7"})
        EXPECT_NE(Refusal([&] { ParseStatic(wrong); }), "taken") << wrong;
}

struct MovableCase
{
    const char* text;
    const char* name;
    const char* model;
    const char* channel;
};

const MovableCase movables[] = {
    {"Car=car.dae", "Car", "car.dae", "Car"},
    {"Car=car.dae:Chassis", "Car", "car.dae", "Chassis"},
    {"Car=lib/CAR.DAE:Chassis", "Car", "lib/CAR.DAE", "Chassis"},
    {"Car=van.wrl:Body:1", "Car", "van.wrl", "Body:1"},
    {"Car=a:b/car.dae", "Car", "a:b/car.dae", "Car"},
    {"Wheel FL=w.dae:a=b", "Wheel FL", "w.dae", "a=b"},
};

TEST(Arguments, MovableBodiesAreBoundByNameUnlessAChannelIsGiven)
{
    for (const MovableCase& one : movables)
    {
        SCOPED_TRACE(one.text);
        const MovableArgument parsed = ParseMovable(one.text);
        EXPECT_EQ(parsed.name, one.name);
        EXPECT_EQ(parsed.model, one.model);
        EXPECT_EQ(parsed.channel, one.channel);
    }
    for (const char* wrong : {"", "car.dae", "=car.dae", "Car=", "Car=car.dae:", " =car.dae"})
        EXPECT_NE(Refusal([&] { ParseMovable(wrong); }), "taken") << wrong;
}

TEST(Arguments, AFileOfArgumentsStandsForItsLines)
{
    const TemporaryFolder folder;
    const std::string at = folder.path.string() + "/";
    folder.Write("scene.args", "# the course\n--static\nroad.dae@1,2,3\n\n"
                               "--movable=Car=car.dae:Chassis\r\n  --data run.mdf\n--shots\n/abs/shots.txt\n"
                               "--eye -1,2,3\n--headless\n-o\npicture.png\n@not-nested\n");
    const std::vector<std::string> expected{"--static",
                                            at + "road.dae@1,2,3",
                                            "--movable=Car=" + at + "car.dae:Chassis",
                                            "--data=" + at + "run.mdf",
                                            "--shots",
                                            "/abs/shots.txt",
                                            "--eye=-1,2,3",
                                            "--headless",
                                            "-o",
                                            "picture.png",
                                            "@not-nested",
                                            "--count",
                                            "3"};
    EXPECT_EQ(ExpandArgumentFiles({"@" + at + "scene.args", "--count", "3"}), expected);
    EXPECT_EQ(ExpandArgumentFiles({"@", "a@b"}), (std::vector<std::string>{"@", "a@b"}));
    EXPECT_NE(Refusal([&] { ExpandArgumentFiles({"@" + at + "missing.args"}); }).find("missing.args"),
              std::string::npos);
    EXPECT_NE(Refusal([&] { ExpandArgumentFiles({"@" + at}); }), "taken") << "a folder is no file";
}

TEST(Shots, AFileGivesThemByTimeAndNamesItsFaults)
{
    const TemporaryFolder folder;
    const auto file = folder.Write("shots.txt", "# time eye look name\n2.5 1,2,3 0,0,0 second # behind the car\n\n"
                                                "0 first\n");
    const std::vector<Shot> shots = ReadShots(file);
    ASSERT_EQ(shots.size(), 2U);
    EXPECT_EQ(shots[0].name, "first");
    EXPECT_FALSE(shots[0].place) << "the eye stays";
    EXPECT_EQ(shots[1].time, 2.5);
    ASSERT_TRUE(shots[1].place);
    EXPECT_EQ(shots[1].place->eye, (Triple{1, 2, 3}));

    const char* wrong[] = {"1 1,2,3 0,0,0",      "1 1,2,3 1,2,3 a", "1",
                           "1 1,2,3 0,0,0 a b",  "x 1,2,3 0,0,0 a", "1 1,2 0,0,0 a",
                           "1 1,2,3 0,0,0 ../a", "1 1,2,3 0,0,0 .a"};
    for (const char* line : wrong)
        EXPECT_NE(Refusal([&] { ReadShots(folder.Write("bad.txt", std::string("# a\n") + line)); }).find("line 2"),
                  std::string::npos)
            << line;
    EXPECT_NE(Refusal([&] { ReadShots(folder.Write("twice.txt", "1 1,2,3 0,0,0 a\n2 1,2,3 0,0,0 a")); }).find("line 2"),
              std::string::npos);
    EXPECT_NE(Refusal([&] { ReadShots(folder.Write("empty.txt", "# none\n")); }), "taken");
    EXPECT_NE(Refusal([&] { ReadShots(folder.path / "none.txt"); }), "taken");
}

TEST(Shots, EqualDistancesReachBothEnds)
{
    const std::vector<Shot> shots = EquallySpacedShots(10.0, 20.0, 3);
    ASSERT_EQ(shots.size(), 3U);
    EXPECT_EQ(shots[0].time, 10.0);
    EXPECT_EQ(shots[1].time, 15.0);
    EXPECT_EQ(shots[2].time, 20.0);
    EXPECT_NE(shots[0].name, shots[1].name);
    EXPECT_EQ(EquallySpacedShots(10.0, 20.0, 1)[0].time, 15.0);
}

} // namespace

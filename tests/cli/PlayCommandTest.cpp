#include "CommandFixture.h"

namespace
{

struct PlayCommand : CommandFixture
{
    PlayCommand() { WriteRun(); }

    Result Play(const std::vector<std::string>& further, int interruptAfter = 0) const
    {
        std::vector<std::string> all{"play",   "--movable", "Car=car.dae", "--data", "run.mdf", "--size",
                                     "160x90", "--eye",     "5,0,10",      "--look", "5,0,0"};
        all.insert(all.end(), further.begin(), further.end());
        return Run(all, {}, interruptAfter);
    }
};

TEST_F(PlayCommand, ARunIsPlayedInRealTimeAndCounted)
{
    const Result result = Play({"--headless"});
    EXPECT_EQ(result.status, 0) << result.error;
    int frames = 0;
    double seconds = 0, fps = 0, data = 0;
    ASSERT_EQ(sscanf(result.out.c_str(), "%d frames in %lf s: %lf fps; %lf s of data", &frames, &seconds, &fps, &data),
              4)
        << result.out;
    EXPECT_GT(frames, 1);
    EXPECT_GE(seconds, 0.95);
    EXPECT_NEAR(data, 1.0, 0.001);
    EXPECT_NEAR(fps, frames / seconds, fps * 0.02) << "the seconds are rounded";
    EXPECT_EQ(result.error.find("--headless"), std::string::npos);
}

TEST_F(PlayCommand, PassesAndSpeedMultiply)
{
    const Result result = Play({"--speed", "4", "--loop", "3"});
    EXPECT_EQ(result.status, 0) << result.error;
    int frames = 0;
    double seconds = 0, fps = 0, data = 0;
    ASSERT_EQ(sscanf(result.out.c_str(), "%d frames in %lf s: %lf fps; %lf s of data", &frames, &seconds, &fps, &data),
              4);
    EXPECT_NEAR(data, 3.0, 0.001);
    EXPECT_GE(seconds, 0.7);
    EXPECT_NE(result.error.find("--headless"), std::string::npos) << "that there is no window is told";
}

TEST_F(PlayCommand, ALiveSourceRunsWithItsOptions)
{
    const std::vector<std::string> scene{
        "--movable", "Car=car.dae:Vehicle", "--size", "160x90", "--eye", "0,0,10", "--look", "0,0.01,0"};
    const auto run = [&](std::vector<std::string> all)
    {
        all.insert(all.end(), scene.begin(), scene.end());
        return Run(all);
    };
    const Result played = run({"play", "--source", "OffSim:seed=3,fail=90", "--duration", "1.5", "--headless",
                               "--pictures", "out", "--count", "2"});
    EXPECT_EQ(played.status, 0) << played.error;
    double data = 0;
    ASSERT_EQ(sscanf(played.out.c_str(), "%*d frames in %*f s: %*f fps; %lf s of data", &data), 1) << played.out;
    EXPECT_NEAR(data, 1.5, 0.4);
    EXPECT_TRUE(HasFileLike("contact-sheet.png"));

    // Nobody waits for the time of a picture: three minutes of driving.
    const Result far = run({"snapshot", "--source", "OffSim", "--time", "180", "-o", "far.png"});
    EXPECT_EQ(far.status, 0) << far.error;
    const Result near = run({"snapshot", "--source", "OffSim:seed=3", "--time", "0", "-o", "near.png"});
    EXPECT_EQ(near.status, 0) << near.error;
    EXPECT_TRUE(IsRed(At(*ReadPicture(folder.path / "near.png"), 0.5, 0.5))) << "at the start line";
    EXPECT_TRUE(IsSky(At(*ReadPicture(folder.path / "far.png"), 0.5, 0.5))) << "out on the course";

    struct Wrong
    {
        const char* source;
        const char* told;
    };
    for (const Wrong& wrong : {Wrong{"OffSim:pace=2", "there are seed=NUMBER, fail=SECONDS and recover=SECONDS"},
                               {"OnSim", "There are: File, OffSim"},
                               {"File:none.mdf", "no motion data file to read or write"},
                               {"OffSim:fail=0", "can't be opened"}})
    {
        const Result result = run({"snapshot", "--source", wrong.source, "--time", "1", "-o", "p.png"});
        EXPECT_EQ(result.status, 1) << wrong.source;
        EXPECT_NE(result.error.find(wrong.told), std::string::npos) << result.error;
    }
}

TEST_F(PlayCommand, ShotsAreTakenWhenTheRunPassesThem)
{
    folder.Write(
        "shots.txt",
        "# time eye look name\n1 5,0,10 5,0,0 end\n0.33 3,0,6 3,0,0 middle\n0 0,0,10 0,0,0 start # where it starts\n");
    const Result result = Run({"play", "--movable", "Car=car.dae", "--data", "run.mdf", "--size", "160x90",
                               "--headless", "--pictures", "out/run", "--shots", "shots.txt", "--speed", "2"});
    EXPECT_EQ(result.status, 0) << result.error;
    EXPECT_NE(result.out.find("out/run/start.png\nout/run/middle.png\nout/run/end.png\nout/run/contact-sheet.png\n"),
              std::string::npos)
        << result.out;
    const osg::ref_ptr<osg::Image> start = ReadPicture(folder.path / "out/run/start.png");
    const osg::ref_ptr<osg::Image> end = ReadPicture(folder.path / "out/run/end.png");
    ASSERT_TRUE(start && end);
    EXPECT_TRUE(IsRed(At(*start, 0.5, 0.5))) << "the eye of the shot is above the start";
    EXPECT_TRUE(IsSky(At(*end, 0.5, 0.5)));
    EXPECT_TRUE(IsRed(At(*end, 0.5 + 5.0 / 16.8, 0.5)));
    // A picture is of its own time, not of the frame that came next.
    ASSERT_EQ(Run({"snapshot", "--movable", "Car=car.dae", "--data", "run.mdf", "--time", "0.33", "--eye", "3,0,6",
                   "--look", "3,0,0", "--size", "160x90", "-o", "same.png"})
                  .status,
              0);
    EXPECT_EQ(TemporaryFolder::Read(folder.path / "out/run/middle.png"),
              TemporaryFolder::Read(folder.path / "same.png"));
    const osg::ref_ptr<osg::Image> sheet = ReadPicture(folder.path / "out/run/contact-sheet.png");
    ASSERT_TRUE(sheet);
    EXPECT_GT(sheet->s(), sheet->t()) << "the pictures stand side by side";
}

TEST_F(PlayCommand, WithoutShotsPicturesLieAtEqualDistances)
{
    const Result result = Play({"--headless", "--pictures", "out", "--count", "3", "--speed", "4"});
    EXPECT_EQ(result.status, 0) << result.error;
    std::size_t count = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder.path / "out"))
        count += entry.path().extension() == ".png";
    EXPECT_EQ(count, 4U) << "three and the contact sheet";
    for (const char* name : {"out/01-0.00s.png", "out/02-0.50s.png", "out/03-1.00s.png", "out/contact-sheet.png"})
        EXPECT_NE(result.out.find(name), std::string::npos) << result.out;
}

TEST_F(PlayCommand, ShotsOutsideOfTheDataAndFoldersThatCannotBeMadeEndIt)
{
    folder.Write("late.txt", "1.5 5,0,10 5,0,0 late\n");
    const Result late = Play({"--pictures", "out", "--shots", "late.txt"});
    EXPECT_EQ(late.status, 1);
    EXPECT_NE(late.error.find("from 0 s to 1 s"), std::string::npos) << late.error;
    EXPECT_FALSE(HasFileLike("out"));
    const Result blocked = Play({"--pictures", "car.dae/out"});
    EXPECT_EQ(blocked.status, 1);
    EXPECT_NE(blocked.error.find("car.dae/out"), std::string::npos) << blocked.error;
    EXPECT_EQ(blocked.out, "") << "nothing is played";
}

TEST_F(PlayCommand, DataWithoutTimesPlayFrameByFrameAndGiveNoPictures)
{
    folder.Write("untimed.csv", "time,Car.x,Car.y,Car.z,Car.roll,Car.pitch,Car.yaw\n,1,0,0,0,0,0\n,2,0,0,0,0,0\n"
                                ",3,0,0,0,0,0\n");
    ASSERT_EQ(Run({"mdf", "import", "untimed.csv", "-o", "untimed.mdf"}).status, 0);
    const std::vector<std::string> play{"play", "--movable",  "Car=car.dae", "--data", "untimed.mdf", "--size",
                                        "16x9", "--headless", "--eye",       "5,0,10", "--look",      "5,0,0"};
    const Result played = Run(play);
    EXPECT_EQ(played.status, 0) << played.error;
    EXPECT_EQ(played.out.rfind("3 frames", 0), 0U) << played.out;
    std::vector<std::string> pictures = play;
    pictures.insert(pictures.end(), {"--pictures", "out"});
    const Result refused = Run(pictures);
    EXPECT_EQ(refused.status, 1);
    EXPECT_NE(refused.error.find("time stamps"), std::string::npos) << refused.error;
}

TEST_F(PlayCommand, AnInterruptEndsItCleanly)
{
    const Result result = Play({"--headless", "--loop", "1000"}, 2500);
    EXPECT_EQ(result.status, 0) << result.error;
    EXPECT_NE(result.error.find("Interrupted"), std::string::npos) << result.error;
    EXPECT_NE(result.out.find("fps"), std::string::npos);
}

} // namespace

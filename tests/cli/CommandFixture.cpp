#include "CommandFixture.h"

#include <csignal>
#include <fcntl.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include <osgDB/ReadFile>

#include "tests/support/BoxModel.h"

CommandFixture::CommandFixture()
{
    folder.Write("car.dae", fake::BoxModel("1 0 0", 2.0, 1.0, 1.0));
    folder.Write("ground.dae", fake::BoxModel("0 1 0", 40.0, 0.1, 40.0));
}

CommandFixture::Result CommandFixture::Run(const std::vector<std::string>& arguments, const Environment& environment,
                                           int interruptAfter) const
{
    const std::filesystem::path out = folder.path / ".stdout";
    const std::filesystem::path error = folder.path / ".stderr";
    const pid_t child = fork();
    if (child == 0)
    {
        dup2(open(out.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), STDOUT_FILENO);
        dup2(open(error.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), STDERR_FILENO);
        setenv("XDG_CONFIG_HOME", (folder.path / "config").c_str(), 1);
        setenv("PANORAMIC_MODEL_CACHE", "off", 1);
        for (const auto& [name, value] : environment)
            setenv(name.c_str(), value.c_str(), 1);
        std::vector<char*> pointers{const_cast<char*>("panoramic")};
        for (const std::string& argument : arguments)
            pointers.push_back(const_cast<char*>(argument.c_str()));
        pointers.push_back(nullptr);
        if (chdir(folder.path.c_str()) == 0)
            execv(PANORAMIC_PROGRAM, pointers.data());
        _exit(127);
    }
    if (interruptAfter > 0)
    {
        std::this_thread::sleep_for(std::chrono::milliseconds(interruptAfter));
        kill(child, SIGINT);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return {WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status), TemporaryFolder::Read(out),
            TemporaryFolder::Read(error)};
}

osg::ref_ptr<osg::Image> CommandFixture::ReadPicture(const std::filesystem::path& file)
{
    return osgDB::readRefImageFile(file.string());
}

CommandFixture::Colour CommandFixture::At(const osg::Image& picture, double x, double y)
{
    const unsigned char* pixel = picture.data(static_cast<unsigned>(x * (picture.s() - 1) + 0.5),
                                              static_cast<unsigned>(y * (picture.t() - 1) + 0.5));
    return {pixel[0], pixel[1], pixel[2]};
}

bool CommandFixture::HasFileLike(const std::string& name) const
{
    for (const auto& entry : std::filesystem::recursive_directory_iterator(folder.path))
        if (entry.path().filename().string().starts_with(name))
            return true;
    return false;
}

void CommandFixture::WriteRun() const
{
    std::string table = "time,Car.x,Car.y,Car.z,Car.roll,Car.pitch,Car.yaw,"
                        "Van.x,Van.y,Van.z,Van.roll,Van.pitch,Van.yaw,speed [km/h]\n";
    for (int i = 0; i <= 100; ++i)
        table += std::to_string(i / 100.0) + "," + std::to_string(i / 10.0) + ",0,0.5,0,0,0,5,5,0.5,0,0,0,36\n";
    folder.Write("run.csv", table);
    ASSERT_EQ(Run({"mdf", "import", "run.csv", "-o", "run.mdf"}).status, 0);
}

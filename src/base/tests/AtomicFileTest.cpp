#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <unistd.h>

#include "base/AtomicFile.h"

namespace fs = std::filesystem;

namespace
{

std::string Content(const fs::path& path)
{
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

struct AtomicFileTest : testing::Test
{
    fs::path folder = fs::temp_directory_path() / ("panoramic_atomic_" + std::to_string(getpid()));

    void SetUp() override { fs::create_directories(folder); }
    void TearDown() override { fs::remove_all(folder); }
    std::size_t Files() const
    {
        return static_cast<std::size_t>(std::distance(fs::directory_iterator(folder), fs::directory_iterator()));
    }
};

} // namespace

TEST_F(AtomicFileTest, AnOlderFileStaysUntilTheNewOneIsWhole)
{
    const fs::path path = folder / "a.txt";
    ASSERT_EQ(base::WriteWholeFile(path, "old"), "");
    {
        base::AtomicFile abandoned(path);
        EXPECT_TRUE(abandoned.Write("half"));
        EXPECT_EQ(Content(path), "old");
    }
    EXPECT_EQ(Content(path), "old");
    EXPECT_EQ(Files(), 1u) << "the temporary file of an abandoned write is left behind";

    base::AtomicFile file(path);
    file.Write("0 new");
    file.WriteAt(0, "5", 1);
    file.Write("!");
    EXPECT_TRUE(file.Commit());
    EXPECT_EQ(Content(path), "5 new!");
    EXPECT_EQ(Files(), 1u);
}

TEST_F(AtomicFileTest, ReportsTheFileAndTheCause)
{
    const std::string error = base::WriteWholeFile(folder / "none" / "a.txt", "x");
    EXPECT_NE(error.find("none/a.txt"), std::string::npos) << error;
    EXPECT_NE(error.find("No such file"), std::string::npos) << error;

    if (fs::exists("/dev/full"))
    {
        base::AtomicFile file("/dev/full/x");
        EXPECT_FALSE(file.Write("x", 1));
        EXPECT_FALSE(file.Commit());
        EXPECT_NE(file.Error(), "");
    }
}

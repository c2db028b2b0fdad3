#include <fcntl.h>
#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <sys/stat.h>
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

TEST_F(AtomicFileTest, WhatTheNameLeadsToIsWrittenAndNotReplaced)
{
    const fs::path file = folder / "file";
    const fs::path link = folder / "link";
    const fs::path toNothing = folder / "to_nothing";
    const fs::path pipe = folder / "pipe";
    ASSERT_EQ(base::WriteWholeFile(file, "old"), "");
    fs::permissions(file, fs::perms(0640));
    fs::create_directories(folder / "inner");
    fs::create_symlink("../file", folder / "inner" / "second");
    fs::create_symlink("inner/second", link);
    fs::create_symlink("made", toNothing);
    fs::create_symlink("circle", folder / "circle");
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    const int reading = open(pipe.c_str(), O_RDONLY | O_NONBLOCK);

    struct Case
    {
        fs::path path;
        bool isWritten;
        fs::path content;                         ///< where it can be read then; empty: not in a file
        fs::file_type type = fs::file_type::none; ///< of the path afterwards
    };
    const Case cases[] = {
        {link, true, file, fs::file_type::symlink},
        {toNothing, true, folder / "made", fs::file_type::symlink},
        {pipe, true, {}, fs::file_type::fifo},
        {"/dev/null", true, {}, fs::file_type::character},
        {folder / "circle", false, {}, fs::file_type::symlink},
        {folder / "inner", false, {}, fs::file_type::directory},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.path);
        EXPECT_EQ(base::WriteWholeFile(c.path, "new").empty(), c.isWritten);
        EXPECT_EQ(fs::symlink_status(c.path).type(), c.type);
        if (!c.content.empty())
        {
            EXPECT_EQ(Content(c.content), "new");
        }
    }
    EXPECT_EQ(fs::status(file).permissions(), fs::perms(0640));
    char got[8] = {};
    EXPECT_EQ(read(reading, got, sizeof got), 3);
    EXPECT_STREQ(got, "new");
    close(reading);

    EXPECT_TRUE(base::IsSpecialFile("/dev/stdout"));
    EXPECT_FALSE(base::IsSpecialFile(link));
    fs::create_hard_link(file, folder / "other");
    EXPECT_TRUE(base::IsSameFile(link, folder / "other"));
    EXPECT_FALSE(base::IsSameFile(link, folder / "made"));
    EXPECT_FALSE(base::IsSameFile(folder / "none", folder / "none"));
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

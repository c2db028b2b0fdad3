#include "hosts/common/Picture.h"

#include <cstdlib>
#include <filesystem>

#include <gtest/gtest.h>
#include <osgDB/ReadFile>

namespace
{

osg::ref_ptr<osg::Image> Plain(int width, int height, unsigned char red, unsigned char green, unsigned char blue)
{
    osg::ref_ptr<osg::Image> picture = new osg::Image;
    picture->allocateImage(width, height, 1, GL_RGB, GL_UNSIGNED_BYTE);
    for (int pixel = 0; pixel < width * height; ++pixel)
    {
        picture->data()[pixel * 3] = red;
        picture->data()[pixel * 3 + 1] = green;
        picture->data()[pixel * 3 + 2] = blue;
    }
    return picture;
}

/// Red, green and blue at a place that is told as in a picture viewer: from the upper left corner.
std::vector<int> At(const osg::Image& picture, int x, int fromTop)
{
    const unsigned char* pixel =
        picture.data(static_cast<unsigned int>(x), static_cast<unsigned int>(picture.t() - 1 - fromTop));
    return {pixel[0], pixel[1], pixel[2]};
}

/// A folder of its own, gone with the test.
class Picture : public testing::Test
{
protected:
    Picture()
    {
        std::string name = (std::filesystem::temp_directory_path() / "panoramic-picture-XXXXXX").string();
        folder = mkdtemp(name.data());
    }
    ~Picture() override { std::filesystem::remove_all(folder); }

    std::filesystem::path folder;
};

TEST_F(Picture, ComesBackFromItsFileUprightAndUnchanged)
{
    const osg::ref_ptr<osg::Image> picture = Plain(5, 3, 10, 20, 30);
    picture->data(4, 2)[0] = 250; // the upper right corner
    ASSERT_EQ("", hosts::WritePicture(*picture, folder / "picture.png"));
    const osg::ref_ptr<osg::Image> read = osgDB::readRefImageFile((folder / "picture.png").string());
    ASSERT_TRUE(read);
    ASSERT_EQ(5, read->s());
    ASSERT_EQ(3, read->t());
    EXPECT_EQ((std::vector<int>{250, 20, 30}), At(*read, 4, 0));
    EXPECT_EQ((std::vector<int>{10, 20, 30}), At(*read, 4, 2));
    EXPECT_EQ((std::vector<int>{10, 20, 30}), At(*read, 0, 0));
}

TEST_F(Picture, ThatCannotBeWrittenTellsPathAndReasonAndLeavesNothing)
{
    const osg::ref_ptr<osg::Image> picture = Plain(5, 3, 10, 20, 30);
    const std::filesystem::path missing = folder / "no such folder" / "picture.png";
    const std::string error = hosts::WritePicture(*picture, missing);
    EXPECT_NE(std::string::npos, error.find(missing.string())) << error;
    EXPECT_NE(std::string::npos, error.find("No such file or directory")) << error;

    std::filesystem::create_directory(folder / "picture.png");
    EXPECT_NE("", hosts::WritePicture(*picture, folder / "picture.png"));
    EXPECT_TRUE(std::filesystem::is_empty(folder / "picture.png"));
    EXPECT_EQ(1, std::distance(std::filesystem::directory_iterator(folder), {})) << "no temporary file is left";
}

TEST_F(Picture, SheetHoldsAllOfThemInRowsFromTheUpperLeft)
{
    std::vector<osg::ref_ptr<osg::Image>> pictures{Plain(80, 40, 255, 0, 0), Plain(80, 40, 0, 255, 0), nullptr,
                                                   Plain(80, 40, 0, 0, 255), Plain(40, 40, 255, 255, 0)};
    const osg::ref_ptr<osg::Image> sheet = hosts::ComposeContactSheet(pictures, 3, 40);
    ASSERT_TRUE(sheet);
    // Gaps of 8 around cells of 40, as high as the highest picture: the square one.
    ASSERT_EQ(3 * 48 + 8, sheet->s());
    ASSERT_EQ(2 * 48 + 8, sheet->t());
    const std::vector<int> gap{40, 40, 40};
    EXPECT_EQ(gap, At(*sheet, 4, 4));
    EXPECT_EQ((std::vector<int>{255, 0, 0}), At(*sheet, 28, 28));
    EXPECT_EQ(gap, At(*sheet, 28, 12)) << "a flat picture stands in the middle of its cell";
    EXPECT_EQ((std::vector<int>{0, 255, 0}), At(*sheet, 76, 28));
    EXPECT_EQ(gap, At(*sheet, 124, 28)) << "the one that isn't there";
    EXPECT_EQ((std::vector<int>{0, 0, 255}), At(*sheet, 28, 76));
    EXPECT_EQ((std::vector<int>{255, 255, 0}), At(*sheet, 57, 57));

    EXPECT_EQ(nullptr, hosts::ComposeContactSheet({}, 3, 40));
    EXPECT_EQ(nullptr, hosts::ComposeContactSheet({nullptr}, 3, 40));
}

TEST_F(Picture, SheetShowsTheMeanOfWhatItMakesSmaller)
{
    const osg::ref_ptr<osg::Image> stripes = Plain(80, 40, 0, 0, 0);
    for (int y = 0; y < 40; ++y)
        for (int x = 0; x < 80; x += 2)
            stripes->data(x, y)[0] = 200;
    const osg::ref_ptr<osg::Image> sheet = hosts::ComposeContactSheet({stripes}, 3, 40);
    ASSERT_TRUE(sheet);
    EXPECT_EQ((std::vector<int>{100, 0, 0}), At(*sheet, 8, 8));
    EXPECT_EQ((std::vector<int>{100, 0, 0}), At(*sheet, 40, 20));
}

} // namespace

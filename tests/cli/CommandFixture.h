#pragma once

#include <map>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <osg/Image>
#include <osg/ref_ptr>

#include "tests/support/TemporaryFolder.h"

/// Runs the command as its user does: the built program, in an empty folder, with settings of its own.
class CommandFixture : public testing::Test
{
protected:
    struct Result
    {
        int status = -1; ///< 128 and the signal's number when it was killed
        std::string out;
        std::string error;
    };

    using Environment = std::map<std::string, std::string>;

    CommandFixture();

    /// Waits for the end. With `interruptAfter` milliseconds above 0 it gets SIGINT then.
    Result Run(const std::vector<std::string>& arguments, const Environment& environment = {},
               int interruptAfter = 0) const;

    /// Colours in the middle of the regions of a picture, 0 to 255; (0, 0) is the lower left corner and (1, 1) the
    /// upper right one.
    struct Colour
    {
        int red, green, blue;
    };
    static osg::ref_ptr<osg::Image> ReadPicture(const std::filesystem::path& file);
    static Colour At(const osg::Image& picture, double x, double y);
    static bool IsRed(const Colour& c) { return c.red > 60 && c.red > 2 * c.green && c.red > 2 * c.blue; }
    static bool IsGreen(const Colour& c) { return c.green > 60 && c.green > 2 * c.red && c.green > 2 * c.blue; }
    static bool IsSky(const Colour& c) { return c.red == 200 && c.green == 230 && c.blue == 255; }

    /// Is there a file in the folder whose name begins like that? Half-written files have other endings.
    bool HasFileLike(const std::string& name) const;

    /// A run of 1 s at 100 Hz: the channel "Car" drives from x = 0 to x = 10 at z = 0.5, "Van" stands at y = 5.
    void WriteRun() const;

    TemporaryFolder folder;
};

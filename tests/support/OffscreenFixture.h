#pragma once

#include <memory>
#include <vector>

#include <gtest/gtest.h>
#include <osg/Image>
#include <osg/ref_ptr>
#include <osg/Vec3d>
#include <osg/Vec4>
#include <osgViewer/View>

#include "hosts/common/EglGraphics.h"
#include "hosts/common/OffscreenViews.h"
#include "render/Viewer.h"
#include "tests/support/FakeHost.h"

/// What every test that draws starts from: a viewer with its shared context over off-screen windows.
///
/// With PANORAMIC_TEST_PICTURES set to a folder, each picture that a test takes is also left there as a PNG file named
/// after the test, to be looked at.
class OffscreenFixture : public testing::Test
{
protected:
    /// Means of a region, each channel 0 to 255.
    struct Colour
    {
        double red = 0.0;
        double green = 0.0;
        double blue = 0.0;
    };

    void SetUp() override;
    void TearDown() override;

    /// A view in the viewer that shows `scene` in a window of its own; the fixture owns both.
    osgViewer::View& AddView(osg::Node* scene, int width, int height);

    /// Puts the camera of `view` at `eye` (scene: metres, z up).
    static void LookAt(osgViewer::View& view, const osg::Vec3d& eye, const osg::Vec3d& centre);

    /// One frame of all views, and what `view` then shows; lowest row first.
    osg::ref_ptr<osg::Image> Draw(osgViewer::View& view);

    /// What `view` shows since the last frame.
    osg::ref_ptr<osg::Image> Read(osgViewer::View& view);

    /// The mean colour of the region between two corners, in fractions of the picture; (0, 0) is the lower left.
    static Colour Mean(const osg::Image& picture, double left, double bottom, double right, double top);

    /// How many pixels differ by more than `tolerance` in a channel; all of them when the sizes differ.
    static int CountDifferent(const osg::Image& a, const osg::Image& b, int tolerance = 0);

    VtTViewerServices services; ///< call `setViewerServices` again after a change
    fake::Clock clock;
    hosts::EglGraphics graphics;
    hosts::OffscreenWindow rootWindow{0, 0};
    std::vector<std::unique_ptr<hosts::OffscreenWindow>> windows;
    std::vector<osg::ref_ptr<osgViewer::View>> views;

private:
    int picturesTaken = 0;
};

#include "tests/support/OffscreenFixture.h"

#include <cmath>
#include <cstdlib>
#include <filesystem>

#include <osg/Camera>

#include "hosts/common/Picture.h"

void OffscreenFixture::SetUp()
{
    services.graphics = &graphics;
    services.clock = &clock;
    setViewerServices(services);
    createViewer();
    createSharedContext(rootWindow);
    ASSERT_TRUE(getSharedContext()) << "drawing needs OpenGL without a display: libegl-mesa0 and libgl1-mesa-dri";
}

void OffscreenFixture::TearDown()
{
    destroyViewer();
    renderingEnabled = true;
    views.clear();
    setViewerServices({});
}

osgViewer::View& OffscreenFixture::AddView(osg::Node* scene, int width, int height)
{
    windows.push_back(std::make_unique<hosts::OffscreenWindow>(width, height));
    views.push_back(createView(*windows.back(), windows.back()->GetClientRectangle()));
    osgViewer::View& view = *views.back();
    view.setSceneData(scene);
    addViewToViewer(&view);
    return view;
}

void OffscreenFixture::LookAt(osgViewer::View& view, const osg::Vec3d& eye, const osg::Vec3d& centre)
{
    view.getCamera()->setViewMatrixAsLookAt(eye, centre, osg::Vec3d(0, 0, 1));
}

osg::ref_ptr<osg::Image> OffscreenFixture::Draw(osgViewer::View& view)
{
    RenderViewerFrame();
    return Read(view);
}

osg::ref_ptr<osg::Image> OffscreenFixture::Read(osgViewer::View& view)
{
    osg::ref_ptr<osg::Image> picture = hosts::ReadPicture(*view.getCamera());
    const char* folder = std::getenv("PANORAMIC_TEST_PICTURES");
    if (picture && folder)
    {
        const testing::TestInfo& test = *testing::UnitTest::GetInstance()->current_test_info();
        const std::string name =
            std::string(test.test_suite_name()) + "." + test.name() + "." + std::to_string(++picturesTaken) + ".png";
        EXPECT_EQ("", hosts::WritePicture(*picture, std::filesystem::path(folder) / name));
    }
    return picture;
}

OffscreenFixture::Colour OffscreenFixture::Mean(const osg::Image& picture, double left, double bottom, double right,
                                                double top)
{
    const auto column = [&](double fraction) { return static_cast<int>(std::lround(fraction * picture.s())); };
    const auto row = [&](double fraction) { return static_cast<int>(std::lround(fraction * picture.t())); };
    Colour sum;
    int count = 0;
    for (int y = row(bottom); y < row(top); ++y)
        for (int x = column(left); x < column(right); ++x, ++count)
        {
            const unsigned char* pixel = picture.data(static_cast<unsigned int>(x), static_cast<unsigned int>(y));
            sum.red += pixel[0];
            sum.green += pixel[1];
            sum.blue += pixel[2];
        }
    EXPECT_GT(count, 0) << "the region holds no pixel";
    return {sum.red / count, sum.green / count, sum.blue / count};
}

int OffscreenFixture::CountDifferent(const osg::Image& a, const osg::Image& b, int tolerance)
{
    if (a.s() != b.s() || a.t() != b.t())
        return a.s() * a.t();

    int different = 0;
    for (int y = 0; y < a.t(); ++y)
        for (int x = 0; x < a.s(); ++x)
        {
            const unsigned char* first = a.data(static_cast<unsigned int>(x), static_cast<unsigned int>(y));
            const unsigned char* second = b.data(static_cast<unsigned int>(x), static_cast<unsigned int>(y));
            for (int channel = 0; channel < 3; ++channel)
                if (std::abs(first[channel] - second[channel]) > tolerance)
                {
                    ++different;
                    break;
                }
        }
    return different;
}

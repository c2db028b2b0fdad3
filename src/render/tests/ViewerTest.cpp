#include <cstdlib>

#include <osgViewer/CompositeViewer>

#include "render/tests/TestScenes.h"
#include "tests/support/OffscreenFixture.h"

namespace
{

using Viewer = OffscreenFixture;

unsigned int FrameNumber()
{
    return getViewer()->getViewerFrameStamp()->getFrameNumber();
}

TEST_F(Viewer, IsMadeOnceAndDoesNothingWithoutBeingMade)
{
    osgViewer::CompositeViewer* first = getViewer();
    EXPECT_TRUE(viewerReady);
    createViewer();
    EXPECT_EQ(first, getViewer());

    osgViewer::View& view = AddView(scenes::Boxes(), 64, 64);
    EXPECT_TRUE(isViewInViewer(&view));
    addViewToViewer(nullptr);
    removeViewFromViewer(nullptr);
    removeViewFromViewer(&view);
    EXPECT_FALSE(isViewInViewer(&view));

    destroyViewer();
    EXPECT_FALSE(viewerReady);
    EXPECT_FALSE(getSharedContext());
    RenderViewerFrame();
    addViewToViewer(&view);
    EXPECT_FALSE(isViewInViewer(&view));
    EXPECT_FALSE(getViewer());
}

TEST_F(Viewer, DestroyedTakesTheSceneOutOfItsViews)
{
    const osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    osgViewer::View& view = AddView(scene, 64, 64);
    RenderViewerFrame();
    destroyViewer();
    EXPECT_EQ(nullptr, view.getSceneData());
    EXPECT_TRUE(view.getCamera()->getGraphicsContext());
}

TEST_F(Viewer, DrawsNothingUntilTheLastSuspensionEnds)
{
    AddView(scenes::Boxes(), 64, 64);
    const auto draws = []
    {
        const unsigned int before = FrameNumber();
        RenderViewerFrame();
        return FrameNumber() > before;
    };
    EXPECT_TRUE(draws());
    {
        const VtCFrameSuspension outer;
        {
            const VtCFrameSuspension inner(VtCFrameSuspension::Extent::pictures);
        }
        EXPECT_FALSE(draws());
        renderingEnabled = true;
        EXPECT_FALSE(renderingEnabled) << "the name doesn't end what others hold";
        EXPECT_FALSE(draws());
        renderingEnabled = false;
        renderingEnabled = false;
    }
    EXPECT_FALSE(draws()) << "nor do others end what the name holds";
    EXPECT_FALSE(isViewerFrameDue());
    renderingEnabled = true;
    EXPECT_TRUE(draws());
    const VtCFrameSuspension steps(VtCFrameSuspension::Extent::steps);
    EXPECT_TRUE(draws());
}

// Angles by hand: 80 degrees across a landscape window make 80/aspect upright.
struct Projection
{
    const char* name;
    int width, height;
    osg::Camera::ProjectionResizePolicy policy;
    double angle;
};

const Projection projections[] = {
    {"portrait", 90, 160, osg::Camera::HORIZONTAL, 40.0},
    {"square", 120, 120, osg::Camera::VERTICAL, 80.0},
    {"landscape", 160, 80, osg::Camera::VERTICAL, 40.0},
    {"one pixel short of square", 119, 120, osg::Camera::HORIZONTAL, 40.0},
};

TEST_F(Viewer, SeesAsWideAsItsWindowAllows)
{
    for (const Projection& projection : projections)
    {
        SCOPED_TRACE(projection.name);
        hosts::OffscreenWindow window(projection.width, projection.height);
        const osg::ref_ptr<osgViewer::View> view = createView(window, window.GetClientRectangle());
        double angle = 0, aspect = 0, nearPlane = 0, farPlane = 0;
        ASSERT_TRUE(view->getCamera()->getProjectionMatrixAsPerspective(angle, aspect, nearPlane, farPlane));
        EXPECT_EQ(projection.policy, view->getCamera()->getProjectionResizePolicy());
        EXPECT_NEAR(projection.angle, angle, 1e-9);
        EXPECT_NEAR(double(projection.width) / projection.height, aspect, 1e-9);
        EXPECT_NEAR(0.015, nearPlane, 1e-6);
        EXPECT_NEAR(10000.0, farPlane, 1.0);
        EXPECT_EQ(projection.width, view->getCamera()->getViewport()->width());
        EXPECT_EQ(GLbitfield(0x4500), view->getCamera()->getClearMask());
    }
}

TEST_F(Viewer, TakesAnEmptyRectangleFromTheWindowOfTheSharedContext)
{
    rootWindow.Resize(200, 100);
    hosts::OffscreenWindow window(50, 50);
    const osg::ref_ptr<osgViewer::View> view = createView(window, {});
    EXPECT_EQ(200, view->getCamera()->getViewport()->width());
    EXPECT_EQ(100, view->getCamera()->getViewport()->height());
}

/// Sets an environment variable for the time of a test.
class Variable
{
public:
    Variable(const char* variable, const char* value) : name(variable) { setenv(name, value, 1); }
    ~Variable() { unsetenv(name); }

private:
    const char* name;
};

TEST_F(Viewer, TellsWhyThereIsNoContext)
{
    hosts::OffscreenWindow window(64, 64);
    {
        const Variable none("PANORAMIC_EGL", "none");
        EXPECT_EQ(nullptr, createViewContext(window));
    }
    EXPECT_NE(std::wstring::npos, graphics.GetLastError().find(L"PANORAMIC_EGL is \"none\"")) << "words for the user";

    window.Resize(1 << 20, 64);
    EXPECT_EQ(nullptr, createViewContext(window));
    EXPECT_NE(std::wstring::npos, graphics.GetLastError().find(L"1048576 x 64 pixels is too large"));
    window.Resize(64, 64);
    EXPECT_NE(nullptr, createViewContext(window));
    EXPECT_EQ(L"", graphics.GetLastError());
}

TEST_F(Viewer, GoesOnAfterAFrameWithoutAnyContext)
{
    services.graphics = nullptr;
    setViewerServices(services);
    osgViewer::View& black = AddView(scenes::Boxes(), 64, 64);
    RenderViewerFrame();
    EXPECT_EQ(nullptr, Read(black));
    EXPECT_EQ(0u, FrameNumber());
    EXPECT_EQ(nullptr, black.getCamera()->getGraphicsContext()) << "no window of the library's own";

    services.graphics = &graphics;
    setViewerServices(services);
    osgViewer::View& view = AddView(scenes::Boxes(), 64, 64);
    LookAt(view, osg::Vec3d(0, -6, 2), osg::Vec3d());
    const osg::ref_ptr<osg::Image> picture = Draw(view);
    ASSERT_TRUE(picture);
    EXPECT_GT(Mean(*picture, 0.45, 0.45, 0.55, 0.55).green, 150);

    view.getCamera()->getGraphicsContext()->close();
    RenderViewerFrame();
    view.getCamera()->setGraphicsContext(createViewContext(*windows.back()).get());
    const osg::ref_ptr<osg::Image> again = Draw(view);
    ASSERT_TRUE(again);
    EXPECT_EQ(0, CountDifferent(*picture, *again));
}

TEST_F(Viewer, RealisesAViewThatReplacesTheOnlyOne)
{
    osgViewer::View& first = AddView(scenes::Boxes(), 64, 64);
    RenderViewerFrame();
    removeViewFromViewer(&first);
    osgViewer::View& second = AddView(scenes::Boxes(), 64, 64);
    LookAt(second, osg::Vec3d(0, -6, 2), osg::Vec3d());
    const osg::ref_ptr<osg::Image> picture = Draw(second);
    ASSERT_TRUE(picture);
    EXPECT_GT(Mean(*picture, 0.45, 0.45, 0.55, 0.55).green, 150);
}

// Which cards want a frame without the scene, and what else it takes.
struct EmptyFrame
{
    const char* name;
    const char* card;
    bool scene, active;
    bool drawn;
};

const EmptyFrame emptyFrames[] = {
    {"a card of the one make", "NVIDIA GeForce RTX 3080/PCIe/SSE2", true, true, true},
    {"a business card of that make", "Quadro NVS 295/PCIe/SSE2", true, true, true},
    {"another make", "llvmpipe (LLVM 15.0.6, 256 bits)", true, true, false},
    {"a card not known yet", "", true, true, false},
    {"no scene", "GeForce 8400", false, true, false},
    {"no active view", "GeForce 8400", true, false, false},
};

/// Tells whether the cycle was suspended when the picture was drawn.
struct Witness : osg::Camera::DrawCallback
{
    void operator()(osg::RenderInfo&) const override
    {
        told = VtCFrameSuspension::AreStepsSuspended() && !renderingEnabled ? "suspended" : "live";
    }
    mutable std::string told;
};

TEST_F(Viewer, DrawsAnEmptyFrameOnlyForCardsThatNeedIt)
{
    const osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    osgViewer::View& view = AddView(scene, 64, 64);
    RenderViewerFrame();
    const osg::ref_ptr<Witness> witness = new Witness;
    view.getCamera()->setFinalDrawCallback(witness);
    for (const EmptyFrame& empty : emptyFrames)
    {
        SCOPED_TRACE(empty.name);
        services.cardRenderer = [&] { return std::string(empty.card); };
        services.hasScene = [&] { return empty.scene; };
        services.activeView = [&] { return empty.active ? &view : nullptr; };
        setViewerServices(services);

        for (const bool suspend : {true, false})
        {
            witness->told.clear();
            clock.sleeps.clear();
            const unsigned int before = FrameNumber();
            renderEmptyFrame(suspend);
            EXPECT_EQ(before + (empty.drawn ? 1 : 0), FrameNumber());
            EXPECT_EQ(!empty.drawn ? "" : suspend ? "suspended" : "live", witness->told);
            EXPECT_EQ(empty.drawn && suspend ? std::vector<std::uint32_t>(2, 100) : std::vector<std::uint32_t>(),
                      clock.sleeps);
            EXPECT_EQ(scene.get(), view.getSceneData());
            EXPECT_TRUE(renderingEnabled);
        }
    }
    const unsigned int before = FrameNumber();
    renderEmptyFrameOfView(nullptr, true);
    EXPECT_EQ(before, FrameNumber());
    services.cardRenderer = [] { return std::string("geforce"); };
    setViewerServices(services);
    renderEmptyFrameOfView(&view, false);
    EXPECT_EQ(before + 1, FrameNumber());
}

} // namespace

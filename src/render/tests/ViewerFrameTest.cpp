#include <osg/NodeCallback>

#include "render/tests/TestScenes.h"
#include "tests/support/OffscreenFixture.h"

namespace
{

/// Three boxes in one view, drawn, with nothing due.
class FrameOnDemand : public OffscreenFixture
{
protected:
    void SetUp() override
    {
        OffscreenFixture::SetUp();
        view = &AddView(scene, 96, 64);
        LookAt(*view, osg::Vec3d(0, -6, 2), osg::Vec3d());
        scene->addChild(mover);
        mover->addChild(scenes::Box(osg::Vec3(0, 0, 1.5F), 0.5F, osg::Vec4(1, 1, 0, 1)));
        picture = Draw(*view);
    }

    osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    osg::ref_ptr<osg::MatrixTransform> mover = new osg::MatrixTransform;
    osgViewer::View* view = nullptr;
    osg::ref_ptr<osg::Image> picture;
};

TEST_F(FrameOnDemand, WhatChangesThePictureMakesAFrameDue)
{
    struct Change
    {
        const char* name;
        std::function<void()> make;
    };
    osg::Camera& camera = *view->getCamera();
    const osg::ref_ptr<osg::Node> more = scenes::Box(osg::Vec3(1, -1, 0), 0.5F, osg::Vec4(1, 0, 1, 1));
    const Change changes[] = {
        {"something moves", [&] { mover->setMatrix(osg::Matrixd::translate(0.3, 0, 0)); }},
        {"something comes", [&] { scene->addChild(more); }},
        {"something goes", [&] { scene->removeChild(more); }},
        {"the camera moves", [&] { LookAt(*view, osg::Vec3d(0, -7, 2), osg::Vec3d()); }},
        {"the angle of view", [&] { camera.setProjectionMatrixAsPerspective(30, 1.5, 0.1, 100); }},
        {"the pane's size", [&] { camera.setViewport(0, 0, 48, 32); }},
        {"the background", [&] { camera.setClearColor(osg::Vec4(1, 1, 1, 1)); }},
        {"another scene", [&] { view->setSceneData(more); }},
        {"the scene before", [&] { view->setSceneData(scene); }},
        {"what is told of",
         [&]
         {
             mover->setNodeMask(0);
             requestViewerRedraw();
         }},
    };
    for (const Change& change : changes)
    {
        SCOPED_TRACE(change.name);
        EXPECT_FALSE(isViewerFrameDue());
        change.make();
        EXPECT_TRUE(isViewerFrameDue());
        const osg::ref_ptr<osg::Image> next = Draw(*view);
        EXPECT_GT(CountDifferent(*picture, *next), 0) << "that was no change of the picture";
        picture = next;
    }
    EXPECT_FALSE(isViewerFrameDue());
}

TEST_F(FrameOnDemand, InputAnimationsAndViewsThatComeAndGoCountToo)
{
    view->getEventQueue()->keyPress('a');
    EXPECT_TRUE(isViewerFrameDue());
    RenderViewerFrame();
    EXPECT_FALSE(isViewerFrameDue());

    osgViewer::View& other = AddView(scene, 32, 32);
    EXPECT_TRUE(isViewerFrameDue());
    RenderViewerFrame();
    other.requestContinuousUpdate(true);
    RenderViewerFrame();
    EXPECT_TRUE(isViewerFrameDue()) << "until it is over";
    removeViewFromViewer(&other);
    EXPECT_TRUE(isViewerFrameDue());
    RenderViewerFrame();
    EXPECT_FALSE(isViewerFrameDue());

    osg::ref_ptr<osg::NodeCallback> weather = new osg::NodeCallback;
    mover->setUpdateCallback(weather);
    RenderViewerFrame();
    EXPECT_TRUE(isViewerFrameDue());
    mover->setUpdateCallback(nullptr);
    RenderViewerFrame();
    EXPECT_FALSE(isViewerFrameDue());

    view->getCamera()->getGraphicsContext()->close();
    EXPECT_TRUE(isViewerFrameDue());
    RenderViewerFrame();
    view->getCamera()->setGraphicsContext(createViewContext(*windows.front()).get());
    EXPECT_TRUE(isViewerFrameDue()) << "a window that is there again";
    EXPECT_EQ(0, CountDifferent(*picture, *Draw(*view)));
}

TEST_F(FrameOnDemand, TheViewerKeepsNoSceneThatNobodyShows)
{
    osg::observer_ptr<osg::Group> watched = scene;
    removeViewFromViewer(view);
    views.clear();
    scene = nullptr;
    EXPECT_FALSE(watched.valid());
}

} // namespace

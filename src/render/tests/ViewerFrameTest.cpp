#include <osgGA/GUIEventHandler>
#include <osgViewer/CompositeViewer>
#include <osgViewer/Renderer>

#include "render/tests/TestScenes.h"
#include "tests/support/HeapCount.h"
#include "tests/support/OffscreenFixture.h"

namespace
{

using ViewerFrame = OffscreenFixture;

/// A crowd in `count` views, each from another place.
class Show
{
public:
    template <class MakeView>
    Show(int count, MakeView makeView) : scene(scenes::Crowd(moving))
    {
        for (int index = 0; index < count; ++index)
        {
            views.push_back(makeView(scene.get()));
            views.back()->getCamera()->setViewMatrixAsLookAt(osg::Vec3d(3.0 * index, -20, 10), osg::Vec3d(),
                                                             osg::Vec3d(0, 0, 1));
        }
    }

    void Move(int step) { scenes::MoveCrowd(moving, step); }

    std::vector<osg::ref_ptr<osg::MatrixTransform>> moving;
    osg::ref_ptr<osg::Group> scene;
    std::vector<osgViewer::View*> views;
};

TEST_F(ViewerFrame, DrawsWhatTheLibrarysOwnViewerDraws)
{
    Show ours(2, [this](osg::Node* scene) { return &AddView(scene, 320, 180); });

    osg::ref_ptr<osgViewer::CompositeViewer> library = new osgViewer::CompositeViewer;
    library->setThreadingModel(osgViewer::ViewerBase::SingleThreaded);
    Show theirs(2,
                [&](osg::Node* scene)
                {
                    windows.push_back(std::make_unique<hosts::OffscreenWindow>(320, 180));
                    views.push_back(createView(*windows.back(), windows.back()->GetClientRectangle()));
                    osg::Camera* camera = views.back()->getCamera();
                    camera->setRenderer(new osgViewer::Renderer(camera));
                    views.back()->setSceneData(scene);
                    library->addView(views.back().get());
                    return views.back().get();
                });

    for (const int step : {0, 1, 2, 20, 40, 41, 200})
    {
        SCOPED_TRACE(step);
        ours.Move(step);
        theirs.Move(step);
        RenderViewerFrame();
        library->frame();
        for (std::size_t index = 0; index < ours.views.size(); ++index)
        {
            const osg::ref_ptr<osg::Image> mine = Read(*ours.views[index]);
            const osg::ref_ptr<osg::Image> stock = Read(*theirs.views[index]);
            ASSERT_TRUE(mine && stock);
            EXPECT_EQ(0, CountDifferent(*mine, *stock));
        }
    }
    while (library->getNumViews() > 0)
        library->removeView(library->getView(0));
}

TEST_F(ViewerFrame, LeavesTheHeapAloneOnceThePictureIsSteady)
{
    if (!heap::CanCount())
        GTEST_SKIP() << "nothing counts under the address sanitizer";
    Show show(4, [this](osg::Node* scene) { return &AddView(scene, 64, 36); });
    // Once around, so that every body has been in and out of sight, and every list has grown as long as it gets.
    int step = 0;
    for (; step < 70; ++step)
    {
        show.Move(step % 63);
        RenderViewerFrame();
    }
    long taken = 0;
    for (; step < 140; ++step)
    {
        show.Move(step % 63);
        heap::Count count;
        RenderViewerFrame();
        taken += count.Stop();
    }
    EXPECT_EQ(0, taken);
}

/// Remembers the frame events it was sent.
class Recorder : public osgGA::GUIEventHandler
{
public:
    bool handle(const osgGA::GUIEventAdapter& event, osgGA::GUIActionAdapter&) override
    {
        if (event.getEventType() == osgGA::GUIEventAdapter::FRAME)
            times.push_back(event.getTime());
        else
            ++others;
        if (keeps)
            kept.push_back(&event);
        return false;
    }

    bool keeps = false;
    int others = 0;
    std::vector<double> times;
    std::vector<osg::ref_ptr<const osgGA::GUIEventAdapter>> kept;
};

TEST_F(ViewerFrame, SendsEachViewOneFrameEventAndItsInput)
{
    const osg::ref_ptr<osg::Group> scene = scenes::Boxes();
    const osg::ref_ptr<Recorder> inScene = new Recorder;
    scene->addEventCallback(inScene);
    std::vector<osg::ref_ptr<Recorder>> recorders;
    for (int index = 0; index < 2; ++index)
    {
        recorders.push_back(new Recorder);
        AddView(scene, 64, 64).addEventHandler(recorders.back());
    }

    RenderViewerFrame();
    RenderViewerFrame();
    for (const osg::ref_ptr<Recorder>& recorder : recorders)
    {
        ASSERT_EQ(2u, recorder->times.size());
        EXPECT_LT(recorder->times[0], recorder->times[1]);
        EXPECT_EQ(getViewer()->getViewerFrameStamp()->getReferenceTime(), recorder->times[1]);
    }
    EXPECT_EQ(4u, inScene->times.size()) << "once for each view that shows it";

    recorders[0]->keeps = true;
    RenderViewerFrame();
    RenderViewerFrame();
    ASSERT_EQ(2u, recorders[0]->kept.size());
    EXPECT_NE(recorders[0]->kept[0], recorders[0]->kept[1]);
    EXPECT_LT(recorders[0]->kept[0]->getTime(), recorders[0]->kept[1]->getTime()) << "an event kept stays as it was";

    views[1]->getEventQueue()->keyPress('a');
    RenderViewerFrame();
    EXPECT_EQ(0, recorders[0]->others);
    EXPECT_EQ(1, recorders[1]->others) << "input comes with the next frame, to its own view";
    EXPECT_EQ(5u, recorders[1]->times.size());
}

} // namespace

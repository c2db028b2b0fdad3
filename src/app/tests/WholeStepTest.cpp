#include "app/tests/AppFixture.h"

#include <osg/Camera>

#include "base/Text.h"
#include "hosts/common/EglGraphics.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/FakeViews.h"
#include "tests/support/HeapCount.h"

namespace
{

/// Where the body is when the observers are told, and when the picture is drawn.
struct Witness : VtISceneObservers, osg::Camera::DrawCallback
{
    explicit Witness(const VtC3DMovableBody& watched) : body(watched) {}

    void UpdateObservers() override { Note("observers"); }
    void operator()(osg::RenderInfo&) const override { Note("picture"); }
    void Note(const char* who) const { log.push_back(std::string(who) + " " + Place()); }
    std::string Place() const { return std::to_string(std::lround(body.GetTransform().getTrans().x())); }

    const VtC3DMovableBody& body;
    mutable std::vector<std::string> log;
};

struct WholeStep : AppFixture
{
    /// A scene with one body that follows the channel "Car".
    VtC3DMovableBody& StartWithBody()
    {
        host.viewWindows = &windows; // only a scene with an active view has its observers moved
        Start();
        document = NewDocument();
        AddPoint({0.0, 1.0, 2.0, 3.0});
        auto* body = new VtC3DMovableBody(*document, *document->GetScene()->GetMovableBodies(0), L"Car", L"\\none.dae",
                                          osg::Matrixd(), true, new osg::Group, {});
        body->ConnectChannel(0, {});
        return *body;
    }

    VtCPanoramicDocument* document = nullptr;
    fake::ViewWindows windows;
};

TEST_F(WholeStep, BodiesMoveBeforeTheObserversAndThePictureComesLast)
{
    hosts::EglGraphics graphics;
    host.graphics = &graphics;
    const VtC3DMovableBody& body = StartWithBody();
    windows.Fire(); // makes the views
    osgViewer::View* view = document->GetChildFrame()->getSplitter().getView(1)->getView();
    ASSERT_NE(getSharedContext(), nullptr) << base::Utf8(graphics.GetLastError());

    osg::ref_ptr<Witness> witness = new Witness(body);
    view->getCamera()->setPreDrawCallback(witness.get());
    document->GetScene()->SetObservers(witness.get());

    app.GetController()->GotoFirst();
    app.GetController()->PlayOnce();
    for (int step = 0; step < 3; ++step)
    {
        host.variables.idle.Raise();
        host.clock.Advance(1.0);
    }
    // Frame n, which comes at n - 1 s, has the car at x = n.
    const std::vector<std::string> expected{"observers 1", "picture 1",   "observers 2",
                                            "picture 2",   "observers 3", "picture 3"};
    EXPECT_EQ(witness->log, expected);

    witness->log.clear();
    host.mainWindow.state = host::windowMinimised;
    host.variables.idle.Raise();
    EXPECT_TRUE(witness->log.empty());
    host.mainWindow.state = host::windowNormal;
    host.variables.idle.Raise();
    EXPECT_EQ(witness->log, (std::vector<std::string>{"observers 4", "picture 4"}))
        << "restored, the data are where the clock is";

    document->GetScene()->SetObservers(nullptr);
    view->getCamera()->setPreDrawCallback(nullptr);
    Stop();
}

TEST_F(WholeStep, OnlineAFailingSourceIsTriedAgainAfterFiveSeconds)
{
    const VtC3DMovableBody& body = StartWithBody();
    auto& point = static_cast<simtest::Point&>(*app.GetController()->GetRouter().GetActivePoint(0));
    app.StartSimulation();
    ASSERT_TRUE(app.IsRunning());
    host.variables.idle.Raise();
    EXPECT_NEAR(body.GetLastTransformMatrix().getTrans().x(), 4.0, 1e-6) << "the newest frame";

    point.streams = false;
    host.variables.idle.Raise(); // fails
    host.clock.Advance(6.0);
    host.variables.idle.Raise(); // the retry fails too
    point.streams = true;
    point.AppendAt(4.0);
    host.clock.Advance(4.0);
    host.variables.idle.Raise();
    EXPECT_NEAR(body.GetLastTransformMatrix().getTrans().x(), 4.0, 1e-6);
    host.clock.Advance(1.1);
    host.variables.idle.Raise();
    EXPECT_NEAR(body.GetLastTransformMatrix().getTrans().x(), 5.0, 1e-6);
    app.StopSimulation();
    Stop();
}

TEST_F(WholeStep, ASteadyPassAllocatesNothing)
{
    StartWithBody();
    renderingEnabled = false; // what the scene graph library allocates in its frame is not measured here
    app.GetController()->GotoFirst();
    app.GetController()->PlayLoop();
    const auto passes = [&](int count)
    {
        for (int i = 0; i < count; ++i)
        {
            host.clock.Advance(0.016);
            app.IdleStep();
        }
    };
    passes(20);
    heap::Count count;
    passes(500);
    EXPECT_EQ(count.Stop(), 0);
    renderingEnabled = true;
    app.GetController()->StopPlay();
    Stop();
}

} // namespace

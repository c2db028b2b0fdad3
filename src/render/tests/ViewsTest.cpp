#include <cmath>

#include <gtest/gtest.h>

#include "hosts/common/EglGraphics.h"
#include "hosts/common/OffscreenViews.h"
#include "hosts/common/Picture.h"
#include "interaction/InteractionServices.h"
#include "interaction/MouseInput.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/ViewCommandsHandler.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/FakeScene.h"
#include "tests/support/FakeViews.h"

namespace
{

// Four panes of a scene over off-screen surfaces, as the application has them.
class Views : public testing::Test, public VtIInteractionServices
{
protected:
    Views()
    {
        RegisterInteractionAttributes();
        RegisterViewAttributes();
        VtTViewerServices services;
        services.graphics = &graphics;
        services.clock = &clock;
        services.hasScene = [] { return true; };
        setViewerServices(services);
        document.texts.known[6221] = L"free|fixed|Fixed_to_Object|heading|smooth|look at|position|along x|along y";
        scene = std::make_unique<VtCScene3D>(document);
        observers = new VtC3DObservers(document, *this, clock, {});
        scene->SetObservers(observers);
        observers->CreateFreeObservers();
        Open();
    }

    ~Views() override
    {
        frame.reset();
        destroyViewer();
        scene->SetObservers(nullptr);
        observers->Release();
        scene.reset();
        setViewerServices({});
    }

    void Open()
    {
        frame = std::make_unique<VtCChildFrame>(
            VtTChildFrameServices{document, *observers, *this, mouse, windows, selection, clock});
    }

    void CreateViews()
    {
        frame->startViewCreation();
        windows.Fire();
    }

    VtCPanoramicView& Pane(int number) const { return *frame->getSplitter().getView(number); }

    std::vector<int> PanesInViewer() const
    {
        std::vector<int> panes;
        for (int pane = 1; pane <= 4; ++pane)
            if (Pane(pane).isInViewer())
                panes.push_back(pane);
        return panes;
    }

    // Eye of a pane's camera, and where it looks.
    static osg::Vec3d Eye(const VtCPanoramicView& pane)
    {
        return osg::Matrixd::inverse(pane.getView()->getCameraManipulator()->getInverseMatrix()).getTrans();
    }

    // From (0, 0, 2) along y.
    static void LookNorth(const VtCPanoramicView& pane)
    {
        pane.getObserver()->StoreFreeView(osg::Vec3f(0, 0, 2), osg::Quat(osg::PI_2, osg::Vec3d(1, 0, 0)));
        pane.getObserver()->PushViewMatrix();
        RenderViewerFrame();
    }

    std::uint32_t GetMouseSensitivity() const override { return 5; }
    bool IsActiveView(const osgViewer::View* view) const override { return frame && frame->IsActiveView(view); }
    const VtC3DObserver* GetActiveObserver() const override { return frame ? frame->GetActiveObserver() : nullptr; }
    void SetHeadLightPosition(const osg::Vec3f&) override {}
    void ReplaceObserverInViews(const VtC3DObserver& gone, VtC3DObserver& substitute) override
    {
        frame->assignObserver(gone, substitute);
    }

    fake::SceneDocument document;
    fake::Clock clock;
    fake::ViewWindows windows;
    fake::Selection selection;
    hosts::EglGraphics graphics;
    VtCMouseInputManager mouse;
    std::unique_ptr<VtCScene3D> scene;
    VtC3DObservers* observers = nullptr;
    std::unique_ptr<VtCChildFrame> frame;
};

} // namespace

TEST_F(Views, AreMadeByTheTimerAndNotDrawnBefore)
{
    EXPECT_FALSE(renderingEnabled);
    EXPECT_EQ(clock.sleeps, (std::vector<std::uint32_t>{100}));
    EXPECT_EQ(Pane(1).getView(), nullptr);
    EXPECT_EQ(Pane(1).getObserver(), observers->GetFree1()) << "pane 1 takes that of pane 4";
    EXPECT_EQ(Pane(3).getObserver(), observers->GetFree2());
    EXPECT_EQ(frame->GetActiveView(), &Pane(1));

    frame->startViewCreation();
    EXPECT_EQ(windows.periods.at(1), 250u);
    windows.Fire();
    EXPECT_TRUE(renderingEnabled);
    EXPECT_TRUE(windows.ticks.empty()) << "the timer fires once";
    EXPECT_EQ(PanesInViewer(), (std::vector<int>{1, 2, 3, 4}));
    EXPECT_EQ(Pane(1).getObserver(), observers->GetFree1()) << "the records say who looks through what";
    EXPECT_EQ(Pane(2).getView()->getSceneData(), scene->GetRootNode());
}

TEST_F(Views, LayoutsShareTheFrame)
{
    CreateViews();
    struct Case
    {
        std::uint32_t command;
        int active;
        std::vector<int> shown;
        int width, height; ///< of the first pane shown, in a frame of 804 x 604 with a gap of 4
        int activeAfter;
    };
    const Case cases[] = {
        {commandTwoColumns, 2, {1, 2}, 402, 604, 2},      {commandTwoColumns, 3, {1, 2}, 402, 604, 1},
        {commandTwoRows, 3, {1, 3}, 804, 302, 3},         {commandTwoRows, 4, {1, 3}, 804, 302, 1},
        {commandFourViews, 4, {1, 2, 3, 4}, 402, 302, 4}, {commandSingleView, 3, {3}, 804, 604, 3},
        {commandSingleView, 2, {2}, 804, 604, 2},
    };
    VtCVisualizationViewCommandsHandler commands(*frame);
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.command);
        frame->activateView(Pane(c.active));
        EXPECT_TRUE(commands.Execute(c.command));
        EXPECT_EQ(PanesInViewer(), c.shown);
        const host::Rectangle size = Pane(c.shown.front()).getWindow().GetClientRectangle();
        EXPECT_EQ(size.width, c.width);
        EXPECT_EQ(size.height, c.height);
        EXPECT_EQ(frame->GetActiveView(), &Pane(c.activeAfter));
    }
}

TEST_F(Views, SplitterPositionsAtTheEdgeLeaveOnePane)
{
    CreateViews();
    struct Case
    {
        double x, y;
        std::vector<int> shown;
        int layout;
    };
    const Case cases[] = {
        {0.5, 0.5, {1, 2, 3, 4}, 3}, {1.0, 0.0, {3}, 0},          {1.0, 1.0, {1}, 0},    {1.0, 0.4, {1, 3}, 2},
        {0.0, 0.0, {4}, 0},          {0.0, 1.0, {2}, 0},          {0.0, 0.4, {2, 4}, 2}, {0.3, 1.0, {1, 2}, 1},
        {0.3, 0.0, {3, 4}, 1},       {0.3, 0.6, {1, 2, 3, 4}, 3},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(std::to_string(c.x) + ", " + std::to_string(c.y));
        frame->getSplitter().setSplitterPosition(c.x, c.y);
        EXPECT_EQ(PanesInViewer(), c.shown);
        EXPECT_EQ(frame->getSplitter().getLayout(), c.layout);
    }
    EXPECT_FALSE(frame->getSplitter().getView(0));
    EXPECT_FALSE(frame->getSplitter().getView(5));

    // Bars move where the layout has them.
    VtCSplitterEx& splitter = frame->getSplitter();
    splitter.setLayout(layoutTwoColumns);
    splitter.OnRowBarMoved(300);
    EXPECT_EQ(PanesInViewer(), (std::vector<int>{1, 2}));
    splitter.OnColumnBarMoved(300);
    EXPECT_EQ(Pane(1).getWindow().GetClientRectangle().width, 300);
    splitter.OnColumnBarMoved(60);
    EXPECT_EQ(PanesInViewer(), (std::vector<int>{2})) << "too narrow to be seen";
}

TEST_F(Views, KeepTheirRatiosWhenTheFrameGrowsAndShrinks)
{
    CreateViews();
    VtCSplitterEx& splitter = frame->getSplitter();
    splitter.setSplitterPosition(0.25, 0.5);
    const std::array<double, 2> before = splitter.getFirstPaneRatios();
    EXPECT_NEAR(before[0], 0.25, 0.002);
    for (const int width : {1203, 997, 1501, 804})
    {
        windows.splitter.width = width;
        splitter.OnSize();
    }
    EXPECT_EQ(splitter.getFirstPaneRatios(), before) << "rounding doesn't creep in";
    EXPECT_NEAR(Pane(1).getWindow().GetClientRectangle().width, 201, 1);
    const auto* stored = splitter.getWindowLayout()->Find<std::vector<float>>(L"splitter_position");
    ASSERT_TRUE(stored);
    EXPECT_NEAR((*stored)[0], before[0], 1e-6);

    osg::GraphicsContext* context = Pane(1).getView()->getCamera()->getGraphicsContext();
    windows.splitter.width = 0;
    splitter.OnSize();
    EXPECT_TRUE(PanesInViewer().empty());
    EXPECT_EQ(Pane(1).getView()->getCamera()->getViewport()->width(), 0);
    windows.splitter.width = 804;
    splitter.OnSize();
    EXPECT_EQ(PanesInViewer(), (std::vector<int>{1, 2, 3, 4}));
    EXPECT_EQ(Pane(1).getView()->getCamera()->getGraphicsContext(), context) << "the context is the old one";
    EXPECT_TRUE(context->valid()) << "and can be drawn to";
}

TEST_F(Views, ProjectTheirAngleAcrossOrUpright)
{
    CreateViews();
    const auto fieldOfView = [this]
    {
        double angle = 0, aspect = 0, zNear = 0, zFar = 0;
        Pane(1).getView()->getCamera()->getProjectionMatrixAsPerspective(angle, aspect, zNear, zFar);
        return angle;
    };
    Pane(1).resize({0, 0, 200, 400});
    EXPECT_NEAR(fieldOfView(), 40, 1e-3);
    Pane(1).resize({0, 0, 400, 200});
    EXPECT_NEAR(fieldOfView(), 40, 1e-3);
    Pane(1).resize({0, 0, 300, 300});
    EXPECT_NEAR(fieldOfView(), 80, 1e-3);

    document.modified = false;
    Pane(1).setViewAngle(40);
    EXPECT_FALSE(document.modified) << "the present value changes nothing";
    Pane(1).getSceneObject()->Write(L"view_angle", 30.0F);
    EXPECT_TRUE(document.modified);
    const host::Rectangle pane = Pane(1).getWindow().GetClientRectangle();
    EXPECT_NEAR(fieldOfView(), 60.0 * pane.height / pane.width, 1e-3) << "a change of the record reaches the camera";
}

TEST_F(Views, TwoViewsOfOneObserverLetGoOneByOne)
{
    CreateViews();
    VtC3DObserver& shared = observers->CreateObserver(L"Shared", true);
    ASSERT_TRUE(Pane(1).assignObserverByName(L"SHARED"));
    ASSERT_TRUE(Pane(2).assignObserverByName(L"Shared"));
    EXPECT_FALSE(Pane(2).assignObserverByName(L"nobody"));
    EXPECT_EQ(frame->countViewsOfObserver(shared), 2);
    Pane(1).assignObserver(observers->GetFree1());
    EXPECT_TRUE(shared.IsAssigned());
    EXPECT_EQ(shared.GetCameras(), (std::vector<osg::Camera*>{Pane(2).getView()->getCamera()}));
    Pane(2).assignObserver(observers->GetFree1());
    EXPECT_FALSE(shared.IsAssigned());

    Pane(1).assignObserverByName(L"Shared");
    observers->RemoveNonFreeObservers();
    EXPECT_EQ(Pane(1).getObserver(), observers->GetFree1()) << "a view of a removed observer";
}

// The whole way of the mouse: window, input, queue, manipulator, observer, its record and its other views.
TEST_F(Views, TheMouseDrivesAFreeObserver)
{
    CreateViews();
    VtCPanoramicView& pane = Pane(4);
    VtC3DObserver& observer = *pane.getObserver();
    LookNorth(pane);
    host::WindowEvents& window = *pane.getWindow().GetEvents();
    window.OnLeftButtonDown(100, 250);
    EXPECT_EQ(frame->GetActiveView(), &pane) << "a click activates";
    EXPECT_EQ(mouse.getCurrentInput(), pane.getMouseInput());
    RenderViewerFrame();
    window.OnMouseMove(100, 150); // 100 pixels up
    RenderViewerFrame();
    const double afterDrag = Eye(pane).y();
    RenderViewerFrame();
    RenderViewerFrame();
    EXPECT_NEAR(Eye(pane).y() - afterDrag, 0.5, 1e-5) << "0.25 m in each frame while it is held";
    EXPECT_NEAR(Eye(Pane(1)).y(), Eye(pane).y(), 1e-9) << "pane 1 looks through the same observer";

    window.OnMouseLeave();
    RenderViewerFrame();
    const double released = Eye(pane).y();
    RenderViewerFrame();
    EXPECT_EQ(Eye(pane).y(), released) << "leaving the pane ends the drag";
    EXPECT_NEAR((*observer.GetAttributeObject()->Find<VtTFloatTupel3>(L"position"))[1], released, 1e-4);
}

TEST_F(Views, ADoubleClickSelectsWhatIsSeen)
{
    document.models.models[L"\\cube.dae"] = fake::MakeModel(fake::MakeCube("cube").get());
    auto& body = *new VtC3DMovableBody(document, *scene->GetMovableBodies(0), L"Cube", L"\\cube.dae", osg::Matrixd(),
                                       true, nullptr, {});
    body.SetLastTransformMatrix(osg::Matrixd::translate(0, 5, 2));
    CreateViews();
    VtCPanoramicView& pane = Pane(1);
    LookNorth(pane);
    const host::Rectangle size = pane.getWindow().GetClientRectangle();
    pane.getWindow().GetEvents()->OnLeftDoubleClick(size.width / 2, size.height / 2);
    EXPECT_EQ(selection.selected, (std::vector<std::wstring>{body.GetInternalId()}));
    EXPECT_EQ(PanesInViewer().size(), 4u);
    pane.getWindow().GetEvents()->OnLeftDoubleClick(5, 5);
    EXPECT_EQ(PanesInViewer(), (std::vector<int>{1})) << "a click on nothing enlarges the pane";
}

// Windows beside the panes: their contexts share with the root and leave those of the panes good.
TEST_F(Views, InWindowsOfEveryKindShareTheRoot)
{
    CreateViews();
    hosts::OffscreenViews opener(clock);
    for (const host::WindowKind kind : {host::WindowKind::fullscreen, host::WindowKind::editorView})
    {
        SCOPED_TRACE(static_cast<int>(kind));
        const host::OpenedWindow opened = opener.OpenWindow({.kind = kind, .width = 160, .height = 100});
        ASSERT_TRUE(opened.window);
        EXPECT_EQ(opened.window->GetKind(), kind);
        const osg::ref_ptr<osgViewer::View> view = createView(*opened.window, opened.window->GetClientRectangle());
        ASSERT_TRUE(view->getCamera()->getGraphicsContext());
        EXPECT_EQ(view->getCamera()->getGraphicsContext()->getState()->getContextID(),
                  getSharedContext()->getState()->getContextID());
        view->setSceneData(scene->GetRootNode());
        view->getCamera()->setClearColor({0, 1, 0, 1});
        addViewToViewer(view.get());
        RenderViewerFrame();
        const osg::ref_ptr<osg::Image> picture = hosts::ReadPicture(*view->getCamera());
        ASSERT_TRUE(picture);
        EXPECT_EQ(picture->s(), kind == host::WindowKind::editorView ? 160 : 1280) << "the tool's window, the screen";
        EXPECT_EQ(picture->getColor(5, 5), osg::Vec4(0, 1, 0, 1));

        EXPECT_FALSE(frame->IsActiveView(view.get()));
        view->setCameraManipulator(Pane(1).getView()->getCameraManipulator(), false);
        EXPECT_TRUE(frame->IsActiveView(view.get())) << "what drives the active pane drives it";
        view->setCameraManipulator(nullptr);
        removeViewFromViewer(view.get());
    }
    EXPECT_EQ(PanesInViewer().size(), 4u);
    EXPECT_TRUE(Pane(1).getView()->getCamera()->getGraphicsContext()->valid());
    const host::OpenedWindow refused = opener.OpenWindow({.kind = host::WindowKind::pane});
    EXPECT_TRUE(!refused.window && !refused.refusal.empty());
}

// A view that is no pane can have the focus, and hands it back when it goes.
TEST_F(Views, TheActiveOneMayBeAnyView)
{
    CreateViews();
    {
        VtCBase3DView other(*frame);
        other.attachView(new osgViewer::View);
        other.assignObserver(observers->GetFree2());
        frame->activateView(other);
        EXPECT_TRUE(frame->IsActiveView(other.getView()));
        EXPECT_FALSE(frame->IsActiveView(Pane(1).getView()));
        EXPECT_EQ(frame->GetActiveObserver(), observers->GetFree2());
        EXPECT_EQ(frame->GetActivePane(), nullptr);
        frame->ApplyLayout(layoutSingle);
        EXPECT_EQ(PanesInViewer().size(), 4u) << "it fills no frame";
        EXPECT_EQ(mouse.getCurrentInput(), Pane(1).getMouseInput()) << "it has no input of its own";
    }
    EXPECT_EQ(frame->GetActivePane(), &Pane(1));
}

// A row whose state and deed disagree would show the check on another entry, or on none.
TEST_F(Views, CommandsCheckWhatTheyHaveSet)
{
    CreateViews();
    VtCVisualizationViewCommandsHandler commands(*frame);
    EXPECT_TRUE(commands.GetState(commandMixed)->checked);
    for (const auto& group :
         {std::vector<std::uint32_t>{commandGouraud, commandTextured, commandFlat, commandWireFrame, commandMixed},
          std::vector<std::uint32_t>{commandSingleView, commandTwoColumns, commandTwoRows, commandFourViews}})
        for (const std::uint32_t chosen : group)
        {
            EXPECT_TRUE(commands.Execute(chosen));
            for (const std::uint32_t one : group)
                EXPECT_EQ(commands.GetState(one)->checked, one == chosen) << one << " after " << chosen;
        }
    EXPECT_EQ(scene->GetGlobalRenderMode(), VtERenderMode::Mixed);
    EXPECT_EQ(frame->getSplitter().getLayout(), layoutFour);
    EXPECT_FALSE(commands.GetState(commandFileSave)->enabled);
    EXPECT_FALSE(commands.GetState(12345));
    EXPECT_FALSE(commands.Execute(12345));
}

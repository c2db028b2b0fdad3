#include <cmath>

#include "interaction/MouseInput.h"
#include "interaction/tests/InteractionFixture.h"

namespace
{

using Event = osgGA::GUIEventAdapter;

// What the manipulator asks of its view.
class Actions : public osgGA::GUIActionAdapter
{
public:
    void requestRedraw() override { ++redraws; }
    void requestContinuousUpdate(bool needed) override { continuous = needed; }
    void requestWarpPointer(float, float) override {}

    int redraws = 0;
    bool continuous = false;
};

class Manipulator : public InteractionFixture
{
protected:
    void Use(VtC3DObserver& observer)
    {
        View& made = Look(observer);
        manipulator = made.manipulator.get();
        interaction.activeView = made.view.get();
    }

    bool Send(Event::EventType type, float x = 0, float y = 0, int key = 0, int button = Event::LEFT_MOUSE_BUTTON)
    {
        osg::ref_ptr<Event> event = new Event;
        event->setEventType(type);
        event->setTime(time += 0.02);
        event->setX(x);
        event->setY(y);
        event->setButton(button);
        event->setKey(key);
        return manipulator->handle(*event, actions);
    }

    void Frames(int count)
    {
        for (int i = 0; i < count; ++i)
            Send(Event::FRAME);
    }

    osg::Vec3d Eye() const { return manipulator->getMatrix().getTrans(); }
    osg::Vec3d Axis(int row) const
    {
        const osg::Matrixd m = manipulator->getMatrix();
        return {m(row, 0), m(row, 1), m(row, 2)};
    }

    VtCOsgCameramanipulator* manipulator = nullptr;
    Actions actions;
    double time = 0;
};

void ExpectNear(const osg::Vec3d& found, const osg::Vec3d& expected, const char* what)
{
    EXPECT_LT((found - expected).length(), 1e-5)
        << what << ": (" << found.x() << ", " << found.y() << ", " << found.z() << ")";
}

// Placed so that the camera looks along +y with z up: its -z axis is +y, its x axis +x.
const osg::Matrixd facingNorth(1, 0, 0, 0, 0, 0, 1, 0, 0, -1, 0, 0, 10, 20, 2, 1);

} // namespace

// Displacement in pixels from the press, held for one frame after the drag, at the default sensitivity: 100 pixels
// drive 0.25 m and turn 0.025 rad a frame. The drag itself counts as one frame's motion too.
TEST_F(Manipulator, DrivesAFreeObserver)
{
    struct Drag
    {
        const char* name;
        int key;
        float dx, dy;
        osg::Vec3d moved;
        double turned; ///< to the right, radians, about the vertical
    };
    const int shift = VtCOsgCameramanipulator::keyShiftRight;
    const Drag drags[] = {
        {"up drives forward", 0, 0, 100, {0, 0.5, 0}, 0},  {"down drives back", 0, 0, -40, {0, -0.2, 0}, 0},
        {"right turns right", 0, 100, 0, {0, 0, 0}, 0.05}, {"shift pans sideways", shift, 100, 0, {0.5, 0, 0}, 0},
        {"shift pans up", shift, 0, 100, {0, 0, 0.5}, 0},
    };
    for (const Drag& drag : drags)
    {
        SCOPED_TRACE(drag.name);
        Use(*observers->GetFree1());
        manipulator->setByMatrix(facingNorth);
        if (drag.key)
        {
            EXPECT_TRUE(Send(Event::KEYDOWN, 0, 0, drag.key));
        }
        EXPECT_TRUE(Send(Event::PUSH, 300, 200));
        EXPECT_TRUE(actions.continuous);
        EXPECT_TRUE(Send(Event::DRAG, 300 + drag.dx, 200 + drag.dy));
        Frames(1);
        ExpectNear(Eye(), osg::Vec3d(10, 20, 2) + drag.moved, "eye");
        ExpectNear(-Axis(2), osg::Vec3d(std::sin(drag.turned), std::cos(drag.turned), 0), "look");
        Frames(3);
        EXPECT_NEAR((Eye() - osg::Vec3d(10, 20, 2)).length(), 2.5 * drag.moved.length(), 1e-5) << "held, it goes on";
        EXPECT_TRUE(Send(Event::RELEASE));
        EXPECT_FALSE(actions.continuous);
        const osg::Vec3d there = Eye();
        Frames(3);
        ExpectNear(Eye(), there, "released, it stands");
        ExpectNear(observers->GetFree1()->GetPosition(), there, "the observer takes it over");
        const auto* written = observers->GetFree1()->GetAttributeObject()->Find<VtTFloatTupel3>(L"position");
        EXPECT_NEAR((*written)[1], there.y(), 1e-5);
    }
}

TEST_F(Manipulator, TabRollsAndPitches)
{
    Use(*observers->GetFree1());
    manipulator->setByMatrix(facingNorth);
    Send(Event::KEYDOWN, 0, 0, VtCOsgCameramanipulator::keyShiftLeft);
    Send(Event::KEYDOWN, 0, 0, VtCOsgCameramanipulator::keyTab);
    Send(Event::KEYUP, 0, 0, VtCOsgCameramanipulator::keyShiftLeft);
    Send(Event::PUSH, 0, 0);
    Send(Event::DRAG, 100, 0);
    // A roll by -0.025 about the camera's z axis, which points south: the camera's x axis dips by as much.
    ExpectNear(Eye(), osg::Vec3d(10, 20, 2), "rolling moves nothing");
    ExpectNear(-Axis(2), osg::Vec3d(0, 1, 0), "looks where it did");
    EXPECT_NEAR(std::abs(Axis(0).z()), std::sin(0.025), 1e-6);
}

TEST_F(Manipulator, OnlyTheActiveViewMovesOnAFrame)
{
    Use(*observers->GetFree1());
    manipulator->setByMatrix(facingNorth);
    Send(Event::PUSH, 0, 0);
    Send(Event::DRAG, 0, 100);
    const osg::Vec3d there = Eye();
    interaction.activeView = nullptr;
    Frames(5);
    ExpectNear(Eye(), there, "another view is active");
}

TEST_F(Manipulator, AnOffsetOnAMovingBodySnapsBack)
{
    Use(Rider(followRigid));
    scene->UpdateFrame();
    const osg::Matrixd before = manipulator->getMatrix();
    EXPECT_TRUE(Send(Event::PUSH, 0, 0));
    Send(Event::DRAG, 0, 100);
    // 5 * 0.005 * 0.02 = 0.0005 for turning, * 0.2 = 0.0001 for moving, * 0.1 for every translation: 100 pixels give 1
    // mm.
    const osg::Vec3d moved = Eye() - before.getTrans();
    EXPECT_NEAR(moved.length(), 0.001, 1e-6);
    EXPECT_NEAR(moved * (-osg::Vec3d(before(2, 0), before(2, 1), before(2, 2))), 0.001, 1e-6) << "forward";
    Send(Event::DRAG, 0, 60); // turned round: -40 from the last event, what had piled up is forgotten
    EXPECT_NEAR((Eye() - before.getTrans()).length(), 0.001 - 0.0004, 1e-6);
    Frames(5);
    EXPECT_NEAR((Eye() - before.getTrans()).length(), 0.0006, 1e-6) << "frames move a free observer only";
    Send(Event::RELEASE);
    for (int k = 0; k < 16; ++k)
        EXPECT_NEAR(manipulator->getMatrix().ptr()[k], before.ptr()[k], 1e-9);
}

TEST_F(Manipulator, LeavesAloneWhatItShould)
{
    Use(*observers->GetFree1());
    manipulator->setByMatrix(facingNorth);
    EXPECT_FALSE(Send(Event::PUSH, 0, 0, 0, Event::RIGHT_MOUSE_BUTTON));
    Send(Event::DRAG, 0, 100, 0, Event::RIGHT_MOUSE_BUTTON);
    ExpectNear(Eye(), osg::Vec3d(10, 20, 2), "the right button drives nothing");
    EXPECT_FALSE(Send(Event::KEYDOWN, 0, 0, 'a'));
    manipulator->home(0.0);
    ExpectNear(Eye(), osg::Vec3d(10, 20, 2), "there is no home");

    interaction.sensitivity = 0;
    Send(Event::PUSH, 0, 0);
    Send(Event::DRAG, 300, 300);
    Frames(3);
    ExpectNear(Eye(), osg::Vec3d(10, 20, 2), "a sensitivity of 0 holds still");
    ExpectNear(-Axis(2), osg::Vec3d(0, 1, 0), "and straight");
}

TEST_F(Manipulator, AClickWithoutMotionMovesNothing)
{
    Use(*observers->GetFree1());
    manipulator->setByMatrix(facingNorth);
    const osg::Matrixd before = manipulator->getMatrix();
    document.SetModified(false);
    Send(Event::PUSH, 5, 5);
    Send(Event::RELEASE);
    Send(Event::RELEASE); // as when the pointer leaves the pane
    for (int k = 0; k < 16; ++k)
        EXPECT_NEAR(manipulator->getMatrix().ptr()[k], before.ptr()[k], 1e-6);
    EXPECT_FALSE(document.modified) << "nothing to be saved";
}

TEST_F(Manipulator, OtherViewsOfTheObserverMoveAlong)
{
    Use(*observers->GetFree1());
    VtCOsgCameramanipulator* first = manipulator;
    VtCOsgCameramanipulator* second = Look(*observers->GetFree1()).manipulator.get();
    first->setByMatrix(facingNorth);
    Send(Event::PUSH, 0, 0);
    Send(Event::DRAG, 30, 100);
    for (int k = 0; k < 16; ++k)
        EXPECT_NEAR(second->getMatrix().ptr()[k], first->getMatrix().ptr()[k], 1e-9);
}

TEST_F(Manipulator, StraightenLevelsAndIsStored)
{
    VtC3DObserver& observer = *observers->GetFree1();
    Use(observer);
    const osg::Matrixd rolled = osg::Matrixd::rotate(0.4, osg::Vec3d(0, 0, 1)) * facingNorth;
    manipulator->setByMatrix(rolled);
    manipulator->straighten();
    ExpectNear(-Axis(2), osg::Vec3d(0, 1, 0), "looks where it did");
    ExpectNear(Axis(1), osg::Vec3d(0, 0, 1), "up is up");
    const osg::Matrixd shown = observer.GetViewMatrix();
    observers->GetFree2()->ApplyAttributes(*observer.GetAttributeObject());
    for (int k = 0; k < 16; ++k)
        EXPECT_NEAR(observers->GetFree2()->GetViewMatrix().ptr()[k], shown.ptr()[k], 1e-4) << "reads back";
}

TEST_F(Manipulator, FramesANode)
{
    Use(*observers->GetFree1());
    manipulator->setByMatrix(facingNorth);
    osg::ref_ptr<osg::Group> root = new osg::Group;
    osg::ref_ptr<osg::MatrixTransform> node = new osg::MatrixTransform(osg::Matrixd::translate(100, 50, 4));
    root->addChild(node);
    node->addChild(fake::MakeCube("cube"));
    const double r = node->getBound().radius();
    frameNode(views.front().view.get(), node.get());
    ExpectNear(Eye(), osg::Vec3d(100, 50 - 2 * r, 4 + r / 2), "eye");
    ExpectNear(-Axis(2), osg::Vec3d(0, 1, 0), "the direction stays");

    osg::ref_ptr<osg::Group> loose = new osg::Group;
    frameNode(views.front().view.get(), loose.get());
    frameNode(nullptr, node.get());
    ExpectNear(Eye(), osg::Vec3d(100, 50 - 2 * r, 4 + r / 2), "nothing for a node in no graph");
}

TEST(MouseInput, TellsTheOldOneBeforeTheNewOne)
{
    static std::string calls;
    struct Input : VtCBaseMouseInput
    {
        explicit Input(char letter) : name(letter) {}
        void activate() override { calls += {'+', name}; }
        void deactivate() override { calls += {'-', name}; }
        char name;
    };
    calls.clear();
    Input a('a');
    Input b('b');
    VtCMouseInputManager manager;
    manager.setActiveInput(&a);
    manager.setActiveInput(&a);
    manager.setActiveInput(nullptr);
    manager.setActiveInput(&b);
    manager.setActiveInput(&a);
    EXPECT_EQ(calls, "+a-a+b-b+a");
    EXPECT_EQ(manager.getCurrentInput(), &a);
    EXPECT_EQ(manager.getPreviousInput(), &b);
}

#include <functional>
#include <sstream>

#include <osg/Geometry>
#include <osg/ProxyNode>

#include "interaction/MouseInput.h"
#include "interaction/Pick.h"
#include "interaction/tests/InteractionFixture.h"
#include "scene/StaticBody.h"

namespace
{

using Event = osgGA::GUIEventAdapter;

// A view of 200 x 100 pixels with its input; what reaches its queue is told in words.
class Input : public InteractionFixture, public VtIViewInputOwner
{
protected:
    Input()
    {
        view->getCamera()->setViewport(0, 0, 200, 100);
        input.Attach(view.get());
    }

    bool TakesInput() const override { return takes; }
    void OnPress() override { told += "press; "; }
    bool OnPointer() override { return pointer; }
    void OnDoubleClick(int x, int y) override
    {
        told += "double " + std::to_string(x) + " " + std::to_string(y) + "; ";
    }

    // What has happened since the last call.
    std::string Told()
    {
        osgGA::EventQueue::Events events;
        view->getEventQueue()->takeEvents(events);
        std::ostringstream text;
        text << told;
        for (const auto& each : events)
            if (const Event* event = each->asGUIEventAdapter())
                switch (event->getEventType())
                {
                case Event::PUSH:
                case Event::DRAG:
                case Event::MOVE:
                    text << (event->getEventType() == Event::PUSH   ? "push "
                             : event->getEventType() == Event::DRAG ? "drag "
                                                                    : "move ")
                         << event->getX() << " " << event->getY() << " by " << event->getButton() << "; ";
                    break;
                case Event::RELEASE:
                    text << "release; ";
                    break;
                default:
                    text << (event->getEventType() == Event::KEYDOWN ? "down " : "up ") << std::hex << event->getKey()
                         << "; ";
                }
        told.clear();
        return text.str();
    }

    bool takes = true;
    bool pointer = true;
    std::string told;
    osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
    VtCViewInput input{*this};
};

} // namespace

TEST_F(Input, BecomesEventsOfTheView)
{
    using host::ViewKey;
    struct Case
    {
        const char* name;
        std::function<void(host::WindowEvents&)> tell;
        const char* told;
    };
    const Case cases[] = {
        {"a press activates, and y turns upwards", [](auto& to) { to.OnLeftButtonDown(10, 20); },
         "press; push 10 80 by 1; "},
        {"a held pointer drags", [](auto& to) { to.OnMouseMove(12, 30); }, "drag 12 70 by 1; "},
        {"outside it has left, once",
         [](auto& to)
         {
             to.OnMouseMove(-3, 30);
             to.OnMouseMove(-9, 30);
         },
         "release; "},
        {"and may come back", [](auto& to) { to.OnMouseMove(199, 99); }, "drag 199 1 by 1; "},
        {"a release ends it", [](auto& to) { to.OnLeftButtonUp(12, 30); }, "release; "},
        {"a free pointer moves", [](auto& to) { to.OnMouseMove(12, 30); }, "move 12 70 by 1; "},
        {"the right button only activates", [](auto& to) { to.OnRightButtonDown(); }, "press; "},
        {"the pointer leaves", [](auto& to) { to.OnMouseLeave(); }, "release; "},
        {"a double click isn't queued", [](auto& to) { to.OnLeftDoubleClick(5, 5); }, "double 5 95; "},
        {"a key repeats",
         [](auto& to)
         {
             to.OnKey(ViewKey::tab, true);
             to.OnKey(ViewKey::tab, true);
             to.OnKey(ViewKey::shiftRight, true);
         },
         "down ff09; down ffe2; "},
        {"that Shift is known", [](auto& to) { to.OnShiftState(true); }, ""},
        {"another window takes the keyboard", [](auto& to) { to.OnFocusLost(); }, "up ff09; up ffe2; "},
        {"a Shift went down elsewhere", [](auto& to) { to.OnShiftState(true); }, "down ffe1; "},
        {"and up", [](auto& to) { to.OnShiftState(false); }, "up ffe1; "},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        c.tell(input);
        EXPECT_EQ(Told(), c.told);
    }
    EXPECT_EQ(view->getEventQueue()->getCurrentEventState()->getEventType(), Event::DOUBLECLICK);
}

TEST_F(Input, IsIgnoredWithoutASceneAndAView)
{
    const auto tellAll = [](host::WindowEvents& to)
    {
        to.OnLeftButtonDown(1, 1);
        to.OnRightButtonDown();
        to.OnMouseMove(1, 1);
        to.OnMouseLeave();
        to.OnLeftDoubleClick(1, 1);
        to.OnKey(host::ViewKey::tab, true);
        to.OnFocusLost();
        to.OnLeftButtonUp(1, 1);
    };
    takes = false;
    tellAll(input);
    EXPECT_EQ(Told(), "");
    takes = true;
    input.Attach(nullptr);
    tellAll(input);
    EXPECT_EQ(Told(), "");
    EXPECT_FALSE(input.IsLeftButtonDown());

    input.Attach(view.get());
    pointer = false;
    input.OnMouseMove(1, 1);
    EXPECT_EQ(Told(), "") << "the view's owner keeps motions back";
}

// A view over two screens: the input of the second window measures in the second camera.
TEST_F(Input, OfOneViewInSeveralWindows)
{
    osg::ref_ptr<osg::Camera> slave = new osg::Camera;
    slave->setViewport(0, 0, 300, 400);
    VtCViewInput second(*this);
    second.Attach(view.get(), slave.get());
    second.OnMouseMove(250, 100);
    EXPECT_EQ(Told(), "move 250 300 by 1; ");
    slave = nullptr;
    second.OnMouseMove(250, 100);
    EXPECT_EQ(Told(), "") << "the window has gone";
}

namespace
{

// What stands behind the middle pixel, one thing behind the other.
enum class Thing
{
    car,
    hiddenCar,
    lockedCar, ///< not selectable
    part,      ///< of a group
    house,
    fixedHouse,
    line, ///< as a selection box has them
    dragger,
    markerMove,
    markerRotate,
    sky, ///< nobody's
};

class Pick : public InteractionFixture
{
protected:
    Pick()
    {
        document.models.models[L"\\m\\cube.dae"] = fake::MakeModel(fake::MakeCube("cube"));
        osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
        proxy->addChild(new osg::Group);
        proxy->getChild(0)->setName("cab");
        proxy->setFileName(0, "cube.dae");
        document.models.models[L"\\m\\truck.dae"] = fake::MakeModel(proxy);
        document.models.descriptions[L"\\m\\truck.dae"] =
            "<vtattr:Object type='6'>"
            "<vtattr:Attribute name='is_grouped'><vtattr:value>1</vtattr:value></vtattr:Attribute>"
            "<vtattr:Attribute name='child_count'><vtattr:value>1</vtattr:value></vtattr:Attribute>"
            "<vtattr:Attribute name='child_ids'><vtattr:value>cab</vtattr:value></vtattr:Attribute></vtattr:Object>";

        osg::Camera& camera = *view->getCamera();
        camera.setViewport(0, 0, 200, 100);
        camera.setProjectionMatrixAsPerspective(40, 2, 0.1, 1000);
        camera.setViewMatrixAsLookAt({0, -10, 0}, {0, 0, 0}, {0, 0, 1});
        view->setSceneData(scene->GetRootNode());
    }

    VtC3DMovableBody& AddMovable(const wchar_t* path, double y)
    {
        auto& body = *new VtC3DMovableBody(document, *scene->GetMovableBodies(0), path, path,
                                           osg::Matrixd::translate(0, y, 0), true, nullptr, {});
        body.SetLastTransformMatrix(osg::Matrixd::translate(0, y, 0));
        return body;
    }

    // A node of nobody's, with a cube or a line across the view.
    void AddNode(const char* name, double y, bool asLine = false)
    {
        osg::ref_ptr<osg::Geode> geode = fake::MakeCube("handle");
        if (asLine)
        {
            osg::ref_ptr<osg::Geometry> line = new osg::Geometry;
            const osg::Vec3 ends[] = {{-1, 0, 0}, {1, 0, 0}};
            line->setVertexArray(new osg::Vec3Array(2, ends));
            line->addPrimitiveSet(new osg::DrawArrays(GL_LINES, 0, 2));
            geode = new osg::Geode;
            geode->addDrawable(line);
        }
        osg::ref_ptr<osg::MatrixTransform> place = new osg::MatrixTransform(osg::Matrixd::translate(0, y, 0));
        place->setName(name);
        place->addChild(geode);
        scene->GetEnvironmentNode()->addChild(place);
    }

    VtC3DBody* Add(Thing thing, double y)
    {
        switch (thing)
        {
        case Thing::car:
        case Thing::hiddenCar:
        case Thing::lockedCar:
        {
            VtC3DMovableBody& body = AddMovable(L"\\m\\cube.dae", y);
            body.SetVisible(thing != Thing::hiddenCar);
            if (thing == Thing::lockedCar)
                body.GetAttributeObject()->Write(L"selectable", 0);
            return &body;
        }
        case Thing::part:
            return AddMovable(L"\\m\\truck.dae", y).GetParts().at(0);
        case Thing::house:
        case Thing::fixedHouse:
        {
            auto* body = new VtC3DStaticBody(document, *scene->GetStaticBodies(), L"House", L"\\m\\cube.dae",
                                             osg::Matrixd::translate(0, 0, -y), true, {}); // y up, as models are
            if (thing == Thing::fixedHouse)
                body->GetAttributeObject()->Write(L"fixed_to_world", 1);
            return body;
        }
        case Thing::line:
            AddNode("cube_bbox", y, true);
            break;
        case Thing::dragger:
            AddNode("_active_dragger_", y);
            break;
        case Thing::markerMove:
            AddNode("_overview_move_", y);
            break;
        case Thing::markerRotate:
            AddNode("_overview_rotate_", y);
            break;
        case Thing::sky:
            AddNode("sky", y);
            break;
        }
        return nullptr;
    }

    osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
};

} // namespace

TEST_F(Pick, GoesFromTheLeafToTheObjectNearestFirst)
{
    using enum Thing;
    using enum VtEPickCode;
    constexpr int none = -1;
    struct Case
    {
        const char* name;
        std::vector<Thing> things; ///< nearest first
        int body;                  ///< which of them a double click selects
        VtEPickCode code;          ///< what an editor's view tells
        int edited;
        VtEPickCode inOverview;
        int point; ///< on whose front something new is put
    };
    const Case cases[] = {
        {"nothing", {}, none, nothing, none, nothing, none},
        {"a movable body", {car, house}, 0, movableBody, 0, movableBody, 0},
        {"a static body", {house, car}, 0, staticBody, 0, staticBody, 0},
        {"a hidden body isn't there", {hiddenCar, house}, 1, staticBody, 1, staticBody, 1},
        {"a fixed body can't be edited", {fixedHouse, car}, 0, movableBody, 1, movableBody, 0},
        {"nor one that isn't selectable", {lockedCar, house}, 0, staticBody, 1, staticBody, 1},
        {"a part stays in its group", {part, house}, 0, staticBody, 1, staticBody, 0},
        {"lines of a selection box", {line, car}, 1, movableBody, 1, movableBody, 1},
        {"a dragger behind a wall", {house, dragger}, 0, activeDragger, none, activeDragger, 0},
        {"the marker is the overview's", {markerMove, car}, none, movableBody, 1, overviewMove, 1},
        {"and so is its handle", {markerRotate, house}, none, staticBody, 1, overviewRotate, 1},
        {"the nearest handle of several", {markerRotate, dragger}, none, activeDragger, none, overviewRotate, none},
        {"what is nobody's", {sky, house}, none, staticBody, 1, staticBody, 1},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        scene->GetEnvironmentNode()->removeChildren(0, scene->GetEnvironmentNode()->getNumChildren());
        std::vector<VtC3DBody*> bodies;
        for (const Thing thing : c.things)
            bodies.push_back(Add(thing, 3.0 * static_cast<double>(bodies.size())));
        const auto body = [&](int index) { return index == none ? nullptr : bodies[static_cast<std::size_t>(index)]; };

        const VtCPick pick(view.get(), 100, 50);
        EXPECT_EQ(pick.IsEmpty(), c.things.empty());
        EXPECT_EQ(pick.GetBody(), body(c.body));
        EXPECT_EQ(pick.GetEditable(false).code, c.code);
        EXPECT_EQ(pick.GetEditable(false).body, body(c.edited));
        EXPECT_EQ(pick.GetEditable(true).code, c.inOverview);
        const std::optional<osg::Vec3d> point = pick.GetPoint();
        EXPECT_EQ(point.has_value(), c.point != none);
        EXPECT_NEAR(point.value_or(osg::Vec3d(0, 3.0 * c.point - 0.5, 0)).y(), 3.0 * c.point - 0.5, 1e-3)
            << "the front of a cube of one metre";
        EXPECT_TRUE(VtCPick(view.get(), 2, 98).IsEmpty()) << "beside everything";

        for (VtC3DBody* made : bodies)
            if (made)
                (made->IsGroupChild() ? static_cast<VtC3DBody*>(made->GetParent()) : made)->Destroy();
    }
    EXPECT_TRUE(VtCPick(nullptr, 100, 50).IsEmpty());
}

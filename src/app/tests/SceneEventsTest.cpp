#include <functional>

#include <osg/ProxyNode>

#include "app/tests/LoadFixture.h"
#include "scene/ObjectHandle.h"

using namespace scenefile;

namespace
{

using Any = VtCGlidePanelAbstractNavigatorObject;
using Heard = std::vector<std::string>;

/// Writes down what it is told, and looks at whether the object is what the event promises.
class Listener : public VtISceneListener
{
public:
    explicit Listener(VtCScene3D& heardScene) : scene(heardScene) { scene.GetObjects().AddListener(*this); }

    void ObjectAdded(Any& object) override
    {
        heard.push_back("+ " + base::Utf8(object.GetName()));
        ExpectWhole(object);
        EXPECT_EQ(scene.GetObjects().FindById(base::ToLower(object.GetInternalId())), &object);
        const VtISceneObject* record = object.GetAttributeObject();
        ASSERT_TRUE(record);
        EXPECT_EQ(*record->Find<std::wstring>(L"internal_id"), object.GetInternalId());
        EXPECT_EQ(*record->Find<std::wstring>(L"name"), object.GetName());
        EXPECT_EQ(scene.GetDocument().GetServices().store.GetObject(object.GetInternalId()), record);
    }
    void ObjectRemoved(Any& object) override
    {
        heard.push_back("- " + base::Utf8(object.GetName()));
        ExpectWhole(object);
        EXPECT_NE(scene.GetObjects().FindById(object.GetInternalId()), &object);
    }
    void ObjectRenamed(Any& object, const std::wstring& former) override
    {
        heard.push_back(base::Utf8(former) + " = " + base::Utf8(object.GetName()));
    }
    void ObjectMoved(Any& object, Any& former) override
    {
        heard.push_back(
            base::Utf8(object.GetName() + L": " + former.GetName() + L" > " + object.GetParent()->GetName()));
    }
    void ConnectionStateChanged(VtC3DMovableBody& body) override
    {
        heard.push_back(base::Utf8(body.GetName()) + " is " + std::to_string(body.GetConnectionState()));
    }
    void ActiveViewChanged(VtCBase3DView*, Any* observer) override
    {
        heard.push_back("through " + (observer ? base::Utf8(observer->GetName()) : "none"));
    }

    Heard heard;

private:
    static void ExpectWhole(Any& object)
    {
        EXPECT_TRUE(dynamic_cast<VtC3DMovableBody*>(&object) || dynamic_cast<VtC3DStaticBody*>(&object) ||
                    dynamic_cast<VtC3DObserver*>(&object));
        ASSERT_TRUE(object.GetParent());
        EXPECT_TRUE(dynamic_cast<VtC3DBodies*>(object.GetParent()) || object.GetParent()->IsInScene());
    }

    VtCScene3D& scene;
};

/// "Car" with the observer "Rider" on it, the group "Truck" with the part "Cab", "Door" below "House".
struct World : LoadWorld
{
    World()
    {
        osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
        osg::ref_ptr<osg::Group> part = new osg::Group;
        part->setName("cab");
        proxy->addChild(part);
        proxy->setFileName(0, "cab.dae");
        document.models.models[L"\\m\\truck.dae"] = fake::MakeModel(proxy);
        document.models.descriptions[L"\\m\\truck.dae"] =
            Attribute("is_grouped", "1", "int") + Attribute("child_count", "1", "int") +
            Attribute("child_ids", "cab", "stringList") + Attribute("cab_name", "Cab");
        document.channels.channels = {L"Chassis"};
        AddMovable(L"Car");
        AddMovable(L"Truck", L"\\m\\truck.dae");
        house = AddStatic(*scene->GetStaticBodies(), L"House");
        door = AddStatic(*house, L"Door");
        rider = &observers->CreateObserver(L"Rider", true);
        rider->SetConnectedBody(&Movable(L"Car"));
    }

    VtC3DMovableBody* AddMovable(const wchar_t* name, const wchar_t* model = L"\\m\\car.dae")
    {
        return new VtC3DMovableBody(document, Movables(), name, model, osg::Matrixd(), true, nullptr, {});
    }
    VtC3DStaticBody* AddStatic(Any& parent, const wchar_t* name)
    {
        return new VtC3DStaticBody(document, parent, name, L"\\m\\house.dae", osg::Matrixd(), true, {});
    }

    VtC3DStaticBody* house = nullptr;
    VtC3DStaticBody* door = nullptr;
    VtC3DObserver* rider = nullptr;
    VtCTrack* const track = reinterpret_cast<VtCTrack*>(this); // never looked into
};

struct Way
{
    const char* name;
    std::function<void(World&)> go;
    Heard heard;
};

void Write(Any& object, const wchar_t* attribute, VtTAttributeValue value)
{
    object.GetAttributeObject()->Write(attribute, std::move(value));
}

TEST(SceneEvents, TellEveryWayOnce)
{
    const std::string defaults =
        "[OBSERVER_1]\nName=Behind\nConnectedBody=\n[OBSERVER_2]\nName=Ahead\nConnectedBody=\n";
    const Way ways[] = {
        {"a movable body is made", [](World& w) { w.AddMovable(L"Van"); }, {"+ Van"}},
        {"a group with its part", [](World& w) { w.AddMovable(L"Bus", L"\\m\\truck.dae"); }, {"+ Bus", "+ Cab"}},
        {"a static body", [](World& w) { w.AddStatic(*w.door, L"Knob"); }, {"+ Knob"}},
        {"an observer", [](World& w) { w.observers->CreateObserver({}, true); }, {"+ Observer_1"}},
        {"default observers of a model",
         [&](World& w)
         {
             w.folder.Write("defaults.ini", defaults);
             w.observers->LoadDefaultObservers(L"Car.dae");
         },
         {"+ Car Behind", "+ Car Ahead"}},
        {"a loaded scene",
         [](World& w)
         {
             w.Load(ObserverRecord("o", "name of b") + BodyRecord(6, "d", Attribute("parent_object_id", "H")) +
                    BodyRecord(7, "b", Attribute("simulation_data_stream", "0", "int")) +
                    Object(9, "FREE1", "Eye", Attribute("behaviour", "0", "int")));
         },
         {"Free1 = Eye", "+ name of b", "+ name of d", "+ eye o"}},
        {"a load that ends in the middle",
         [](World& w) { EXPECT_THROW(w.Load(BodyRecord(7, "b") + Object(7, "c", "no file")), VtCAttributeError); },
         {"+ name of b"}},
        {"a track with clones",
         [](World& w) { w.scene->RemoveTrackBodies(w.scene->AddTrackBodies(true, w.track, 1)); },
         {"+ Car", "+ Truck", "- Car", "- Truck"}},
        {"a body is removed with its clone",
         [](World& w)
         {
             w.scene->AddTrackBodies(true, w.track, 1);
             w.Movables().RemoveBody(w.Movable(L"Car").GetInternalId());
         },
         {"+ Car", "+ Truck", "- Car", "- Car"}},
        {"a body is destroyed", [](World& w) { w.house->Destroy(); }, {"- Door", "- House"}},
        {"let go by its parent", [](World& w) { w.Movable(L"Truck").DetachFromParent(); }, {"- Cab", "- Truck"}},
        {"all go", [](World& w) { w.Movables().RemoveAllBodies(); }, {"- Car", "- Cab", "- Truck"}},
        {"an observer goes", [](World& w) { w.observers->RemoveObserver(L"rider"); }, {"- Rider"}},
        {"one that is kept alive goes",
         [](World& w)
         {
             w.rider->AddRef();
             w.observers->RemoveNonFreeObservers();
             w.rider->SetName(L"Nobody");
             w.rider->Release();
         },
         {"- Rider"}},
        {"the scene ends",
         [](World& w) { w.End(); },
         {"- Rider", "- Free2", "- Free1", "- Cab", "- Truck", "- Car", "- Door", "- House"}},
        {"renamed by its record",
         [](World& w) { Write(w.Movable(L"Car"), L"name", std::wstring(L"Van")); },
         {"Car = Van"}},
        {"renamed by its setter",
         [](World& w)
         {
             w.rider->SetName(L"Driver");
             w.rider->SetName(L"Driver");
         },
         {"Rider = Driver"}},
        {"moved below another",
         [](World& w)
         {
             VtC3DStaticBody* shed = w.AddStatic(*w.scene->GetStaticBodies(), L"Shed");
             shed->AddChild(*w.house);
             w.door->AddChild(*w.house); // not below itself
             EXPECT_EQ(w.house->GetParent(), shed);
             EXPECT_EQ(w.house->GetTransformNode()->getParent(0), shed->GetTransformNode());
             EXPECT_EQ(*w.house->GetAttributeObject()->Find<std::wstring>(L"parent_object_id"), shed->GetInternalId());
             EXPECT_EQ(shed->FindById(w.door->GetInternalId()), w.door);
         },
         {"+ Shed", "House: 6234 > Shed"}},
        {"taken out and put in again",
         [](World& w)
         {
             w.house->AddRef();
             w.house->DetachFromParent();
             w.scene->GetStaticBodies()->AddChild(*w.house);
             w.house->Release();
             EXPECT_EQ(w.scene->GetObjects().FindById(w.door->GetInternalId()), w.door);
         },
         {"- Door", "- House", "+ House", "+ Door"}},
        {"connected, the channel goes, not connected",
         [](World& w)
         {
             VtC3DMovableBody& car = w.Movable(L"Car");
             car.ConnectChannel(0, L"");
             car.UpdateConnectionState();
             w.document.channels.channels.clear();
             car.UpdateConnectionState();
             car.ConnectChannel(-1, L"");
         },
         {"Car is 2", "Car is 1", "Car is 0"}},
        {"another view, another observer, none",
         [](World& w)
         {
             auto* view = reinterpret_cast<VtCBase3DView*>(&w); // never looked into
             w.scene->SetActiveView(view, w.rider);
             w.scene->SetActiveView(view, w.rider);
             w.scene->SetActiveView(view, w.observers->GetFree1());
             w.scene->SetActiveView(nullptr, nullptr);
         },
         {"through Rider", "through Free1", "through none"}},
    };
    for (const Way& way : ways)
    {
        SCOPED_TRACE(way.name);
        World world;
        Listener listener(*world.scene);
        way.go(world);
        EXPECT_EQ(listener.heard, way.heard);
        world.End();
    }
}

TEST(SceneEvents, ListenersMayComeAndGoWhileTheyAreTold)
{
    struct Leaving : VtISceneListener
    {
        void ObjectAdded(Any&) override
        {
            ++told;
            scene->GetObjects().RemoveListener(*this);
            scene->GetObjects().AddListener(*next);
        }
        VtCScene3D* scene = nullptr;
        VtISceneListener* next = nullptr;
        int told = 0;
    };
    World world;
    Leaving first, second;
    first.scene = second.scene = world.scene.get();
    first.next = &second;
    second.next = &first;
    world.scene->GetObjects().AddListener(first);
    for (const int told : {1, 2})
    {
        world.AddMovable(L"Van");
        EXPECT_EQ(first.told + second.told, told) << "who joins hears the next";
    }
}

TEST(SceneEvents, AHandleKnowsWhenItsObjectHasGone)
{
    World world;
    VtC3DMovableBody& car = world.Movable(L"Car");
    const VtCObjectHandle<VtC3DMovableBody> handle = car;
    const VtCObjectHandle<VtC3DStaticBody> door = world.door;
    const VtCObjectHandle<> free = world.observers->GetFree1();
    EXPECT_FALSE(VtCObjectHandle<>());
    car.RebindAttributes(car.GetInternalId());
    world.scene->GetStaticBodies()->AddChild(*world.door);
    EXPECT_EQ(handle.Get(), &car);
    EXPECT_EQ(door.Get(), world.door) << "a move changes nothing";

    car.AddRef();
    car.Destroy();
    EXPECT_FALSE(handle) << "gone for the scene, however long others keep it";
    EXPECT_EQ(world.rider->GetConnectedBody(), nullptr);
    car.Release();
    world.End();
    EXPECT_FALSE(free);
    EXPECT_FALSE(door);
}

TEST(SceneEvents, IdsAreFoundInAnyCaseAndOfSeveralTheFirst)
{
    World world;
    VtC3DStaticBody& other = *world.AddStatic(*world.scene->GetStaticBodies(), L"Other");
    auto* inner =
        new VtC3DStaticBody(world.document, other, L"Inner", L"\\m\\house.dae", osg::Matrixd(), true, L"Same");
    auto* first =
        new VtC3DStaticBody(world.document, *world.house, L"First", L"\\m\\house.dae", osg::Matrixd(), true, L"SAME");
    const VtCSceneObjects& objects = world.scene->GetObjects();
    EXPECT_EQ(world.scene->GetStaticBodies()->FindById(L"same"), first) << "depth first";
    EXPECT_EQ(other.FindById(L"same"), inner);
    EXPECT_EQ(world.Movables().FindById(L"same"), nullptr);
    EXPECT_EQ(objects.FindById(L"sAME"), inner) << "in the whole scene the older one";
    inner->Destroy();
    EXPECT_EQ(objects.FindById(L"same"), first);
    EXPECT_EQ(other.FindById(L"same"), nullptr);

    ASSERT_TRUE(world.Load(BodyRecord(7, "Loaded")));
    EXPECT_EQ(objects.FindById(L"LOADED"), &world.Movable(L"name of loaded")) << "under its stored id";
    world.Movable(L"Car").RebindAttributes(L"LOADED");
    EXPECT_EQ(world.Movables().FindById(L"loaded"), &world.Movable(L"Car"));
}

} // namespace

#include <osg/Program>

#include "scene/tests/SceneFixture.h"
#include "scene/UserData.h"

namespace
{

using osg::StateAttribute;

class Scene : public SceneFixture
{
protected:
    VtCTrack* const track = reinterpret_cast<VtCTrack*>(&trackPlace); // never looked into
    int trackPlace = 0;
};

TEST_F(Scene, ANewOneHasItsGraphAndItsSettings)
{
    EXPECT_EQ(document.scene, &scene);
    EXPECT_FALSE(document.modified);
    const osg::Group& root = *scene.GetRootNode();
    EXPECT_EQ(root.getName(), "6231");
    for (const GLenum mode : {GL_LIGHTING, GL_NORMALIZE, GL_LIGHT0, GL_LIGHT1, GL_BLEND, GL_DEPTH_TEST})
        EXPECT_EQ(root.getStateSet()->getMode(mode), StateAttribute::ON);
    EXPECT_EQ(root.getStateSet()->getMode(GL_STENCIL_TEST), StateAttribute::ON | StateAttribute::OVERRIDE);
    ASSERT_EQ(root.getNumChildren(), 2U);
    EXPECT_EQ(root.getChild(0)->getName(), "6233");
    EXPECT_EQ(root.getChild(1)->getName(), "6232");

    const osg::Group& content = *scene.GetContentNode();
    ASSERT_EQ(content.getNumChildren(), 3U);
    EXPECT_EQ(content.getChild(0), scene.GetOverlayProjection());
    EXPECT_EQ(content.getChild(1)->getName(), "6234");
    EXPECT_EQ(content.getChild(2)->getName(), "6235");
    EXPECT_EQ(scene.GetOverlayTransform()->getReferenceFrame(), osg::Transform::ABSOLUTE_RF);
    ExpectNear(osg::Vec3d(0, 0, 0) * scene.GetOverlayProjection()->getMatrix(), {-1, -1, 0});
    ExpectNear(osg::Vec3d(1, 1, 0) * scene.GetOverlayProjection()->getMatrix(), {1, 1, 0});
    ExpectNear(osg::Vec3d(1, 2, 3) * scene.GetStaticBodies()->GetTransform(), {1, -3, 2});
    const auto* data = static_cast<const VtCOsgUserData*>(scene.GetStaticBodiesNode()->getUserData());
    EXPECT_EQ(data->owner, scene.GetStaticBodies());

    const VtISceneObject* settings = document.store.GetObject(L"render_settings");
    ASSERT_TRUE(settings);
    EXPECT_EQ(*settings->Find<std::int32_t>(L"global_render_mode"), 5);
    EXPECT_EQ(*settings->Find<std::wstring>(L"internal_id"), L"render_settings");
}

TEST_F(Scene, GivesNoCollectionBeyondTheLast)
{
    EXPECT_TRUE(scene.GetMovableBodies(0));
    EXPECT_FALSE(scene.GetMovableBodies(1));
    EXPECT_FALSE(scene.GetMovableBodies(2));
    EXPECT_FALSE(scene.GetMovableBodies(-1));
    VtC3DMovableBody& car = AddMovable(L"Car");
    EXPECT_EQ(scene.FindMovableByName(L"CAR"), &car);
    EXPECT_EQ(scene.FindMovableByName(L"Bus"), nullptr);
    AddStatic(L"House");
    std::vector<std::wstring> files = {L"before"};
    scene.CollectModelFiles(files);
    EXPECT_EQ(files, (std::vector<std::wstring>{L"before", L"\\m\\car.dae", L"\\m\\house.dae"}));
}

TEST_F(Scene, TheGlobalModeGoesToAllBodiesButThoseOfTracks)
{
    VtC3DMovableBody& car = AddMovable(L"Car");
    VtC3DStaticBody& house = AddStatic(L"House");
    house.SetRenderMode(VtERenderMode::WireFrame);
    VtCMovableBodies* clones = scene.AddTrackBodies(true, track, 1);
    ASSERT_TRUE(clones);
    const auto culls = [](VtC3DBody& body)
    {
        const osg::StateSet* state = body.GetTransformNode()->getStateSet();
        return state ? state->getMode(GL_CULL_FACE) : StateAttribute::GLModeValue{StateAttribute::INHERIT};
    };
    document.modified = false;
    scene.ChangeGlobalRenderMode(VtERenderMode::Mixed, true);
    EXPECT_FALSE(document.modified);
    EXPECT_EQ(culls(car), StateAttribute::INHERIT);

    scene.ChangeGlobalRenderMode(VtERenderMode::Flat, false);
    EXPECT_TRUE(document.modified);
    EXPECT_EQ(culls(car), StateAttribute::ON);
    EXPECT_EQ(culls(house), StateAttribute::ON);
    EXPECT_EQ(culls(*clones->GetBodies()[0]), StateAttribute::INHERIT);
    EXPECT_EQ(*scene.GetRenderSettings()->Find<std::int32_t>(L"global_render_mode"), 2);

    scene.SetGlobalRenderMode(VtERenderMode::Mixed, true);
    EXPECT_EQ(culls(house), StateAttribute::OVERRIDE) << "each body's own mode again";
}

TEST_F(Scene, TracksReplayClones)
{
    osg::ref_ptr<osg::Geode> cube = fake::MakeCube("cube");
    osg::ref_ptr<osg::Program> program = new osg::Program;
    program->setName("paint");
    cube->getDrawable(0)->getStateSet()->setAttribute(program);
    document.models.models[L"\\m\\car.dae"] = fake::MakeModel(cube);
    document.channels.channels = {L"Chassis"};
    VtC3DMovableBody& car = AddMovable(L"Car");
    Write(car, L"position", VtTFloatTupel3{1, 2, 3});
    Write(car, L"rotation", VtTFloatTupel3{0, 30, 0});
    car.ConnectChannel(0, L"");

    VtCMovableBodies* collection = scene.AddTrackBodies(true, track, 3);
    ASSERT_TRUE(collection);
    EXPECT_EQ(scene.GetMovableBodies(1), collection);
    EXPECT_EQ(scene.GetContentNode()->getNumChildren(), 4U);
    ASSERT_EQ(collection->GetBodies().size(), 1U);
    VtC3DMovableBody& clone = *collection->GetBodies()[0];
    EXPECT_TRUE(clone.IsClone());
    EXPECT_FALSE(car.IsClone());
    EXPECT_EQ(clone.GetCloneSource(), &car);
    EXPECT_EQ(clone.GetTransform(), car.GetTransform());
    EXPECT_NE(clone.GetModelNode(), car.GetModelNode());
    EXPECT_EQ(clone.GetSimulationDataIndex(), 0);
    EXPECT_EQ(Stored(clone, L"cloned_from"), car.GetInternalId());
    EXPECT_EQ(Stored(clone, L"track_id"), L"3");
    EXPECT_EQ(Stored(clone, L"rotation"), Stored(car, L"rotation"));
    EXPECT_EQ(Stored(clone, L"simulation_data_index"), L"Chassis");

    // The copy of the program is gone, and the shared one asked for by its name.
    osg::Drawable* drawable = clone.GetModelNode()->asGroup()->getChild(0)->asGeode()->getDrawable(0);
    EXPECT_EQ(drawable->getStateSet()->getAttribute(StateAttribute::PROGRAM), nullptr);
    ASSERT_EQ(document.models.shaders.size(), 1U);
    EXPECT_EQ(document.models.shaders[0].node, drawable);
    EXPECT_EQ(document.models.shaders[0].vertexPath, L"\\app\\Assets\\paint.vert");
    EXPECT_TRUE(cube->getDrawable(0)->getStateSet()->getAttribute(StateAttribute::PROGRAM));

    scene.GetMovableBodies(0)->RemoveBody(car.GetInternalId());
    EXPECT_TRUE(collection->GetBodies().empty()) << "a clone can't outlive what it replays";
}

TEST_F(Scene, TracksComeAndGoUpToTheLimit)
{
    document.configuration.maxTracks = 2;
    VtCScene3D limited(document);
    VtCMovableBodies* first = limited.AddTrackBodies(false, track, 1);
    VtCMovableBodies* second = limited.AddTrackBodies(false, track, 2);
    EXPECT_TRUE(second);
    EXPECT_EQ(limited.AddTrackBodies(false, track, 3), nullptr);
    EXPECT_FALSE(limited.RemoveTrackBodies(nullptr));
    EXPECT_FALSE(limited.RemoveTrackBodies(limited.GetMovableBodies(0)));
    EXPECT_TRUE(limited.RemoveTrackBodies(first));
    EXPECT_EQ(limited.GetMovableBodies(1), second);
    EXPECT_EQ(limited.GetMovableBodies(2), nullptr);
    EXPECT_EQ(limited.GetContentNode()->getNumChildren(), 4U);

    document.services.configuration = nullptr;
    VtCScene3D without(document);
    EXPECT_EQ(without.GetMaxTracks(), 0);
    EXPECT_EQ(without.AddTrackBodies(false, track, 1), nullptr);
}

TEST_F(Scene, EndsWithItsBodiesAndTheirRecords)
{
    const std::size_t before = document.store.GetObjects().size();
    {
        VtCScene3D other(document);
        new VtC3DMovableBody(document, *other.GetMovableBodies(0), L"Car", L"\\m\\car.dae", osg::Matrixd(), true,
                             nullptr, {});
        new VtC3DStaticBody(document, *other.GetStaticBodies(), L"House", L"\\m\\h.dae", osg::Matrixd(), true, {});
        other.AddTrackBodies(true, track, 1);
        EXPECT_EQ(document.store.GetObjects().size(), before + 3);
    }
    EXPECT_EQ(document.store.GetObjects().size(), before);
    EXPECT_EQ(document.scene, nullptr);
}

class Observers : public VtISceneObservers
{
public:
    void UpdateObservers() override { ++updates; }

    int updates = 0;
};

TEST_F(Scene, UpdatesItsObserversIfItHasAny)
{
    scene.UpdateFrame();
    Observers observers;
    scene.SetObservers(&observers);
    scene.UpdateFrame();
    EXPECT_EQ(observers.updates, 1);
}

} // namespace

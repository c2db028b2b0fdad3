#include <cmath>
#include <fstream>
#include <random>

#include "interaction/tests/InteractionFixture.h"
#include "scene/Placement.h"

namespace
{

// What a camera shows, taken from a view matrix (scene to camera): where it stands, where it looks, what is up.
struct Sight
{
    osg::Vec3d eye;
    osg::Vec3d look;
    osg::Vec3d up;
};

Sight SightOf(const osg::Matrixd& viewMatrix)
{
    const osg::Matrixd camera = osg::Matrixd::inverse(viewMatrix);
    const auto row = [&](int i) { return osg::Vec3d(camera(i, 0), camera(i, 1), camera(i, 2)); };
    return {camera.getTrans(), -row(2), row(1)};
}

void ExpectNear(const osg::Vec3d& found, const osg::Vec3d& expected, double tolerance, const char* what)
{
    EXPECT_LT((found - expected).length(), tolerance)
        << what << ": (" << found.x() << ", " << found.y() << ", " << found.z() << ") instead of (" << expected.x()
        << ", " << expected.y() << ", " << expected.z() << ")";
}

constexpr double radius = 50;

// A car on a circle about the origin, driving anticlockwise with a bank of 0.1 rad: forward, left and up worked out
// from the tangent and the radius alone.
struct OnCircle
{
    osg::Vec3d at;
    osg::Vec3d forward;
    osg::Vec3d left;
    osg::Vec3d up;

    explicit OnCircle(double angle)
        : at(radius * std::cos(angle), radius * std::sin(angle), 0.5), forward(-std::sin(angle), std::cos(angle), 0)
    {
        const osg::Vec3d inwards(-std::cos(angle), -std::sin(angle), 0);
        const osg::Vec3d vertical(0, 0, 1);
        left = inwards * std::cos(0.1) - vertical * std::sin(0.1);
        up = vertical * std::cos(0.1) + inwards * std::sin(0.1);
    }

    osg::Matrixd Matrix() const
    {
        return {forward.x(), forward.y(), forward.z(), 0, left.x(), left.y(), left.z(), 0,
                up.x(),      up.y(),      up.z(),      0, at.x(),   at.y(),   at.z(),   1};
    }
};

const double angles[] = {0.0, 0.7, 2.0, 3.5, 5.9};

class Observer : public InteractionFixture
{
};

} // namespace

TEST_F(Observer, RidesFixedToTheBody)
{
    VtC3DObserver& rider = Rider(followRigid);
    rider.SetTranslationOffset(osg::Vec3f(-6, 1, 2));
    Look(rider);
    for (const double angle : angles)
    {
        SCOPED_TRACE(angle);
        const OnCircle car_(angle);
        car->SetLastTransformMatrix(car_.Matrix());
        scene->UpdateFrame();
        const Sight sight = SightOf(rider.GetViewMatrix());
        ExpectNear(sight.eye, car_.at - car_.forward * 6 + car_.left + car_.up * 2, 1e-4, "eye");
        ExpectNear(sight.look, car_.forward, 1e-5, "look");
        ExpectNear(sight.up, car_.up, 1e-5, "up");
        ExpectNear(SightOf(views.front().manipulator->getInverseMatrix()).look, car_.forward, 1e-5,
                   "the view's camera");
    }
}

TEST_F(Observer, FollowsTheHeadingAndStaysLevel)
{
    VtC3DObserver& rider = Rider(followHeading);
    rider.SetTranslationOffset(osg::Vec3f(-6, 1, 2));
    Look(rider);
    for (const double angle : angles)
    {
        SCOPED_TRACE(angle);
        const OnCircle car_(angle);
        // Pitched by 0.2 as well: the nose points up, the heading stays.
        const osg::Matrixd pitched = osg::Matrixd::rotate(-0.2, osg::Vec3d(0, 1, 0)) * car_.Matrix();
        car->SetLastTransformMatrix(pitched);
        scene->UpdateFrame();
        osg::Vec3d heading(pitched(0, 0), pitched(0, 1), 0);
        heading.normalize();
        const osg::Vec3d leftwards(-heading.y(), heading.x(), 0);
        const Sight sight = SightOf(rider.GetViewMatrix());
        ExpectNear(sight.eye, car_.at - heading * 6 + leftwards + osg::Vec3d(0, 0, 2), 1e-4, "eye");
        ExpectNear(sight.look, heading, 1e-5, "look");
        ExpectNear(sight.up, osg::Vec3d(0, 0, 1), 1e-5, "up");
    }
}

TEST_F(Observer, DrivingStraightBackwardsStaysUpright)
{
    VtC3DObserver& rider = Rider(followHeading);
    Look(rider);
    car->SetLastTransformMatrix(osg::Matrixd::rotate(osg::PI, osg::Vec3d(0, 0, 1)));
    scene->UpdateFrame();
    const Sight sight = SightOf(rider.GetViewMatrix());
    ExpectNear(sight.look, osg::Vec3d(-1, 0, 0), 1e-5, "look");
    ExpectNear(sight.up, osg::Vec3d(0, 0, 1), 1e-5, "up");
}

TEST_F(Observer, CalmsTheRotationButNotThePosition)
{
    VtC3DObserver& rider = Rider(followSmooth);
    rider.SetTranslationOffset(osg::Vec3f(0, 0, 0));
    Look(rider);
    // 50 frames a second, turning at 0.4 rad/s: after 5 s the past of 2.5 s ago is 1 rad behind.
    for (int frame = 0; frame <= 250; ++frame)
    {
        car->SetLastTransformMatrix(osg::Matrixd::rotate(0.008 * frame, osg::Vec3d(0, 0, 1)) *
                                    osg::Matrixd::translate(frame, 0, 0));
        scene->UpdateFrame();
        clock.Advance(0.02);
    }
    const Sight sight = SightOf(rider.GetViewMatrix());
    // The newest entry was added just when it was asked for; the walk takes 125 steps of 20 ms to reach 2500 ms.
    const double calmed = 2.0 - 0.07 * 1.0;
    ExpectNear(sight.eye, osg::Vec3d(250, 0, 0), 1e-4, "eye");
    ExpectNear(sight.look, osg::Vec3d(std::cos(calmed), std::sin(calmed), 0), 1e-3, "look");
}

TEST_F(Observer, LooksAtTheBodyFromTheRoadside)
{
    VtC3DObserver& rider = Rider(followLookAt);
    rider.SetTranslationOffset(osg::Vec3f(80, -20, 3));
    rider.SetRotationOffset(osg::Vec3f(0, 0, 33)); // about z it is the rule that turns the head
    Look(rider);
    for (const double angle : angles)
    {
        SCOPED_TRACE(angle);
        const OnCircle car_(angle);
        car->SetLastTransformMatrix(car_.Matrix());
        scene->UpdateFrame();
        osg::Vec3d towards = car_.at - osg::Vec3d(80, -20, 3);
        towards.z() = 0;
        towards.normalize();
        const Sight sight = SightOf(rider.GetViewMatrix());
        ExpectNear(sight.eye, osg::Vec3d(80, -20, 3), 1e-4, "eye");
        ExpectNear(sight.look, towards, 1e-5, "look");
        ExpectNear(sight.up, osg::Vec3d(0, 0, 1), 1e-5, "up");
    }
    car->SetLastTransformMatrix(osg::Matrixd::translate(80, -20, 9));
    scene->UpdateFrame();
    EXPECT_FALSE(rider.GetViewMatrix().isNaN()) << "a body right above gives no direction";
}

TEST_F(Observer, FollowsThePositionOrOneOfItsAxes)
{
    struct Rule
    {
        VtEFollowMode mode;
        osg::Vec3d eye;
    };
    const Rule rules[] = {
        {followFixed, {1, 2, 3}},
        {followPosition, {11, 22, 33}},
        {followAlongX, {10, 2, 33}},
        {followAlongY, {1, 20, 33}},
    };
    for (const Rule& rule : rules)
    {
        SCOPED_TRACE(rule.mode);
        VtC3DObserver& rider = Rider(rule.mode, L"");
        rider.SetTranslationOffset(osg::Vec3f(1, 2, 3));
        Look(rider);
        car->SetLastTransformMatrix(osg::Matrixd::rotate(0.5, osg::Vec3d(0, 0, 1)) *
                                    osg::Matrixd::translate(10, 20, 30));
        scene->UpdateFrame();
        const Sight sight = SightOf(rider.GetViewMatrix());
        ExpectNear(sight.eye, rule.eye, 1e-5, "eye");
        ExpectNear(sight.look, osg::Vec3d(1, 0, 0), 1e-5, "keeps its direction");
        ExpectNear(sight.up, osg::Vec3d(0, 0, 1), 1e-5, "up");
    }
}

TEST_F(Observer, StandsStillWithoutAView)
{
    VtC3DObserver& rider = Rider(followRigid);
    car->SetLastTransformMatrix(osg::Matrixd::translate(5, 0, 0));
    scene->UpdateFrame();
    EXPECT_EQ(rider.GetPosition(), osg::Vec3f(0, 0, 1.5f)) << "a new observer stands 1.5 m above the origin";
    Look(rider).manipulator->setObserver(&rider, nullptr);
    scene->UpdateFrame();
    EXPECT_EQ(rider.GetPosition(), osg::Vec3f(5, 0, 1.5f));
}

TEST_F(Observer, OnlyTheActiveViewsObserverCarriesTheHeadLight)
{
    VtC3DObserver& rider = Rider(followPosition);
    VtC3DObserver& fixed = Rider(followFixed, L"Fixed");
    Look(rider);
    Look(fixed);
    car->SetLastTransformMatrix(osg::Matrixd::translate(7, 8, 9));
    interaction.activeObserver = &fixed;
    scene->UpdateFrame();
    EXPECT_EQ(interaction.headLightMoves, 0) << "one that stands in the world doesn't move it";
    interaction.activeObserver = &rider;
    scene->UpdateFrame();
    EXPECT_EQ(interaction.headLight, osg::Vec3f(7, 8, 10.5f));
}

TEST_F(Observer, AStoredFreeViewReadsBackAsTheSameView)
{
    VtC3DObserver& stored = *observers->GetFree1();
    VtC3DObserver& read = *observers->GetFree2();
    std::mt19937 random(7);
    std::normal_distribution<double> component;
    std::uniform_real_distribution<float> place(-1000, 1000);
    for (int i = 0; i < 2000; ++i)
    {
        osg::Quat camera(component(random), component(random), component(random), component(random));
        if (i % 10 == 0) // upright and level cameras, as users have them, and ones that look straight down or up
            camera = osg::Quat(osg::PI / 2 * (i % 30) / 10, osg::Vec3d(1, 0, 0)) *
                     osg::Quat(component(random), osg::Vec3d(0, 0, 1));
        if (i % 10 == 1) // rolled by a quarter turn, where the angles lose one degree of freedom
            camera = osg::Quat(component(random), osg::Vec3d(1, 0, 0)) * osg::Quat(osg::PI / 2, osg::Vec3d(0, 1, 0)) *
                     osg::Quat(component(random), osg::Vec3d(0, 0, 1));
        camera /= camera.length();
        const osg::Vec3f eye(place(random), place(random), place(random));
        stored.StoreFreeView(eye, camera);
        read.ApplyAttributes(*stored.GetAttributeObject());

        const osg::Matrixd expected = osg::Matrixd::rotate(camera) * osg::Matrixd::translate(eye);
        const osg::Matrixd found = osg::Matrixd::inverse(read.GetViewMatrix());
        for (int k = 0; k < 16; ++k)
            ASSERT_NEAR(found.ptr()[k], expected.ptr()[k], 3e-4) << "entry " << k << " of view " << i;
        for (int k = 0; k < 16; ++k)
            ASSERT_NEAR(osg::Matrixd::inverse(stored.GetViewMatrix()).ptr()[k], expected.ptr()[k], 3e-4);
    }
}

TEST_F(Observer, KnowsItsModesByName)
{
    VtC3DObserver& rider = Rider(followFixed);
    rider.SetFollowMode(L"fixed_to_body");
    EXPECT_EQ(rider.GetFollowMode(), followRigid);
    EXPECT_EQ(rider.GetFollowModeName(), L"Fixed_to_Object");
    EXPECT_FALSE(rider.IsValidConfiguration()) << "it needs a body now";
    rider.SetConnectedBody(car);
    EXPECT_TRUE(rider.IsValidConfiguration());
    rider.SetFollowMode(L"no such mode");
    EXPECT_EQ(rider.GetFollowMode(), followFree);
    EXPECT_FALSE(rider.IsValidConfiguration()) << "a free one must have no body";
    rider.SetFollowModeIndex(12);
    EXPECT_FALSE(rider.IsValidConfiguration());
}

TEST_F(Observer, TakesItsRecord)
{
    VtC3DObserver& rider = Rider(followFixed);
    const osg::ref_ptr<VtISceneObject> record = rider.GetAttributeObject();
    record->Write(L"attached_to", std::wstring(L"CAR"));
    EXPECT_EQ(rider.GetConnectedBody(), car);
    record->Write(L"attached_to", std::wstring(L"nobody"));
    EXPECT_EQ(rider.GetConnectedBody(), car) << "an unknown name changes nothing";
    EXPECT_EQ(*record->Find<std::wstring>(L"attached_to"), L"Car") << "not even the record";
    record->Write(L"attached_to", std::wstring(L"Not connected"));
    EXPECT_EQ(rider.GetConnectedBody(), nullptr);

    VtC3DObserver& orphan = Rider(followFixed, L"Orphan");
    orphan.GetAttributeObject()->Write(L"attached_to", std::wstring(L"Lost"));
    EXPECT_EQ(orphan.GetConnectedBodyName(), L"Lost") << "kept, so that the user can be asked";
}

TEST_F(Observer, ABodyThatGoesLeavesItsObserversStanding)
{
    VtC3DObserver& rider = Rider(followRigid);
    Look(rider);
    scene->GetMovableBodies(0)->RemoveBody(car->GetInternalId());
    EXPECT_EQ(rider.GetConnectedBody(), nullptr);
    EXPECT_EQ(*rider.GetAttributeObject()->Find<std::wstring>(L"attached_to"), L"Not connected");
    scene->UpdateFrame();
}

TEST_F(Observer, CollectionsNameFindAndRemove)
{
    EXPECT_EQ(observers->CreateObserver(L"", true).GetName(), L"Observer_1");
    EXPECT_EQ(observers->CreateObserver(L"", true).GetName(), L"Observer_2");
    EXPECT_TRUE(observers->RemoveObserver(L"observer_1"));
    EXPECT_EQ(observers->CreateObserver(L"", true).GetName(), L"Observer_1") << "the smallest free number";
    EXPECT_EQ(observers->FindObserverByName(L"FREE1"), observers->GetFree1());
    EXPECT_FALSE(observers->RemoveObserver(L"Free1"));
    EXPECT_FALSE(observers->RemoveObserver(L"nobody"));

    Rider(followRigid);
    EXPECT_EQ(observers->RemoveObserversOfBody(*car), 1);
    observers->RemoveNonFreeObservers();
    EXPECT_EQ(observers->GetObservers().size(), 2u);
    EXPECT_EQ(interaction.replaced, (std::vector<std::wstring>{L"Observer_2", L"Observer_1"}));
}

TEST_F(Observer, DefaultObserversComeFromTheirFile)
{
    std::ofstream(defaultsFile) << "[OBSERVER_1]\nName=Behind\nOffsetTranslationX=-8.5\nOffsetTranslationZ=2\n"
                                   "OffsetRotationY=5\nFollowMode=smooth\nConnectedBody=\n"
                                   "[OBSERVER_2]\nName=Driver\nFollowMode=Fixed_to_Body\nConnectedBody=\n"
                                   "[OBSERVER_4]\nName=unreachable\nConnectedBody=\n";
    MakeBody(L"Sedan.dae");
    observers->GenerateDefaultObservers(L"Sedan.dae|Nobody.dae");
    const VtC3DObserver* behind = observers->FindObserverByName(L"Sedan Behind");
    const VtC3DObserver* driver = observers->FindObserverByName(L"Sedan Driver");
    ASSERT_TRUE(behind && driver);
    EXPECT_EQ(observers->GetObservers().size(), 4u) << "the section behind the last ends it and leaves nothing";
    EXPECT_EQ(behind->GetTranslationOffset(), osg::Vec3f(-8.5f, 0, 2));
    EXPECT_EQ(behind->GetFollowMode(), followSmooth);
    EXPECT_EQ(driver->GetFollowMode(), followRigid);
    EXPECT_EQ(behind->GetConnectedBody()->GetName(), L"Sedan.dae");
    EXPECT_EQ(*driver->GetAttributeObject()->Find<std::wstring>(L"attached_to"), L"Sedan.dae");

    observers->LoadDefaultObservers(L"Sedan.dae");
    EXPECT_TRUE(observers->FindObserverByName(L"Sedan Driver #")) << "a second model of that name";
    observers->LoadDefaultObservers(L"Sedan.dae");
    EXPECT_TRUE(observers->FindObserverByName(L"Sedan Driver ##"));
    std::filesystem::remove(defaultsFile);
    observers->LoadDefaultObservers(L"Other.dae");
    EXPECT_FALSE(observers->FindObserverByName(L"Other Driver")) << "no file, no observers";
}

#include <osg/BlendFunc>
#include <osg/Depth>
#include <osg/ProxyNode>
#include <osg/Stencil>

#include "scene/Placement.h"
#include "scene/tests/SceneFixture.h"

namespace
{

using osg::StateAttribute;

class StaticBody : public SceneFixture
{
protected:
    /// Where the model's point ends up in the scene.
    osg::Vec3d InScene(const VtC3DBody& body, const osg::Vec3d& point)
    {
        return Placed(body, point) * scene.GetStaticBodies()->GetTransform();
    }
};

TEST_F(StaticBody, LiesInTheSceneWhereItsRecordSays)
{
    VtC3DStaticBody& body = AddStatic(L"House");
    EXPECT_EQ(body.GetTransformNode()->getName(), "House_Transform");
    EXPECT_EQ(document.models.loads.back().second, false);
    Write(body, L"position", VtTFloatTupel3{1, 2, 3});
    EXPECT_EQ(body.GetPosition(), osg::Vec3f(1, 3, -2));
    ExpectNear(InScene(body, {0, 0, 0}), {1, 2, 3});
    ExpectNear(InScene(body, {0, 1, 0}), {1, 2, 4});

    Write(body, L"scale", VtTFloatTupel3{1, 2, 3});
    EXPECT_EQ(body.GetScale(), osg::Vec3f(100, 300, 200));
    ExpectNear(InScene(body, {0, 1, 0}), {1, 2, 6});

    // A quarter turn about the scene's z takes the model's x to the scene's y.
    Write(body, L"rotation", VtTFloatTupel3{0, 0, 90});
    ExpectNear(InScene(body, {1, 0, 0}), {1, 3, 3});

    // Turning and scaling leave the centre where it is.
    Write(body, L"center", VtTFloatTupel3{5, 6, 7});
    EXPECT_EQ(body.GetCenter(), osg::Vec3f(5, 7, -6));
    ExpectNear(InScene(body, {5, 7, -6}), {6, 8, 10});
}

TEST_F(StaticBody, PlacesLikeAVrmlTransform)
{
    VtC3DStaticBody& body = AddStatic(L"House");
    Write(body, L"center", VtTFloatTupel3{1, -2, 0.5F});
    Write(body, L"scale", VtTFloatTupel3{2, 0.5F, 3});
    Write(body, L"rotation", VtTFloatTupel3{10, 20, -30});
    Write(body, L"position", VtTFloatTupel3{7, 8, 9});
    const osg::Matrixd before = body.GetTransform();
    Write(body, L"scale_orient", VtTFloatTupel3{40, -50, 60});
    EXPECT_EQ(body.GetTransform(), before) << "alone it takes no effect";
    body.UpdateBaseTransform();

    // The VRML formula on a point: T(C(R(SO(S(SO'(C'(p))))))), in model axes, by column-vector rotations.
    const auto turn = [](osg::Vec3d p, double x, double y, double z, bool back)
    {
        const double rad = osg::PI / 180;
        const osg::Quat q =
            osg::Quat(z * rad, osg::Z_AXIS) * osg::Quat(y * rad, osg::Y_AXIS) * osg::Quat(x * rad, osg::X_AXIS);
        return (back ? q.inverse() : q) * p;
    };
    const osg::Vec3d center(1, 0.5, 2);
    const osg::Vec3d point(0.3, -0.7, 1.9);
    osg::Vec3d p = turn(point - center, 40, 60, 50, true);
    p = turn(osg::Vec3d(p.x() * 2, p.y() * 3, p.z() * 0.5), 40, 60, 50, false);
    p = turn(p, 10, -30, -20, false) + center + osg::Vec3d(7, 9, -8);
    ExpectNear(Placed(body, point), p, 1e-4);
}

TEST_F(StaticBody, TakesItsPlaceFromTheInsertMatrix)
{
    const osg::Matrixd insert =
        osg::Matrixd::scale(2, 2, 2) * osg::Matrixd::rotate(osg::PI_2, 0, 1, 0) * osg::Matrixd::translate(1, 2, 3);
    VtC3DStaticBody& body = AddStatic(L"House", L"\\m\\house.dae", insert);
    EXPECT_EQ(body.GetPlacementMatrix(), insert);
    EXPECT_EQ(Stored(body, L"position"), L"1 2 3");
    const VtTFloatTupel3 scale = *body.GetAttributeObject()->Find<VtTFloatTupel3>(L"scale");
    const VtTFloatTupel3 rotation = *body.GetAttributeObject()->Find<VtTFloatTupel3>(L"rotation");
    for (int i = 0; i < 3; ++i)
    {
        EXPECT_NEAR(scale[i], 2, 1e-5);
        EXPECT_NEAR(body.GetScale()[i], 200, 1e-3);
        EXPECT_NEAR(rotation[i], i == 1 ? 90 : 0, 0.05);
    }
}

TEST(EulerAngles, GiveBackTheAnglesOfAQuaternion)
{
    for (const osg::Vec3f& angles : {osg::Vec3f(10, 20, 30), osg::Vec3f(-170, 80, 95), osg::Vec3f(0, -89, 179)})
    {
        const double rad = osg::PI / 180;
        const osg::Matrixd turn = osg::Matrixd::rotate(angles.x() * rad, 1, 0, 0) *
                                  osg::Matrixd::rotate(angles.y() * rad, 0, 1, 0) *
                                  osg::Matrixd::rotate(angles.z() * rad, 0, 0, 1);
        const osg::Vec3f found = EulerAngles(turn.getRotate());
        for (int i = 0; i < 3; ++i)
            EXPECT_NEAR(found[i], angles[i], 1e-3);
    }
    EXPECT_EQ(EulerAngles(osg::Quat(0, 0, 0, 0)), osg::Vec3f());
    EXPECT_NEAR(EulerAngles(osg::Quat(osg::PI_2, osg::Y_AXIS)).y(), 90, 1e-3);
}

// A road model: surface, bump and bump base, each below a group of its own.
class RoadSurface : public StaticBody
{
protected:
    osg::Geode* AddPart(const std::string& name)
    {
        osg::ref_ptr<osg::Geode> geode = fake::MakeCube(name);
        model->addChild(fake::MakeModel(geode));
        return geode;
    }

    VtC3DStaticBody& AddRoad(const std::vector<std::pair<std::string, std::string>>& attributes)
    {
        std::string text = "<vtattr:Object type='6'>";
        for (const auto& [name, value] : attributes)
            text +=
                "<vtattr:Attribute name='" + name + "'><vtattr:value>" + value + "</vtattr:value></vtattr:Attribute>";
        document.models.models[L"\\m\\road.dae"] = model;
        document.models.descriptions[L"\\m\\road.dae"] = text + "</vtattr:Object>";
        return AddStatic(L"Road", L"\\m\\road.dae");
    }

    static const osg::Stencil* StencilOf(osg::Geode& geode)
    {
        return geode.getStateSet()
                   ? static_cast<osg::Stencil*>(geode.getStateSet()->getAttribute(StateAttribute::STENCIL))
                   : nullptr;
    }

    const std::vector<std::pair<std::string, std::string>> textures = {{"basetexture", "uniform,sampler2D,0"},
                                                                       {"decalMap", "uniform,,sampler2D,1,extra"},
                                                                       {"batterTexture", "uniform"}};
    osg::ref_ptr<osg::Group> model = new osg::Group;
};

TEST_F(RoadSurface, BumpsAreDrawnOverAMarkedRoad)
{
    osg::Geode* road = AddPart("a_road_geometry");
    osg::Geode* bump = AddPart("a_bump_geometry");
    osg::Geode* base = AddPart("a_bumpbase_geometry");
    osg::Geode* tree = AddPart("tree");
    VtC3DStaticBody& body = AddRoad(textures);

    const osg::StateSet& state = *body.GetTransformNode()->getStateSet();
    EXPECT_EQ(state.getBinNumber(), -1);
    EXPECT_EQ(state.getBinName(), "RenderBin");
    EXPECT_EQ(model->getChild(0), base->getParent(0)) << "the bump base is drawn first";

    const osg::Stencil* marks = StencilOf(*base);
    ASSERT_TRUE(marks);
    EXPECT_EQ(marks->getFunction(), osg::Stencil::ALWAYS);
    EXPECT_EQ(marks->getStencilPassAndDepthPassOperation(), osg::Stencil::REPLACE);
    EXPECT_EQ(marks->getStencilPassAndDepthFailOperation(), osg::Stencil::KEEP);
    const osg::Stencil* leavesOut = StencilOf(*road);
    ASSERT_TRUE(leavesOut);
    EXPECT_EQ(leavesOut->getFunction(), osg::Stencil::NOTEQUAL);
    EXPECT_EQ(leavesOut->getFunctionRef(), 1);
    EXPECT_EQ(leavesOut->getStencilPassAndDepthPassOperation(), osg::Stencil::KEEP);
    EXPECT_FALSE(StencilOf(*bump));
    EXPECT_FALSE(tree->getStateSet());
    EXPECT_FALSE(tree->getDrawable(0)->getStateSet()->getAttribute(StateAttribute::DEPTH));

    const osg::StateSet& baseState = *base->getDrawable(0)->getStateSet();
    const osg::StateSet& bumpState = *bump->getDrawable(0)->getStateSet();
    EXPECT_EQ(baseState.getMode(GL_DEPTH_TEST), StateAttribute::OFF);
    EXPECT_EQ(bumpState.getMode(GL_DEPTH_TEST), StateAttribute::ON);
    EXPECT_EQ(bumpState.getMode(GL_BLEND), StateAttribute::ON);
    EXPECT_NEAR(static_cast<const osg::Depth*>(baseState.getAttribute(StateAttribute::DEPTH))->getZFar(), 0.99996,
                1e-9);

    ASSERT_EQ(document.models.shaders.size(), 2U);
    EXPECT_EQ(document.models.shaders[0].node, body.GetTransformNode());
    EXPECT_EQ(document.models.shaders[0].vertexPath, L"\\app\\bin\\..\\Assets\\VtxShader.vert");
    EXPECT_EQ(document.models.shaders[0].fragmentPath, L"\\app\\bin\\..\\Assets\\PixShader.frag");
    EXPECT_EQ(document.models.shaders[1].node, base);
    EXPECT_EQ(document.models.shaders[1].name, L"bumpBaseShader");

    const std::vector<fake::ModelLibrary::Parameter>& parameters = document.models.parameters;
    ASSERT_EQ(parameters.size(), 4U);
    const wchar_t* expected[4][4] = {{L"varying", L"SecondaryColor", L"vertexAttribBinding", L"4"},
                                     {L"uniform", L"basetexture", L"sampler2D", L"0"},
                                     {L"uniform", L"decalMap", L"sampler2D", L"1"},
                                     {L"uniform", L"batterTexture", L"", L""}};
    for (std::size_t i = 0; i < 4; ++i)
    {
        EXPECT_EQ(parameters[i].kind, expected[i][0]);
        EXPECT_EQ(parameters[i].name, expected[i][1]);
        EXPECT_EQ(parameters[i].type, expected[i][2]);
        EXPECT_EQ(parameters[i].value, expected[i][3]);
        EXPECT_EQ(parameters[i].shaderName, L"streetShader");
    }
}

TEST_F(RoadSurface, WithoutABumpBaseNothingIsLeftOut)
{
    osg::Geode* road = AddPart("a_road_geometry");
    AddRoad(textures);
    EXPECT_FALSE(StencilOf(*road));
    EXPECT_EQ(road->getDrawable(0)->getStateSet()->getMode(GL_BLEND), StateAttribute::ON);
}

TEST_F(RoadSurface, TwoTexturesMakeNoRoad)
{
    osg::Geode* base = AddPart("a_bumpbase_geometry");
    VtC3DStaticBody& body = AddRoad({textures[0], textures[1]});
    EXPECT_FALSE(StencilOf(*base));
    EXPECT_FALSE(body.GetTransformNode()->getStateSet());
    EXPECT_TRUE(document.models.shaders.empty());
}

TEST_F(StaticBody, PartsOfAGroupFollowItsRecord)
{
    osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
    osg::ref_ptr<osg::Group> part = new osg::Group;
    part->setName("w1");
    proxy->addChild(part);
    proxy->setFileName(0, "wall.dae");
    document.models.models[L"\\m\\house.dae"] = fake::MakeModel(proxy);
    const auto attribute = [](const std::string& name, const std::string& value)
    { return "<vtattr:Attribute name='" + name + "'><vtattr:value>" + value + "</vtattr:value></vtattr:Attribute>"; };
    document.models.descriptions[L"\\m\\house.dae"] =
        attribute("is_grouped", "1") + attribute("child_count", "1") + attribute("child_ids", "w1") +
        attribute("w1_name", "Wall") + attribute("w1_position", "1 2 3") + attribute("w1_scale", "1 2 3");

    VtC3DStaticBody& house = AddStatic(L"House");
    auto* wall = dynamic_cast<VtC3DStaticBody*>(house.FindById(L"w1"));
    ASSERT_TRUE(wall);
    EXPECT_EQ(wall->GetName(), L"Wall");
    EXPECT_EQ(wall->GetFilePath(), L"\\m\\wall.dae");
    ExpectNear(Placed(*wall, {0, 1, 0}), {1, 6, -2});

    Write(house, L"w1_position", VtTFloatTupel3{4, 5, 6});
    ExpectNear(Placed(*wall, {0, 0, 0}), {4, 6, -5});
    Write(house, L"w1_scale_orient", VtTFloatTupel3{0, 0, 45});
    EXPECT_EQ(wall->GetScale(), osg::Vec3f(100, 300, 200));
    EXPECT_EQ(wall->GetScaleOrientation(), osg::Vec3f(0, 45, 0));
    Write(house, L"w1_name", std::wstring(L"Mauer"));
    EXPECT_EQ(wall->GetName(), L"Mauer");
    Write(house, L"w2_position", VtTFloatTupel3{9, 9, 9});
    Write(house, L"w1_position", VtTFloatTupel3{0, 0, 0});
    ExpectNear(Placed(*wall, {0, 0, 0}), {0, 0, 0});
}

} // namespace

#include <osg/CullFace>
#include <osg/Geometry>
#include <osg/PolygonMode>
#include <osg/ShadeModel>

#include "scene/tests/SceneFixture.h"

namespace
{

using osg::StateAttribute;

const osg::Vec4f grey(0.5F, 0.5F, 0.5F, 1);
const osg::Vec4f white(1, 1, 1, 1);

// Two bodies of one file: a plain cube and a textured one.
class BodyAppearance : public SceneFixture
{
protected:
    BodyAppearance()
    {
        model = new osg::Group;
        model->addChild(fake::MakeCube("plain", grey));
        model->addChild(fake::MakeCube("textured", textured, true));
        document.models.models[L"\\m\\car.dae"] = model;
        body = &AddMovable(L"Car");
        other = &AddMovable(L"Other");
    }

    static osg::Vec4f Diffuse(osg::Node& root, unsigned child)
    {
        osg::Node& drawable = *root.asGroup()->getChild(child)->asGroup()->getChild(0);
        return static_cast<osg::Material*>(drawable.getStateSet()->getAttribute(StateAttribute::MATERIAL))
            ->getDiffuse(osg::Material::FRONT);
    }

    bool ShowsShared() const { return body->GetTransformNode()->containsNode(model); }

    /// The model that the body shows now.
    osg::Node& Shown() const { return *body->GetTransformNode()->getChild(0); }

    osg::StateSet& GeodeState(unsigned child) const
    {
        return *Shown().asGroup()->getChild(child)->getOrCreateStateSet();
    }

    void ExpectSharedUntouched()
    {
        EXPECT_EQ(Diffuse(*model, 0), grey);
        EXPECT_EQ(Diffuse(*model, 1), textured);
        EXPECT_TRUE(other->GetTransformNode()->containsNode(model));
    }

    const osg::Vec4f textured{1, 1, 1, 1};
    osg::ref_ptr<osg::Group> model;
    VtC3DMovableBody* body;
    VtC3DMovableBody* other;
};

TEST_F(BodyAppearance, TransparencyAndDyeNeverTouchTheSharedModel)
{
    Write(*body, L"render_mode", 4);
    EXPECT_FALSE(ShowsShared()) << "transparent by nothing is still a copy of its own";
    EXPECT_EQ(Diffuse(Shown(), 0), grey);
    EXPECT_EQ(GeodeState(0).getRenderingHint(), osg::StateSet::OPAQUE_BIN);

    Write(*body, L"transparency", 0.75F);
    EXPECT_FLOAT_EQ(Diffuse(Shown(), 0).a(), 0.25F);
    EXPECT_EQ(GeodeState(0).getRenderingHint(), osg::StateSet::TRANSPARENT_BIN);
    EXPECT_EQ(GeodeState(0).getMode(GL_BLEND), StateAttribute::ON);
    ExpectSharedUntouched();

    Write(*body, L"render_mode", 1);
    EXPECT_TRUE(ShowsShared());
    EXPECT_EQ(body->GetTransformNode()->getNumChildren(), 1U);

    Write(*body, L"dye_color", VtTIntTupel3{255, 51, 0});
    EXPECT_TRUE(ShowsShared());
    Write(*body, L"dye_enabled", 1);
    EXPECT_FALSE(ShowsShared());
    EXPECT_EQ(Diffuse(Shown(), 0), osg::Vec4f(1, 0.2F, 0, 1));
    EXPECT_EQ(Diffuse(Shown(), 1), textured) << "textures keep their colour";
    const osg::Material& dyed = MaterialOf(Shown());
    EXPECT_EQ(dyed.getAmbient(osg::Material::FRONT), osg::Vec4f(0.3F, 0.2F * 0.3F, 0, 1));
    EXPECT_EQ(dyed.getSpecular(osg::Material::FRONT), osg::Vec4f(0.8F, 0.8F, 0.8F, 1));

    // Transparent and dyed at once, then neither, then transparent again: the colour must be gone.
    Write(*body, L"render_mode", 4);
    EXPECT_EQ(Diffuse(Shown(), 0), osg::Vec4f(1, 0.2F, 0, 0.25F));
    Write(*body, L"dye_enabled", 0);
    EXPECT_FLOAT_EQ(Diffuse(Shown(), 0).a(), 0.25F);
    Write(*body, L"render_mode", 1);
    EXPECT_TRUE(ShowsShared());
    Write(*body, L"render_mode", 4);
    EXPECT_EQ(MaterialOf(Shown()).getAmbient(osg::Material::FRONT).r(), 0.25F);
    ExpectSharedUntouched();
    EXPECT_EQ(document.models.clones, 1);
}

TEST_F(BodyAppearance, BodiesOfOneModelMayHaveDifferentModes)
{
    osg::Vec4f brown(0.4F, 0.2F, 0.1F, 1);
    document.models.models[L"\\m\\brown.dae"] = fake::MakeModel(fake::MakeCube("b", brown, true));
    VtC3DMovableBody& textured1 = AddMovable(L"A", L"\\m\\brown.dae");
    VtC3DMovableBody& plain = AddMovable(L"B", L"\\m\\brown.dae");
    plain.SetRenderMode(VtERenderMode::Gouraud);
    scene.SetGlobalRenderMode(VtERenderMode::Mixed, true);
    // Textures are drawn on white, but the untextured body needs the file's colour.
    EXPECT_EQ(Diffuse(*textured1.GetTransformNode()->getChild(0), 0), white);
    EXPECT_EQ(Diffuse(*plain.GetTransformNode()->getChild(0), 0), brown);
    EXPECT_EQ(Diffuse(*plain.GetModelNode(), 0), brown);
}

struct Mode
{
    VtERenderMode mode;
    osg::ShadeModel::Mode shade;
    StateAttribute::OverrideValue shadeValue;
    osg::PolygonMode::Mode polygon;
    StateAttribute::GLModeValue cull;
    bool texture;
};

TEST_F(BodyAppearance, EachModeSetsItsState)
{
    constexpr StateAttribute::OverrideValue forced = StateAttribute::OVERRIDE;
    const Mode modes[] = {
        {VtERenderMode::Gouraud, osg::ShadeModel::SMOOTH, forced, osg::PolygonMode::FILL, StateAttribute::ON, false},
        {VtERenderMode::Flat, osg::ShadeModel::FLAT, forced, osg::PolygonMode::FILL, StateAttribute::ON, false},
        {VtERenderMode::WireFrame, osg::ShadeModel::SMOOTH, 0, osg::PolygonMode::LINE, StateAttribute::OVERRIDE, true},
        {VtERenderMode::Transparent, osg::ShadeModel::SMOOTH, 0, osg::PolygonMode::FILL, StateAttribute::ON, true},
        {VtERenderMode::Textured, osg::ShadeModel::SMOOTH, 0, osg::PolygonMode::FILL, StateAttribute::ON, true},
    };
    for (const Mode& mode : modes)
    {
        SCOPED_TRACE(static_cast<int>(mode.mode));
        Write(*body, L"render_mode", static_cast<std::int32_t>(mode.mode));
        const osg::StateSet& state = *body->GetTransformNode()->getStateSet();
        const auto* shade = state.getAttributePair(StateAttribute::SHADEMODEL);
        ASSERT_TRUE(shade);
        EXPECT_EQ(static_cast<osg::ShadeModel&>(*shade->first).getMode(), mode.shade);
        EXPECT_EQ(shade->second, mode.shadeValue);
        const auto& polygon = static_cast<const osg::PolygonMode&>(*state.getAttribute(StateAttribute::POLYGONMODE));
        EXPECT_EQ(polygon.getMode(osg::PolygonMode::FRONT), mode.polygon);
        EXPECT_EQ(state.getMode(GL_CULL_FACE), mode.cull);
        EXPECT_EQ(state.getTextureMode(0, GL_TEXTURE_2D),
                  mode.texture ? StateAttribute::INHERIT : StateAttribute::OVERRIDE);
    }
}

TEST_F(BodyAppearance, ABodysModeWaitsWhileTheSceneHasOne)
{
    scene.SetGlobalRenderMode(VtERenderMode::Gouraud, false);
    Write(*body, L"render_mode", 4);
    EXPECT_EQ(body->GetRenderMode(), VtERenderMode::Transparent);
    EXPECT_TRUE(ShowsShared());
    Write(*body, L"transparency", 0.5F);
    EXPECT_EQ(body->GetTransparency(), 0) << "not even the field";

    scene.SetGlobalRenderMode(VtERenderMode::Mixed, true);
    EXPECT_FALSE(ShowsShared());

    document.modified = false;
    const std::wstring before = Stored(*body, L"render_mode");
    body->SetRenderMode(VtERenderMode::Transparent);
    EXPECT_FALSE(document.modified);
    EXPECT_EQ(Stored(*body, L"render_mode"), before);
}

TEST_F(BodyAppearance, ADyeUnderASceneModeMovesToACopyToo)
{
    scene.SetGlobalRenderMode(VtERenderMode::Gouraud, false);
    Write(*body, L"dye_color", VtTIntTupel3{0, 255, 0});
    Write(*body, L"dye_enabled", 1);
    EXPECT_EQ(Diffuse(Shown(), 0), osg::Vec4f(0, 1, 0, 1));
    ExpectSharedUntouched();
    body->SetDyeBytes(0, 0, 255);
    EXPECT_EQ(Diffuse(Shown(), 0), osg::Vec4f(0, 0, 1, 1));
    Write(*body, L"dye_enabled", 0);
    EXPECT_EQ(Diffuse(Shown(), 0), grey);
}

TEST_F(BodyAppearance, TheSelectionBoxSurroundsTheBodyWhereverItIs)
{
    body->SetLastTransformMatrix(osg::Matrixd::translate(10, 0, 0));
    body->SetBoundingBoxVisible(true);
    body->SetBoundingBoxVisible(true);
    ASSERT_EQ(body->GetTransformNode()->getNumChildren(), 2U);
    osg::Geode& box = *body->GetTransformNode()->getChild(1)->asGeode();
    EXPECT_EQ(box.getName(), "Car_bbox");
    const osg::Geometry& lines = *box.getDrawable(0)->asGeometry();
    EXPECT_EQ(lines.getNumPrimitiveSets(), 6U);
    EXPECT_EQ(lines.getVertexArray()->getNumElements(), 24U);
    EXPECT_EQ(box.getBoundingBox().center(), osg::Vec3f());
    EXPECT_FLOAT_EQ(box.getBoundingBox().xMax(), 0.5F);
    body->SetBoundingBoxVisible(false);
    EXPECT_EQ(body->GetTransformNode()->getNumChildren(), 1U);
}

TEST_F(BodyAppearance, AReplacedModelTakesTheBodysPlace)
{
    body->GetModelClone();
    osg::ref_ptr<osg::MatrixTransform> node = new osg::MatrixTransform;
    node->addChild(fake::MakeModel(fake::MakeCube("new", white)));
    const osg::ref_ptr<osg::Group> old = body->GetTransformNode();
    body->ReplaceModel(nullptr);
    EXPECT_EQ(body->GetTransformNode(), old);
    body->ReplaceModel(node);
    EXPECT_EQ(body->GetTransformNode(), node.get());
    EXPECT_EQ(old->getUserData(), nullptr);
    EXPECT_FALSE(scene.GetMovableBodiesNode()->containsNode(old));
    EXPECT_TRUE(scene.GetMovableBodiesNode()->containsNode(node));
    EXPECT_EQ(body->GetModelNode(), node->getChild(0));
    EXPECT_EQ(body->GetFileMaterials().size(), 1U);
    body->SetLastTransformMatrix(osg::Matrixd::translate(1, 2, 3));
    ExpectNear(node->getMatrix().getTrans(), {1, 2, 3});
    body->SetDye(1, 0, 0);
    EXPECT_EQ(Diffuse(Shown(), 0), osg::Vec4f(1, 0, 0, 1));
    EXPECT_EQ(Diffuse(*body->GetModelNode(), 0), white);
}

TEST(RenderMode, NamesReadInAnyCase)
{
    EXPECT_EQ(RenderModeFromText(L"wireFRAME"), VtERenderMode::WireFrame);
    EXPECT_EQ(RenderModeFromText(L"Wire Frame"), VtERenderMode::Mixed);
    EXPECT_EQ(RenderModeFromText(L""), VtERenderMode::Mixed);
    EXPECT_EQ(VtCScene3D::RenderModeToText(VtERenderMode::Flat), L"Flat");
    EXPECT_EQ(VtCScene3D::RenderModeToText(static_cast<VtERenderMode>(-1)), L"Mixed");
    for (int mode = 0; mode <= 5; ++mode)
        EXPECT_EQ(RenderModeFromText(RenderModeToText(static_cast<VtERenderMode>(mode))),
                  static_cast<VtERenderMode>(mode));
}

} // namespace

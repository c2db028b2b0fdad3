#include <osg/LightModel>
#include <osg/Material>
#include <osg/Texture2D>
#include <osgDB/ReadFile>

#include "assets/AssetManager.h"
#include "assets/DrawableCollector.h"
#include "assets/ModelNormals.h"
#include "assets/RecompileVisitor.h"
#include "assets/TextureCollector.h"
#include "assets/TextureSizeVisitor.h"
#include "AssetsFixture.h"
#include "base/Paths.h"
#include "tests/support/FakeHost.h"

namespace fs = std::filesystem;

namespace
{

// What a state set keeps beside an attribute of the value given to it.
constexpr unsigned plain = osg::StateAttribute::OFF;
constexpr unsigned overriding = osg::StateAttribute::OVERRIDE;

class AssetManager : public AssetsFixture
{
protected:
    void SetUp() override
    {
        AssetsFixture::SetUp();
        fs::create_directories(folder / "Assets");
        paths.module = base::InnerPath(folder / "bin") + L"\\";
        fs::create_directories(folder / "bin");
        VtCOsgAssetManager::destroyInstance();
        VtCOsgAssetManager::setServices({&paths, &messages, Settings()});
    }

    void TearDown() override
    {
        VtCOsgAssetManager::destroyInstance();
        AssetsFixture::TearDown();
    }

    std::wstring Square(const std::string& name) const
    {
        return base::InnerPath(Write(name, Dae({{{"a", "", ""}}, {}, "1", "Y_UP", {}})));
    }

    std::wstring Shader(const std::string& name) const
    {
        return base::InnerPath(Write("Assets/" + name, "void main() {}\n"));
    }

    static VtCOsgAssetManager& Assets() { return VtCOsgAssetManager::getInstance(); }

    fake::LibraryPaths paths;
    fake::MessageHandler messages;
};

/// Moves a file's last write by whole seconds.
void Touch(const std::wstring& path, int seconds)
{
    const fs::path native = base::NativePath(path);
    fs::last_write_time(native, fs::last_write_time(native) + std::chrono::seconds(seconds));
}

const osg::StateSet::RefAttributePair* ProgramOf(const osg::StateSet* state)
{
    return state ? state->getAttributePair(osg::StateAttribute::PROGRAM) : nullptr;
}

} // namespace

TEST_F(AssetManager, AModelIsReadOncePerSpellingAndAgainWhenItsFileIsNewer)
{
    const std::wstring path = Square("m.dae");
    osg::ref_ptr<osg::Group> first = Assets().loadModel(path, true);
    ASSERT_EQ(first->getNumChildren(), 1u);
    EXPECT_EQ(Assets().getPolygonCount(), 2);
    EXPECT_EQ(Assets().getVertexCount(), 4);

    EXPECT_EQ(Assets().loadModel(path, true), first);
    EXPECT_EQ(Assets().loadModel(path, false), first) << "the way it is placed makes no other model";
    EXPECT_EQ(Assets().getPolygonCount(), 2);

    std::wstring other = path;
    other.replace(other.rfind(L"\\"), 1, L"\\.\\");
    EXPECT_NE(Assets().loadModel(other, true), first);
    EXPECT_EQ(Assets().getPolygonCount(), 4);

    Touch(path, -10);
    EXPECT_EQ(Assets().loadModel(path, true), first) << "an older file is no newer one";
    Touch(path, 12);
    osg::ref_ptr<osg::Group> second = Assets().loadModel(path, true);
    EXPECT_NE(second, first);
    EXPECT_EQ(first->getNumChildren(), 1u) << "bodies that hold the older group keep showing it";
    EXPECT_EQ(Assets().loadModel(path, true), second);

    fs::remove(base::NativePath(path));
    EXPECT_EQ(Assets().loadModel(path, true), second);
    EXPECT_TRUE(messages.shown.empty());

    VtCOsgAssetManager::destroyInstance();
    EXPECT_EQ(Assets().loadModel(path, true)->getNumChildren(), 0u) << "a new instance starts empty";
    EXPECT_EQ(Assets().getPolygonCount(), 0);
}

TEST_F(AssetManager, AModelThatCantBeReadIsAGroupWithoutChildAndOneMessage)
{
    const std::wstring bad = base::InnerPath(Write("bad.dae", "<COLLADA"));
    const std::wstring missing = base::InnerPath(folder / "missing.wrl");
    for (const std::wstring& path : {bad, missing})
    {
        messages.shown.clear();
        osg::ref_ptr<osg::Group> group = Assets().loadModel(path, true);
        ASSERT_TRUE(group);
        EXPECT_EQ(group->getNumChildren(), 0u);
        EXPECT_EQ(Assets().loadModel(path, false), group);
        ASSERT_EQ(messages.shown.size(), 1u) << "once for each read";
        EXPECT_EQ(messages.shown[0].severity, host::Severity::error);
        EXPECT_EQ(messages.shown[0].number, 9001u);
        EXPECT_EQ(messages.shown[0].first, path);
        EXPECT_NE(messages.shown[0].second.find(path == bad ? L"well-formed" : L"no such file"), std::wstring::npos);
        EXPECT_EQ(Assets().getXmlAttributes(path), "");
        Assets().readModel(path, true);
        EXPECT_EQ(messages.shown.size(), 2u);
    }
}

TEST_F(AssetManager, LossesAreAWarningAndTheRestIsShown)
{
    const std::wstring path = base::InnerPath(
        Write("m.dae", Dae({{{"a", "", "t"}}, {{"t", "<phong><diffuse>TEXTURE</diffuse></phong>"}}, "1", "Y_UP", {}})));
    EXPECT_EQ(Assets().loadModel(path, true)->getNumChildren(), 1u);
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.shown[0].severity, host::Severity::warning);
    EXPECT_EQ(messages.shown[0].number, 9002u);
    EXPECT_EQ(messages.shown[0].second, L"the texture \"tex.png\" is missing");
}

TEST_F(AssetManager, RoadPartsAreFoundByTheNamesOfTheirNodesWhateverIsOptimized)
{
    const char* const names[] = {"x_road_geometry", "x_bump_geometry", "x_bumpbase_geometry"};
    File file{{}, {{"grey", "<lambert><diffuse><color>1 1 1 1</color></diffuse></lambert>"}}, "1", "Y_UP", {}};
    std::string vrml = "#VRML V2.0 utf8\n";
    for (const char* name : names)
    {
        file.squares.push_back({name, "<translate>0 0 1</translate>", "grey"});
        vrml += "Transform { translation 0 0 1 children " + WrlSquare(name, "material Material { }") + " }\n";
    }
    for (const std::string& path : {Write("Road.dae", Dae(file)), Write("Road.wrl", vrml)})
    {
        osg::ref_ptr<osg::Group> root = Assets().loadModel(base::InnerPath(path), false);
        const auto all = Geometries(*root);
        EXPECT_EQ(all.size(), 3u);
        for (const char* name : names)
        {
            ASSERT_TRUE(Find(all, name)) << name;
            EXPECT_FLOAT_EQ(Find(all, name)->box.zMin(), 1);
            // What a road does with its bump base: its parent out of its parent's parent, and in again in front.
            const osg::Geode& geode = *Find(all, name)->geode;
            ASSERT_EQ(geode.getNumParents(), 1u);
            ASSERT_EQ(geode.getParent(0)->getNumParents(), 1u);
        }
    }
}

TEST_F(AssetManager, OnlyGroupElementsAreNotOptimized)
{
    // Two sets of triangles with one material become one geometry, where merging is wanted.
    std::string text = Dae({{{"a", "", "grey"}},
                            {{"grey", "<lambert><diffuse><color>1 1 1 1</color></diffuse></lambert>"}},
                            "1",
                            "Y_UP",
                            {}});
    const std::size_t begin = text.find("<triangles");
    const std::size_t end = text.find("</triangles>") + 12;
    text.insert(end, text.substr(begin, end - begin));
    for (const auto& [file, geometries] :
         {std::pair{"GroupElements.dae", 1u}, {"GROUPElement.DAE", 2u}, {"theGroupElement.dae", 2u}})
        EXPECT_EQ(Geometries(*Assets().loadModel(base::InnerPath(Write(file, text)), false)).size(), geometries)
            << file;
}

TEST_F(AssetManager, NormalsAreCalculatedAnewWhenTheDescriptionAsks)
{
    struct Case
    {
        const char* text;
        std::optional<float> angle;
    };
    const Case cases[] = {
        {R"(<vtattr:Attribute name="recalc_normals"><vtattr:value>180</vtattr:value></vtattr:Attribute>)", 3.1415927f},
        {R"(<a/><vtattr:Attribute name="recalc_normals"> <x/><vtattr:value> 45.5deg</vtattr:value>)", 0.79412484f},
        {R"(<vtattr:Attribute name="recalc_normals"><vtattr:value>0</vtattr:value>)", 0.0f},
        {R"(<vtattr:Attribute name="recalc_normals"><vtattr:value></vtattr:value>)", 0.0f},
        {R"(<vtattr:Attribute name="recalc_normals"></vtattr:Attribute>)", std::nullopt},
        {R"(<vtattr:value>30</vtattr:value><vtattr:Attribute name="recalc_normals">)", std::nullopt},
        {R"(<vtattr:Attribute name="other"><vtattr:value>30</vtattr:value></vtattr:Attribute>)", std::nullopt},
        {"", std::nullopt},
    };
    for (const Case& c : cases)
        EXPECT_EQ(GetRecalculationAngle(c.text), c.angle) << c.text;

    // A square whose file has its normals the wrong way round.
    std::string text = Dae({{{"a", "", ""}}, {}, "1", "Y_UP", {}});
    text.replace(text.find(">0 0 1<"), 7, ">0 0 -1<");
    for (const bool asks : {false, true})
    {
        const std::string name = asks ? "asks/m.dae" : "plain/m.dae";
        const std::string path = Write(name, text);
        if (asks)
            Write("asks/Imported.xml", cases[0].text);
        osg::ref_ptr<osg::Group> root = Assets().loadModel(base::InnerPath(path), true);
        EXPECT_EQ(Assets().getXmlAttributes(base::InnerPath(path)), asks ? cases[0].text : "");
        const auto all = Geometries(*root);
        ASSERT_EQ(all.size(), 1u);
        const auto& normals = dynamic_cast<const osg::Vec3Array&>(*all[0].geometry->getNormalArray());
        for (const osg::Vec3& normal : normals)
            EXPECT_NEAR(normal.z(), asks ? 1.0 : -1.0, 1e-5);
    }
}

TEST_F(AssetManager, TheOldLibraryIsSeenFromBothSides)
{
    struct Case
    {
        const char* folder;
        bool twoSided;
    };
    const Case cases[] = {{"Vantor Objects/OLD(prior GLD 2.3)/A", true}, {"Vantor Objects/Old/A", false}};
    for (const Case& c : cases)
    {
        const osg::StateSet* state = Assets().loadModel(Square(std::string(c.folder) + "/m.dae"), false)->getStateSet();
        ASSERT_EQ(state != nullptr, c.twoSided) << c.folder;
        if (!state)
            continue;
        EXPECT_EQ(state->getMode(GL_CULL_FACE), static_cast<unsigned>(osg::StateAttribute::OVERRIDE));
        const auto* pair = state->getAttributePair(osg::StateAttribute::LIGHTMODEL);
        ASSERT_TRUE(pair);
        EXPECT_EQ(pair->second, overriding);
        EXPECT_TRUE(dynamic_cast<const osg::LightModel&>(*pair->first).getTwoSided());
    }
}

TEST_F(AssetManager, AProgramKeepsItsFirstFilesAndSharesShadersByPath)
{
    const std::wstring vertex = Shader("a.vert");
    const std::wstring missing = base::InnerPath(folder / "Assets" / "b.frag");
    Assets().createProgram(L"one", vertex, missing);
    EXPECT_FALSE(Assets().getProgram(L"one")) << "without one of its shaders there is no program";

    const std::wstring fragment = Shader("b.frag"); // the file comes later: the next call finds it
    Assets().createProgram(L"one", vertex, fragment);
    osg::ref_ptr<osg::Program> one = Assets().getProgram(L"one");
    ASSERT_TRUE(one);
    EXPECT_EQ(one->getName(), "one");
    ASSERT_EQ(one->getNumShaders(), 2u);
    EXPECT_EQ(one->getShader(0)->getType(), osg::Shader::VERTEX);
    EXPECT_EQ(one->getShader(1)->getType(), osg::Shader::FRAGMENT);
    EXPECT_EQ(one->getAttribBindingList().at("Tangent"), 6u);
    EXPECT_EQ(one->getAttribBindingList().at("Binormal"), 7u);

    Assets().createProgram(L"one", Shader("c.vert"), fragment);
    EXPECT_EQ(Assets().getProgram(L"one"), one);
    EXPECT_EQ(one->getShader(0)->getFileName(), base::NativePath(vertex).string());

    Assets().createProgram(L"two", vertex, Shader("d.frag"));
    EXPECT_EQ(Assets().getProgram(L"two")->getShader(0), one->getShader(0));
    osg::ref_ptr<osg::Shader> shared = one->getShader(0);
    EXPECT_NE(shared->getShaderSource(), "");
    VtCOsgAssetManager::destroyInstance();
    EXPECT_EQ(shared->getShaderSource(), "");
}

TEST_F(AssetManager, AProgramGoesWhereItsNameSays)
{
    const std::wstring vertex = Shader("a.vert");
    const std::wstring fragment = Shader("a.frag");
    struct Case
    {
        const wchar_t* name;
        bool onNode;
        unsigned value;
    };
    const Case cases[] = {
        {L"streetShader", true, plain}, {L"bumpBaseShader", true, overriding}, {L"streetshader", false, plain}};
    for (const Case& c : cases)
    {
        osg::ref_ptr<osg::Group> node = new osg::Group;
        osg::ref_ptr<osg::Geode> geode = new osg::Geode;
        geode->addDrawable(new osg::Geometry);
        node->addChild(geode);
        Assets().assignShader(node, c.name, vertex, fragment);
        const auto* onNode = ProgramOf(node->getStateSet());
        const auto* onDrawable = ProgramOf(geode->getDrawable(0)->getStateSet());
        EXPECT_EQ(onNode != nullptr, c.onNode);
        EXPECT_EQ(onDrawable != nullptr, !c.onNode);
        EXPECT_EQ((c.onNode ? onNode : onDrawable)->second, c.value);
        EXPECT_EQ((c.onNode ? onNode : onDrawable)->first, Assets().getProgram(c.name));
    }
    osg::ref_ptr<osg::Geometry> drawable = new osg::Geometry;
    Assets().assignDrawableShader(drawable, L"streetShader", vertex, fragment);
    EXPECT_EQ(ProgramOf(drawable->getStateSet())->second, overriding);

    Assets().assignShader(nullptr, L"x", vertex, fragment);
    Assets().assignDrawableShader(nullptr, L"x", vertex, fragment);
    EXPECT_FALSE(Assets().getProgram(L"x"));

    osg::ref_ptr<osg::Group> without = new osg::Group;
    Assets().assignShader(without, L"missing", L"\\no.vert", L"\\no.frag");
    EXPECT_FALSE(without->getStateSet());
}

TEST_F(AssetManager, ShaderParametersOfADescriptionTakeEffectOrAreIgnored)
{
    Assets().createProgram(L"p", Shader("a.vert"), Shader("a.frag"));
    osg::ref_ptr<osg::Group> node = new osg::Group;
    Assets().setShaderParameter(node, L"uniform", L"u", L"float", L"1", L"p");
    Assets().setShaderParameter(node, L"varying", L"v", L"vertexAttribBinding", L"4", L"");
    Assets().setShaderParameter(node, L"varying", L"v", L"vertexAttribBinding", L"4", L"unknown");
    Assets().setShaderParameter(node, L"varying", L"v", L"sampler2D", L"4", L"p");
    Assets().setShaderParameter(nullptr, L"uniform", L"u", L"int", L"1", L"p");
    EXPECT_FALSE(node->getStateSet());
    EXPECT_FALSE(Assets().getProgram(L"p")->getAttribBindingList().contains("v"));

    Assets().setShaderParameter(node, L"varying", L"SecondaryColor", L"vertexAttribBinding", L"4", L"p");
    EXPECT_EQ(Assets().getProgram(L"p")->getAttribBindingList().at("SecondaryColor"), 4u);
    Assets().setShaderParameter(node, L"uniform", L"decalMap", L"sampler2D", L"2", L"");
    Assets().setShaderParameter(node, L"uniform", L"mode", L"int", L" 7x", L"");
    for (const auto& [name, value] : {std::pair{"decalMap", 2}, {"mode", 7}})
    {
        const auto* pair = node->getStateSet()->getUniformPair(name);
        ASSERT_TRUE(pair) << name;
        int stored = 0;
        EXPECT_TRUE(pair->first->get(stored));
        EXPECT_EQ(stored, value);
        EXPECT_EQ(pair->second, overriding);
    }
}

TEST_F(AssetManager, ASurfaceWithAShaderOfItsOwnKeepsItThroughTheOptimizer)
{
    Shader("glow.vert");
    Shader("glow.frag");
    // Two surfaces of one geode that differ in nothing but the shader asked for.
    std::string text = Dae({{{"a", "", "one"}},
                            {{"one", "<lambert><diffuse><color>1 1 1 1</color></diffuse></lambert>"},
                             {"two", "<lambert><diffuse><color>1 1 1 1</color></diffuse></lambert>"}},
                            "1",
                            "Y_UP",
                            {}});
    const std::size_t begin = text.find("<triangles");
    const std::size_t end = text.find("</triangles>") + 12;
    std::string second = text.substr(begin, end - begin);
    second.replace(second.find("material=\"m\""), 12, "material=\"k\"");
    text.insert(end, second);
    text.insert(text.find("<instance_material"), "<instance_material symbol=\"k\" target=\"#two\"/>");
    const std::string path = Write("m.dae", text);
    Write("Imported.xml",
          R"(<r><vtattr:Attribute name="shader:two"><vtattr:value>glow</vtattr:value></vtattr:Attribute></r>)");

    osg::ref_ptr<osg::Group> root = Assets().loadModel(base::InnerPath(path), true);
    int with = 0;
    const auto all = Geometries(*root);
    ASSERT_EQ(all.size(), 2u);
    for (const Placed& placed : all)
        if (const auto* pair = ProgramOf(placed.geometry->getStateSet()))
        {
            ++with;
            EXPECT_EQ(pair->second, overriding);
            EXPECT_EQ(pair->first, Assets().getProgram(L"glow"));
        }
    EXPECT_EQ(with, 1);
    EXPECT_EQ(Assets().getShaderDirectory(), paths.module + L"..\\Assets\\");
}

TEST_F(AssetManager, ACopySharesWhatIsHeavyAndNothingElse)
{
    WritePicture("tex.png", 16);
    const std::wstring path = base::InnerPath(
        Write("m.dae", Dae({{{"a", "", "t"}}, {{"t", "<phong><diffuse>TEXTURE</diffuse></phong>"}}, "1", "Y_UP", {}})));
    osg::ref_ptr<osg::Group> model = Assets().loadModel(path, true);
    osg::ref_ptr<osg::Node> copy = VtCOsgAssetManager::cloneNode(model);
    EXPECT_EQ(copy->referenceCount(), 1);
    const osg::Geometry& a = *Geometries(*model).at(0).geometry;
    const osg::Geometry& b = *Geometries(*copy).at(0).geometry;
    EXPECT_NE(&a, &b);
    EXPECT_NE(a.getVertexArray(), b.getVertexArray());
    EXPECT_NE(a.getStateSet(), b.getStateSet());
    EXPECT_NE(a.getStateSet()->getAttribute(osg::StateAttribute::MATERIAL),
              b.getStateSet()->getAttribute(osg::StateAttribute::MATERIAL));
    EXPECT_EQ(a.getStateSet()->getTextureAttribute(0, osg::StateAttribute::TEXTURE),
              b.getStateSet()->getTextureAttribute(0, osg::StateAttribute::TEXTURE));
    EXPECT_EQ(VtCOsgAssetManager::cloneNode(nullptr), nullptr);
}

TEST_F(AssetManager, AReferenceToTheLibraryOutlivesTheInstance)
{
    VtIModelLibrary& library = VtCOsgAssetManager::getLibrary();
    const std::wstring path = Square("m.dae");
    osg::ref_ptr<osg::Group> first = library.loadModel(path, true);
    VtCOsgAssetManager::destroyInstance();
    osg::ref_ptr<osg::Group> second = library.loadModel(path, true);
    EXPECT_NE(first, second);
    EXPECT_EQ(second, Assets().loadModel(path, true));
}

TEST(AssetVisitors, FindTexturesWhereTheyAreLookedFor)
{
    const auto state = [](const char* name, int size, GLenum format, unsigned unit)
    {
        osg::ref_ptr<osg::Image> image = new osg::Image;
        image->allocateImage(size, size, 1, format, GL_UNSIGNED_BYTE);
        image->setInternalTextureFormat(static_cast<GLint>(format));
        image->setFileName(name);
        osg::ref_ptr<osg::StateSet> made = new osg::StateSet;
        made->setTextureAttribute(unit, new osg::Texture2D(image));
        return made;
    };
    osg::ref_ptr<osg::Group> root = new osg::Group;
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    for (int i = 0; i < 4; ++i)
        geode->addDrawable(new osg::Geometry);
    root->addChild(geode);
    root->setStateSet(state("root.png", 1024, GL_RGBA, 0));
    geode->setStateSet(state("geode.png", 512, GL_RGB, 0));
    geode->getDrawable(0)->setStateSet(state("\xC3\xA4.png", 256, GL_LUMINANCE, 0));
    geode->getDrawable(1)->setStateSet(geode->getDrawable(0)->getStateSet());
    geode->getDrawable(2)->setStateSet(state("unit7.png", 64, GL_RGB, 7));
    geode->getDrawable(3)->setStateSet(state("unit8.png", 2048, GL_RGBA, 8));

    VtCOsgTextureCollector collector;
    root->accept(collector);
    EXPECT_EQ(collector.fileNames, (std::vector<std::wstring>{L"root.png", L"\u00E4.png"}));

    // 4 bytes a pixel for RGBA, 3 for all other formats of these.
    VtCOsgTextureSizeVisitor sizes;
    root->accept(sizes);
    EXPECT_EQ(sizes.textureSizes.size(), 4u);
    const float bytes = 1024 * 1024 * 4 + 512 * 512 * 3 + 256 * 256 * 3 + 64 * 64 * 3;
    EXPECT_FLOAT_EQ(sizes.getTotalSize(0), bytes);
    EXPECT_FLOAT_EQ(sizes.getTotalSize(-1), bytes);
    EXPECT_FLOAT_EQ(sizes.getTotalSize(2), bytes / 1048576);

    VtCOsgAssetManager::VtCOsgDrawableCollector drawables;
    root->accept(drawables);
    EXPECT_EQ(drawables.drawables, (std::vector<osg::Drawable*>{geode->getDrawable(0), geode->getDrawable(1),
                                                                geode->getDrawable(2), geode->getDrawable(3)}));
}

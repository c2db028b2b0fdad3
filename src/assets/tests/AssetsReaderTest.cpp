#include <algorithm>
#include <fstream>
#include <iterator>

#include <osg/BlendColor>
#include <osg/BlendFunc>
#include <osg/Material>
#include <osg/ProxyNode>
#include <osg/Texture2D>
#include <osgDB/Registry>

#include "assets/models/ModelReader.h"
#include "AssetsFixture.h"
#include "base/Paths.h"
#include "base/Text.h"

namespace fs = std::filesystem;

namespace
{

using ShaderNodes = std::map<osg::Drawable*, std::string>;

class AssetsReader : public AssetsFixture
{
protected:
    osg::ref_ptr<osgDB::Options> Options() const
    {
        const std::pair<const char*, const char*> values[] = {
            {"useShininess", "30.0"}, {"useAmbientIntensity", "0.7"},    {"useSpecularity", "1.0"},
            {"autoloadProxies", "0"}, {"glidePanelAssignsShaders", "1"}, {"useMaxTexAnisotropy", "8"}};
        osg::ref_ptr<osgDB::Options> made = new osgDB::Options;
        for (const auto& [key, value] : values)
            made->setPluginStringData(key, value);
        return made;
    }

    /// The model read with `reader`, or null with the reason in `error`.
    osg::ref_ptr<osg::Node> Read(const VtCModelReader& with, const std::string& path)
    {
        options = Options();
        osgDB::ReaderWriter::ReadResult result = with.readNode(path, options);
        error = result.message();
        return result.getNode();
    }

    osg::ref_ptr<osg::Node> Read(const std::string& path)
    {
        reader = new VtCModelReader(Settings());
        return Read(*reader, path);
    }

    osg::ref_ptr<VtCModelReader> reader;
    osg::ref_ptr<osgDB::Options> options;
    std::string error;
};

const osg::Material& MaterialOf(const osg::Geometry& geometry)
{
    return dynamic_cast<const osg::Material&>(*geometry.getStateSet()->getAttribute(osg::StateAttribute::MATERIAL));
}

const osg::Texture2D* TextureOf(const osg::Geometry& geometry, unsigned unit = 0)
{
    return dynamic_cast<const osg::Texture2D*>(
        geometry.getStateSet()->getTextureAttribute(unit, osg::StateAttribute::TEXTURE));
}

void ExpectBox(const osg::BoundingBox& box, const osg::Vec3& low, const osg::Vec3& high)
{
    EXPECT_LT((box._min - low).length(), 1e-5) << box._min.x() << ' ' << box._min.y() << ' ' << box._min.z();
    EXPECT_LT((box._max - high).length(), 1e-5) << box._max.x() << ' ' << box._max.y() << ' ' << box._max.z();
}

} // namespace

TEST_F(AssetsReader, ModelsStandYUpInMetresWhateverTheirFileSays)
{
    // The square spans x and y at z = 4, moved 2 along the file's x.
    const std::string move = "<translate>2 0 4</translate>";
    struct Case
    {
        const char* up;
        const char* unit;
        osg::Vec3 low, high;
    };
    const Case cases[] = {
        {"Y_UP", "1", {2, 0, 4}, {3, 1, 4}},
        {"Y_UP", "0.0254", {2 * 0.0254f, 0, 4 * 0.0254f}, {3 * 0.0254f, 0.0254f, 4 * 0.0254f}},
        {"Z_UP", "1", {2, 4, -1}, {3, 4, 0}},                  // z becomes up, y goes away from the viewer
        {"X_UP", "0.1", {-0.1f, 0.2f, 0.4f}, {0, 0.3f, 0.4f}}, // x becomes up, -y goes right
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(std::string(c.up) + " " + c.unit);
        const auto node = Read(Write("m.dae", Dae({{{"a", move, ""}}, {}, c.unit, c.up, {}})));
        ASSERT_TRUE(node) << error;
        const auto all = Geometries(*node);
        ASSERT_EQ(all.size(), 1u);
        ExpectBox(all[0].box, c.low, c.high);
    }

    const std::string vrml = Write("m.wrl", "#VRML V2.0 utf8\nTransform { translation 2 0 4 children [ " +
                                                WrlSquare("a", "material Material { }") + " ] }");
    const auto node = Read(vrml);
    ASSERT_TRUE(node) << error;
    ExpectBox(Geometries(*node).at(0).box, {2, 0, 4}, {3, 1, 4});

    // Who asks for the turn gets it: up is z then, and what looked at the viewer looks along -y.
    options->setPluginStringData("useVrmlTransform", "1");
    const auto turned = reader->readNode(vrml, options);
    ASSERT_TRUE(turned.success());
    ExpectBox(Geometries(*osgDB::ReaderWriter::ReadResult(turned).getNode()).at(0).box, {2, -4, 0}, {3, -4, 1});
}

TEST_F(AssetsReader, ASquareUsedTwiceStandsInBothPlaces)
{
    const auto node =
        Read(Write("m.dae", Dae({{{"left", "<translate>-3 0 0</translate>", ""}, {"right", "<scale>2 2 2</scale>", ""}},
                                 {},
                                 "1",
                                 "Y_UP",
                                 {}})));
    ASSERT_TRUE(node) << error;
    const auto all = Geometries(*node);
    ASSERT_TRUE(Find(all, "left") && Find(all, "right"));
    ExpectBox(Find(all, "left")->box, {-3, 0, 0}, {-2, 1, 0});
    ExpectBox(Find(all, "right")->box, {0, 0, 0}, {2, 2, 0});
}

TEST_F(AssetsReader, AMirroredPartShowsItsFront)
{
    const auto node = Read(Write("m.dae", Dae({{{"as it is", "<scale>1 1 1</scale>", ""},
                                                {"mirrored", "<scale>-1 1 1</scale>", ""},
                                                {"mirrored twice", "<scale>-1 -1 1</scale>", ""}},
                                               {},
                                               "1",
                                               "Y_UP",
                                               {}})));
    ASSERT_TRUE(node) << error;
    const auto all = Geometries(*node);
    ASSERT_EQ(all.size(), 3u);
    for (const Placed& placed : all)
    {
        SCOPED_TRACE(placed.geode->getName());
        const auto& vertices = dynamic_cast<const osg::Vec3Array&>(*placed.geometry->getVertexArray());
        const osg::PrimitiveSet& set = *placed.geometry->getPrimitiveSet(0);
        ASSERT_EQ(set.getNumIndices(), 6u);
        for (unsigned i = 0; i < 6; i += 3)
        {
            const osg::Vec3 a = vertices[set.index(i)], b = vertices[set.index(i + 1)], c = vertices[set.index(i + 2)];
            EXPECT_GT(((b - a) ^ (c - a)).z(), 0) << "it looks away";
        }
    }
}

TEST_F(AssetsReader, MaterialAndTextureStandOnTheDrawableWithDefaultsOnlyWhereTheFileIsSilent)
{
    WritePicture("tex.png", 16);
    struct Case
    {
        const char* name;
        const char* collada;
        const char* vrml;
        osg::Vec4 diffuse, ambient, specular;
        float shininess;
        bool texture;
    };
    const Case cases[] = {
        {"silent",
         "<phong><diffuse><color>0.5 1 0 1</color></diffuse></phong>",
         "material Material { diffuseColor 0.5 1 0 }",
         {0.5f, 1, 0, 1},
         {0.35f, 0.7f, 0, 1},
         {1, 1, 1, 1},
         30,
         false},
        {"told",
         "<blinn><ambient><color>0.1 0.2 0.3 1</color></ambient><diffuse><color>1 0 0 1</color></diffuse>"
         "<specular><color>0.5 0.5 0.5 1</color></specular><shininess><float>16</float></shininess></blinn>",
         "material Material { diffuseColor 1 0 0 ambientIntensity 0.5 specularColor 0.5 0.5 0.5 shininess 0.125 }",
         {1, 0, 0, 1},
         {0.1f, 0.2f, 0.3f, 1},
         {0.5f, 0.5f, 0.5f, 1},
         16,
         false},
        {"textured",
         "<phong><diffuse>TEXTURE</diffuse></phong>",
         "material Material { diffuseColor 1 1 1 } texture ImageTexture { url [ \"none.png\" \"TEX.png\" ] }",
         {1, 1, 1, 1},
         {0.7f, 0.7f, 0.7f, 1},
         {1, 1, 1, 1},
         30,
         true},
        {"dull",
         "<lambert><diffuse><color>0 0 1 1</color></diffuse></lambert>",
         "material Material { diffuseColor 0 0 1 specularColor 0 0 0 shininess 0 }",
         {0, 0, 1, 1},
         {0, 0, 0.7f, 1},
         {0, 0, 0, 1},
         0,
         false},
    };
    File file;
    std::string vrml = "#VRML V2.0 utf8\n# a comment with a { brace\n";
    for (const Case& c : cases)
    {
        file.squares.push_back({c.name, "", c.name});
        file.effects[c.name] = c.collada;
        vrml += WrlSquare(c.name, c.vrml);
    }
    for (const std::string& path : {Write("m.dae", Dae(file)), Write("m.wrl", vrml)})
    {
        const auto node = Read(path);
        ASSERT_TRUE(node) << error;
        EXPECT_EQ(options->getPluginStringData("readWarnings"), "");
        const auto all = Geometries(*node);
        for (const Case& c : cases)
        {
            SCOPED_TRACE(path + " " + c.name);
            ASSERT_TRUE(Find(all, c.name));
            const osg::Geometry& geometry = *Find(all, c.name)->geometry;
            EXPECT_FALSE(Find(all, c.name)->geode->getStateSet());
            EXPECT_FALSE(geometry.getColorArray()) << "a dye would show nothing";
            const osg::Material& material = MaterialOf(geometry);
            const bool isVrmlTold = c.name == std::string("told") && path.ends_with(".wrl");
            EXPECT_LT((material.getDiffuse(osg::Material::FRONT) - c.diffuse).length(), 1e-4);
            EXPECT_LT((material.getAmbient(osg::Material::FRONT) - (isVrmlTold ? osg::Vec4(0.5f, 0, 0, 1) : c.ambient))
                          .length(),
                      1e-4);
            EXPECT_LT((material.getSpecular(osg::Material::FRONT) - c.specular).length(), 1e-4);
            EXPECT_NEAR(material.getShininess(osg::Material::FRONT), c.shininess, 1e-3);

            const osg::Texture2D* texture = TextureOf(geometry);
            ASSERT_EQ(texture != nullptr, c.texture);
            if (!texture)
                continue;
            EXPECT_EQ(texture->getImage()->getFileName(), (folder / "tex.png").string());
            EXPECT_EQ(texture->getMaxAnisotropy(), 8.0f);
            EXPECT_EQ(texture->getFilter(osg::Texture::MIN_FILTER), osg::Texture::LINEAR_MIPMAP_LINEAR);
            EXPECT_FALSE(texture->getUnRefImageDataAfterApply());
            ASSERT_TRUE(geometry.getTexCoordArray(0));
            EXPECT_EQ(geometry.getTexCoordArray(0)->getNumElements(), geometry.getVertexArray()->getNumElements());
        }
        // Four squares of two triangles; the square of COLLADA keeps its four corners, and so does VRML's.
        EXPECT_EQ(options->getPluginStringData("polygonCount"), "8");
        EXPECT_EQ(options->getPluginStringData("vertexCount"), "16");
        EXPECT_EQ(options->getPluginStringData("textureMemoryUsed"), std::to_string(16 * 16 * 3));
    }
}

TEST_F(AssetsReader, FacesSeenFromBothSidesAndThroughStayThatWay)
{
    WritePicture("tex.png", 16, true);
    const auto node =
        Read(Write("m.wrl", "#VRML V2.0 utf8\n" + WrlSquare("plain", "material Material { }", "solid TRUE") +
                                WrlSquare("leaf", "material Material { }", "solid FALSE") +
                                "Transform { translation 5 0 0 children USE leaf }\n" +
                                WrlSquare("fence", "texture ImageTexture { url \"tex.png\" }")));
    ASSERT_TRUE(node) << error;
    const auto all = Geometries(*node);
    ASSERT_EQ(all.size(), 4u);
    for (const Placed& placed : all)
    {
        SCOPED_TRACE(placed.geode->getName());
        const osg::StateSet& state = *placed.geometry->getStateSet();
        const bool isLeaf = placed.geode->getName() == "leaf";
        EXPECT_EQ(state.getMode(GL_CULL_FACE), isLeaf ? osg::StateAttribute::OFF : osg::StateAttribute::INHERIT);
        const bool blends = state.getMode(GL_BLEND) == osg::StateAttribute::ON;
        EXPECT_EQ(blends, placed.geode->getName() == "fence");
        EXPECT_EQ(state.getRenderingHint() == osg::StateSet::TRANSPARENT_BIN, blends);
    }
}

TEST_F(AssetsReader, ASkinStandsAsItIsAndAHalfTransparentSurfaceIsSeenByHalf)
{
    // Callbacks of the skin's own classes came along, and ended the first picture.
    std::string skin = Dae({{},
                            {},
                            "1",
                            "Y_UP",
                            "<node id=\"bone\" sid=\"bone\" type=\"JOINT\"/><node name=\"body\">"
                            "<instance_controller url=\"#c\"><skeleton>#bone</skeleton></instance_controller></node>"});
    const auto list =
        [](const std::string& id, const char* array, const std::string& values, const char* stride, const char* type)
    {
        const std::string count = std::to_string(1 + std::count(values.begin(), values.end(), ' '));
        return "<source id=\"" + id + "\"><" + array + " id=\"" + id + "a\" count=\"" + count + "\">" + values + "</" +
               array + "><technique_common><accessor source=\"#" + id + "a\" count=\"1\" stride=\"" + stride +
               "\"><param type=\"" + type + "\"/></accessor></technique_common></source>";
    };
    skin.insert(skin.find("<library_visual_scenes>"),
                "<library_controllers><controller id=\"c\"><skin source=\"#square\">" +
                    list("j", "Name_array", "bone", "1", "name") +
                    list("b", "float_array", "1 0 0 0 0 1 0 0 0 0 1 0 0 0 0 1", "16", "float4x4") +
                    list("w", "float_array", "1", "1", "float") +
                    "<joints><input semantic=\"JOINT\" source=\"#j\"/><input semantic=\"INV_BIND_MATRIX\" "
                    "source=\"#b\"/></joints><vertex_weights count=\"4\"><input semantic=\"JOINT\" source=\"#j\" "
                    "offset=\"0\"/><input semantic=\"WEIGHT\" source=\"#w\" offset=\"1\"/><vcount>1 1 1 1</vcount>"
                    "<v>0 0 0 0 0 0 0 0</v></vertex_weights></skin></controller></library_controllers>");
    const auto body = Read(Write("skin.dae", skin));
    ASSERT_TRUE(body) << error;
    ASSERT_EQ(Geometries(*body).size(), 1u);
    const osg::Geometry& shape = *Geometries(*body).at(0).geometry;
    EXPECT_STREQ(shape.className(), "Geometry");
    EXPECT_FALSE(shape.getUpdateCallback() || shape.getComputeBoundingBoxCallback());
    ExpectBox(Geometries(*body).at(0).box, {0, 0, 0}, {1, 1, 0});

    const char* const ways[] = {
        "<transparent opaque=\"A_ONE\"><color>1 1 1 "
        "1</color></transparent><transparency><float>0.5</float></transparency>",
        "<transparent opaque=\"RGB_ZERO\"><color>0.5 0.5 0.5 0.5</color></transparent>"
        "<transparency><float>1</float></transparency>",
        "<transparency><float>0.5</float></transparency>",
    };
    for (const char* way : ways)
    {
        SCOPED_TRACE(way);
        const auto pane = Read(Write("pane.dae", Dae({{{"a", "", "g"}},
                                                      {{"g", std::string("<lambert><diffuse><color>1 0 0 1</color>"
                                                                         "</diffuse>") +
                                                                 way + "</lambert>"}},
                                                      "1",
                                                      "Y_UP",
                                                      {}})));
        ASSERT_TRUE(pane) << error;
        const osg::StateSet& state = *Geometries(*pane).at(0).geometry->getStateSet();
        EXPECT_EQ(state.getRenderingHint(), osg::StateSet::TRANSPARENT_BIN);
        const auto* colour = dynamic_cast<const osg::BlendColor*>(state.getAttribute(osg::StateAttribute::BLENDCOLOR));
        ASSERT_TRUE(colour);
        EXPECT_NEAR(colour->getConstantColor().a(), 0.5, 0.01);
    }
}

TEST_F(AssetsReader, PartsOfAGroupAreNamedAndNotLoaded)
{
    const std::string part =
        Write("Sub Parts/Wheel.wrl", "#VRML V2.0 utf8\n" + WrlSquare("w", "material Material { }"));
    const std::string inner = base::Utf8(base::InnerPath(part));
    const std::string vrml = "#VRML V2.0 utf8\nDEF id-1 Transform { children Inline { url \"sub parts/wheel.wrl\" } }\n"
                             "DEF id-2 Inline { url [ \"Sub Parts/Wheel.wrl\" ] }\n";
    const std::string collada = Dae({{},
                                     {},
                                     "1",
                                     "Y_UP",
                                     "<node id=\"id-1\"><instance_node url=\"./Sub Parts/Wheel.wrl#x\"/></node>"
                                     "<node id=\"other\" name=\"id-2\"><instance_node url=\"file://" +
                                         part + "\"/></node>"});
    for (const auto& [name, text] : {std::pair{"GroupElement.wrl", vrml}, {"GroupElement.dae", collada}})
    {
        SCOPED_TRACE(name);
        const auto node = Read(Write(name, text));
        ASSERT_TRUE(node) << error;
        osg::Group& root = *node->asGroup();
        auto* proxy = dynamic_cast<osg::ProxyNode*>(root.getChild(root.getNumChildren() - 1));
        ASSERT_TRUE(proxy);
        ASSERT_EQ(proxy->getNumChildren(), 2u);
        ASSERT_EQ(proxy->getNumFileNames(), 2u);
        for (unsigned i = 0; i < 2; ++i)
        {
            EXPECT_EQ(proxy->getChild(i)->getName(), "id-" + std::to_string(i + 1));
            EXPECT_EQ(proxy->getFileName(i), inner);
        }
        EXPECT_TRUE(Geometries(*node).empty());
    }

    // Without the option an inlined file is part of the model.
    osg::ref_ptr<osgDB::Options> loading = new osgDB::Options;
    auto loaded = reader->readNode((folder / "GroupElement.wrl").string(), loading);
    ASSERT_TRUE(loaded.validNode()) << loaded.message();
    EXPECT_EQ(Geometries(*loaded.getNode()).size(), 2u);
}

TEST_F(AssetsReader, TheDescriptionGivesShadersTangentsAndFurtherTextures)
{
    WritePicture("tex.png", 8);
    WritePicture("decal.png", 8);
    const std::string dae = Write("m.dae", Dae({{{"hood", "", "paint"}, {"pane", "<rotate>0 0 1 90</rotate>", "glass"}},
                                                {{"paint", "<phong><diffuse>TEXTURE</diffuse></phong>"},
                                                 {"glass", "<phong><diffuse>TEXTURE</diffuse></phong>"}},
                                                "1",
                                                "Y_UP",
                                                {}}));
    const std::string text =
        "<vtattr:Attributes><vtattr:Attribute name=\"shader:PANE\"><vtattr:value>glow</vtattr:value>"
        "</vtattr:Attribute><vtattr:Attribute name=\"texture:2:paint\"><vtattr:value>decal.png"
        "</vtattr:value></vtattr:Attribute></vtattr:Attributes>";
    Write("Imported.xml", text);
    const auto node = Read(dae);
    ASSERT_TRUE(node) << error;
    EXPECT_EQ(options->getPluginStringData("xmlAttributes"), text);
    const auto all = Geometries(*node);
    const osg::Geometry& hood = *Find(all, "hood")->geometry;
    osg::Geometry& pane = *Find(all, "pane")->geometry;

    const auto* wishes = static_cast<const ShaderNodes*>(options->getPluginData("shaderNodes"));
    ASSERT_TRUE(wishes);
    EXPECT_EQ(*wishes, (ShaderNodes{{&pane, "glow"}}));
    EXPECT_FALSE(hood.getVertexAttribArray(6));
    ASSERT_TRUE(pane.getVertexAttribArray(6) && pane.getVertexAttribArray(7));
    // The texture's u runs along the square's x, which the node's quarter turn about z makes y; v runs along -x.
    const auto& tangents = dynamic_cast<const osg::Vec4Array&>(*pane.getVertexAttribArray(6));
    const auto& binormals = dynamic_cast<const osg::Vec4Array&>(*pane.getVertexAttribArray(7));
    ASSERT_EQ(tangents.size(), pane.getVertexArray()->getNumElements());
    for (unsigned i = 0; i < tangents.size(); ++i)
    {
        EXPECT_LT((osg::Vec3(tangents[i].x(), tangents[i].y(), tangents[i].z()) - osg::Vec3(0, 1, 0)).length(), 1e-4);
        EXPECT_LT((osg::Vec3(binormals[i].x(), binormals[i].y(), binormals[i].z()) - osg::Vec3(-1, 0, 0)).length(),
                  1e-4);
    }
    ASSERT_TRUE(TextureOf(hood, 2));
    EXPECT_EQ(TextureOf(hood, 2)->getImage()->getFileName(), (folder / "decal.png").string());
    EXPECT_FALSE(TextureOf(pane, 2));

    // A road's shader reads tangents on every surface.
    Write("Imported.xml", "<a:Attribute name=\"basetexture\"/><a:Attribute name=\"decalMap\"/>"
                          "<a:Attribute name=\"batterTexture\"/>");
    const auto road = Read(dae);
    ASSERT_TRUE(road) << error;
    for (const Placed& placed : Geometries(*road))
        EXPECT_TRUE(placed.geometry->getVertexAttribArray(6)) << placed.geode->getName();
    EXPECT_TRUE(static_cast<const ShaderNodes*>(options->getPluginData("shaderNodes"))->empty());
}

TEST_F(AssetsReader, ABadFileGivesAReason)
{
    const std::string good = Dae({{{"a", "", ""}}, {}, "1", "Y_UP", {}});
    const auto with = [&](const std::string& what, const std::string& instead)
    {
        std::string text = good;
        text.replace(text.find(what), what.size(), instead);
        return text;
    };
    struct Case
    {
        const char* file;
        std::string content;
        const char* reason;
    };
    std::string deep = "#VRML V2.0 utf8\n";
    for (int i = 0; i < 5000; ++i)
        deep += "Group { children [ ";
    const Case cases[] = {
        {"empty.dae", "", "empty"},
        {"half.dae", good.substr(0, good.size() / 2), "well-formed"},
        {"other.dae", "<html></html>", "no COLLADA"},
        {"newer.dae", with("1.4.1", "1.5.0"), "1.5.0"},
        {"itself.dae", with("<node id=\"a-id\" name=\"a\">", "<node id=\"a-id\"><instance_node url=\"#a-id\"/>"),
         "contains itself"},
        {"nothing.dae", Dae({}), "no geometry"},
        {"other.wrl", "this is no VRML", "nothing"},
        {"node.wrl", "#VRML V2.0 utf8\nShape { geometry Foo { } }", "``Foo'' not recognized. Occurred at line 2"},
        {"half.wrl", "#VRML V2.0 utf8\nGroup { children [", "middle of a node"},
        {"brackets.wrl", "#VRML V2.0 utf8\nGroup { children ] }", "brackets"},
        {"deep.wrl", deep, "nested too deeply"},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.file);
        EXPECT_FALSE(Read(Write(c.file, c.content)));
        EXPECT_NE(error.find(c.reason), std::string::npos) << error;
    }
    EXPECT_FALSE(Read((folder / "none.dae").string()));
    EXPECT_EQ(error, "there is no such file");
    fs::create_directories(folder / "folder.dae");
    EXPECT_FALSE(Read((folder / "folder.dae").string()));
    EXPECT_EQ(error, "it is no file");
}

TEST_F(AssetsReader, ABadPartIsLeftOutAndTold)
{
    WritePicture("tex.png", 8);
    std::string dae = Dae({{{"a", "", "t"}}, {{"t", "<phong><diffuse>TEXTURE</diffuse></phong>"}}, "1", "Y_UP", {}});
    const std::string path = Write("m.dae", dae);

    fs::remove(folder / "tex.png");
    auto node = Read(path);
    ASSERT_TRUE(node) << error;
    EXPECT_EQ(options->getPluginStringData("readWarnings"), "the texture \"tex.png\" is missing");
    EXPECT_FALSE(TextureOf(*Geometries(*node).at(0).geometry));

    Write("tex.png", "no picture");
    node = Read(path);
    ASSERT_TRUE(node) << error;
    EXPECT_NE(options->getPluginStringData("readWarnings").find("can't be read"), std::string::npos);
    EXPECT_FALSE(TextureOf(*Geometries(*node).at(0).geometry));
}

TEST_F(AssetsReader, WhateverBecomesOfTheReadingProcessThisOneGoesOn)
{
    const std::string model = Write("m.dae", Dae({{{"a", "", ""}}, {}, "1", "Y_UP", {}}));
    struct Case
    {
        const char* name;
        const char* body;
        const char* reason; ///< null: the model is read all the same
    };
    const Case cases[] = {
        {"all is well", "exec \"$READER\" \"$@\"", nullptr},
        {"crash", "kill -SEGV $$", "SIGSEGV"},
        {"hang", "exec sleep 100", "within 0.5 s"},
        {"hang with its output closed", "exec >&- ; exec sleep 100", "within 0.5 s"},
        {"gives up", "echo first >&2; echo 'no memory' >&2; exit 1", "no memory"},
        {"gives up without a word", "exit 3", "without a word"},
        {"nothing", "exit 0", "cut short"},
        {"something else", "echo This is a text that has nothing to do with models of any kind.", "something else"},
        {"cut off", "\"$READER\" \"$@\" | head -c 800", "cut short"},
        {"a bit is wrong", "\"$READER\" \"$@\" | sed s/drawables/drawablez/", "checksum"},
        {"a flood of complaints", "yes complaint | head -c 3000000 >&2; exec \"$READER\" \"$@\"", nullptr},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        VtTModelReaderSettings settings = Settings();
        settings.program = Script(c.body);
        settings.limits.seconds = std::string(c.name).starts_with("hang") ? 0.5 : 10;
        osg::ref_ptr<VtCModelReader> scripted = new VtCModelReader(settings);
        const auto node = Read(*scripted, model);
        EXPECT_EQ(node == nullptr, c.reason != nullptr) << error;
        if (c.reason)
        {
            EXPECT_NE(error.find(c.reason), std::string::npos) << error;
        }
    }
    VtTModelReaderSettings settings = Settings();
    settings.program = folder / "missing";
    osg::ref_ptr<VtCModelReader> none = new VtCModelReader(settings);
    EXPECT_FALSE(Read(*none, model));
    EXPECT_NE(error.find("No such file"), std::string::npos) << error;
}

// A plug-in that is chosen by an ending can be a script's, an archive's, the network's or a command's.
TEST_F(AssetsReader, NoFileChoosesWhatIsLoadedIntoThisProcess)
{
    Write("good.obj", "v 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n");
    Write("good.STL", "solid a\nfacet normal 0 0 1\nouter loop\nvertex 0 0 0\nvertex 1 0 0\nvertex 0 1 0\nendloop\n"
                      "endfacet\nendsolid a\n");
    const std::string script = "f = io.open(\"" + (folder / "proof").string() + "\", \"w\")\nf:close()\n";
    Write("s.lua", script);
    Write("m.wrl", "#VRML V2.0 utf8\n" + WrlSquare("a", "texture ImageTexture { url \"s.lua\" }"));
    struct Case
    {
        const char* file;
        bool isRead;
    };
    const Case cases[] = {
        {"good.obj", true},
        {"good.STL", true},
        {"m.wrl", true},
        {"s.lua", false},
        {"bad.dae", false},
        {"good.obj.90,0,0.rot", false},
        {"good.obj.2.scale", false},
        {"x.zip/a.obj", false},
        {"x.osga", false},
        {"good", false},
        {"http://localhost/a.obj", false},
    };
    Write("bad.dae", "<COLLADA");
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.file);
        const std::string name = c.file;
        EXPECT_EQ(Read(name.starts_with("http") ? name : (folder / name).string()) != nullptr, c.isRead) << error;
        EXPECT_EQ(error.empty(), c.isRead);
    }
    EXPECT_FALSE(Read((folder / "s.lua").string()));
    EXPECT_NE(error.find(".dae, .wrl, .obj"), std::string::npos) << error;
    EXPECT_FALSE(fs::exists(folder / "proof"));

    std::ifstream maps("/proc/self/maps");
    const std::string loaded{std::istreambuf_iterator<char>(maps), {}};
    for (const char* plugin : {"osgdb_dae", "osgdb_iv", "osgdb_obj", "osgdb_lua", "osgdb_curl"})
        EXPECT_EQ(loaded.find(plugin), std::string::npos) << plugin;
    EXPECT_NE(loaded.find("libosgDB"), std::string::npos) << "the look at the loaded libraries finds none";
}

#include <algorithm>
#include <chrono>
#include <fstream>
#include <iterator>
#include <random>

#include <osg/ComputeBoundsVisitor>

#include "assets/AssetManager.h"
#include "AssetsFixture.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "tests/support/FakeHost.h"
#include "tests/support/OffscreenFixture.h"

namespace fs = std::filesystem;

namespace
{

constexpr int models = 300;
constexpr unsigned seed = 20240229;

using Random = std::mt19937;

std::size_t Below(Random& random, std::size_t limit)
{
    return limit == 0 ? 0 : random() % limit; // not a distribution: those differ between libraries
}

/// The places where a number stands.
std::vector<std::pair<std::size_t, std::size_t>> Numbers(const std::string& text)
{
    std::vector<std::pair<std::size_t, std::size_t>> places;
    for (std::size_t at = 0; at < text.size();)
    {
        const std::size_t begin = text.find_first_of("0123456789", at);
        if (begin == std::string::npos)
            break;
        const std::size_t end = std::min(text.find_first_not_of("0123456789.", begin), text.size());
        places.emplace_back(begin, end - begin);
        at = end;
    }
    return places;
}

const char* const wrongNumbers[] = {"-1", "99999",   "4294967295", "2147483647", "-2147483648", "1e38", "nan",
                                    "0",  "1000000", "-0.0001",    "",           "1 1 1 1 1 1"};

std::string WithWrongNumbers(std::string text, Random& random, const std::string& near, int count)
{
    for (int i = 0; i < count; ++i)
    {
        auto places = Numbers(text);
        if (!near.empty())
            std::erase_if(places,
                          [&](const auto& place)
                          {
                              const std::size_t from = place.first < 200 ? 0 : place.first - 200;
                              return text.substr(from, place.first - from).rfind(near) == std::string::npos;
                          });
        if (places.empty())
            break;
        const auto [at, length] = places[Below(random, places.size())];
        text.replace(at, length, wrongNumbers[Below(random, std::size(wrongNumbers))]);
    }
    return text;
}

std::string WithWrongBytes(std::string text, Random& random)
{
    const std::size_t edits = 1 + Below(random, 30);
    for (std::size_t i = 0; i < edits && !text.empty(); ++i)
    {
        const std::size_t at = Below(random, text.size());
        switch (Below(random, 4))
        {
        case 0:
            text[at] = static_cast<char>(random());
            break;
        case 1:
            text.erase(at, 1 + Below(random, 20));
            break;
        case 2:
            text.insert(at, text.substr(Below(random, text.size()), Below(random, 60)));
            break;
        default:
            text[at] = "<>{}[]\"/#,. "[Below(random, 12)];
        }
    }
    return text;
}

/// Piece of the text moved to where it has no business, tags and all.
std::string WithMovedPieces(std::string text, Random& random, char open)
{
    const std::size_t from = text.find(open, Below(random, text.size()));
    const std::size_t to = text.find(open, Below(random, text.size()));
    if (from == std::string::npos || to == std::string::npos)
        return text;
    return text.insert(to, text.substr(from, Below(random, 400)));
}

std::string Nested(const std::string& begin, const std::string& inner, const std::string& end, std::size_t depth)
{
    std::string text;
    for (std::size_t i = 0; i < depth; ++i)
        text += begin;
    text += inner;
    for (std::size_t i = 0; i < depth; ++i)
        text += end;
    return text;
}

class AssetsDamage : public OffscreenFixture
{
};

/// The small models that are damaged, and the folder they go to.
class Workshop : public AssetsFixture
{
public:
    Workshop() { SetUp(); }
    ~Workshop() override { TearDown(); }
    void TestBody() override {}

    using AssetsFixture::Dae;
    using AssetsFixture::folder;
    using AssetsFixture::Settings;
    using AssetsFixture::Write;
    using AssetsFixture::WritePicture;

    std::string GoodDae() const
    {
        return Dae(
            {{{"a", "<translate>1 0 0</translate>", "t"}, {"b", "<scale>2 2 2</scale>", "p"}},
             {{"t", "<phong><diffuse>TEXTURE</diffuse></phong>"},
              {"p", "<blinn><diffuse><color>1 0 0 1</color></diffuse><shininess><float>9</float></shininess></blinn>"}},
             "0.01",
             "Z_UP",
             "<node id=\"c\"><instance_node url=\"#a-id\"/></node>"});
    }

    std::string GoodWrl() const
    {
        return "#VRML V2.0 utf8\nDEF top Transform { rotation 0 1 0 0.5 children [\n" +
               WrlSquare("one", "material Material { diffuseColor 1 0 0 } texture ImageTexture { url \"tex.png\" }",
                         "solid FALSE normal Normal { vector [ 0 0 1 0 0 1 0 0 1 0 0 1 ] }") +
               "Shape { appearance Appearance { material Material { transparency 0.5 } } geometry Sphere { radius 0.3 "
               "} }\n"
               "Shape { geometry IndexedLineSet { coord Coordinate { point [ 0 0 0, 1 1 1 ] } coordIndex [ 0 1 -1 ] } "
               "}\n"
               "Shape { geometry ElevationGrid { xDimension 3 zDimension 2 height [ 0 1 2 3 4 5 ] } }\n"
               "Shape { geometry Extrusion { crossSection [ 1 1, 1 -1, -1 -1, 1 1 ] spine [ 0 0 0, 0 1 0 ] } }\n"
               "Inline { url \"part.wrl\" } Transform { translation 3 0 0 children USE one } ] }\n";
    }

    /// The models as they are before any damage.
    std::vector<std::wstring> MakeGood()
    {
        WritePicture("good/tex.png", 16);
        Write("good/part.wrl", "#VRML V2.0 utf8\n");
        return {base::InnerPath(Write("good/m.dae", GoodDae())), base::InnerPath(Write("good/m.wrl", GoodWrl()))};
    }

    /// The path of damaged model `number`.
    std::wstring Make(int number, Random& random)
    {
        const bool isDae = number % 2 == 0;
        const std::string good = isDae ? GoodDae() : GoodWrl();
        const std::string name = std::to_string(number) + "/m" + (isDae ? ".dae" : ".wrl");
        std::string text = good;
        if (number % 25 != 24)
            WritePictureAt(number);
        switch (number / 2 % 10)
        {
        case 0:
        case 1:
            text = WithWrongBytes(good, random);
            break;
        case 2:
            text = WithWrongNumbers(good, random, isDae ? "<p>" : "coordIndex", 1 + static_cast<int>(Below(random, 4)));
            break;
        case 3:
            text =
                WithWrongNumbers(good, random, isDae ? "<accessor" : "point", 1 + static_cast<int>(Below(random, 3)));
            break;
        case 4:
            text =
                WithWrongNumbers(good, random, isDae ? "count=" : "Dimension", 1 + static_cast<int>(Below(random, 3)));
            break;
        case 5:
            text = WithWrongNumbers(good, random, "", 1 + static_cast<int>(Below(random, 12)));
            break;
        case 6:
            text = good.substr(0, Below(random, good.size()));
            break;
        case 7:
            text = WithMovedPieces(good, random, isDae ? '<' : '{');
            break;
        case 8:
            text = isDae ? Recursive(random) : RecursiveWrl(random, number);
            break;
        default:
            Write(std::to_string(number) + "/tex.png", WithWrongBytes(picture, random));
            if (Below(random, 2) == 0)
                text = WithWrongBytes(good, random);
        }
        return base::InnerPath(Write(name, text));
    }

private:
    std::string Recursive(Random& random) const
    {
        const std::size_t depth = 1 + Below(random, 3000);
        const std::string square = "<instance_geometry url=\"#square\"/>";
        std::string doubling; // each node twice the one before: 2 to the power 40 squares
        for (int i = 0; i < 40; ++i)
        {
            const std::string url = "<instance_node url=\"#d" + std::to_string(i + 1) + "\"/>";
            doubling += "<node id=\"d" + std::to_string(i) + "\">" + (i == 39 ? square : url + url) + "</node>";
        }
        const std::string kinds[] = {
            Nested("<node>", square, "</node>", depth),
            "<node id=\"x\"><instance_node url=\"#y\"/></node><node id=\"y\"><instance_node url=\"#x\"/></node>",
            "<node id=\"x\">" + square + "<node><instance_node url=\"#x\"/></node></node>",
            doubling,
        };
        return Dae({{{"a", "", ""}}, {}, "1", "Y_UP", kinds[Below(random, std::size(kinds))]});
    }

    std::string RecursiveWrl(Random& random, int number) const
    {
        const std::string kinds[] = {
            "Group { children [ " + GoodWrl().substr(16) + " Inline { url \"m.wrl\" } ] }",
            Nested("Group { children [ ", "Shape { geometry Box { } }", " ] }", 1 + Below(random, 3000)),
            "DEF x Group { children [ Shape { geometry Box { } } USE x ] }",
            "PROTO P [ ] { Group { children P { } } } P { }",
        };
        Write(std::to_string(number) + "/part.wrl", "#VRML V2.0 utf8\nInline { url \"m.wrl\" }");
        return "#VRML V2.0 utf8\n" + kinds[Below(random, std::size(kinds))];
    }

    void WritePictureAt(int number)
    {
        if (picture.empty())
        {
            WritePicture("good.png", 16);
            picture = ReadFile(folder / "good.png");
        }
        Write(std::to_string(number) + "/tex.png", picture);
    }

    static std::string ReadFile(const fs::path& path)
    {
        std::ifstream file(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    std::string picture;
};

} // namespace

TEST_F(AssetsDamage, NoneOf300DamagedModelsEndsOrHoldsUpTheSession)
{
    Workshop workshop;
    fake::LibraryPaths paths;
    fake::MessageHandler messages;
    VtTModelReaderSettings settings = workshop.Settings();
    settings.limits.seconds = 2;
    settings.limits.megabytes = 1024;
    VtCOsgAssetManager::destroyInstance();
    VtCOsgAssetManager::setServices({&paths, &messages, settings});
    VtCOsgAssetManager& assets = VtCOsgAssetManager::getInstance();

    Random random(seed);
    std::vector<std::wstring> files;
    for (int i = 0; i < models; ++i)
        files.push_back(workshop.Make(i, random));
    for (const std::wstring& good : workshop.MakeGood())
        EXPECT_EQ(assets.loadModel(good, true)->getNumChildren(), 1u);
    ASSERT_TRUE(messages.shown.empty()) << "the models that are damaged must be good ones: "
                                        << base::Utf8(messages.shown.front().second);

    const auto start = std::chrono::steady_clock::now();
    assets.preloadModels(files, true);
    const std::chrono::duration<double> parsing = std::chrono::steady_clock::now() - start;

    osg::ref_ptr<osg::Group> scene = new osg::Group;
    osgViewer::View& view = AddView(scene, 64, 64);
    std::map<std::wstring, int> reasons;
    int shown = 0;
    for (const std::wstring& file : files)
    {
        messages.shown.clear();
        osg::ref_ptr<osg::Group> group = assets.loadModel(file, true);
        ASSERT_TRUE(group);
        const bool failed = messages.Has(host::Severity::error, 9001);
        EXPECT_EQ(failed, group->getNumChildren() == 0);
        if (failed)
        {
            ++reasons[messages.shown.front().second.substr(0, 25)];
            continue;
        }
        ++shown;
        osg::ComputeBoundsVisitor bounds;
        group->accept(bounds);
        scene->removeChildren(0, scene->getNumChildren());
        scene->addChild(VtCOsgAssetManager::cloneNode(group));
        const osg::BoundingBox& box = bounds.getBoundingBox();
        if (box.valid())
            LookAt(view, osg::Vec3d(box.center()) + osg::Vec3d(0, -1.0 - box.radius() * 2, 0), box.center());
        Draw(view);
    }
    // Most edits of a small file hit something that matters; but those that don't must not cost the model.
    EXPECT_GT(shown, models / 10);
    EXPECT_GT(models - shown, models / 10);
    RecordProperty("shown", shown);
    std::printf("%d of %d damaged models still show something; parsed in %.1f s\n", shown, models, parsing.count());
    for (const auto& [reason, count] : reasons)
        std::printf("%4d  %ls\n", count, reason.c_str());
    VtCOsgAssetManager::destroyInstance();
}

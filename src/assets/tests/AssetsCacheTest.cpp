#include <fstream>

#include <osgDB/Options>

#include "assets/models/ModelReader.h"
#include "AssetsFixture.h"

namespace fs = std::filesystem;

namespace
{

class AssetsCache : public AssetsFixture
{
protected:
    void SetUp() override
    {
        AssetsFixture::SetUp();
        WritePicture("tex.png", 16);
        model = Write("m.dae",
                      Dae({{{"a", "", "t"}}, {{"t", "<phong><diffuse>TEXTURE</diffuse></phong>"}}, "1", "Y_UP", {}}));
        settings = Settings();
        settings.cacheFolder = folder / "cache";
        settings.program = Script("exec \"$READER\" \"$@\"");
    }

    /// Reads the model with a reader that remembers nothing but what lies on the disk.
    bool Reads(const std::string& path, const char* specularity = "1.0") const
    {
        osg::ref_ptr<osgDB::Options> options = new osgDB::Options;
        options->setPluginStringData("useSpecularity", specularity);
        osg::ref_ptr<VtCModelReader> reader = new VtCModelReader(settings);
        return reader->readNode(path, options).validNode();
    }

    std::vector<fs::path> Entries() const
    {
        std::vector<fs::path> entries;
        if (fs::exists(settings.cacheFolder))
            for (const auto& entry : fs::directory_iterator(settings.cacheFolder))
                entries.push_back(entry.path());
        return entries;
    }

    std::string model;
    VtTModelReaderSettings settings;
};

void Age(const fs::path& path, int seconds)
{
    fs::last_write_time(path, fs::last_write_time(path) - std::chrono::seconds(seconds));
}

} // namespace

TEST_F(AssetsCache, AModelIsParsedAgainOnlyWhenSomethingItWasMadeFromChanged)
{
    struct Step
    {
        const char* what;
        std::function<void()> change;
        bool parses;
    };
    const Step steps[] = {
        {"first", [] {}, true},
        {"nothing changed", [] {}, false},
        {"the model changed", [&] { Age(model, 5); }, true},
        {"the texture changed", [&] { Age(folder / "tex.png", 5); }, true},
        {"the texture went", [&] { fs::remove(folder / "tex.png"); }, true},
        {"still without", [] {}, false},
        {"the texture came back", [&] { WritePicture("tex.png", 16); }, true},
        {"a description came", [&] { Write("Imported.xml", "<a/>"); }, true},
        {"the description changed", [&] { Age(folder / "Imported.xml", 5); }, true},
        {"nothing changed again", [] {}, false},
        {"the entry was cut off", [&] { fs::resize_file(Entries().front(), 100); }, true},
        {"the entry is something else", [&] { std::ofstream(Entries().front()) << std::string(5000, 'x'); }, true},
        {"the entry lost a bit",
         [&]
         {
             std::fstream file(Entries().front(), std::ios::in | std::ios::out | std::ios::binary);
             file.seekp(-5, std::ios::end);
             file.put('\x7f');
         },
         true},
        {"mended", [] {}, false},
    };
    for (const Step& step : steps)
    {
        SCOPED_TRACE(step.what);
        step.change();
        const int before = CountStarts();
        EXPECT_TRUE(Reads(model));
        EXPECT_EQ(CountStarts() - before, step.parses ? 1 : 0);
        EXPECT_EQ(Entries().size(), 1u) << "an older state of the model stays behind";
    }
    EXPECT_TRUE(Reads(model, "0.5"));
    EXPECT_EQ(Entries().size(), 2u) << "other options give another model";
}

TEST_F(AssetsCache, ItStaysWithinItsSizeAndKeepsWhatIsInUse)
{
    ASSERT_TRUE(Reads(model));
    const auto one = fs::file_size(Entries().front());
    settings.cacheBytes = one * 5 / 2;
    const fs::path first = Entries().front();
    Age(first, 100);

    ASSERT_TRUE(Reads(model, "0.5"));
    for (const fs::path& entry : Entries())
        if (entry != first)
            Age(entry, 50);
    ASSERT_TRUE(Reads(model)); // used again, so the other one is now the oldest
    ASSERT_TRUE(Reads(model, "0.25"));
    EXPECT_EQ(Entries().size(), 2u);
    EXPECT_TRUE(fs::exists(first));

    settings.cacheBytes = one / 2; // nothing fits any more, and the model is read all the same
    EXPECT_TRUE(Reads(model, "0.125"));
}

TEST_F(AssetsCache, WithoutAFolderOrOneThatCantBeWrittenModelsAreRead)
{
    for (const fs::path& where : {fs::path(), fs::path("/proc/none")})
    {
        settings.cacheFolder = where;
        const int before = CountStarts();
        EXPECT_TRUE(Reads(model));
        EXPECT_TRUE(Reads(model));
        EXPECT_EQ(CountStarts() - before, 2);
    }
}

TEST_F(AssetsCache, TheEnvironmentSaysWhereAndHowMuch)
{
    const auto get = [] { return VtTModelReaderSettings::FromEnvironment("/bin/reader"); };
    ::setenv("XDG_CACHE_HOME", "/somewhere", 1);
    ::unsetenv("PANORAMIC_MODEL_CACHE");
    EXPECT_EQ(get().cacheFolder, "/somewhere/panoramic/models");
    ::setenv("PANORAMIC_MODEL_CACHE", "/elsewhere", 1);
    EXPECT_EQ(get().cacheFolder, "/elsewhere");
    ::setenv("PANORAMIC_MODEL_CACHE", "off", 1);
    ::setenv("PANORAMIC_MODEL_SECONDS", "2.5", 1);
    ::setenv("PANORAMIC_MODEL_MEGABYTES", "none", 1);
    EXPECT_EQ(get().cacheFolder, "");
    EXPECT_EQ(get().limits.seconds, 2.5);
    EXPECT_EQ(get().limits.megabytes, 4096u);
    for (const char* name :
         {"XDG_CACHE_HOME", "PANORAMIC_MODEL_CACHE", "PANORAMIC_MODEL_SECONDS", "PANORAMIC_MODEL_MEGABYTES"})
        ::unsetenv(name);
}

TEST_F(AssetsCache, ModelsLoadedAheadAreParsedOnceEachAndABadOneTellsItsReasonLater)
{
    settings.cacheFolder.clear();
    const std::string bad = Write("bad.dae", "<COLLADA");
    const std::string second = Write("second.wrl", "#VRML V2.0 utf8\n" + WrlSquare("a", "material Material { }"));
    osg::ref_ptr<VtCModelReader> reader = new VtCModelReader(settings);
    reader->Preload({model, second, bad, model, (folder / "none.dae").string()}, nullptr);
    EXPECT_EQ(CountStarts(), 3);

    EXPECT_TRUE(reader->readNode(model, nullptr).validNode());
    EXPECT_TRUE(reader->readNode(second, nullptr).validNode());
    auto failed = reader->readNode(bad, nullptr);
    EXPECT_NE(failed.message().find("well-formed"), std::string::npos) << failed.message();
    EXPECT_EQ(CountStarts(), 3);

    EXPECT_TRUE(reader->readNode(model, nullptr).validNode()); // what was ready is used up
    EXPECT_EQ(CountStarts(), 4);

    reader->Preload({second}, nullptr);
    Age(second, 5);
    EXPECT_TRUE(reader->readNode(second, nullptr).validNode()); // changed since then
    EXPECT_EQ(CountStarts(), 6);
}

#include <fstream>
#include <iterator>
#include <regex>
#include <set>

#include "assets/AssetManager.h"
#include "assets/TextureCollector.h"
#include "AssetsFixture.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "tests/support/FakeHost.h"

namespace fs = std::filesystem;

namespace
{

/// The first group of every match of `pattern`.
std::set<std::string> Matches(const std::string& text, const std::string& pattern)
{
    const std::regex expression(pattern);
    std::set<std::string> result;
    for (std::sregex_iterator at(text.begin(), text.end(), expression); at != std::sregex_iterator(); ++at)
        result.insert((*at)[1]);
    return result;
}

using AssetsExample = AssetsFixture;

} // namespace

TEST_F(AssetsExample, EveryBundledModelKeepsItsPartsAndPictures)
{
    const fs::path example = fs::read_symlink("/proc/self/exe").parent_path().parent_path() / "share/panoramic/example";
    fake::LibraryPaths paths;
    fake::MessageHandler messages;
    VtTModelReaderSettings settings = Settings();
    settings.parallel = 4;
    VtCOsgAssetManager::destroyInstance();
    VtCOsgAssetManager::setServices({&paths, &messages, settings});

    std::vector<std::wstring> models;
    for (const auto& entry : fs::recursive_directory_iterator(example, fs::directory_options::follow_directory_symlink))
        if (entry.path().extension() == ".dae" || entry.path().extension() == ".wrl")
            models.push_back(base::InnerPath(entry.path()));
    ASSERT_GE(models.size(), 10u);
    VtCOsgAssetManager::getInstance().preloadModels(models, true);

    for (const std::wstring& model : models)
    {
        const fs::path path = base::NativePath(model);
        SCOPED_TRACE(path.string());
        osg::ref_ptr<osg::Group> root = VtCOsgAssetManager::getInstance().loadModel(model, true);
        std::ifstream file(path);
        const std::string text{std::istreambuf_iterator<char>(file), {}};
        const bool isCollada = path.extension() == ".dae";

        std::set<std::string> geodes;
        for (const Placed& placed : Geometries(*root))
            geodes.insert(placed.geode->getName());
        EXPECT_EQ(geodes, Matches(text, isCollada ? "<node [^>]*name=\"([^\"]+)\"" : "DEF (\\S+) Shape"));

        VtCOsgTextureCollector collector;
        root->accept(collector);
        std::set<std::string> pictures;
        for (const std::wstring& name : collector.fileNames)
            pictures.insert(fs::path(base::Utf8(name)).filename().string());
        EXPECT_EQ(pictures, Matches(text, isCollada ? "<init_from>([^<]+\\.png)<" : "url \"([^\"]+\\.png)\""));
    }
    for (const auto& message : messages.shown)
        ADD_FAILURE() << base::Utf8(message.first) << ": " << base::Utf8(message.second);
    VtCOsgAssetManager::destroyInstance();
}

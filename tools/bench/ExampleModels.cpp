#include "tools/bench/ExampleModels.h"

#include <stdexcept>
#include <unistd.h>

#include "assets/AssetManager.h"
#include "base/Paths.h"

namespace fs = std::filesystem;

namespace bench
{

namespace
{

constexpr const char* library = "Vantor Objects/advanced";

/// A folder for finished models that goes with the program.
class CacheFolder
{
public:
    CacheFolder() : path(fs::temp_directory_path() / ("panoramic_bench_models." + std::to_string(getpid()))) {}
    ~CacheFolder() { fs::remove_all(path); }

    const fs::path path;
};

void UseModels(ModelDocument& document, bool cached)
{
    static const CacheFolder cache;
    VtTModelReaderSettings settings =
        VtTModelReaderSettings::FromEnvironment(ProgramFolder() / "panoramic-model-reader");
    settings.cacheFolder = cached ? cache.path : fs::path();
    VtCOsgAssetManager::destroyInstance();
    VtCOsgAssetManager::setServices({&document.paths, &document.messages, settings});
}

} // namespace

fs::path ProgramFolder()
{
    return fs::read_symlink("/proc/self/exe").parent_path();
}

fs::path ExampleFolder()
{
    const fs::path folder = ProgramFolder().parent_path() / "share/panoramic/example";
    if (!fs::exists(folder))
        throw std::runtime_error("the example " + folder.string() + " is missing");
    return folder;
}

fs::path ModelPath(const char* file)
{
    const fs::path path = ExampleFolder() / library / file;
    if (!fs::exists(path))
        throw std::runtime_error("the example's model " + path.string() + " is missing");
    return path;
}

ModelDocument::ModelDocument(const ModelList& files, bool cached)
    : services{store, VtCOsgAssetManager::getLibrary(), paths, texts, messages, &channels, &configuration}
{
    paths.objects = base::InnerPath(ExampleFolder() / library);
    UseModels(*this, cached);
    for (const char* file : files)
        models.push_back(base::InnerPath(ModelPath(file)));
}

ModelDocument::~ModelDocument()
{
    VtCOsgAssetManager::destroyInstance();
}

void ModelDocument::ReadModels()
{
    VtCOsgAssetManager::destroyInstance();
    for (const std::wstring& model : models)
        if (VtCOsgAssetManager::getInstance().loadModel(model, true)->getNumChildren() == 0)
            throw std::runtime_error("a model of the example can't be read");
}

} // namespace bench

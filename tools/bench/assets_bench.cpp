// Models: building a scene over a few of them, and what reading one costs by each way.
#include <filesystem>
#include <stdexcept>
#include <string>
#include <unistd.h>
#include <vector>

#include <benchmark/benchmark.h>
#include <osg/Version>
#include <osgDB/Registry>

#include "base/Paths.h"
#include "render/AssetManager.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tests/support/FakeScene.h"

namespace fs = std::filesystem;

namespace
{

constexpr int bodyCount = 1000;
const char* const modelFiles[] = {
    "Vehicles/$Sedan/Sedan.dae",    "Vehicles/$Wheel/Wheel.dae",    "Buildings/$Hall/Hall.dae",
    "Buildings/$House/House.dae",   "Buildings/$Office/Office.dae", "Buildings/$WaterTower/WaterTower.wrl",
    "Roadside/$Gantry/Gantry.dae",  "Roadside/$Lamp/Lamp.dae",      "Landscape/$Oak/Oak.dae",
    "Landscape/$Ground/Ground.dae",
};
const char* const largeModel = "Vehicles/$Sedan/Sedan.dae";

fs::path ProgramFolder()
{
    return fs::read_symlink("/proc/self/exe").parent_path();
}

fs::path ModelPath(const char* file)
{
    const fs::path path = ProgramFolder().parent_path() / "share/panoramic/example/Vantor Objects/advanced" / file;
    if (!fs::exists(path))
        throw std::runtime_error("the example's model " + path.string() + " is missing");
    return path;
}

/// A folder for finished models that goes with the program.
class CacheFolder
{
public:
    CacheFolder() : path(fs::temp_directory_path() / ("panoramic_bench_models." + std::to_string(getpid()))) {}
    ~CacheFolder() { fs::remove_all(path); }

    const fs::path path;
};

/// The services that a scene needs, with the real models.
class Document : public VtISceneDocument
{
public:
    explicit Document(bool cached)
    {
        static const CacheFolder cache;
        VtTModelReaderSettings settings =
            VtTModelReaderSettings::FromEnvironment(ProgramFolder() / "panoramic-model-reader");
        settings.cacheFolder = cached ? cache.path : fs::path();
        VtCOsgAssetManager::destroyInstance();
        VtCOsgAssetManager::setServices({&paths, &messages, settings});
        for (const char* file : modelFiles)
            models.push_back(base::InnerPath(ModelPath(file)));
    }
    ~Document() override { VtCOsgAssetManager::destroyInstance(); }

    VtCScene3D* GetScene() const override { return scene; }
    void SetScene(VtCScene3D* newScene) override { scene = newScene; }
    void SetModified(bool) override {}
    VtTSceneServices& GetServices() override { return services; }

    /// One read of each model by a manager that has none.
    void ReadModels()
    {
        VtCOsgAssetManager::destroyInstance();
        for (const std::wstring& model : models)
            if (VtCOsgAssetManager::getInstance().loadModel(model, true)->getNumChildren() == 0)
                throw std::runtime_error("a model of the example can't be read");
    }

    fake::LibraryPaths paths;
    fake::MessageHandler messages;
    VtCSceneObjectStore store;
    fake::Texts texts;
    fake::ChannelSource channels;
    fake::Configuration configuration;
    VtTSceneServices services{store,         VtCOsgAssetManager::getLibrary(), paths, texts, messages, &channels,
                              &configuration};
    VtCScene3D* scene = nullptr;
    std::vector<std::wstring> models;
};

void BuildScene(benchmark::State& state, bool cached)
{
    Document document(cached);
    document.ReadModels(); // fills the disk cache, if there is one
    for (auto _ : state)
    {
        VtCOsgAssetManager::destroyInstance();
        document.store.Clear();
        VtCScene3D scene(document);
        for (int i = 0; i < bodyCount; ++i)
        {
            const std::wstring& model = document.models[static_cast<std::size_t>(i) % document.models.size()];
            const std::wstring name = L"Body " + std::to_wstring(i);
            if (i % 2 == 0)
                new VtC3DStaticBody(document, *scene.GetStaticBodies(), name, model, osg::Matrixd(), true, L"");
            else
                new VtC3DMovableBody(document, *scene.GetMovableBodies(0), name, model, osg::Matrixd(), true, nullptr,
                                     L"");
        }
    }
}

void ReadModels(benchmark::State& state, bool cached)
{
    Document document(cached);
    document.ReadModels();
    for (auto _ : state)
        document.ReadModels();
}

void PreloadModels(benchmark::State& state)
{
    Document document(false);
    for (auto _ : state)
    {
        VtCOsgAssetManager::destroyInstance();
        VtCOsgAssetManager::getInstance().preloadModels(document.models, true);
        for (const std::wstring& model : document.models)
            VtCOsgAssetManager::getInstance().loadModel(model, true);
    }
}

void ReadOne(benchmark::State& state, bool cached)
{
    Document document(cached);
    const std::wstring model = base::InnerPath(ModelPath(largeModel));
    VtCOsgAssetManager::getInstance().readModel(model, true);
    for (auto _ : state)
        benchmark::DoNotOptimize(VtCOsgAssetManager::getInstance().readModel(model, true));
}

/// The library's own reader in this process: what a model costs without a check and without a process around it.
void ReadOneStock(benchmark::State& state)
{
    osgDB::Registry* registry = osgDB::Registry::instance();
    // By its file, for our own reader keeps it from being found by what it reads.
    registry->loadLibrary(std::string("osgPlugins-") + osgGetVersion() + "/osgdb_dae.so");
    osgDB::ReaderWriter* stock = nullptr;
    for (const auto& reader : registry->getReaderWriterList())
        if (reader->acceptsExtension("dae"))
            stock = reader.get();
    if (!stock)
        throw std::runtime_error("the library's own reader is missing");
    const std::string path = ModelPath(largeModel).string();
    for (auto _ : state)
        if (!stock->readNode(path, nullptr).validNode())
            throw std::runtime_error("the library's own reader fails");
}

BENCHMARK_CAPTURE(BuildScene, cold, false)->Name("build_scene/subject")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ReadModels, cold, false)->Name("build_scene/baseline")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BuildScene, warm, true)->Name("build_scene_cached/subject")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ReadModels, warm, true)->Name("build_scene_cached/baseline")->Unit(benchmark::kMillisecond);
BENCHMARK(PreloadModels)->Name("preload_models/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(ReadModels, one_by_one, false)
    ->Name("preload_models/baseline")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(ReadOne, cold, false)->Name("read_model/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(ReadOneStock)->Name("read_model/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(ReadOne, warm, true)->Name("read_model_cached/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(ReadOneStock)->Name("read_model_cached/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();

} // namespace

// Models: building a scene over a few of them, and what reading one costs by each way.
#include <stdexcept>
#include <string>

#include <benchmark/benchmark.h>
#include <osg/Version>
#include <osgDB/Registry>

#include "assets/AssetManager.h"
#include "base/Paths.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tools/bench/ExampleModels.h"

using namespace bench;

namespace
{

constexpr int bodyCount = 1000;
const ModelList modelFiles = {
    "Vehicles/$Sedan/Sedan.dae",    "Vehicles/$Wheel/Wheel.dae",    "Buildings/$Hall/Hall.dae",
    "Buildings/$House/House.dae",   "Buildings/$Office/Office.dae", "Buildings/$WaterTower/WaterTower.wrl",
    "Roadside/$Gantry/Gantry.dae",  "Roadside/$Lamp/Lamp.dae",      "Landscape/$Oak/Oak.dae",
    "Landscape/$Ground/Ground.dae",
};
const char* const largeModel = "Vehicles/$Sedan/Sedan.dae";

void BuildScene(benchmark::State& state, bool cached)
{
    ModelDocument document(modelFiles, cached);
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
    ModelDocument document(modelFiles, cached);
    document.ReadModels();
    for (auto _ : state)
        document.ReadModels();
}

void PreloadModels(benchmark::State& state)
{
    ModelDocument document(modelFiles, false);
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
    ModelDocument document(modelFiles, cached);
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

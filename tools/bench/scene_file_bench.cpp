// Scene files: loading and saving a scene, and how the time grows with the number of records.
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>

#include <fcntl.h>
#include <unistd.h>

#include <benchmark/benchmark.h>

#include "app/SceneLoader.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "records/AttributeNames.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tests/support/TemporaryFolder.h"
#include "tools/bench/ExampleModels.h"

namespace fs = std::filesystem;
using namespace bench;

namespace
{

constexpr int bodyCount = 1000;
const ModelList modelFiles = {
    "Vehicles/$Sedan/Sedan.dae",   "Buildings/$Hall/Hall.dae",     "Vehicles/$Wheel/Wheel.dae",
    "Buildings/$House/House.dae",  "Roadside/$Cone/Cone.dae",      "Buildings/$Office/Office.dae",
    "Roadside/$Gantry/Gantry.dae", "Landscape/$Ground/Ground.dae", "Landscape/$Oak/Oak.dae",
    "Roadside/$Lamp/Lamp.dae",
};

bool IsMovable(int index)
{
    return index % 2 == 0;
}

/// What a program does that sets a scene up by itself: bodies, and where they stand.
void Build(VtISceneDocument& document, VtCScene3D& scene, const std::vector<std::wstring>& models, int count)
{
    for (int i = 0; i < count; ++i)
    {
        const std::wstring& model = models[static_cast<std::size_t>(i) % models.size()];
        const std::wstring name = L"Body " + std::to_wstring(i);
        VtC3DBody* body = nullptr;
        if (IsMovable(i))
            body = new VtC3DMovableBody(document, *scene.GetMovableBodies(0), name, model, osg::Matrixd(), true,
                                        nullptr, L"");
        else
            body = new VtC3DStaticBody(document, *scene.GetStaticBodies(), name, model, osg::Matrixd(), true, L"");
        const auto number = static_cast<float>(i);
        body->GetAttributeObject()->Write(attribute::position, VtTFloatTupel3{number, -number, 0.5F});
        body->GetAttributeObject()->Write(attribute::rotation, VtTFloatTupel3{0, 0, 0.1F * number});
    }
}

/// The file of such a scene.
void SaveBodies(VtISceneDocument& document, const std::vector<std::wstring>& models, int count,
                const std::wstring& file)
{
    VtCScene3D scene(document);
    Build(document, scene, models, count);
    if (!scene.SaveScene(file))
        throw std::runtime_error(base::Utf8(scene.GetFileError()));
}

void Check(const VtCScene3D& scene, std::size_t bodies, const fake::MessageHandler& messages)
{
    const std::size_t found =
        scene.GetMovableBodies(0)->GetChildren().size() + scene.GetStaticBodies()->GetChildren().size();
    if (found != bodies || !messages.shown.empty())
        throw std::runtime_error("the scene isn't what was saved");
}

/// Times one load of `file` into a new scene; its end is not timed.
template <class Document>
void TimeLoad(benchmark::State& state, Document& document, const std::wstring& file, int bodies)
{
    document.store.Clear();
    auto scene = std::make_unique<VtCScene3D>(document);
    VtCRecordBuilders builders;
    RegisterSceneRecords(builders);
    state.ResumeTiming();
    const bool loaded = VtCSceneLoader(*scene, builders).Load(file);
    state.PauseTiming();
    if (!loaded)
        throw std::runtime_error(base::Utf8(scene->GetFileError()));
    Check(*scene, static_cast<std::size_t>(bodies), document.messages);
    scene.reset();
}

void LoadScene(benchmark::State& state)
{
    const TemporaryFolder folder;
    const std::wstring file = base::InnerPath(folder.path / "scene.xml");
    ModelDocument document(modelFiles, true);
    SaveBodies(document, document.models, bodyCount, file);
    for (auto _ : state)
    {
        state.PauseTiming();
        TimeLoad(state, document, file, bodyCount);
        state.ResumeTiming();
    }
}

void BuildInMemory(benchmark::State& state)
{
    ModelDocument document(modelFiles, true);
    std::vector<std::wstring> movable, fixed;
    for (std::size_t i = 0; i < document.models.size(); ++i)
        (IsMovable(static_cast<int>(i)) ? movable : fixed).push_back(document.models[i]);
    for (auto _ : state)
    {
        state.PauseTiming();
        document.store.Clear();
        auto scene = std::make_unique<VtCScene3D>(document);
        state.ResumeTiming();
        document.services.models.emptyCache();
        document.services.models.preloadModels(movable, true);
        document.services.models.preloadModels(fixed, false);
        Build(document, *scene, document.models, bodyCount);
        state.PauseTiming();
        Check(*scene, bodyCount, document.messages);
        scene.reset();
        state.ResumeTiming();
    }
}

void SaveScene(benchmark::State& state)
{
    const TemporaryFolder folder;
    const std::wstring file = base::InnerPath(folder.path / "scene.xml");
    ModelDocument document(modelFiles, true);
    VtCScene3D scene(document);
    Build(document, scene, document.models, bodyCount);
    for (auto _ : state)
        if (!scene.SaveScene(file))
            state.SkipWithError("the scene can't be saved");
}

/// The bytes of the saved scene, all there already, in one call and flushed to the disk.
void WriteBytes(benchmark::State& state)
{
    const TemporaryFolder folder;
    const fs::path path = folder.path / "scene.xml";
    {
        ModelDocument document(modelFiles, true);
        SaveBodies(document, document.models, bodyCount, base::InnerPath(path));
    }
    const std::string bytes = TemporaryFolder::Read(path);
    for (auto _ : state)
    {
        const int file = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
        if (write(file, bytes.data(), bytes.size()) != static_cast<ssize_t>(bytes.size()) || fsync(file) != 0)
            state.SkipWithError("the bytes can't be written");
        close(file);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes.size()));
}

/// Bodies over one model that costs nothing, so that only the records count.
void LoadRecords(benchmark::State& state, int count)
{
    const TemporaryFolder folder;
    const fs::path model = folder.Write("$Box/Box.dae", "");
    const std::wstring file = base::InnerPath(folder.path / "scene.xml");
    fake::SceneDocument document;
    document.paths.objects = base::InnerPath(folder.path);
    SaveBodies(document, {base::InnerPath(model)}, count, file);
    for (auto _ : state)
    {
        state.PauseTiming();
        document.models.loads.clear();
        TimeLoad(state, document, file, count);
        state.ResumeTiming();
    }
}

BENCHMARK(LoadScene)->Name("load_scene/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BuildInMemory)->Name("load_scene/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(SaveScene)->Name("save_scene/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(WriteBytes)->Name("save_scene/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(LoadRecords, ten_thousand, 10'000)
    ->Name("load_records/subject")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(LoadRecords, thousand, 1'000)
    ->Name("load_records/baseline")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();

} // namespace

// Delivery: a frame of 10,000 channels to as many bodies.
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <osg/Group>
#include <osg/MatrixTransform>

#include "scene/MovableBodies.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/points/SimulationDataFrames.h"
#include "simdata/points/SimulationDataTracker.h"
#include "simdata/SimulationDataReceiver.h"
#include "simdata/SimulationServices.h"
#include "tests/support/FakeScene.h"

using namespace SimulationDataPoints;

namespace
{

constexpr int channelCount = 10000;
constexpr int frameCount = 8;

/// Frames in which every body moves and turns.
std::unique_ptr<VtCSimulationDataFrames> MakeFrames()
{
    auto channels = std::make_shared<VtTChannelDescription>();
    for (int i = 0; i < channelCount; ++i)
        channels->poses.push_back(L"Body " + std::to_wstring(i));
    auto frames = std::make_unique<VtCSimulationDataFrames>(channels, frameCount);
    for (int frame = 0; frame < frameCount; ++frame)
    {
        VtCFrameRecord record = frames->Append(0.01 * frame);
        for (int i = 0; i < channelCount; ++i)
        {
            const float x = static_cast<float>(i);
            const float y = static_cast<float>(frame);
            const float pose[4][4] = {{0.6F, -0.8F, 0, x}, {0.8F, 0.6F, 0, y}, {0, 0, 1, 1}, {0, 0, 0, 1}};
            record.SetPose(static_cast<std::size_t>(i), pose);
        }
    }
    return frames;
}

class BenchScene : public VtIActiveScene
{
public:
    BenchScene() : scene(document)
    {
        for (int i = 0; i < channelCount; ++i)
        {
            const std::wstring number = std::to_wstring(i);
            auto* body = new VtC3DMovableBody(document, *scene.GetMovableBodies(0), L"Body " + number, L"car",
                                              osg::Matrixd(), true, nullptr, L"");
            body->ConnectChannel(i, L"");
        }
    }

    VtCScene3D* GetActiveScene() const override { return const_cast<VtCScene3D*>(&scene); }
    VtIInstrumentFeed* GetActiveInstruments() const override { return nullptr; }

private:
    fake::SceneDocument document;
    VtCScene3D scene;
};

void ApplyFrames(benchmark::State& state)
{
    const BenchScene scene;
    const auto frames = MakeFrames();
    VtCSimulationDataReceiver receiver(scene);
    const VtTChannelLists channels;
    VtCSimulationDataTracker tracker;
    std::size_t next = 0;
    for (auto _ : state)
    {
        tracker.RemoveAll();
        tracker.AddHead(frames->GetFrame(next));
        receiver.ApplyFrames(tracker, channels);
        next = (next + 1) % frameCount;
    }
    state.SetItemsProcessed(state.iterations() * channelCount);
}

/// The least that must be done: 16 floats copied into a matrix, and the matrix set on the transform. The transforms are
/// those of a scene too, so that they lie in memory as those of the subject do.
void PlainLoop(benchmark::State& state)
{
    const BenchScene scene;
    std::vector<osg::MatrixTransform*> nodes;
    for (const VtC3DMovableBody* body : scene.GetActiveScene()->GetMovableBodies(0)->GetBodies())
        nodes.push_back(body->GetTransformNode()->asTransform()->asMatrixTransform());
    const auto frames = MakeFrames();
    std::size_t next = 0;
    for (auto _ : state)
    {
        const std::byte* record = frames->GetFrame(next)->GetRecord() + VtTChannelDescription::timeBytes;
        for (osg::MatrixTransform* node : nodes)
        {
            float values[16];
            std::memcpy(values, record, sizeof values);
            node->setMatrix(osg::Matrixd(values));
            record += sizeof values;
        }
        next = (next + 1) % frameCount;
    }
    state.SetItemsProcessed(state.iterations() * channelCount);
}

BENCHMARK(ApplyFrames)->Name("apply_frames/subject")->Unit(benchmark::kMicrosecond);
BENCHMARK(PlainLoop)->Name("apply_frames/baseline")->Unit(benchmark::kMicrosecond);

} // namespace

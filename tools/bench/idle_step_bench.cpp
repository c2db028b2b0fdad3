// What the component costs around the picture: one idle step against a bare viewer that draws the same graph.
#include <array>
#include <cmath>
#include <memory>
#include <stdexcept>
#include <vector>

#include <benchmark/benchmark.h>
#include <osg/Geode>
#include <osg/ShapeDrawable>
#include <osgViewer/CompositeViewer>

#include "app/PanoramicDocument.h"
#include "hosts/common/EglGraphics.h"
#include "hosts/common/OffscreenViews.h"
#include "render/Viewer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "simdata/points/SimulationDataPoint.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationDataRouter.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"
#include "tests/support/HeapCount.h"
#include "tools/bench/BareView.h"

namespace
{

constexpr int bodyCount = 1000;
constexpr int frameCount = 50;
constexpr double frameTime = 0.02;

/// Where body `index` is in `frame`: the bodies stand in a square and wander about.
osg::Matrixd Placement(int index, int frame)
{
    const double phase = 0.1 * frame + index;
    return osg::Matrixd::rotate(phase, osg::Vec3d(0, 0, 1)) *
           osg::Matrixd::translate(3.0 * (index % 32) + std::sin(phase), 3.0 * (index / 32), 0.5);
}

/// A recorded run in memory, with a channel for each body.
class Run : public SimulationDataPoints::VtCSimulationDataPoint
{
public:
    Run() : VtCSimulationDataPoint(L"Run")
    {
        auto channels = std::make_shared<SimulationDataPoints::VtTChannelDescription>();
        for (int i = 0; i < bodyCount; ++i)
            channels->poses.push_back(L"Body" + std::to_wstring(i));
        SetDescription(channels);
        SetFrameBufferSize(frameCount);
        if (!StartBuffer())
            throw std::runtime_error("no memory for the run");
        for (int frame = 0; frame < frameCount; ++frame)
        {
            SimulationDataPoints::VtCFrameRecord record = AppendFrame(frame * frameTime);
            for (int i = 0; i < bodyCount; ++i)
            {
                const osg::Matrixd placed = Placement(i, frame);
                float pose[4][4];
                for (int row = 0; row < 4; ++row)
                    for (int column = 0; column < 4; ++column)
                        pose[row][column] = static_cast<float>(placed(column, row));
                record.SetPose(static_cast<std::size_t>(i), pose);
            }
        }
    }

    void Disconnect() override {}
    int Connect() override { return 1; }
    void GetSourceType(std::wstring& type) const override { type = L"BENCH"; }
    void GetSourcePath(std::wstring& path) const override { path = L"memory"; }
    int Configure(const std::wstring&, const std::wstring&, int, int) override { return 1; }
    SimulationDataPoints::VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) override
    {
        return NewestFrame(frame);
    }
};

osg::ref_ptr<osg::Group> MakeModel()
{
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->addDrawable(new osg::ShapeDrawable(new osg::Box(osg::Vec3(0, 0.5F, 0), 2, 1, 1)));
    osg::ref_ptr<osg::Group> model = new osg::Group;
    model->addChild(geode);
    return model;
}

/// The application in a loop replay of 1000 bodies, with four views that see them all.
class Stage
{
public:
    Stage()
    {
        host.graphics = &graphics;
        fake::StartApplication(app);
        document = dynamic_cast<VtCPanoramicDocument*>(host.documentManager.NewDocument());

        const osg::ref_ptr<osg::Group> model = MakeModel();
        for (int i = 0; i < bodyCount; ++i)
        {
            bodies.push_back(new VtC3DMovableBody(*document, *document->GetScene()->GetMovableBodies(0),
                                                  L"Body" + std::to_wstring(i), L"", osg::Matrixd(), true, model.get(),
                                                  {}));
            bodies.back()->ConnectChannel(i, {});
        }

        createViewer();
        createSharedContext(root);
        for (std::size_t pane = 0; pane < windows.size(); ++pane)
        {
            windows[pane] = std::make_unique<hosts::OffscreenWindow>(640, 360);
            views[pane] = createView(*windows[pane], windows[pane]->GetClientRectangle());
            SetUp(*views[pane], pane);
            addViewToViewer(views[pane].get());
        }
        renderingEnabled = true;

        VtCSimulationDataRouter& router = app.GetController()->GetRouter();
        router.AddPoint(VtTDataPointPtr(new Run, {}));
        router.SelectPoint(L"Run");
        app.GetController()->GotoFirst();
        app.GetController()->PlayLoop();
    }

    ~Stage()
    {
        app.GetController()->StopPlay();
        for (osg::ref_ptr<osgViewer::View>& view : views)
        {
            removeViewFromViewer(view.get());
            view = nullptr;
        }
        host.documentManager.CloseActiveDocument();
        fake::StopApplication(app);
    }

    void Step()
    {
        host.clock.Advance(frameTime);
        app.IdleStep();
    }

    /// The same cameras for both viewers, looking down at the square from its corners.
    void SetUp(osgViewer::View& view, std::size_t pane) const
    {
        view.setSceneData(document->GetScene()->GetRootNode());
        bench::FinishFrames(view);
        const osg::Vec3d eye(pane % 2 ? 130 : -35, pane / 2 ? 130 : -35, 40);
        view.getCamera()->setViewMatrixAsLookAt(eye, osg::Vec3d(46, 46, 0), osg::Vec3d(0, 0, 1));
    }

    fake::Host host;
    hosts::EglGraphics graphics;
    hosts::OffscreenWindow root{0, 0};
    std::array<std::unique_ptr<hosts::OffscreenWindow>, 4> windows;
    std::array<osg::ref_ptr<osgViewer::View>, 4> views;
    VtCPanoramicApp app{host};
    VtCPanoramicDocument* document = nullptr;
    std::vector<VtC3DMovableBody*> bodies;
};

constexpr int warmUp = 300; // display lists, statistics and capacities have settled by then

void IdleStep(benchmark::State& state)
{
    Stage stage;
    for (int i = 0; i < warmUp; ++i)
        stage.Step();
    for (auto _ : state)
        stage.Step();
}

/// The library's viewer over the same graph, with a loop that sets the matrices.
class BareViewer
{
public:
    explicit BareViewer(Stage& shownStage) : stage(shownStage), placements(frameCount)
    {
        viewer->setThreadingModel(osgViewer::ViewerBase::SingleThreaded);
        viewer->getViewerStats()->collectStats("frame_rate", true);
        for (std::size_t pane = 0; pane < stage.views.size(); ++pane)
        {
            removeViewFromViewer(stage.views[pane].get());
            osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
            osg::Camera& camera = *view->getCamera();
            const osg::Camera& model = *stage.views[pane]->getCamera();
            camera.setGraphicsContext(createViewContext(*stage.windows[pane]).get());
            camera.setViewport(0, 0, 640, 360);
            camera.setClearMask(model.getClearMask());
            camera.setComputeNearFarMode(osg::CullSettings::DO_NOT_COMPUTE_NEAR_FAR);
            camera.setProjectionMatrix(model.getProjectionMatrix());
            stage.SetUp(*view, pane);
            viewer->addView(view.get());
        }
        for (int frame = 0; frame < frameCount; ++frame)
            for (int i = 0; i < bodyCount; ++i)
                placements[static_cast<std::size_t>(frame)].push_back(
                    stage.bodies[static_cast<std::size_t>(i)]->GetBaseMatrix() * Placement(i, frame));
    }

    void Step()
    {
        for (std::size_t i = 0; i < stage.bodies.size(); ++i)
            static_cast<osg::MatrixTransform*>(stage.bodies[i]->GetTransformNode())->setMatrix(placements[next][i]);
        next = (next + 1) % placements.size();
        viewer->frame();
    }

private:
    Stage& stage;
    osg::ref_ptr<osgViewer::CompositeViewer> viewer = new osgViewer::CompositeViewer;
    std::vector<std::vector<osg::Matrixd>> placements;
    std::size_t next = 0;
};

void BareFrame(benchmark::State& state)
{
    Stage stage;
    BareViewer bare(stage);
    for (int i = 0; i < warmUp; ++i)
        bare.Step();
    for (auto _ : state)
        bare.Step();
}

/// Calls of operator new within one steady step, on average.
template <class Stepping>
double CountAllocations(Stepping& stepping)
{
    for (int i = 0; i < warmUp; ++i)
        stepping.Step();
    constexpr int steps = 4 * frameCount; // whole rounds of the run, in each of which the same bodies are in sight
    heap::Count count;
    for (int i = 0; i < steps; ++i)
        stepping.Step();
    return static_cast<double>(count.Stop()) / steps;
}

/// Those of a step beyond those of the library's viewer on the same graph.
void IdleStepAllocations(benchmark::State& state)
{
    double ours = 0.0;
    double theirs = 0.0;
    for (auto _ : state)
    {
        Stage stage;
        ours = CountAllocations(stage);
        BareViewer bare(stage);
        theirs = CountAllocations(bare);
    }
    state.counters["count"] = ours - theirs;
    state.counters["library"] = theirs;
}

BENCHMARK(IdleStep)->Name("idle_step/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BareFrame)->Name("idle_step/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(IdleStepAllocations)->Name("idle_step_allocations/subject")->Unit(benchmark::kMillisecond)->Iterations(1);

} // namespace

// What the panes cost around the picture: a frame of the example in four of them, against a bare viewer.
#include <array>
#include <stdexcept>

#include <benchmark/benchmark.h>
#include <osgViewer/CompositeViewer>

#include "render/Viewer.h"
#include "tools/bench/BareView.h"
#include "tools/bench/OpenExample.h"

namespace
{

constexpr long frameShown = 500; // ten seconds into the run
constexpr int warmUp = 60;       // display lists and textures are with the driver by then

/// Two that stand and two that ride on the sedan.
const std::array<const wchar_t*, 4> observers = {L"Free1", L"Grandstand", L"Chase", L"Above"};

/// Ready to be measured: all that the panes show has been given to the driver.
class Example : public bench::OpenExample
{
public:
    Example() : OpenExample(1284, 724, frameShown) // four panes of 640x360, and the bars between them
    {
        for (int pane = 1; pane <= 4; ++pane)
            if (!Pane(pane).assignObserverByName(observers[static_cast<std::size_t>(pane - 1)]))
                throw std::runtime_error("the example lacks an observer");
        for (int pane = 1; pane <= 4; ++pane)
            bench::FinishFrames(*Pane(pane).getView());
        for (int i = 0; i < warmUp; ++i)
            Draw();
    }

    /// The run is held at one frame, so the picture would be drawn only once.
    void Draw()
    {
        requestViewerRedraw();
        Step();
    }
};

void FourPanes(benchmark::State& state)
{
    Example example;
    for (auto _ : state)
        example.Draw();
}

void BareFrame(benchmark::State& state)
{
    Example example;
    osg::ref_ptr<osgViewer::CompositeViewer> viewer = new osgViewer::CompositeViewer;
    viewer->setThreadingModel(osgViewer::ViewerBase::SingleThreaded);
    for (int pane = 1; pane <= 4; ++pane)
    {
        viewer->addView(bench::MakeBareView(example.Pane(pane), example.GetRootNode(),
                                            createViewContext(example.Pane(pane).getWindow()).get())
                            .get());
        removeViewFromViewer(example.Pane(pane).getView());
    }
    for (int i = 0; i < warmUp; ++i)
        viewer->frame();
    for (auto _ : state)
        viewer->frame();
    viewer = nullptr;
}

BENCHMARK(FourPanes)->Name("four_panes/subject")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BareFrame)->Name("four_panes/baseline")->Unit(benchmark::kMillisecond)->UseRealTime();

} // namespace

// What the panes cost around the picture: a frame of the example in four of them, against a bare viewer.
#include <array>
#include <stdexcept>

#include <benchmark/benchmark.h>
#include <osgViewer/CompositeViewer>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "hosts/common/EglGraphics.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"
#include "tests/support/FakeViews.h"
#include "tools/bench/ExampleModels.h"

namespace
{

constexpr double frameTime = 0.02;
constexpr long frameShown = 500; // ten seconds into the run
constexpr int warmUp = 60;       // display lists and textures are with the driver by then

/// Two that stand and two that ride on the sedan.
const std::array<const wchar_t*, 4> observers = {L"Free1", L"Grandstand", L"Chase", L"Above"};

/// The application with the example open, held at one frame of its run.
class Example
{
public:
    Example()
    {
        host.graphics = &graphics;
        host.viewWindows = &windows;
        windows.splitter.width = 1284;
        windows.splitter.height = 724; // four panes of 640x360, and the bars between them
        host.paths.module = base::InnerPath(bench::ProgramFolder()) + L"\\";
        host.paths.objects = base::InnerPath(bench::ExampleFolder() / "Vantor Objects/advanced");
        host.paths.customer = base::InnerPath(bench::ExampleFolder() / "Customer_Objects");
        fake::StartApplication(app);

        VtCSimulationDataRouter& router = app.GetController()->GetRouter();
        router.SelectPoint(L"File");
        auto* point = router.FindPoint(L"File");
        if (!point || !point->Configure(L"MDF", base::InnerPath(bench::ExampleFolder() / "run.mdf"), 1, 0))
            throw std::runtime_error("the run of the example can't be read");
        document = dynamic_cast<VtCPanoramicDocument*>(
            host.documentManager.OpenDocument(base::InnerPath(bench::ExampleFolder() / "example.xml")));
        if (!document)
            throw std::runtime_error("the scene of the example can't be read");
        windows.Fire();
        for (int pane = 1; pane <= 4; ++pane)
            if (!Pane(pane).assignObserverByName(observers[static_cast<std::size_t>(pane - 1)]) ||
                !Pane(pane).isInViewer())
                throw std::runtime_error("a pane can't be drawn");
        app.GetController()->ShowFrame({}, frameShown);
        for (int i = 0; i < warmUp; ++i)
            Step();
    }

    ~Example()
    {
        host.documentManager.CloseActiveDocument();
        fake::StopApplication(app);
    }

    void Step()
    {
        host.clock.Advance(frameTime);
        app.IdleStep();
    }

    VtCPanoramicView& Pane(int number) const { return *document->GetChildFrame()->getSplitter().getView(number); }

    fake::Host host;
    fake::ViewWindows windows;
    hosts::EglGraphics graphics;
    VtCPanoramicApp app{host};
    VtCPanoramicDocument* document = nullptr;
};

void FourPanes(benchmark::State& state)
{
    Example example;
    for (auto _ : state)
        example.Step();
}

/// The library's own view with the camera and the light of a pane, in the same window.
osg::ref_ptr<osgViewer::View> MakeBareView(VtCPanoramicView& pane, osg::Node* scene)
{
    osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
    const osg::Camera& model = *pane.getView()->getCamera();
    osg::Camera& camera = *view->getCamera();
    camera.setGraphicsContext(createViewContext(pane.getWindow()).get());
    camera.setViewport(new osg::Viewport(*model.getViewport()));
    camera.setClearMask(model.getClearMask());
    camera.setClearColor(model.getClearColor());
    camera.setComputeNearFarMode(model.getComputeNearFarMode());
    camera.setProjectionMatrix(model.getProjectionMatrix());
    camera.setViewMatrix(model.getViewMatrix());
    view->setLightingMode(pane.getView()->getLightingMode());
    view->setSceneData(scene);
    return view;
}

void BareFrame(benchmark::State& state)
{
    Example example;
    osg::ref_ptr<osgViewer::CompositeViewer> viewer = new osgViewer::CompositeViewer;
    viewer->setThreadingModel(osgViewer::ViewerBase::SingleThreaded);
    for (int pane = 1; pane <= 4; ++pane)
    {
        viewer->addView(MakeBareView(example.Pane(pane), example.document->GetScene()->GetRootNode()).get());
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

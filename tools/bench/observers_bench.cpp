// Observers that ride smoothly on moving bodies.
#include <chrono>
#include <cmath>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <osgViewer/View>

#include "interaction/CameraManipulator.h"
#include "interaction/InteractionServices.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/FakeScene.h"

namespace
{

constexpr int observerCount = 100;
constexpr double frameTime = 1.0 / 60;
constexpr int placementCount = 64;

class NoViews : public VtIInteractionServices
{
public:
    std::uint32_t GetMouseSensitivity() const override { return 5; }
    bool IsActiveView(const osgViewer::View*) const override { return false; }
    const VtC3DObserver* GetActiveObserver() const override { return nullptr; }
    void SetHeadLightPosition(const osg::Vec3f&) override {}
    void ReplaceObserverInViews(const VtC3DObserver&, VtC3DObserver&) override {}
};

/// Observers in smooth follow, each on a body of its own that drives in a circle, and each with a view.
class Riders
{
public:
    Riders() : scene(document)
    {
        document.texts.known[6221] = L"free|fixed|Fixed_to_Object|heading|smooth|look at|position|along x|along y";
        observers = new VtC3DObservers(document, interaction, clock, {});
        scene.SetObservers(observers);
        for (int i = 0; i < observerCount; ++i)
        {
            const std::wstring number = std::to_wstring(i);
            bodies.push_back(new VtC3DMovableBody(document, *scene.GetMovableBodies(0), L"Body " + number, L"car",
                                                  osg::Matrixd(), true, nullptr, L""));
            VtC3DObserver& observer = observers->CreateObserver(L"Rider " + number, true);
            observer.SetFollowModeIndex(followSmooth);
            observer.SetConnectedBody(bodies.back());
            observer.SetTranslationOffset(osg::Vec3f(-6, 0, 2));
            Look(observer);
        }
        for (int i = 0; i < placementCount; ++i)
        {
            const double angle = 2 * osg::PI * i / placementCount;
            placements.push_back(osg::Matrixd::rotate(angle + osg::PI_2, osg::Vec3d(0, 0, 1)) *
                                 osg::Matrixd::translate(50 * std::cos(angle), 50 * std::sin(angle), 0.5));
        }
    }

    ~Riders()
    {
        for (const osg::ref_ptr<osgViewer::View>& view : views)
            view->setCameraManipulator(nullptr);
        scene.SetObservers(nullptr);
        observers->Release();
    }

    void MoveBodies()
    {
        clock.Advance(frameTime);
        ++step;
        for (std::size_t i = 0; i < bodies.size(); ++i)
            bodies[i]->SetLastTransformMatrix(placements[(step + i) % placements.size()]);
    }

    fake::SceneDocument document;
    fake::Clock clock;
    NoViews interaction;
    VtCScene3D scene;
    VtC3DObservers* observers = nullptr;
    std::vector<VtC3DMovableBody*> bodies;

private:
    void Look(VtC3DObserver& observer)
    {
        osg::ref_ptr<osgViewer::View> view = new osgViewer::View;
        osg::ref_ptr<VtCOsgCameramanipulator> manipulator = new VtCOsgCameramanipulator(interaction);
        view->setCameraManipulator(manipulator.get(), false);
        manipulator->setObserver(&observer, view.get());
        observer.AddCamera(view->getCamera());
        observer.SetAssigned(true);
        views.push_back(view);
    }

    std::vector<osg::ref_ptr<osgViewer::View>> views;
    std::vector<osg::Matrixd> placements;
    std::size_t step = 0;
};

// Only the work itself is timed: the bodies move outside of it.
template <class Work>
void Time(benchmark::State& state, Riders& riders, const Work& work)
{
    for (auto _ : state)
    {
        riders.MoveBodies();
        const auto start = std::chrono::steady_clock::now();
        work();
        state.SetIterationTime(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
    }
}

void UpdateObservers(benchmark::State& state)
{
    Riders riders;
    for (int i = 0; i < 500; ++i) // more than any history of a follower holds
    {
        riders.MoveBodies();
        riders.observers->UpdateObservers();
    }
    const osg::Matrixd before = riders.observers->GetObservers().front()->GetViewMatrix();
    Time(state, riders, [&] { riders.observers->UpdateObservers(); });
    if (riders.observers->GetObservers().front()->GetViewMatrix() == before)
        state.SkipWithError("the observers stand still");
}

/// The least that leads from a body to the matrix of a camera that rides on it.
void Products(benchmark::State& state)
{
    Riders riders;
    const std::vector<osg::Matrixd> offsets(observerCount, osg::Matrixd::translate(-6, 0, 2));
    std::vector<osg::Matrixd> results(observerCount);
    Time(state, riders,
         [&]
         {
             for (std::size_t i = 0; i < results.size(); ++i)
                 results[i] = osg::Matrixd::inverse(offsets[i] * riders.bodies[i]->GetLastTransformMatrix());
             benchmark::DoNotOptimize(results.data());
             benchmark::ClobberMemory();
         });
}

BENCHMARK(UpdateObservers)->Name("update_observers/subject")->Unit(benchmark::kMicrosecond)->UseManualTime();
BENCHMARK(Products)->Name("update_observers/baseline")->Unit(benchmark::kMicrosecond)->UseManualTime();

} // namespace

// What a window costs without us: four views of the example in a bare Qt window, drawn by the library's own viewer.
// Arguments: width and height of the four panes together, seconds. Prints the frames a second.
#include <array>
#include <chrono>
#include <cstdlib>
#include <exception>
#include <iostream>
#include <memory>

#include <osgViewer/CompositeViewer>
#include <osgViewer/GraphicsWindow>
#include <QGuiApplication>
#include <QOpenGLContext>
#include <QWindow>

#include "host/ViewWindows.h"
#include "hosts/common/ContextState.h"
#include "render/CompositeViewer.h"
#include "tools/bench/BareView.h"
#include "tools/bench/OpenExample.h"

namespace
{

constexpr int settling = 2;
constexpr int warmUp = 60; // display lists and textures are with the driver by then

QSurfaceFormat Format()
{
    QSurfaceFormat format;
    format.setVersion(2, 1);
    format.setDepthBufferSize(24);
    format.setStencilBufferSize(8);
    format.setSwapInterval(0);
    return format;
}

/// A child window that the viewer draws to.
class BareContext : public osgViewer::GraphicsWindow
{
public:
    BareContext(QWindow& paneWindow, BareContext* shared) : window(paneWindow)
    {
        _traits = new Traits;
        _traits->width = window.width();
        _traits->height = window.height();
        _traits->doubleBuffer = true;
        _traits->sharedContext = shared;
        context.setFormat(Format());
        if (shared)
            context.setShareContext(&shared->context);
        if (!context.create())
            throw std::runtime_error("the driver gives no context of OpenGL");
        hosts::GiveContextState(*this);
    }

    bool valid() const override { return window.isExposed(); }
    bool isRealizedImplementation() const override { return realised; }
    bool realizeImplementation() override { return realised = true; }
    void closeImplementation() override { realised = false; }
    bool makeCurrentImplementation() override
    {
        if (!context.makeCurrent(&window))
            return false;
        if (!prepared)
            hosts::PrepareContextState(*this);
        return prepared = true;
    }
    bool releaseContextImplementation() override
    {
        context.doneCurrent();
        return true;
    }
    void swapBuffersImplementation() override { context.swapBuffers(&window); }

private:
    QWindow& window;
    QOpenGLContext context;
    bool realised = false;
    bool prepared = false;
};

double FramesPerSecond(int width, int height, double seconds)
{
    bench::OpenExample example(width, height, 1);
    for (int i = 0; i < settling; ++i)
        example.Step(); // the cameras are where the observers are then

    QWindow window;
    window.resize(width, height);
    std::array<std::unique_ptr<QWindow>, 4> panes;
    for (int number = 1; number <= 4; ++number)
    {
        const host::Rectangle place = example.Pane(number).getWindow().GetRectangleInParent();
        auto& pane = panes[static_cast<std::size_t>(number - 1)] = std::make_unique<QWindow>(&window);
        pane->setSurfaceType(QSurface::OpenGLSurface);
        pane->setFormat(Format());
        pane->setGeometry(place.x, place.y, place.width, place.height);
        pane->show();
    }
    window.show();
    while (!panes.back()->isExposed())
        QGuiApplication::processEvents(QEventLoop::WaitForMoreEvents);

    osg::ref_ptr<osgViewer::CompositeViewer> viewer = new osgViewer::CompositeViewer;
    viewer->setThreadingModel(osgViewer::ViewerBase::SingleThreaded);
    osg::ref_ptr<BareContext> first;
    for (int number = 1; number <= 4; ++number)
    {
        const osg::ref_ptr<BareContext> context =
            new BareContext(*panes[static_cast<std::size_t>(number - 1)], first.get());
        if (!first)
            first = context;
        context->realize();
        adaptToSoftwareRenderer(*context); // as the panes are: a picture may take seconds otherwise
        viewer->addView(bench::MakeBareView(example.Pane(number), example.GetRootNode(), context).get());
    }

    const auto draw = [&viewer]
    {
        QGuiApplication::processEvents();
        viewer->frame();
    };
    for (int i = 0; i < warmUp; ++i)
        draw();
    using Clock = std::chrono::steady_clock;
    const Clock::time_point began = Clock::now();
    const auto passed = [began] { return std::chrono::duration<double>(Clock::now() - began).count(); };
    int frames = 0;
    for (; passed() < seconds; ++frames)
        draw();
    return frames / passed();
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 4)
    {
        std::cerr << "usage: panoramic_bare_window WIDTH HEIGHT SECONDS\n";
        return 2;
    }
    try
    {
        QGuiApplication application(argc, argv);
        std::cout << FramesPerSecond(std::atoi(argv[1]), std::atoi(argv[2]), std::atof(argv[3])) << '\n';
        return 0;
    }
    catch (const std::exception& error)
    {
        std::cerr << "panoramic_bare_window: error: " << error.what() << '\n';
        return 1;
    }
}

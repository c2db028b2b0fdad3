#pragma once

#include <memory>

#include <osg/Image>
#include <osg/ref_ptr>
#include <osgViewer/View>

#include "hosts/common/OffscreenWindow.h"
#include "hosts/console/Arguments.h"

class VtCScene3D;

namespace console
{

class ConsoleHost;

/// The one view of a console command: off-screen, on a scene that is lit as on a clear day.
///
/// A scene by itself has no light but switches for two: its atmospherics set them. Here the first is a weak head
/// light, so that no side is black, and the second the sun, high in the south-west; the background is a sky blue.
class ConsoleView
{
public:
    /// Null after message 532 when there is no graphics context to be had. `scene` outlives the view.
    static std::unique_ptr<ConsoleView> Create(ConsoleHost& host, VtCScene3D& scene, const Size& size);
    ~ConsoleView();
    ConsoleView(const ConsoleView&) = delete;
    ConsoleView& operator=(const ConsoleView&) = delete;

    /// Puts the eye; both in the axes of the scene, z up. They must not be the same point.
    void LookAt(const Triple& eye, const Triple& look);

    /// What the last frame drew; null when it can't be had.
    osg::ref_ptr<osg::Image> Read();

private:
    explicit ConsoleView(const Size& size) : window(size.width, size.height) {}
    void Light(VtCScene3D& scene);

    hosts::OffscreenWindow window;
    osg::ref_ptr<osgViewer::View> view;
};

} // namespace console

#pragma once

#include "app/PanoramicApp.h"
#include "hosts/common/EglGraphics.h"
#include "render/PanoramicView.h"
#include "tests/support/FakeHost.h"
#include "tests/support/FakeViews.h"

class VtCPanoramicDocument;
namespace osg
{
class Node;
}

namespace bench
{

/// The application with the bundled example open, held at one frame of its run. Nothing is seen of its panes.
class OpenExample
{
public:
    /// Size of the splitter that holds the four panes, in pixels. Throws when a file of the example can't be read.
    OpenExample(int width, int height, long frame);
    ~OpenExample();

    /// The next idle event, one fiftieth of a second later.
    void Step();

    /// 1 to 4.
    VtCPanoramicView& Pane(int number) const;

    osg::Node* GetRootNode() const;

private:
    fake::Host host;
    fake::ViewWindows windows;
    hosts::EglGraphics graphics;
    VtCPanoramicApp app{host};
    VtCPanoramicDocument* document = nullptr;
};

} // namespace bench

#pragma once

#include <memory>

#include <osg/Image>
#include <osg/ref_ptr>

#include "hosts/console/Command.h"

class VtCChildFrame;
class VtCPanoramicDocument;
class VtCPanoramicView;

namespace console
{

class ConsoleHost;

/// Puts the observer "Free1" there, and into its record. The two points must not be the same.
void PlaceFreeObserver(VtCPanoramicDocument& document, const Place& place);

/// What a console command shows of a scene: its four panes, or one of them over the whole picture, off-screen.
class ConsoleView
{
public:
    /// Says how large the panes are. Before the document is made, whose frame takes that size.
    ///
    /// Panes below 100 pixels collapse, so a picture that is smaller is drawn larger and scaled down.
    static void Prepare(ConsoleHost& host, const Size& picture);

    /// Waits for the views, and arranges them as the arguments tell. Null after an error message: there is no graphics
    /// context to be had, or no observer of that name. `document` outlives the view.
    static std::unique_ptr<ConsoleView> Create(ConsoleHost& host, VtCPanoramicDocument& document,
                                               const ViewArguments& arguments);
    ConsoleView(const ConsoleView&) = delete;
    ConsoleView& operator=(const ConsoleView&) = delete;

    /// Looks through the observer "Free1" in the active pane, and puts it there.
    void LookAt(const Place& place);

    /// What the last frame drew; null when it can't be had.
    osg::ref_ptr<osg::Image> Read();

private:
    ConsoleView(VtCPanoramicDocument& viewed, const Size& size) : document(viewed), picture(size) {}
    bool Arrange(ConsoleHost& host, const ViewArguments& arguments);

    VtCPanoramicDocument& document;
    Size picture;
};

} // namespace console

#include "hosts/console/ConsoleView.h"

#include <algorithm>

#include "app/PanoramicDocument.h"
#include "base/Text.h"
#include "host/ViewWindows.h"
#include "hosts/common/Picture.h"
#include "hosts/console/ConsoleHost.h"
#include "hosts/console/ConsoleTexts.h"
#include "interaction/FollowMode.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"

namespace console
{

namespace
{

constexpr std::uint32_t messageNoContext = 532; // %1 the reason
constexpr std::uint32_t timerInterval = 10;     // milliseconds

// How many times larger than the picture the panes are drawn.
int Magnification(const Size& picture)
{
    const int smallest = std::min(picture.width, picture.height);
    return (VtCSplitterEx::minimumSize + smallest - 1) / smallest;
}

void WaitForViews(ConsoleHost& host, const VtCChildFrame& frame)
{
    while (!frame.areViewsCreated())
    {
        host.GetViews().RunTimers();
        if (!frame.areViewsCreated())
            host.GetClock().Sleep(timerInterval);
    }
}

std::string ObserverNames(const VtC3DObservers& observers)
{
    std::wstring text;
    for (const VtC3DObserver* observer : observers.GetObservers())
        text += (text.empty() ? L"" : L", ") + observer->GetName();
    return base::Utf8(text);
}

} // namespace

void PlaceFreeObserver(VtCPanoramicDocument& document, const Place& place)
{
    VtC3DObserver& observer = *document.GetObservers().GetFree1();
    if (observer.GetFollowMode() != followFree)
        observer.SetFollowModeIndex(followFree);
    const osg::Vec3d from(place.eye[0], place.eye[1], place.eye[2]);
    const osg::Vec3d to(place.look[0], place.look[1], place.look[2]);
    // Straight up or down there is no "up" by z; then north is.
    const bool upright = to.x() != from.x() || to.y() != from.y();
    const osg::Matrixd viewMatrix = osg::Matrixd::lookAt(from, to, upright ? osg::Vec3d(0, 0, 1) : osg::Vec3d(0, 1, 0));
    observer.StoreFreeView(from, osg::Matrixd::inverse(viewMatrix).getRotate());
    observer.PushViewMatrix();
}

void ConsoleView::Prepare(ConsoleHost& host, const Size& picture)
{
    const int times = Magnification(picture);
    host.GetViews().SetSize(picture.width * times, picture.height * times);
}

std::unique_ptr<ConsoleView> ConsoleView::Create(ConsoleHost& host, VtCPanoramicDocument& document,
                                                 const ViewArguments& arguments)
{
    std::unique_ptr<ConsoleView> made(new ConsoleView(document, arguments.size));
    const VtCChildFrame& frame = *document.GetChildFrame();
    WaitForViews(host, frame);
    const osgViewer::View* view = frame.getSplitter().getView(1)->getView();
    if (!getSharedContext() || !view->getCamera()->getGraphicsContext())
    {
        host.GetMessages().Show({.number = messageNoContext,
                                 .first = host.GetGraphics()->GetLastError(),
                                 .severity = host::Severity::error});
        return nullptr;
    }
    return made->Arrange(host, arguments) ? std::move(made) : nullptr;
}

bool ConsoleView::Arrange(ConsoleHost& host, const ViewArguments& arguments)
{
    VtCChildFrame& frame = *document.GetChildFrame();
    if (arguments.pane != 0)
        frame.activateView(*frame.getSplitter().getView(arguments.pane));
    if (arguments.splitter)
        frame.getSplitter().setSplitterPosition((*arguments.splitter)[0], (*arguments.splitter)[1]);
    else if (arguments.layout)
        frame.ApplyLayout(*arguments.layout);
    else if (arguments.ShowsOnePane())
        frame.ApplyLayout(layoutSingle);
    if (!arguments.observer.empty() && !frame.GetActivePane()->assignObserverByName(base::Wide(arguments.observer)))
    {
        host.ShowError(messageNoObserver, arguments.observer, ObserverNames(document.GetObservers()));
        return false;
    }
    if (arguments.place)
        LookAt(*arguments.place);
    return true;
}

void ConsoleView::LookAt(const Place& place)
{
    VtCPanoramicView& view = *document.GetChildFrame()->GetActivePane();
    const VtC3DObserver* observer = document.GetObservers().GetFree1();
    if (view.getObserver() != observer)
        view.assignObserverByName(observer->GetName());
    PlaceFreeObserver(document, place);
}

osg::ref_ptr<osg::Image> ConsoleView::Read()
{
    const VtCSplitterEx& splitter = document.GetChildFrame()->getSplitter();
    const host::Rectangle client = splitter.getWindow().GetClientRectangle();
    std::vector<hosts::PlacedPicture> parts;
    bool complete = true;
    splitter.forEachView(
        [&](VtCPanoramicView& view)
        {
            const host::Rectangle place = view.getWindow().GetRectangleInParent();
            if (place.width <= 0 || place.height <= 0)
                return;
            const osg::ref_ptr<osg::Image> part = hosts::ReadPicture(*view.getView()->getCamera());
            complete = complete && part;
            if (part)
                parts.push_back({part, place.x, client.height - place.y - place.height});
        });
    if (!complete || parts.empty())
        return nullptr;
    osg::ref_ptr<osg::Image> whole = hosts::ComposePicture(parts, client.width, client.height);
    return client.width == picture.width ? whole : hosts::ScalePicture(*whole, picture.width, picture.height);
}

} // namespace console

#include "tools/bench/OpenExample.h"

#include <stdexcept>

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "render/ChildFrame.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "tests/support/AppStages.h"
#include "tools/bench/ExampleModels.h"

namespace bench
{

namespace
{

constexpr double frameTime = 0.02;

} // namespace

OpenExample::OpenExample(int width, int height, long frame)
{
    host.graphics = &graphics;
    host.viewWindows = &windows;
    windows.splitter.width = width;
    windows.splitter.height = height;
    host.paths.module = base::InnerPath(ProgramFolder()) + L"\\";
    host.paths.objects = base::InnerPath(ExampleFolder() / "Vantor Objects/advanced");
    host.paths.customer = base::InnerPath(ExampleFolder() / "Customer_Objects");
    fake::StartApplication(app);

    VtCSimulationDataRouter& router = app.GetController()->GetRouter();
    router.SelectPoint(L"File");
    auto* point = router.FindPoint(L"File");
    if (!point || !point->Configure(L"MDF", base::InnerPath(ExampleFolder() / "run.mdf"), 1, 0))
        throw std::runtime_error("the run of the example can't be read");
    document = dynamic_cast<VtCPanoramicDocument*>(
        host.documentManager.OpenDocument(base::InnerPath(ExampleFolder() / "example.xml")));
    if (!document)
        throw std::runtime_error("the scene of the example can't be read");
    windows.Fire();
    for (int pane = 1; pane <= 4; ++pane)
        if (!Pane(pane).isInViewer())
            throw std::runtime_error("a pane can't be drawn");
    app.GetController()->ShowFrame({}, frame);
}

OpenExample::~OpenExample()
{
    host.documentManager.CloseActiveDocument();
    fake::StopApplication(app);
}

void OpenExample::Step()
{
    host.clock.Advance(frameTime);
    app.IdleStep();
}

VtCPanoramicView& OpenExample::Pane(int number) const
{
    return *document->GetChildFrame()->getSplitter().getView(number);
}

osg::Node* OpenExample::GetRootNode() const
{
    return document->GetScene()->GetRootNode();
}

} // namespace bench

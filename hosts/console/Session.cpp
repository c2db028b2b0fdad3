#include "hosts/console/Session.h"

#include "app/PanoramicDocument.h"
#include "base/Paths.h"
#include "simdata/SimulationDataController.h"

namespace console
{

Session::Session(bool showLog) : host(showLog), app(host)
{
    app.InitInstance();
    app.Connect();
    app.ConnectToOtherComponents();
    app.InsertGUIElements();
    app.StartupCompleted();
    app.FinalizeInitialization();
}

Session::~Session()
{
    GetController().StopPlay();
    GetController().Stop();
    std::int32_t answer = 0;
    app.ShutDownRequest(answer);
    app.DisconnectIdleSink();
    while (host.GetDocumentManager()->GetActiveDocument())
        host.GetDocumentManager()->CloseActiveDocument();
    app.StartShutdown(answer);
    app.RemoveGUIElements();
    app.RemoveComponentConnections();
    app.Disconnect();
}

VtCPanoramicDocument* Session::NewDocument()
{
    return dynamic_cast<VtCPanoramicDocument*>(host.GetDocumentManager()->NewDocument());
}

VtCPanoramicDocument* Session::OpenDocument(const std::filesystem::path& scene)
{
    return dynamic_cast<VtCPanoramicDocument*>(host.GetDocumentManager()->OpenDocument(base::InnerPath(scene)));
}

} // namespace console

#include "hosts/desktop/Session.h"

#include <QTimer>

#include "base/Paths.h"
#include "simdata/SimulationDataController.h"

namespace desktop
{

Session::Session() : app(host), window(host, app)
{
    app.InitInstance();
    app.Connect();
    app.ConnectToOtherComponents();
    app.InsertGUIElements();
    app.StartupCompleted();
    // Reading the stored settings sets them only; the first scene is to be drawn as the user has chosen.
    if (const VtCVisualizationPPGSettings* settings = app.GetSettings())
        app.SetRendererMode(settings->GetRendererMode());
    window.Build();
    app.FinalizeInitialization();
}

Session::~Session()
{
    host.GetPump().Stop();
    window.LetGo();
    window.GetFiles().CloseScene();
    app.DisconnectIdleSink();
    std::int32_t answer = 0;
    app.StartShutdown(answer);
    app.RemoveGUIElements();
    app.RemoveComponentConnections();
    app.Disconnect();
}

void Session::Show(const StartArguments& arguments)
{
    window.show();
    host.GetPump().Start();
    QTimer::singleShot(0, &window, [this, arguments] { OpenFirst(arguments); });
}

void Session::OpenFirst(const StartArguments& arguments)
{
    const auto inner = [](const std::filesystem::path& path)
    { return base::InnerPath(std::filesystem::absolute(path).lexically_normal()); };

    host.GetDocumentManager()->NewDocument();
    // The data come first: a body finds its channel by name only where there are channels.
    if (!arguments.data.empty())
        window.GetFiles().OpenFile(inner(arguments.data));
    if (!arguments.scene.empty())
        window.GetFiles().OpenFile(inner(arguments.scene));
    if (arguments.play)
        window.GetActions().Execute(ControllerCommand::playOnce);
}

} // namespace desktop

#include "app/PanoramicDocument.h"

#include <filesystem>
#include <system_error>

#include "app/GraphicsSession.h"
#include "app/PanoramicApp.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationDataReceiver.h"

namespace
{

constexpr std::uint32_t messageNoScene = 417;          // %1 the file, if it was one
constexpr std::uint32_t messageSceneNotReadable = 496; // %1 the file

} // namespace

VtCPanoramicDocument::VtCPanoramicDocument(VtCPanoramicApp& application) : app(application)
{
    if (!graphicsSession)
        graphicsSession = std::make_unique<VtCGraphicsSession>();
    ownedScene = std::make_unique<VtCScene3D>(*this);
    receiver = std::make_unique<VtCSimulationDataReceiver>(app);
    if (VtCSimulationDataController* controller = app.GetController())
        controller->GetRouter().AddReceiver(receiver.get());
}

VtCPanoramicDocument::~VtCPanoramicDocument()
{
    if (VtCSimulationDataController* controller = app.GetController())
        controller->GetRouter().RemoveReceiver(receiver.get());
    receiver.reset();
    ownedScene.reset();
    destroyViewer();
}

bool VtCPanoramicDocument::OnNewDocument()
{
    if (app.CanOpenScene())
        return true;
    app.GetMessageHandler().ShowWarning(messageNoScene);
    return false;
}

bool VtCPanoramicDocument::OnOpenDocument(const std::wstring& path)
{
    const std::filesystem::path file = base::NativePath(path);
    const std::wstring shown = base::Wide(file.string());
    std::error_code failed;
    if (!std::filesystem::is_regular_file(file, failed) || !app.CanOpenScene())
    {
        app.GetMessageHandler().ShowWarning(messageNoScene, shown);
        return false;
    }
    // There is no reader of scene files in this component, so no file can be taken as one.
    app.GetMessageHandler().ShowError(messageSceneNotReadable, shown);
    return false;
}

VtTSceneServices& VtCPanoramicDocument::GetServices()
{
    return app.GetSceneServices();
}

#include "app/PanoramicDocument.h"

#include <filesystem>
#include <system_error>

#include <osg/Notify>
#include <osgDB/Registry>

#include "app/DayLight.h"
#include "app/SceneLoader.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "host/Clock.h"
#include "host/Host.h"
#include "host/Messages.h"
#include "host/Selection.h"
#include "host/ViewWindows.h"
#include "interaction/MouseInput.h"
#include "interaction/Observers.h"
#include "records/SceneObject.h"
#include "records/SceneObjectStore.h"
#include "render/ChildFrame.h"
#include "render/Viewer.h"
#include "scene/Scene3D.h"
#include "simdata/SimulationDataController.h"
#include "simdata/SimulationDataReceiver.h"

namespace
{

constexpr std::uint32_t messageNoScene = 417;          // %1 the file, if it was one
constexpr std::uint32_t messageSceneNotReadable = 496; // %1 the file, %2 the reason
constexpr std::uint32_t messageSaved = 524;            // %1 the file
constexpr std::uint32_t messageNotSaved = 525;         // %1 the file, %2 the reason
constexpr std::uint32_t textOtherFileType = 9014;      // why a file of another extension can't be read

// The store serves all documents of the process; what a scene only kept goes with the last of them.
int openDocuments = 0;

std::wstring Shown(const std::wstring& path)
{
    return base::Wide(base::NativePath(path).string());
}

} // namespace

std::unique_ptr<VtCGraphicsSession> graphicsSession;

VtCGraphicsSession::VtCGraphicsSession()
{
    osg::setNotifyLevel(osg::WARN);
}

VtCGraphicsSession::~VtCGraphicsSession()
{
    osgDB::Registry::instance()->clearObjectCache();
}

VtCPanoramicDocument::VtCPanoramicDocument(VtIDocumentApplication& application) : app(application)
{
    ++openDocuments;
    if (!graphicsSession)
        graphicsSession = std::make_unique<VtCGraphicsSession>();
    ownedScene = std::make_unique<VtCScene3D>(*this);
    scene->GetObjects().AddListener(*this);
    for (VtISceneListener* listener : app.GetSceneListeners())
        scene->GetObjects().AddListener(*listener);
    AddDayLight(*scene->GetEnvironmentNode());

    observers = new VtC3DObservers(*this, *this, app.GetHost().GetClock(),
                                   base::NativePath(app.GetModuleDirectory() + std::wstring(defaultObserversFile)));
    observers->CreateFreeObservers();
    scene->SetObservers(observers);

    receiver = std::make_unique<VtCSimulationDataReceiver>(app);
    if (VtCSimulationDataController* controller = app.GetController())
        controller->GetRouter().AddReceiver(receiver.get());

    mouseInputManager = std::make_unique<VtCMouseInputManager>();
    MakeChildFrame();
    RegisterSceneRecords(builders);
    RegisterObserverRecords(builders, *observers);
    if (childFrame)
        RegisterViewRecords(builders, *childFrame);
    SetModifiedFlag(false);
}

VtCPanoramicDocument::~VtCPanoramicDocument()
{
    childFrame.reset();
    if (VtCSimulationDataController* controller = app.GetController())
        controller->GetRouter().RemoveReceiver(receiver.get());
    receiver.reset();
    scene->SetObservers(nullptr);
    observers->Release();
    ownedScene.reset();
    destroyViewer();
    if (--openDocuments == 0)
        GetServices().store.Clear();
}

void VtCPanoramicDocument::MakeChildFrame()
{
    host::ViewWindows* windows = app.GetHost().GetViewWindows();
    if (!windows)
        return;
    childFrame = std::make_unique<VtCChildFrame>(VtTChildFrameServices{.document = *this,
                                                                       .observers = *observers,
                                                                       .interaction = *this,
                                                                       .mouseInputManager = *mouseInputManager,
                                                                       .windows = *windows,
                                                                       .selection = app.GetHost().GetSelection(),
                                                                       .clock = app.GetHost().GetClock()});
}

void VtCPanoramicDocument::SetModified(bool flag)
{
    SetModifiedFlag(flag);
    requestViewerRedraw();
}

bool VtCPanoramicDocument::OnNewDocument()
{
    if (!app.CanOpenScene())
    {
        app.GetMessageHandler().ShowWarning(messageNoScene);
        return false;
    }
    if (childFrame)
        childFrame->startViewCreation();
    return true;
}

bool VtCPanoramicDocument::OnOpenDocument(const std::wstring& path)
{
    const std::filesystem::path file = base::NativePath(path);
    std::error_code failed;
    if (!std::filesystem::is_regular_file(file, failed) || !app.CanOpenScene())
    {
        app.GetMessageHandler().ShowWarning(messageNoScene, Shown(path));
        return false;
    }
    std::wstring reason;
    if (!LoadScene(path, reason))
    {
        app.GetMessageHandler().ShowError(messageSceneNotReadable, Shown(path), reason);
        return false;
    }
    observers->ResolveTargets();
    SetModifiedFlag(false);
    if (childFrame)
        childFrame->startViewCreation();
    return true;
}

bool VtCPanoramicDocument::LoadScene(const std::wstring& path, std::wstring& reason)
{
    if (!base::EqualsNoCase(base::Wide(base::NativePath(path).extension().string()), L".xml"))
    {
        reason = app.GetHost().GetTexts().GetText(textOtherFileType);
        return false;
    }
    try
    {
        if (VtCSceneLoader(*scene, builders).Load(path))
            return true;
        reason = scene->GetFileError();
    }
    catch (const VtCAttributeError& error)
    {
        reason = base::Wide(error.what());
    }
    return false;
}

bool VtCPanoramicDocument::OnSaveDocument(const std::wstring& path)
{
    if (scene->SaveScene(path))
    {
        app.GetMessageHandler().Log(messageSaved, Shown(path));
        return true;
    }
    app.GetMessageHandler().ShowError(messageNotSaved, Shown(path), scene->GetFileError());
    return false;
}

void VtCPanoramicDocument::ObjectRemoved(VtCGlidePanelAbstractNavigatorObject& object)
{
    if (!scene->GetObjects().FindById(object.GetInternalId()))
        app.GetHost().GetSelection().RemoveFromSelection(object.GetInternalId());
}

VtTSceneServices& VtCPanoramicDocument::GetServices()
{
    return app.GetSceneServices();
}

std::uint32_t VtCPanoramicDocument::GetMouseSensitivity() const
{
    return app.GetMouseSensitivity();
}

bool VtCPanoramicDocument::IsActiveView(const osgViewer::View* view) const
{
    return childFrame && childFrame->IsActiveView(view);
}

const VtC3DObserver* VtCPanoramicDocument::GetActiveObserver() const
{
    return childFrame ? childFrame->GetActiveObserver() : nullptr;
}

void VtCPanoramicDocument::ReplaceObserverInViews(const VtC3DObserver& gone, VtC3DObserver& substitute)
{
    if (childFrame)
        childFrame->assignObserver(gone, substitute);
}

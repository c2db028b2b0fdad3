#pragma once

#include <memory>
#include <string>
#include <vector>

#include "host/Documents.h"
#include "interaction/InteractionServices.h"
#include "scene/RecordBuilders.h"
#include "scene/SceneObjects.h"
#include "scene/SceneServices.h"
#include "simdata/SimulationServices.h"

namespace host
{
class Host;
}
class VtC3DObservers;
class VtCChildFrame;
class VtCMouseInputManager;
class VtCSimulationDataController;
class VtCSimulationDataReceiver;

/// Its existence means that the scene graph library is set up for the process. The first document makes it, and it
/// stays until the component shuts down. The idle step draws only while it exists.
class VtCGraphicsSession
{
public:
    /// Brings the library's reports down to warnings and errors: at its usual level it tells about every driver.
    VtCGraphicsSession();
    ~VtCGraphicsSession();
    VtCGraphicsSession(const VtCGraphicsSession&) = delete;
    VtCGraphicsSession& operator=(const VtCGraphicsSession&) = delete;
};

/// The one of the process; null while there is none.
extern std::unique_ptr<VtCGraphicsSession> graphicsSession;

/// What a document needs of the application, which outlives it. The application object implements it.
class VtIDocumentApplication : public VtIActiveScene
{
public:
    virtual host::Host& GetHost() const = 0;
    virtual host::MessageHandler& GetMessageHandler() = 0;
    virtual VtTSceneServices& GetSceneServices() = 0;

    /// Who hears of the scenes of all documents, from their first object on.
    virtual const std::vector<VtISceneListener*>& GetSceneListeners() const = 0;

    /// Null outside of the time between start-up and shutdown.
    virtual VtCSimulationDataController* GetController() const = 0;

    /// May a scene be made or opened? Asked before each.
    virtual bool CanOpenScene() const = 0;

    /// Folder of the program with a trailing backslash; empty when it can't be told.
    virtual std::wstring GetModuleDirectory() const = 0;
    virtual std::uint32_t GetMouseSensitivity() const = 0;

    /// Suspend the frame cycle and take it up again.
    virtual void DisconnectIdleSink() = 0;
    virtual void ConnectIdleSink() = 0;
};

/// A document: one scene with its observers and its frame of views, and the receiver by which simulation data get to
/// it. The host's document manager owns it.
///
/// A new one has an empty scene. A different scene is a different document.
class VtCPanoramicDocument : public host::ManagedDocument,
                             public VtISceneDocument,
                             private VtIInteractionServices,
                             private VtISceneListener
{
public:
    /// File beside the program with the observers that a new model is given.
    static constexpr const wchar_t* defaultObserversFile = L"DefaultObservers.ini";

    /// Sets the scene graph library up if this is the first document. `application` outlives this.
    explicit VtCPanoramicDocument(VtIDocumentApplication& application);

    /// Views, observers and scene go, and the viewer.
    ~VtCPanoramicDocument() override;

    /// False with warning 417 when no scene can be shown on this machine.
    bool OnNewDocument() override;

    /// Loads a scene file; the views are drawn to when their creation timer has fired. False with warning 417 when
    /// there is no such file or no scene can be shown, and with error 496 when it can't be read as a scene.
    bool OnOpenDocument(const std::wstring& path) override;

    /// Writes the scene file, whole or not at all. False with error 525, the document then being as modified as it was.
    bool OnSaveDocument(const std::wstring& path) override;

    VtCScene3D* GetScene() const override { return scene; }
    void SetScene(VtCScene3D* newScene) override { scene = newScene; }
    void SetModified(bool flag) override;
    VtTSceneServices& GetServices() override;

    VtC3DObservers& GetObservers() const { return *observers; }

    /// Null in a host without windows for views.
    VtCChildFrame* GetChildFrame() const { return childFrame.get(); }

private:
    std::uint32_t GetMouseSensitivity() const override;
    bool IsActiveView(const osgViewer::View* view) const override;
    const VtC3DObserver* GetActiveObserver() const override;
    void SetHeadLightPosition(const osg::Vec3f&) override {} // the head light stands at the eye of each view
    void ReplaceObserverInViews(const VtC3DObserver& gone, VtC3DObserver& substitute) override;

    /// What has gone isn't selected any more.
    void ObjectRemoved(VtCGlidePanelAbstractNavigatorObject& object) override;

    void MakeChildFrame();
    bool LoadScene(const std::wstring& path, std::wstring& reason);

    VtIDocumentApplication& app;
    VtCScene3D* scene = nullptr; ///< set by the scene's own constructor, before it is whole
    std::unique_ptr<VtCScene3D> ownedScene;
    VtC3DObservers* observers = nullptr; ///< one reference
    std::unique_ptr<VtCMouseInputManager> mouseInputManager;
    std::unique_ptr<VtCChildFrame> childFrame;
    VtCRecordBuilders builders; ///< those of this scene's observers and views among them
    std::unique_ptr<VtCSimulationDataReceiver> receiver;
};

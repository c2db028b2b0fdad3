#pragma once

#include <memory>
#include <string>

#include "host/Documents.h"
#include "scene/SceneServices.h"

class VtCPanoramicApp;
class VtCSimulationDataReceiver;

/// A document: one scene, and the receiver by which simulation data get to it. The host's document manager owns it.
///
/// A new one has an empty scene. A different scene is a different document.
class VtCPanoramicDocument : public host::ManagedDocument, public VtISceneDocument
{
public:
    /// Sets the scene graph library up if this is the first document. `application` outlives this.
    explicit VtCPanoramicDocument(VtCPanoramicApp& application);

    /// The scene goes, and the viewer with all its views.
    ~VtCPanoramicDocument() override;

    /// False with warning 417 when no scene can be shown on this machine.
    bool OnNewDocument() override;

    /// False with warning 417 also when there is no such file, and with error 496 when it can't be read as a scene.
    bool OnOpenDocument(const std::wstring& path) override;

    VtCScene3D* GetScene() const override { return scene; }
    void SetScene(VtCScene3D* newScene) override { scene = newScene; }
    void SetModified(bool flag) override { SetModifiedFlag(flag); }
    VtTSceneServices& GetServices() override;

private:
    VtCPanoramicApp& app;
    VtCScene3D* scene = nullptr; ///< set by the scene's own constructor, before it is whole
    std::unique_ptr<VtCScene3D> ownedScene;
    std::unique_ptr<VtCSimulationDataReceiver> receiver;
};

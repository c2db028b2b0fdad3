#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include <osg/Group>
#include <osg/MatrixTransform>
#include <osg/Projection>
#include <osg/ref_ptr>

#include "records/AttributeTable.h"
#include "records/PGEventSink.h"
#include "records/SceneObject.h"
#include "scene/MovableBodies.h"
#include "scene/ObjectHandle.h"
#include "scene/RenderMode.h"
#include "scene/SceneObjects.h"
#include "scene/StaticBodies.h"

class VtC3DMovableBody;
class VtCTrack;
class VtISceneDocument;
class VtISceneObservers;

/// One scene: the top of the scene graph, the collections of bodies, and the render mode of all of them.
///
/// A document makes one and keeps it for life; there is no emptying of a scene.
class VtCScene3D : public VtIRecordOwner
{
public:
    /// Tells `owningDocument` (not owned) of itself before anything else, and leaves it unmodified.
    explicit VtCScene3D(VtISceneDocument& owningDocument);
    virtual ~VtCScene3D();
    VtCScene3D(const VtCScene3D&) = delete;
    VtCScene3D& operator=(const VtCScene3D&) = delete;

    VtISceneDocument& GetDocument() const { return document; }

    /// All objects of the scene by their ids, and the list of those who hear of them.
    VtCSceneObjects& GetObjects() { return objects; }
    const VtCSceneObjects& GetObjects() const { return objects; }

    // The graph: the root, with the environment and the content; the content holds the overlay projection, the static
    // bodies, the movable bodies and those of each track, in this order.

    osg::Group* GetRootNode() const { return rootNode.get(); }
    osg::Group* GetEnvironmentNode() const { return environmentNode.get(); }
    osg::Group* GetContentNode() const { return contentNode.get(); }
    osg::Group* GetStaticBodiesNode() const { return staticBodiesNode.get(); }
    osg::Group* GetMovableBodiesNode() const { return movableBodiesNode.get(); }
    osg::Projection* GetOverlayProjection() const { return overlayProjection.get(); }
    osg::MatrixTransform* GetOverlayTransform() const { return overlayTransform.get(); }

    // The bodies.

    VtCStaticBodies* GetStaticBodies() const { return staticBodies; }

    /// 0 the simulation's own, n those of track n; null beyond the last.
    VtCMovableBodies* GetMovableBodies(std::int32_t index) const
    {
        return index >= 0 && index < GetMovableBodiesCount() ? movableBodies[static_cast<std::size_t>(index)] : nullptr;
    }
    std::int32_t GetMovableBodiesCount() const { return static_cast<std::int32_t>(movableBodies.size()); }

    /// Highest index that a collection of movable bodies may have.
    std::int32_t GetMaxTracks() const { return maxTracks; }

    /// The first movable body of the simulation of that name, without regard to case; null when there is none.
    VtC3DMovableBody* FindMovableByName(std::wstring_view name) const;

    /// A further collection, with clones of the simulation's bodies if asked for; null beyond `GetMaxTracks`.
    VtCMovableBodies* AddTrackBodies(bool cloneExisting, VtCTrack* track, std::int32_t trackNumber);

    /// Destroys a collection of clones; later ones move down by one. False for null, a stranger, and the collection
    /// of the simulation, which lives as long as the scene.
    bool RemoveTrackBodies(VtCMovableBodies* collection);

    /// Appends the model files of the simulation's movable bodies and of the static bodies.
    void CollectModelFiles(std::vector<std::wstring>& files) const;

    // The render mode.

    VtERenderMode GetGlobalRenderMode() const { return globalRenderMode; }

    /// Applies `mode`, or each body's own mode, to all bodies but those of tracks, changed or not.
    void SetGlobalRenderMode(VtERenderMode mode, bool useOwnModes);

    /// What a command of the user does: nothing when `mode` is the present one, else the document is changed.
    void ChangeGlobalRenderMode(VtERenderMode mode, bool useOwnModes);

    static VtERenderMode RenderModeFromText(std::wstring_view text) { return ::RenderModeFromText(text); }
    static std::wstring RenderModeToText(VtERenderMode mode) { return ::RenderModeToText(mode); }

    /// The record of the render settings; null when the store has none to give. A write to it changes the mode.
    VtISceneObject* GetRenderSettings() const { return renderSettings.get(); }

    /// What that record holds.
    static const VtCAttributeTable& Attributes();
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(); }
    const std::wstring& GetRecordId() const override;
    void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                            const VtTAttributeValue& value) override;
    void OnRecordChanged() override;

    // The scene file. Paths in the inner form. It is read by the loader of the application (app/SceneLoader.h).

    /// Writes the records as they are. The file changes whole or not at all.
    bool SaveSceneFile(const std::wstring& path);

    /// Brings the placements of the movable bodies into their records, then writes them. The document counts as
    /// unmodified only when that succeeds.
    bool SaveScene(const std::wstring& path);

    /// Why the last read or write failed: "scene.xml, line 3: ..."; empty when it didn't.
    const std::wstring& GetFileError() const;

    /// All image files of the scene's textures, as of the end of the last load.
    const std::vector<std::wstring>& GetTextureFiles() const { return textureFiles; }
    void SetTextureFiles(std::vector<std::wstring> files) { textureFiles = std::move(files); }

    // The view that has the focus.

    /// `observer` is the one that `view` looks through. Null when there is no view any more.
    void SetActiveView(VtCBase3DView* view, VtCGlidePanelAbstractNavigatorObject* observer);
    VtCBase3DView* GetActiveView() const { return activeView; }

    /// Null when the active view has none, and when it has left the scene.
    VtCGlidePanelAbstractNavigatorObject* GetActiveObserver() const { return activeObserver.Get(); }

    // The frame.

    /// Not owned, may be null.
    void SetObservers(VtISceneObservers* sceneObservers) { observers = sceneObservers; }
    VtISceneObservers* GetSceneObservers() const { return observers; }

    /// Moves the observers to where their bodies are now. Bodies move when their frames arrive, not here.
    void UpdateFrame();

private:
    void MakeRenderSettings();
    void BuildGraph();
    void TakeGlobalRenderMode(VtERenderMode mode);
    void ApplyGlobalRenderMode(VtERenderMode mode, bool useOwnModes);

    VtISceneDocument& document;
    VtCSceneObjects objects;
    std::int32_t maxTracks = 0;
    VtERenderMode globalRenderMode = VtERenderMode::Mixed;
    osg::ref_ptr<VtISceneObject> renderSettings;
    VTIPGEventSink settingsSink{*this};
    osg::ref_ptr<osg::Group> rootNode;
    osg::ref_ptr<osg::Group> environmentNode;
    osg::ref_ptr<osg::Group> contentNode;
    osg::ref_ptr<osg::Projection> overlayProjection;
    osg::ref_ptr<osg::MatrixTransform> overlayTransform;
    osg::ref_ptr<osg::Group> staticBodiesNode;
    osg::ref_ptr<osg::Group> movableBodiesNode;
    VtCStaticBodies* staticBodies = nullptr;      ///< one reference
    std::vector<VtCMovableBodies*> movableBodies; ///< one reference each
    VtISceneObservers* observers = nullptr;
    VtCBase3DView* activeView = nullptr; ///< not owned; its frame takes it back
    VtCObjectHandle<> activeObserver;
    std::vector<std::wstring> textureFiles;
};

/// Tells the tables of this folder: bodies and render settings.
void RegisterSceneAttributes();

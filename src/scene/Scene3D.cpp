#include "scene/Scene3D.h"

#include "base/Text.h"
#include "host/Messages.h"
#include "host/Storage.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/Collectors.h"
#include "scene/MovableBody.h"
#include "scene/SceneServices.h"
#include "scene/StaticBody.h"

#include <algorithm>

namespace
{

constexpr std::uint32_t textScene = 6231;
constexpr std::uint32_t textContent = 6232;
constexpr std::uint32_t textEnvironment = 6233;
constexpr std::uint32_t textStaticBodies = 6234;
constexpr std::uint32_t textMovableBodies = 6235;

const std::wstring renderSettingsId = L"render_settings";

void ApplyModeToAll(const VtC3DBodies& bodies, VtERenderMode mode, bool useOwnModes)
{
    VtCGlidePanelAbstractNavigatorObject::Objects descendants;
    bodies.CollectDescendants(descendants);
    for (VtCGlidePanelAbstractNavigatorObject* object : descendants)
        if (auto* body = dynamic_cast<VtC3DBody*>(object))
        {
            if (mode == VtERenderMode::Mixed)
                body->TakeWaitingTransparency();
            body->ApplyGlobalMode(useOwnModes ? body->GetRenderMode() : mode);
        }
}

void AppendModelFiles(const VtC3DBodies& bodies, std::vector<std::wstring>& files)
{
    VtCGlidePanelAbstractNavigatorObject::Objects descendants;
    bodies.CollectDescendants(descendants);
    for (VtCGlidePanelAbstractNavigatorObject* object : descendants)
        if (const auto* body = dynamic_cast<VtC3DBody*>(object))
            files.push_back(body->GetFilePath());
}

// A deep copy holds copies of the programs too, which nobody would set parameters of or rebuild.
void ShareProgramsAgain(osg::Node& clone, VtIModelLibrary& models)
{
    VtCOsgShaderCollector collector;
    clone.accept(collector);
    for (const auto& [stateSet, program] : collector.programs)
    {
        stateSet->removeAttribute(program);
        const std::wstring name = base::Wide(program->getName());
        const std::wstring path = models.getShaderDirectory() + name;
        if (stateSet->getNumParents() == 0)
            continue;
        osg::Node* owner = stateSet->getParent(0);
        if (osg::Drawable* drawable = owner->asDrawable())
            models.assignDrawableShader(drawable, name, path + L".vert", path + L".frag");
        else
            models.assignShader(owner, name, path + L".vert", path + L".frag");
    }
}

} // namespace

VtCScene3D::VtCScene3D(VtISceneDocument& owningDocument) : document(owningDocument)
{
    document.SetScene(this);
    if (const host::Configuration* configuration = document.GetServices().configuration)
        maxTracks = std::max(configuration->GetMaxTracks(), 0);
    MakeRenderSettings();
    BuildGraph();
    document.SetModified(false);
}

VtCScene3D::~VtCScene3D()
{
    for (VtCMovableBodies* collection : movableBodies)
        collection->LeaveScene();
    staticBodies->LeaveScene();
    for (VtCMovableBodies* collection : movableBodies)
        collection->Release();
    movableBodies.clear();
    staticBodies->Release();
    staticBodies = nullptr;
    document.SetScene(nullptr);
}

void VtCScene3D::MakeRenderSettings()
{
    VtISceneObjectStore& store = document.GetServices().store;
    renderSettings = store.ParseObject(store.GetDefaultText(objectTypeRenderSettings)).object;
    if (!renderSettings)
        return;
    settingsSink.WriteBack(renderSettings.get(), attribute::globalRenderMode);
    renderSettings->Write(attribute::internalId, renderSettingsId);
    settingsSink.Connect(renderSettings.get());
    store.AddObject(renderSettingsId, renderSettings);
}

const VtCAttributeTable& VtCScene3D::Attributes()
{
    static const VtCAttributeTable table(
        objectTypeRenderSettings,
        {IdentityRows(objectTypeRenderSettings, KeptAttribute(attribute::name, L"", "")),
         {Attribute<VtCScene3D>(attribute::globalRenderMode, VtERenderMode::Mixed, &VtCScene3D::TakeGlobalRenderMode,
                                &VtCScene3D::globalRenderMode, "as of bodies; 5 mixed: each body uses its own")}});
    return table;
}

const std::wstring& VtCScene3D::GetRecordId() const
{
    return renderSettingsId;
}

void VtCScene3D::OnAttributeChanged(const std::wstring&, const std::wstring& attributeName,
                                    const VtTAttributeValue& value)
{
    Attributes().Take(*this, attributeName, value);
}

void VtCScene3D::OnRecordChanged()
{
    document.SetModified(true);
}

void VtCScene3D::BuildGraph()
{
    using osg::StateAttribute;
    const host::Texts& texts = document.GetServices().texts;

    rootNode = new osg::Group;
    rootNode->setName(base::Utf8(texts.GetText(textScene)));
    osg::StateSet& state = *rootNode->getOrCreateStateSet();
    for (const GLenum mode : {GL_LIGHTING, GL_NORMALIZE, GL_LIGHT0, GL_LIGHT1, GL_BLEND, GL_DEPTH_TEST})
        state.setMode(mode, StateAttribute::ON);
    state.setMode(GL_STENCIL_TEST, StateAttribute::ON | StateAttribute::OVERRIDE);

    environmentNode = new osg::Group;
    environmentNode->setName(base::Utf8(texts.GetText(textEnvironment)));
    rootNode->addChild(environmentNode);

    contentNode = new osg::Group;
    contentNode->setName(base::Utf8(texts.GetText(textContent)));
    rootNode->addChild(contentNode);

    overlayProjection = new osg::Projection(osg::Matrixd::ortho2D(0, 1, 0, 1));
    contentNode->addChild(overlayProjection);
    overlayTransform = new osg::MatrixTransform;
    overlayTransform->setReferenceFrame(osg::Transform::ABSOLUTE_RF);
    overlayTransform->getOrCreateStateSet()->setMode(GL_LIGHTING, StateAttribute::OFF);
    overlayProjection->addChild(overlayTransform);

    staticBodies = new VtCStaticBodies(document, contentNode, texts.GetText(textStaticBodies));
    staticBodiesNode = staticBodies->GetTransformNode();
    movableBodies.push_back(new VtCMovableBodies(document, contentNode, texts.GetText(textMovableBodies)));
    movableBodiesNode = movableBodies.front()->GetTransformNode();
}

VtC3DMovableBody* VtCScene3D::FindMovableByName(std::wstring_view name) const
{
    return dynamic_cast<VtC3DMovableBody*>(movableBodies.front()->FindByName(name));
}

VtCMovableBodies* VtCScene3D::AddTrackBodies(bool cloneExisting, VtCTrack* track, std::int32_t trackNumber)
{
    if (GetMovableBodiesCount() > maxTracks)
        return nullptr;

    const VtTSceneServices& services = document.GetServices();
    auto* collection = new VtCMovableBodies(document, contentNode, services.texts.GetText(textScene), track);
    movableBodies.push_back(collection);
    if (cloneExisting)
        for (VtC3DMovableBody* body : movableBodies.front()->GetBodies())
            if (const VtC3DMovableBody* clone = body->CloneIntoTrack(*collection, track, trackNumber))
                ShareProgramsAgain(*clone->GetTransformNode(), services.models);
    return collection;
}

bool VtCScene3D::RemoveTrackBodies(VtCMovableBodies* collection)
{
    const auto at = std::find(movableBodies.begin() + 1, movableBodies.end(), collection);
    if (at == movableBodies.end())
        return false;
    collection->RemoveAllBodies();
    movableBodies.erase(at);
    collection->Release();
    return true;
}

void VtCScene3D::CollectModelFiles(std::vector<std::wstring>& files) const
{
    AppendModelFiles(*movableBodies.front(), files);
    AppendModelFiles(*staticBodies, files);
}

void VtCScene3D::SetGlobalRenderMode(VtERenderMode mode, bool useOwnModes)
{
    ApplyGlobalRenderMode(mode, useOwnModes);
    settingsSink.WriteBack(renderSettings.get(), attribute::globalRenderMode);
}

void VtCScene3D::ApplyGlobalRenderMode(VtERenderMode mode, bool useOwnModes)
{
    ApplyModeToAll(*staticBodies, mode, useOwnModes);
    ApplyModeToAll(*movableBodies.front(), mode, useOwnModes);
    globalRenderMode = mode;
}

void VtCScene3D::TakeGlobalRenderMode(VtERenderMode mode)
{
    const bool isMode = mode >= VtERenderMode::Gouraud && mode <= VtERenderMode::Mixed;
    const VtERenderMode taken = isMode ? mode : VtERenderMode::Mixed;
    ApplyGlobalRenderMode(taken, taken == VtERenderMode::Mixed);
}

void VtCScene3D::ChangeGlobalRenderMode(VtERenderMode mode, bool useOwnModes)
{
    if (mode != globalRenderMode)
        SetGlobalRenderMode(mode, useOwnModes);
}

bool VtCScene3D::SaveSceneFile(const std::wstring& path)
{
    return document.GetServices().store.SaveFile(path);
}

bool VtCScene3D::SaveScene(const std::wstring& path)
{
    VtCGlidePanelAbstractNavigatorObject::Objects descendants;
    movableBodies.front()->CollectDescendants(descendants);
    for (VtCGlidePanelAbstractNavigatorObject* object : descendants)
        if (auto* body = dynamic_cast<VtC3DMovableBody*>(object))
            body->StoreLastTransform();
    if (!SaveSceneFile(path))
        return false;
    document.SetModified(false);
    return true;
}

const std::wstring& VtCScene3D::GetFileError() const
{
    return document.GetServices().store.GetFileError();
}

void VtCScene3D::SetActiveView(VtCBase3DView* view, VtCGlidePanelAbstractNavigatorObject* observer)
{
    if (view == activeView && observer == activeObserver.Get())
        return;
    activeView = view;
    activeObserver = observer;
    objects.Tell([&](VtISceneListener& listener) { listener.ActiveViewChanged(view, observer); });
}

void VtCScene3D::UpdateFrame()
{
    if (observers)
        observers->UpdateObservers();
}

void RegisterSceneAttributes()
{
    RegisterAttributeTable(VtCScene3D::Attributes());
    RegisterAttributeTable(VtC3DStaticBody::Attributes());
    RegisterAttributeTable(VtC3DMovableBody::Attributes());
}

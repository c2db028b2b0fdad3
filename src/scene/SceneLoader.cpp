#include "scene/SceneLoader.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "host/Questions.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/SceneParts.h"
#include "scene/SceneServices.h"
#include "scene/StaticBody.h"
#include "scene/StoredModel.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace
{

constexpr std::uint32_t messageUnknownType = 509;
constexpr std::uint32_t messageNoModelFile = 528;
constexpr long activityScene = 40;
constexpr long activityBody = 50;
constexpr long activityRecords = 51;
constexpr const wchar_t* renderSettingsKey = L"RenderSettings";

/// True for the time of a load, however that ends.
class Loading
{
public:
    explicit Loading(VtCGlidePanelAbstractNavigatorObject& loaded) : object(loaded) { object.SetLoading(true); }
    ~Loading() { object.SetLoading(false); }
    Loading(const Loading&) = delete;
    Loading& operator=(const Loading&) = delete;

private:
    VtCGlidePanelAbstractNavigatorObject& object;
};

std::wstring TextOf(const VtISceneObject& record, const wchar_t* attribute)
{
    const auto* text = record.Find<std::wstring>(attribute);
    return text ? *text : std::wstring();
}

std::int32_t NumberOf(const VtISceneObject& record, const wchar_t* attribute, std::int32_t otherwise)
{
    const auto* number = record.Find<std::int32_t>(attribute);
    return number ? *number : otherwise;
}

bool IsBody(const VtISceneObject& record)
{
    return record.GetObjectType() == objectTypeStaticBody || record.GetObjectType() == objectTypeMovableBody;
}

} // namespace

VtCSceneLoader::VtCSceneLoader(VtCScene3D& loadedScene)
    : scene(loadedScene), services(loadedScene.GetDocument().GetServices())
{
}

bool VtCSceneLoader::Load(const std::wstring& path)
{
    file = path;
    services.models.emptyCache();
    const Records records = services.store.ReadFile(path, {});
    if (!services.store.GetFileError().empty())
        return false;

    if (services.progress)
        services.progress->SetProgresStepCount(activityRecords, static_cast<long>(records.size()));
    Sort(records);
    ApplyRenderSettings(records);
    ApplyDefaultObservers();
    std::erase_if(movableBodies, [this](const auto& record) { return !IsBuilt(*record); });
    PreloadModels();
    for (const auto& record : movableBodies)
        BuildMovableBody(*record);
    BuildStaticBodies();
    for (const auto& record : observers)
        BuildObserver(*record);
    ApplyViews();
    ApplyLayout();

    if (services.progress)
        services.progress->SetProgressDescription(activityRecords, {});
    scene.SetTextureFiles(services.models.collectTextureFiles(*scene.GetContentNode()));
    if (services.progress)
        services.progress->StepProgressActivity(activityScene);
    return true;
}

void VtCSceneLoader::LoadBodies(const std::wstring& path)
{
    file = path;
    Sort(services.store.ReadFile(path, IsBody));
    PreloadModels();
    for (const auto& record : movableBodies)
        BuildMovableBody(*record);
    BuildStaticBodies();
}

void VtCSceneLoader::LoadObjects(const std::wstring& path)
{
    file = path;
    // Its bodies stay out of the store too: records of theirs would come back as bodies with the next load.
    const Records records = services.store.ReadFile(path, [](const VtISceneObject& record) { return !IsBody(record); });
    if (!services.store.GetFileError().empty())
        return;
    Sort(records);
    ApplyRenderSettings(records);
    ApplyDefaultObservers();
    for (const auto& record : observers)
        BuildObserver(*record);
    ApplyViews();
    ApplyLayout();
}

void VtCSceneLoader::Sort(const Records& records)
{
    for (const auto& record : records)
        switch (record->GetObjectType())
        {
        case objectTypeAtmospherics:
        case objectTypeInstrument:
        case objectTypeTrack:
            break;
        case objectTypeWindowLayout:
            windowLayout = record;
            break;
        case objectTypeRenderSettings:
            renderSettings = record;
            break;
        case objectTypeView:
            views.push_back(record);
            break;
        case objectTypeObserver:
            // Copies for a track are made anew with it.
            if (NumberOf(*record, L"cloned", 0) != 1)
                observers.push_back(record);
            break;
        case objectTypeStaticBody:
            staticBodies.push_back(record);
            break;
        case objectTypeMovableBody:
            movableBodies.push_back(record);
            break;
        case objectTypeDefaultObserver:
            defaultObservers.push_back(record);
            break;
        default:
            services.messages.ShowWarning(messageUnknownType, file);
        }
}

// The parts of a group have records of their own and are built as independent bodies; clones are made by their track.
bool VtCSceneLoader::IsBuilt(const VtISceneObject& record) const
{
    return NumberOf(record, L"is_grouped", 0) == 0 && NumberOf(record, L"track_id", -1) == -1;
}

void VtCSceneLoader::ApplyRenderSettings(const Records& all)
{
    const osg::ref_ptr<VtISceneObject> own = scene.GetRenderSettings();
    std::int32_t number = static_cast<std::int32_t>(VtERenderMode::Mixed);
    if (renderSettings)
    {
        const std::int32_t stored = NumberOf(*renderSettings, L"global_render_mode", number);
        if (stored >= static_cast<std::int32_t>(VtERenderMode::Gouraud) && stored <= number)
            number = stored;
        for (const auto& attribute : renderSettings->GetAttributes())
            if (own && !own->GetAttribute(attribute->GetName()))
                own->AddAttribute(attribute->GetName(), attribute->GetValue());
    }
    const auto mode = static_cast<VtERenderMode>(number);
    scene.SetGlobalRenderMode(mode, mode == VtERenderMode::Mixed);

    // One record is left of the scene's own and those of the file; two of one id could not be read again.
    for (const auto& record : all)
        if (record->GetObjectType() == objectTypeRenderSettings)
            services.store.RemoveObject(TextOf(*record, L"internal_id"));
    if (own)
    {
        services.store.RemoveObject(TextOf(*own, L"internal_id"));
        services.store.AddObject(renderSettingsKey, own);
    }
}

void VtCSceneLoader::ApplyDefaultObservers()
{
    VtIObserverRecords* collection = scene.GetSceneObservers() ? scene.GetSceneObservers()->GetRecords() : nullptr;
    if (!collection)
        return;
    for (const auto& record : defaultObservers)
    {
        const std::wstring id = TextOf(*record, L"internal_id");
        auto* observer = collection->GetDefaultObserver(id == L"Free1" ? 0 : 1);
        if (!observer)
            continue;
        observer->ApplyAttributes(*record);
        // The values bring the record's id with them; the observer keeps its own, and its own record alone.
        if (base::EqualsNoCase(id, observer->GetInternalId()))
            continue;
        if (const osg::ref_ptr<VtISceneObject> own = observer->GetAttributeObject())
            own->Write(L"internal_id", observer->GetInternalId());
        services.store.RemoveObject(id);
    }
}

void VtCSceneLoader::PreloadModels()
{
    const auto preload = [this](const Records& records, bool useVrmlTransform)
    {
        std::vector<std::wstring> paths;
        for (const auto& record : records)
            if (const ModelFile& model = FindModel(TextOf(*record, L"file_path")); model.exists)
                paths.push_back(model.path);
        std::sort(paths.begin(), paths.end());
        paths.erase(std::unique(paths.begin(), paths.end()), paths.end());
        if (!paths.empty())
            services.models.preloadModels(paths, useVrmlTransform);
    };
    preload(movableBodies, true);
    preload(staticBodies, false);
}

void VtCSceneLoader::BuildMovableBody(VtISceneObject& record)
{
    const std::wstring id = Needed(record, L"internal_id");
    const std::wstring name = Needed(record, L"name");
    const std::wstring& path = FindModelOrReport(name, Needed(record, L"file_path"));
    Describe(name);
    auto* body = new VtC3DMovableBody(scene.GetDocument(), *scene.GetMovableBodies(0), name, path, osg::Matrixd(), true,
                                      nullptr, {}, true);
    {
        const Loading loading(*body);
        body->ApplyAttributes(record);
        services.store.AddObject(id, &record);
        body->FinishLoad(id);
    }
    Step();
}

void VtCSceneLoader::BuildStaticBodies()
{
    VtCGlidePanelAbstractNavigatorObject::Objects present;
    scene.GetStaticBodies()->CollectDescendants(present);
    for (VtCGlidePanelAbstractNavigatorObject* body : present)
        RememberStatic(*body);
    for (const auto& record : staticBodies)
        BuildStaticBody(*record);
}

// A table of its own: the search through the tree for each record would take the square of their number.
void VtCSceneLoader::RememberStatic(VtCGlidePanelAbstractNavigatorObject& body)
{
    staticById.emplace(body.GetInternalId(), &body);
}

void VtCSceneLoader::BuildStaticBody(VtISceneObject& record)
{
    const std::wstring name = Needed(record, L"name");
    const std::wstring& path = FindModelOrReport(name, Needed(record, L"file_path"));
    const std::wstring id = Needed(record, L"internal_id");
    const auto at = staticById.find(TextOf(record, L"parent_object_id"));
    VtCGlidePanelAbstractNavigatorObject* parent = scene.GetStaticBodies();
    if (at != staticById.end())
        parent = at->second;

    Describe(name);
    auto* body = new VtC3DStaticBody(scene.GetDocument(), *parent, name, path, osg::Matrixd(), true, {}, true);
    {
        const Loading loading(*body);
        body->ApplyAttributes(record);
        services.store.AddObject(id, &record);
        body->FinishLoad(id);
    }
    body->UpdateBaseTransform();
    RememberStatic(*body);
    VtCGlidePanelAbstractNavigatorObject::Objects parts;
    body->CollectDescendants(parts);
    for (VtCGlidePanelAbstractNavigatorObject* part : parts)
        RememberStatic(*part);
    Step();
}

void VtCSceneLoader::BuildObserver(VtISceneObject& record)
{
    VtIObserverRecords* collection = scene.GetSceneObservers() ? scene.GetSceneObservers()->GetRecords() : nullptr;
    const std::wstring name = TextOf(record, L"name");
    Describe(name);
    const std::wstring& id = Needed(record, L"internal_id");
    if (collection && id != L"Free1" && id != L"Free2")
    {
        VtCGlidePanelAbstractNavigatorObject& observer = collection->MakeObserver(name, id);
        observer.ApplyAttributes(record);
        observer.RebindAttributes(id);
    }
    Step();
}

void VtCSceneLoader::ApplyViews()
{
    VtISceneViews* panes = scene.GetViews();
    for (const auto& record : views)
    {
        Describe(TextOf(*record, L"name"));
        if (panes)
            panes->ApplyViewRecord(NumberOf(*record, L"view_pos", 0), *record, Needed(*record, L"internal_id"));
        Step();
    }
    if (panes)
        panes->ActivateObserver();
}

void VtCSceneLoader::ApplyLayout()
{
    if (windowLayout && scene.GetViews())
        scene.GetViews()->ApplyLayoutRecord(TextOf(*windowLayout, L"internal_id"));
}

const std::wstring& VtCSceneLoader::Needed(const VtISceneObject& record, const wchar_t* attribute) const
{
    const auto* text = record.Find<std::wstring>(attribute);
    if (text && (!text->empty() || std::wstring_view(attribute) != L"internal_id"))
        return *text;
    throw VtCAttributeError(base::NativePath(file).string() + ": a record of type " +
                            std::to_string(record.GetObjectType()) + ", name \"" + base::Utf8(TextOf(record, L"name")) +
                            "\", id \"" + base::Utf8(TextOf(record, L"internal_id")) + "\", has no " +
                            base::Utf8(attribute));
}

const VtCSceneLoader::ModelFile& VtCSceneLoader::FindModel(const std::wstring& stored)
{
    const auto known = modelFiles.find(stored);
    if (known != modelFiles.end())
        return known->second;
    std::wstring path = FindStoredModel(stored, file, services.paths);
    const bool exists = IsModelFile(path);
    return modelFiles.emplace(stored, ModelFile{std::move(path), exists}).first->second;
}

const std::wstring& VtCSceneLoader::FindModelOrReport(const std::wstring& name, const std::wstring& stored)
{
    const ModelFile& model = FindModel(stored);
    if (!model.exists)
        services.messages.ShowError(messageNoModelFile, name, model.path);
    return model.path;
}

void VtCSceneLoader::Describe(const std::wstring& name)
{
    if (services.progress)
        services.progress->SetProgressDescription(activityBody, L"Building object " + name);
}

void VtCSceneLoader::Step()
{
    if (services.progress)
        services.progress->StepProgressActivity(activityRecords);
}

void VtCSceneLoader::ResolveObserverTargets(VtCScene3D& scene)
{
    host::Questions* questions = scene.GetDocument().GetServices().questions;
    VtIObserverRecords* collection = scene.GetSceneObservers() ? scene.GetSceneObservers()->GetRecords() : nullptr;
    if (!questions || !collection)
        return;
    const std::vector<VtC3DMovableBody*> bodies = scene.GetMovableBodies(0)->GetBodies();
    for (const VtTMissingTarget& missing : collection->GetMissingTargets())
    {
        host::ReplacementQuestion question{missing.bodyName, {}, {}};
        for (const VtCGlidePanelAbstractNavigatorObject* observer : missing.observers)
            question.observers.push_back(observer->GetName());
        for (const VtC3DMovableBody* body : bodies)
            question.candidates.push_back(body->GetName());
        const std::optional<std::size_t> chosen = questions->AskReplacement(question);
        if (chosen && *chosen < bodies.size())
            collection->SetTarget(missing, *bodies[*chosen]);
    }
}

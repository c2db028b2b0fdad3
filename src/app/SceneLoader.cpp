#include "app/SceneLoader.h"

#include <map>

#include "host/Messages.h"
#include "host/Progress.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

constexpr std::uint32_t messageUnknownType = 509; // %1 the file
constexpr long activityScene = 40;
constexpr long activityRecords = 51;

} // namespace

VtCSceneLoader::VtCSceneLoader(VtCScene3D& loadedScene, const VtCRecordBuilders& recordBuilders)
    : scene(loadedScene), builders(recordBuilders), services(loadedScene.GetDocument().GetServices())
{
}

bool VtCSceneLoader::Load(const std::wstring& path)
{
    services.models.emptyCache();
    const Records records = services.store.ReadFile(path, {});
    if (!services.store.GetFileError().empty())
        return false;

    if (services.progress)
        services.progress->SetProgresStepCount(activityRecords, static_cast<long>(records.size()));
    VtCSceneLoad load(scene, path, true);
    Build(load, path, records, [](const VtTRecordBuilder&) { return true; });

    if (services.progress)
        services.progress->SetProgressDescription(activityRecords, {});
    scene.SetTextureFiles(services.models.collectTextureFiles(*scene.GetContentNode()));
    if (services.progress)
        services.progress->StepProgressActivity(activityScene);
    return true;
}

void VtCSceneLoader::LoadBodies(const std::wstring& path)
{
    const Records records =
        services.store.ReadFile(path, [this](const VtISceneObject& record) { return IsOfBodies(record); });
    VtCSceneLoad load(scene, path, false);
    Build(load, path, records, [](const VtTRecordBuilder& builder) { return builder.ofBodies; });
}

void VtCSceneLoader::LoadObjects(const std::wstring& path)
{
    // Its bodies stay out of the store too: records of theirs would come back as bodies with the next load.
    const Records records =
        services.store.ReadFile(path, [this](const VtISceneObject& record) { return !IsOfBodies(record); });
    if (!services.store.GetFileError().empty())
        return;
    VtCSceneLoad load(scene, path, false);
    Build(load, path, records, [](const VtTRecordBuilder& builder) { return !builder.ofBodies; });
}

void VtCSceneLoader::Build(VtCSceneLoad& load, const std::wstring& path, const Records& records, const Wanted& wanted)
{
    std::map<std::int32_t, Records> byType;
    for (const auto& record : records)
    {
        byType[record->GetObjectType()].push_back(record);
        if (!IsKnownObjectType(record->GetObjectType()))
            services.messages.ShowWarning(messageUnknownType, path);
    }
    for (const VtTRecordBuilder& builder : builders.GetAll())
        if (wanted(builder))
            builder.build(load, byType[builder.type]);
}

bool VtCSceneLoader::IsOfBodies(const VtISceneObject& record) const
{
    const VtTRecordBuilder* builder = builders.Find(record.GetObjectType());
    return builder && builder->ofBodies;
}

// How the records of a scene's own objects are built: its render settings and its bodies.
#include "base/Text.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/MovableBody.h"
#include "scene/RecordBuilders.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"
#include "scene/StaticBody.h"

namespace
{

using Records = VtTRecordBuilder::Records;

constexpr const wchar_t* renderSettingsKey = L"RenderSettings"; // of a scene that was loaded

/// Applies a stored record to a body that was made for it, and has it take the record over. A body that can't take it
/// goes again: nobody was told of it.
template <class Body>
void ApplyRecord(Body& body, VtISceneObject& record, const std::wstring& id)
{
    try
    {
        body.SetLoading(true);
        body.ApplyAttributes(record);
        body.SetLoading(false);
    }
    catch (...)
    {
        body.Destroy();
        throw;
    }
    body.GetServices().store.AddObject(id, &record);
    body.FinishLoad(id);
}

void BuildRenderSettings(VtCSceneLoad& load, const Records& records)
{
    VtCScene3D& scene = load.GetScene();
    const osg::ref_ptr<VtISceneObject> own = scene.GetRenderSettings();
    std::int32_t number = static_cast<std::int32_t>(VtERenderMode::Mixed);
    if (!records.empty())
    {
        const VtISceneObject& last = *records.back();
        const std::int32_t stored = NumberOf(last, L"global_render_mode", number);
        if (stored >= static_cast<std::int32_t>(VtERenderMode::Gouraud) && stored <= number)
            number = stored;
        for (const auto& attribute : last.GetAttributes())
            if (own && !own->GetAttribute(attribute->GetName()))
                own->AddAttribute(attribute->GetName(), attribute->GetValue());
    }
    const auto mode = static_cast<VtERenderMode>(number);
    scene.SetGlobalRenderMode(mode, mode == VtERenderMode::Mixed);

    if (!own)
        return;
    // One record is left of the scene's own and those of the file; two of one id could not be read again. It stands
    // where that of the file stood, so that the next save gives the same file.
    VtISceneObjectStore& store = load.GetServices().store;
    const std::wstring ownId = TextOf(*own, L"internal_id");
    const std::wstring place = records.empty() ? ownId : TextOf(*records.back(), L"internal_id");
    for (const std::wstring& id : {ownId, std::wstring(renderSettingsKey)})
        if (store.GetObject(id) == own && !base::EqualsNoCase(id, place))
            store.RemoveObject(id);
    for (const auto& record : records)
        if (const std::wstring id = TextOf(*record, L"internal_id"); !base::EqualsNoCase(id, place))
            store.RemoveObject(id);
    store.AddObject(place, own);
    store.RenameObject(place, renderSettingsKey);
}

// The parts of a group have records of their own and are built as independent bodies; clones are made by their track.
bool IsBuilt(const VtISceneObject& record)
{
    return NumberOf(record, L"is_grouped", 0) == 0 && NumberOf(record, L"track_id", -1) == -1;
}

void BuildMovableBodies(VtCSceneLoad& load, const Records& records)
{
    Records built = records;
    if (load.IsWhole())
        std::erase_if(built, [](const auto& record) { return !IsBuilt(*record); });
    load.PreloadModels(built, true);

    VtCScene3D& scene = load.GetScene();
    for (const auto& record : built)
    {
        const std::wstring id = load.Needed(*record, L"internal_id");
        const std::wstring name = load.Needed(*record, L"name");
        const std::wstring& path = load.FindModelOrReport(name, load.Needed(*record, L"file_path"));
        load.Describe(name);
        auto* body = new VtC3DMovableBody(scene.GetDocument(), *scene.GetMovableBodies(0), name, path, osg::Matrixd(),
                                          true, nullptr, {}, VtEBirth::recordFollows);
        ApplyRecord(*body, *record, id);
        load.Step();
    }
}

void BuildStaticBodies(VtCSceneLoad& load, const Records& records)
{
    load.PreloadModels(records, false);
    VtCScene3D& scene = load.GetScene();
    for (const auto& record : records)
    {
        const std::wstring name = load.Needed(*record, L"name");
        const std::wstring& path = load.FindModelOrReport(name, load.Needed(*record, L"file_path"));
        const std::wstring id = load.Needed(*record, L"internal_id");
        VtCGlidePanelAbstractNavigatorObject* parent =
            scene.GetStaticBodies()->FindById(TextOf(*record, L"parent_object_id"));
        if (!parent)
            parent = scene.GetStaticBodies();
        load.Describe(name);
        auto* body = new VtC3DStaticBody(scene.GetDocument(), *parent, name, path, osg::Matrixd(), true, {},
                                         VtEBirth::recordFollows);
        ApplyRecord(*body, *record, id);
        load.Step();
    }
}

} // namespace

void RegisterSceneRecords(VtCRecordBuilders& builders)
{
    builders.Register({objectTypeRenderSettings, phaseSettings, false, BuildRenderSettings});
    builders.Register({objectTypeMovableBody, phaseMovableBodies, true, BuildMovableBodies});
    builders.Register({objectTypeStaticBody, phaseStaticBodies, true, BuildStaticBodies});
}

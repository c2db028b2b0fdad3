#include "scene/RecordBuilders.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"
#include "scene/StoredModel.h"

#include <algorithm>
#include <utility>

namespace
{

constexpr std::uint32_t messageNoModelFile = 528; // %1 the object, %2 the path
constexpr long activityBody = 50;
constexpr long activityRecords = 51;

} // namespace

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

VtCSceneLoad::VtCSceneLoad(VtCScene3D& loadedScene, std::wstring path, bool isWhole)
    : scene(loadedScene), services(loadedScene.GetDocument().GetServices()), file(std::move(path)), whole(isWhole)
{
}

void VtCSceneLoad::Describe(const std::wstring& name)
{
    if (services.progress)
        services.progress->SetProgressDescription(activityBody, L"Building object " + name);
}

void VtCSceneLoad::Step()
{
    if (services.progress)
        services.progress->StepProgressActivity(activityRecords);
}

const std::wstring& VtCSceneLoad::Needed(const VtISceneObject& record, const wchar_t* attribute) const
{
    const auto* text = record.Find<std::wstring>(attribute);
    if (text && (!text->empty() || std::wstring_view(attribute) != L"internal_id"))
        return *text;
    throw VtCAttributeError(base::NativePath(file).string() + ": a record of type " +
                            std::to_string(record.GetObjectType()) + ", name \"" + base::Utf8(TextOf(record, L"name")) +
                            "\", id \"" + base::Utf8(TextOf(record, L"internal_id")) + "\", has no " +
                            base::Utf8(attribute));
}

const VtCSceneLoad::ModelFile& VtCSceneLoad::FindModel(const std::wstring& stored)
{
    const auto known = modelFiles.find(stored);
    if (known != modelFiles.end())
        return known->second;
    std::wstring path = FindStoredModel(stored, file, services.paths);
    const bool exists = IsModelFile(path);
    return modelFiles.emplace(stored, ModelFile{std::move(path), exists}).first->second;
}

const std::wstring& VtCSceneLoad::FindModelOrReport(const std::wstring& name, const std::wstring& stored)
{
    const ModelFile& model = FindModel(stored);
    if (!model.exists)
        services.messages.ShowError(messageNoModelFile, name, model.path);
    return model.path;
}

void VtCSceneLoad::PreloadModels(const std::vector<osg::ref_ptr<VtISceneObject>>& records, bool useVrmlTransform)
{
    std::vector<std::wstring> paths;
    for (const auto& record : records)
        if (const ModelFile& model = FindModel(TextOf(*record, L"file_path")); model.exists)
            paths.push_back(model.path);
    std::sort(paths.begin(), paths.end());
    paths.erase(std::unique(paths.begin(), paths.end()), paths.end());
    if (!paths.empty())
        services.models.preloadModels(paths, useVrmlTransform);
}

void VtCRecordBuilders::Register(VtTRecordBuilder builder)
{
    std::erase_if(builders, [&](const VtTRecordBuilder& present) { return present.type == builder.type; });
    const auto at = std::find_if(builders.begin(), builders.end(),
                                 [&](const VtTRecordBuilder& present) { return present.phase > builder.phase; });
    builders.insert(at, std::move(builder));
}

const VtTRecordBuilder* VtCRecordBuilders::Find(std::int32_t type) const
{
    const auto at = std::find_if(builders.begin(), builders.end(),
                                 [&](const VtTRecordBuilder& builder) { return builder.type == type; });
    return at == builders.end() ? nullptr : &*at;
}

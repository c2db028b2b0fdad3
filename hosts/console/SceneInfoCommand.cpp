#include <CLI/CLI.hpp>

#include <iostream>
#include <map>
#include <memory>

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include "app/PanoramicApp.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleHost.h"
#include "hosts/console/ConsoleTexts.h"
#include "interaction/FollowMode.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/StoredModel.h"

namespace console
{

namespace
{

struct InfoArguments
{
    std::filesystem::path file;
    bool json = false;
};

struct ModelUse
{
    std::string body;
    std::string file; ///< as found, or where it was looked for first
    bool found = false;
};

struct ObserverUse
{
    std::string name;
    std::int32_t mode = followFixed;
    std::string modeName;
    std::string body; ///< empty: none
    bool bodyMissing = false;
};

struct ViewUse
{
    std::int32_t pane = 0;
    std::string name;
    std::string observer;
};

/// What a scene file holds, as far as a user asks.
struct SceneInfo
{
    std::map<std::int32_t, int> records; ///< their number by type
    std::vector<ModelUse> models;
    std::vector<ObserverUse> observers;
    std::vector<ViewUse> views;
    std::vector<float> splitter; ///< empty: not stored
};

constexpr std::uint32_t textFollowModes = 6221;

std::string TypeName(std::int32_t type)
{
    static const char* const names[] = {"atmospherics", "window layout",   "render settings", "view",
                                        "instrument",   "observer",        "static body",     "movable body",
                                        "track",        "default observer"};
    return type >= objectTypeAtmospherics && type <= objectTypeDefaultObserver ? names[type]
                                                                               : fmt::format("unknown type {}", type);
}

template <class Value>
Value ValueOf(const VtISceneObject& record, std::wstring_view name, Value otherwise)
{
    const auto* value = record.Find<Value>(name);
    return value ? *value : otherwise;
}

std::string TextOf(const VtISceneObject& record, std::wstring_view name)
{
    return base::Utf8(ValueOf(record, name, std::wstring()));
}

class Collector
{
public:
    Collector(ConsoleHost& consoleHost, std::wstring scene)
        : host(consoleHost),
          file(std::move(scene)),
          modeNames(base::Split(consoleHost.GetTexts().GetText(textFollowModes), L'|'))
    {
    }

    void Add(const VtISceneObject& record)
    {
        ++info.records[record.GetObjectType()];
        switch (record.GetObjectType())
        {
        case objectTypeMovableBody:
            bodies.push_back(base::ToLower(ValueOf(record, attribute::name, std::wstring())));
            [[fallthrough]];
        case objectTypeStaticBody:
            AddModel(record);
            break;
        case objectTypeObserver:
        case objectTypeDefaultObserver:
            AddObserver(record);
            break;
        case objectTypeView:
            info.views.push_back({ValueOf(record, attribute::viewPos, std::int32_t{0}), TextOf(record, attribute::name),
                                  TextOf(record, attribute::observer)});
            break;
        case objectTypeWindowLayout:
            info.splitter = ValueOf(record, attribute::splitterPosition, std::vector<float>());
            break;
        default:
            break;
        }
    }

    SceneInfo Finish()
    {
        for (ObserverUse& observer : info.observers)
            observer.bodyMissing =
                !observer.body.empty() &&
                std::find(bodies.begin(), bodies.end(), base::ToLower(base::Wide(observer.body))) == bodies.end();
        std::sort(info.views.begin(), info.views.end(),
                  [](const ViewUse& a, const ViewUse& b) { return a.pane < b.pane; });
        return std::move(info);
    }

private:
    void AddModel(const VtISceneObject& record)
    {
        const std::wstring stored = ValueOf(record, attribute::filePath, std::wstring());
        const std::wstring path = FindStoredModel(stored, file, host.GetLibraryPaths());
        info.models.push_back({TextOf(record, attribute::name), base::NativePath(path).string(), IsModelFile(path)});
    }

    void AddObserver(const VtISceneObject& record)
    {
        const bool isDefault = record.GetObjectType() == objectTypeDefaultObserver;
        ObserverUse use;
        use.name = isDefault ? TextOf(record, attribute::internalId) : TextOf(record, attribute::name);
        use.mode = ValueOf(record, attribute::behaviour, std::int32_t{isDefault ? followFree : followFixed});
        if (use.mode >= 0 && static_cast<std::size_t>(use.mode) < modeNames.size())
            use.modeName = base::Utf8(modeNames[static_cast<std::size_t>(use.mode)]);
        const std::wstring body = ValueOf(record, attribute::attachedTo, std::wstring(attribute::notConnected));
        if (body != attribute::notConnected)
            use.body = base::Utf8(body);
        info.observers.push_back(std::move(use));
    }

    ConsoleHost& host;
    std::wstring file;
    std::vector<std::wstring> modeNames;
    std::vector<std::wstring> bodies; ///< names of the movable ones in lower case
    SceneInfo info;
};

void PrintText(const SceneInfo& info, const std::filesystem::path& file)
{
    std::cout << file.string() << "\nrecords\n";
    for (const auto& [type, count] : info.records)
        std::cout << fmt::format("  {:<20} {}\n", TypeName(type), count);
    std::cout << "models\n";
    for (const ModelUse& model : info.models)
        std::cout << fmt::format("  {:<20} {}{}\n", model.body, model.found ? "" : "MISSING: ", model.file);
    std::cout << "observers\n";
    for (const ObserverUse& observer : info.observers)
        std::cout << fmt::format("  {:<20} {} {}{}{}\n", observer.name, observer.mode, observer.modeName,
                                 observer.body.empty() ? "" : ", on " + observer.body,
                                 observer.bodyMissing ? " (MISSING)" : "");
    std::cout << "views\n";
    for (const ViewUse& view : info.views)
        std::cout << fmt::format("  pane {} \"{}\" through {}\n", view.pane, view.name,
                                 view.observer.empty() ? "no observer" : view.observer);
    if (info.splitter.size() == 2)
        std::cout << fmt::format("  splitter at {:g}, {:g}\n", info.splitter[0], info.splitter[1]);
}

void PrintJson(const SceneInfo& info, const std::filesystem::path& file)
{
    using Json = nlohmann::ordered_json;
    Json json;
    json["file"] = file.string();
    json["records"] = Json::array();
    for (const auto& [type, count] : info.records)
        json["records"].push_back({{"type", type}, {"name", TypeName(type)}, {"count", count}});
    json["models"] = Json::array();
    for (const ModelUse& model : info.models)
        json["models"].push_back({{"body", model.body}, {"file", model.file}, {"found", model.found}});
    json["observers"] = Json::array();
    for (const ObserverUse& observer : info.observers)
        json["observers"].push_back({{"name", observer.name},
                                     {"mode", observer.mode},
                                     {"modeName", observer.modeName},
                                     {"body", observer.body},
                                     {"bodyMissing", observer.bodyMissing}});
    json["views"] = Json::array();
    for (const ViewUse& view : info.views)
        json["views"].push_back({{"pane", view.pane}, {"name", view.name}, {"observer", view.observer}});
    json["splitter"] = info.splitter;
    std::cout << json.dump(2, ' ', false, Json::error_handler_t::replace) << '\n';
}

int Run(const InfoArguments& arguments)
{
    ConsoleHost host(false);
    const std::wstring path = base::InnerPath(std::filesystem::absolute(arguments.file).lexically_normal());
    RegisterAllAttributes();
    VtCSceneObjectStore store;
    const auto records = store.ReadFile(path, {});
    if (!store.GetFileError().empty())
    {
        host.ShowError(messageSceneNotReadable, arguments.file.string(), base::Utf8(store.GetFileError()));
        return 1;
    }
    Collector collector(host, path);
    for (const auto& record : records)
        collector.Add(*record);
    const SceneInfo info = collector.Finish();
    arguments.json ? PrintJson(info, arguments.file) : PrintText(info, arguments.file);
    return 0;
}

} // namespace

void AddSceneInfoCommand(CLI::App& scene, int& status)
{
    auto arguments = std::make_shared<InfoArguments>();
    CLI::App* command = scene.add_subcommand("info", "Tell what a scene file holds, and which models are missing.");
    command->add_option("scene", arguments->file, "The scene file.")->type_name("SCENE.xml")->required();
    command->add_flag("--json", arguments->json, "As JSON, for programs.");
    command->footer(
        "Records by type, models found and missing, observers with their mode and body, views. A scene with\n"
        "missing models is no error.\n\n"
        "Example:\n"
        "  panoramic scene info scene.xml --json");
    command->callback([arguments, &status] { status = Run(*arguments); });
}

} // namespace console

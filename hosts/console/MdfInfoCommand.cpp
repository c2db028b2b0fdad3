#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include "base/Numbers.h"
#include "base/Text.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleHost.h"
#include "hosts/console/ConsoleTexts.h"
#include "simdata/points/MotionDataInfo.h"

namespace console
{

namespace
{

using SimulationDataPoints::VtTMotionDataInfo;

struct InfoArguments
{
    std::filesystem::path file;
    bool json = false;
};

const char* SafetyName(SimulationDataPoints::TRACK_SAFETY safety)
{
    switch (safety)
    {
    case SimulationDataPoints::TRACK_SAFE:
        return "safe";
    case SimulationDataPoints::TRACK_SAFE_WITH_WARNING:
        return "safe with a warning";
    case SimulationDataPoints::TRACK_UNSAFE:
        break;
    }
    return "unsafe";
}

void PrintText(const VtTMotionDataInfo& info, const std::filesystem::path& file)
{
    std::cout << fmt::format("{}: {} bytes, track safety: {}\n", file.string(), info.fileBytes,
                             SafetyName(info.channels.trackSafety));
    if (info.channels.timeStamps)
        std::cout << fmt::format("{} frames from {} s to {} s, {:.6g} a second\n", info.frames,
                                 base::FormatDouble(info.firstTime), base::FormatDouble(info.lastTime), info.meanRate);
    else
        std::cout << fmt::format("{} frames without time stamps\n", info.frames);
    std::cout << fmt::format("{} pose channels\n", info.channels.poses.size());
    for (std::size_t i = 0; i < info.channels.poses.size(); ++i)
    {
        const std::wstring& name = info.channels.poses[i];
        const std::wstring& stored = info.channels.storedPoses.empty() ? name : info.channels.storedPoses[i];
        std::cout << "  " << base::Utf8(name) << (stored == name ? "" : " (stored as " + base::Utf8(stored) + ")")
                  << '\n';
    }
    std::cout << fmt::format("{} instrument streams\n", info.channels.instruments.size());
    for (const auto& stream : info.channels.instruments)
        std::cout << "  " << base::Utf8(stream.name)
                  << (stream.unit.empty() ? "" : " [" + base::Utf8(stream.unit) + "]") << '\n';
    if (info.unfinished)
        std::cout << "unfinished: it is still being written, or its writer died\n";
    for (const std::wstring& damage : info.damage.Texts())
        std::cout << "damage: " << base::Utf8(damage) << '\n';
    if (!info.damage.IsAny())
        std::cout << "no damage\n";
}

void PrintJson(const VtTMotionDataInfo& info, const std::filesystem::path& file)
{
    nlohmann::ordered_json json;
    json["file"] = file.string();
    json["bytes"] = info.fileBytes;
    json["frames"] = info.frames;
    json["timeStamps"] = info.channels.timeStamps;
    json["firstTime"] = info.firstTime;
    json["lastTime"] = info.lastTime;
    json["rate"] = info.meanRate;
    json["trackSafety"] = static_cast<int>(info.channels.trackSafety);
    json["poses"] = nlohmann::ordered_json::array();
    for (const std::wstring& name : info.channels.poses)
        json["poses"].push_back(base::Utf8(name));
    json["storedPoses"] = nlohmann::ordered_json::array();
    for (const std::wstring& name : info.channels.storedPoses.empty() ? info.channels.poses : info.channels.storedPoses)
        json["storedPoses"].push_back(base::Utf8(name));
    json["instruments"] = nlohmann::ordered_json::array();
    for (const auto& stream : info.channels.instruments)
        json["instruments"].push_back({{"name", base::Utf8(stream.name)}, {"unit", base::Utf8(stream.unit)}});
    json["unfinished"] = info.unfinished;
    json["damage"] = nlohmann::ordered_json::array();
    for (const std::wstring& damage : info.damage.Texts())
        json["damage"].push_back(base::Utf8(damage));
    std::cout << json.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) << '\n';
}

int Run(const InfoArguments& arguments)
{
    const VtTMotionDataInfo info = SimulationDataPoints::ReadMotionDataInfo(arguments.file);
    if (!info.error.empty())
    {
        ConsoleHost host(false);
        host.ShowError(messageConversion, base::Utf8(info.error));
        return 1;
    }
    arguments.json ? PrintJson(info, arguments.file) : PrintText(info, arguments.file);
    return 0;
}

} // namespace

void AddMdfInfoCommand(CLI::App& mdf, int& status)
{
    auto arguments = std::make_shared<InfoArguments>();
    CLI::App* command = mdf.add_subcommand("info", "Tell what a motion data file holds, and what is wrong with it.");
    command->add_option("run", arguments->file, "The motion data file.")->type_name("RUN.mdf")->required();
    command->add_flag("--json", arguments->json, "As JSON, for programs.");
    command->footer("Channels, instruments with units, frames, span, rate and damage. A damaged file of which whole\n"
                    "frames can be used is no error.\n\n"
                    "Example:\n"
                    "  panoramic mdf info run.mdf --json");
    command->callback([arguments, &status] { status = Run(*arguments); });
}

} // namespace console

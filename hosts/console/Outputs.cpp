#include "hosts/console/Outputs.h"

#include <algorithm>
#include <array>
#include <iostream>
#include <string_view>

#include <fmt/format.h>

#include "assets/AssetManager.h"
#include "assets/models/ModelRequest.h"
#include "base/AtomicFile.h"
#include "base/Text.h"
#include "hosts/common/Picture.h"
#include "hosts/console/Command.h"
#include "hosts/console/ConsoleTexts.h"
#include "hosts/console/Session.h"

namespace console
{

namespace
{

/// Endings that tell what a file holds; a file with any other may hold anything.
struct Ending
{
    const char* text;
    Content content;
};
constexpr Ending endings[] = {
    {".xml", Content::scene},   {".mdf", Content::motionData}, {".csv", Content::table},   {".txt", Content::table},
    {".tsv", Content::table},   {".png", Content::picture},    {".jpg", Content::picture}, {".jpeg", Content::picture},
    {".tif", Content::picture}, {".tiff", Content::picture},
};

/// By `Content`: what it is called, and how it ends.
struct Kind
{
    const char* name;
    const char* endings;
};
constexpr std::array<Kind, 4> kinds{{
    {"a picture", ".png, .jpg or .tif"},
    {"a scene", ".xml"},
    {"motion data", ".mdf"},
    {"a table", ".csv"},
}};

bool EndsRightly(const std::filesystem::path& output, Content content)
{
    const std::string own = base::Utf8(base::ToLower(base::Wide(output.extension().string())));
    if (own.empty() || base::IsSpecialFile(output))
        return true;
    for (const Ending& ending : endings)
        if (own == ending.text)
            return ending.content == content || (ending.content == Content::table && own == ".txt");
    return content != Content::picture && !HasModelFormat("x" + own); // pictures of other kinds can't be written
}

} // namespace

std::vector<std::filesystem::path> InputsOf(const SceneArguments& scene)
{
    std::vector<std::filesystem::path> inputs = ReadArgumentFiles();
    for (const std::filesystem::path& file : {scene.file, scene.data})
        if (!file.empty())
            inputs.push_back(file);
    for (const StaticArgument& body : scene.statics)
        inputs.push_back(body.model);
    for (const MovableArgument& body : scene.movables)
        inputs.push_back(body.model);
    return inputs;
}

void CheckOutput(const std::filesystem::path& output, Content content, const std::vector<std::filesystem::path>& inputs)
{
    std::error_code failed;
    if (std::filesystem::is_directory(output, failed))
        RejectArguments("--output: " + output.string() + " is a folder");
    if (!EndsRightly(output, content))
    {
        const Kind& kind = kinds[static_cast<std::size_t>(content)];
        RejectArguments(
            fmt::format("--output: {} is written, which ends with {}: {}", kind.name, kind.endings, output.string()));
    }
    for (const std::filesystem::path& input : inputs)
        if (base::IsSameFile(output, input))
            RejectArguments("--output: " + output.string() + " is read by this command, as " + input.string());
}

bool CheckAgainstModels(Session& session, const std::vector<std::filesystem::path>& outputs)
{
    for (const std::filesystem::path& output : outputs)
        if (VtCOsgAssetManager::getInstance().hasRead(output))
        {
            session.GetHost().ShowError(messageIsInput, output.string());
            return false;
        }
    return true;
}

void TellWritten(const std::filesystem::path& output)
{
    if (!base::IsSpecialFile(output))
        std::cout << output.string() << '\n';
}

} // namespace console

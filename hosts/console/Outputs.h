#pragma once

#include <filesystem>
#include <vector>

namespace console
{

class Session;
struct SceneArguments;

/// What the file that a command writes holds.
enum class Content
{
    picture,
    scene,
    motionData,
    table,
};

/// The files that `scene` names, and those that arguments were read from.
std::vector<std::filesystem::path> InputsOf(const SceneArguments& scene);

/// Refuses, as a wrong argument, an output that is one of `inputs` by whatever links or names, that is a folder, or
/// that ends like something else than it will hold. To be called before anything is opened.
void CheckOutput(const std::filesystem::path& output, Content content,
                 const std::vector<std::filesystem::path>& inputs);

/// With the scene open: false, after an error message, when one of `outputs` is a file that its models were made from.
bool CheckAgainstModels(Session& session, const std::vector<std::filesystem::path>& outputs);

/// Tells which file was written. One that went to a stream or a device has no name to tell, and nothing may follow it.
void TellWritten(const std::filesystem::path& output);

} // namespace console

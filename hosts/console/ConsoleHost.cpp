#include "hosts/console/ConsoleHost.h"

#include <unistd.h>

#include "base/Text.h"
#include "hosts/common/HostMessages.h"

namespace console
{

namespace
{

// Where the data folder isn't to be found, its place beside the program is what a message can name.
std::filesystem::path DataFolder(const std::filesystem::path& module)
{
    const std::filesystem::path found = hosts::FindDataFolder(module);
    return found.empty() ? module.parent_path() / "share" / "panoramic" : found;
}

// Without a home there is no file, and nothing is kept.
std::filesystem::path ConfigurationFile(const char* name)
{
    const std::filesystem::path folder = hosts::ConfigurationFolder();
    return folder.empty() ? folder : folder / name;
}

} // namespace

ConsoleHost::ConsoleHost(bool showLog)
    : terminal(clock, STDERR_FILENO),
      module(hosts::ModuleFolder()),
      data(DataFolder(module)),
      texts(data / "texts" / "en.ini"),
      messages(terminal, texts),
      progress(terminal),
      configurationFile(ConfigurationFile("configuration.ini")),
      configuration(configurationFile, messages),
      settings(ConfigurationFile("settings.ini"), messages),
      paths(configurationFile, data, module),
      loop(clock, messages),
      variables(loop)
{
    messages.ShowLog(showLog);
    const auto warn = [this](std::uint32_t number, const std::string& reason)
    {
        if (!reason.empty())
            messages.Show({.number = number, .first = base::Wide(reason), .severity = host::Severity::warning});
    };
    warn(hosts::messageTextsMissing, texts.Error());
    warn(hosts::messageDefaultsUsed, configurationFile.Error());
}

ConsoleHost::~ConsoleHost() = default;

void ConsoleHost::ShowError(std::uint32_t number, const std::string& first, const std::string& second)
{
    messages.Show({.number = number,
                   .first = base::Wide(first),
                   .second = base::Wide(second),
                   .severity = host::Severity::error});
}

void ConsoleHost::ShowInformation(std::uint32_t number, const std::string& first, const std::string& second)
{
    messages.Show({.number = number, .first = base::Wide(first), .second = base::Wide(second)});
}

} // namespace console

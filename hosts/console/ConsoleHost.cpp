#include "hosts/console/ConsoleHost.h"

#include <unistd.h>

#include "base/Text.h"
#include "hosts/common/HostTexts.h"

namespace console
{

ConsoleHost::ConsoleHost(bool showLog)
    : terminal(clock, STDERR_FILENO),
      module(hosts::ModuleFolder()),
      data(hosts::DataFolder(module)),
      texts(data / "texts" / "en.ini"),
      messages(terminal, texts),
      progress(terminal),
      configurationFile(hosts::ConfigurationFile("configuration.ini")),
      configuration(configurationFile, messages),
      settings(hosts::ConfigurationFile("settings.ini"), messages),
      paths(configurationFile, data, module),
      loop(clock, messages),
      variables(loop)
{
    messages.ShowLog(showLog);
    hosts::WarnOfFiles(messages, texts, configurationFile);
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

#include "hosts/desktop/DesktopHost.h"

#include "base/Text.h"
#include "hosts/common/HostMessages.h"

namespace desktop
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

void DesktopVariables::SetWindow(WindowServices* newWindow)
{
    window = newWindow;
    if (window)
        for (const auto& [name, value] : values)
            window->ShowVariable(name, value);
}

void DesktopVariables::SetText(const std::wstring& name, const std::wstring& value)
{
    std::wstring& kept = values[name];
    if (kept == value)
        return;
    kept = value;
    if (window)
        window->ShowVariable(name, value);
}

std::wstring DesktopVariables::GetText(const std::wstring& name) const
{
    const auto at = values.find(name);
    return at == values.end() ? std::wstring() : at->second;
}

DesktopHost::DesktopHost()
    : module(hosts::ModuleFolder()),
      data(DataFolder(module)),
      texts(data / "texts" / "en.ini"),
      messages(texts),
      configurationFile(ConfigurationFile("configuration.ini")),
      configuration(configurationFile, messages),
      settings(ConfigurationFile("settings.ini"), messages),
      paths(configurationFile, data, module),
      loop(clock, messages),
      pump(loop, clock, messages),
      progress(clock, pump),
      variables(loop),
      questions(texts)
{
    messages.SetBusy([this] { return pump.IsSuspended(); });
    const auto warn = [this](std::uint32_t number, const std::string& reason)
    {
        if (!reason.empty())
            messages.Show({.number = number, .first = base::Wide(reason), .severity = host::Severity::warning});
    };
    warn(hosts::messageTextsMissing, texts.Error());
    warn(hosts::messageDefaultsUsed, configurationFile.Error());
}

DesktopHost::~DesktopHost() = default;

void DesktopHost::SetWindow(WindowServices* services, host::ViewWindows* windows)
{
    window = services;
    viewWindows = windows;
    variables.SetWindow(services);
}

std::filesystem::path DesktopHost::GetStateFile() const
{
    return ConfigurationFile("desktop.ini");
}

} // namespace desktop

#include "hosts/desktop/DesktopHost.h"

#include "base/FrameSuspension.h"
#include "hosts/common/HostTexts.h"

namespace desktop
{

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
      data(hosts::DataFolder(module)),
      texts(data / "texts" / "en.ini"),
      messages(texts),
      configurationFile(hosts::ConfigurationFile("configuration.ini")),
      configuration(configurationFile, messages),
      settings(hosts::ConfigurationFile("settings.ini"), messages),
      paths(configurationFile, data, module),
      loop(clock, messages),
      pump(loop, clock),
      progress(clock),
      variables(loop),
      questions(texts)
{
    messages.SetBusy([] { return VtCFrameSuspension::AreStepsSuspended(); });
    hosts::WarnOfFiles(messages, texts, configurationFile);
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
    return hosts::ConfigurationFile("desktop.ini");
}

} // namespace desktop

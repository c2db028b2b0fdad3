#include "hosts/desktop/StateFile.h"

#include <algorithm>

#include "base/IniFile.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "hosts/common/HostTexts.h"

namespace desktop
{

namespace
{

constexpr std::size_t mostRecentFiles = 8;
const std::string recentSection = "Recent";

} // namespace

StateFile::StateFile(std::filesystem::path stateFile, host::MessageService& messageService)
    : file(std::move(stateFile)), messages(messageService)
{
}

std::string StateFile::Get(const std::string& section, const std::string& key) const
{
    return base::IniFile(file).Find(section, key).value_or("");
}

void StateFile::Set(const std::string& section, const std::string& key, const std::string& value)
{
    base::IniFile ini(file);
    if (ini.Find(section, key) == value)
        return;
    ini.Set(section, key, value);
    Save(ini);
}

std::vector<std::string> StateFile::GetRecentFiles() const
{
    std::vector<std::string> files;
    for (const auto& [key, value] : base::IniFile(file).FindSection(recentSection).value_or(base::IniFile::Entries()))
        files.push_back(value);
    return files;
}

void StateFile::AddRecentFile(const std::string& path)
{
    std::vector<std::string> files = GetRecentFiles();
    std::erase(files, path);
    files.insert(files.begin(), path);
    files.resize(std::min(files.size(), mostRecentFiles));
    SetRecentFiles(files);
}

void StateFile::ClearRecentFiles()
{
    SetRecentFiles({});
}

void StateFile::SetRecentFiles(const std::vector<std::string>& files)
{
    base::IniFile ini(file);
    for (const auto& [key, value] : ini.FindSection(recentSection).value_or(base::IniFile::Entries()))
        ini.Remove(recentSection, key);
    for (std::size_t i = 0; i < files.size(); ++i)
        ini.Set(recentSection, std::to_string(i + 1), files[i]);
    Save(ini);
}

void StateFile::Save(const base::IniFile& ini)
{
    const std::string reason = ini.Save();
    if (reason.empty() || warned)
        return;
    warned = true;
    messages.Show({.number = hosts::messageNotStored,
                   .first = base::Wide(reason),
                   .severity = host::Severity::warning,
                   .interrupts = false});
}

} // namespace desktop

#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace base
{
class IniFile;
}
namespace host
{
class MessageService;
}

namespace desktop
{

/// What the program keeps about itself from one session to the next, in a file that is read and written as a whole.
///
/// Every change reads the file anew and writes it at once, so a program that is killed leaves the last change, and
/// two programs keep each other's.
class StateFile
{
public:
    /// An empty `stateFile` keeps nothing.
    StateFile(std::filesystem::path stateFile, host::MessageService& messageService);

    /// Empty when there is none.
    std::string Get(const std::string& section, const std::string& key) const;
    void Set(const std::string& section, const std::string& key, const std::string& value);

    // Files that were opened, the newest first; UTF-8.

    std::vector<std::string> GetRecentFiles() const;
    void AddRecentFile(const std::string& path);
    void ClearRecentFiles();

private:
    void SetRecentFiles(const std::vector<std::string>& files);
    void Save(const base::IniFile& ini);

    std::filesystem::path file;
    host::MessageService& messages;
    bool warned = false;
};

} // namespace desktop

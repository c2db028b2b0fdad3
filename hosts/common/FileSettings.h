#pragma once

#include <filesystem>

#include "host/Storage.h"

namespace host
{
class MessageService;
}

namespace hosts
{

/// The user's settings in a file: a section for each node, numbers plain and texts in quotes.
///
/// Each call reads the file anew, so that several programs can keep their settings in it. A file that can't be used is
/// told once as a warning; then there are no stored settings, and the file stays as it is.
class FileSettings : public host::Settings
{
public:
    FileSettings(std::filesystem::path file, host::MessageService& messages);

    bool Store(const host::SettingsNode& node) override;
    std::optional<host::SettingsNode> Load(const std::wstring& name) const override;

private:
    void Warn(const std::string& reason) const;

    std::filesystem::path file;
    host::MessageService& messages;
    mutable bool warned = false;
};

} // namespace hosts

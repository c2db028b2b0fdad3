#pragma once

#include <filesystem>
#include <memory>
#include <string>

/// Sectioned text of keys and values, as older settings and the default observers are kept.
class VtISettingsReader
{
public:
    static constexpr int found = 0;
    static constexpr int missing = 1; ///< the section or the key isn't there; negative: the file can't be read

    virtual ~VtISettingsReader() = default;

    /// `value` changes only when the key is found.
    virtual int ReadText(const std::wstring& section, const std::wstring& key, std::wstring& value) const = 0;
};

class VtISettingsWriter
{
public:
    virtual ~VtISettingsWriter() = default;

    /// 0, or a negative value when it can't be written.
    virtual int WriteText(const std::wstring& section, const std::wstring& key, const std::wstring& value) = 0;
};

/// The settings in the file, read whole; null when it doesn't exist or can't be read.
std::unique_ptr<VtISettingsReader> OpenSettings(const std::filesystem::path& path);

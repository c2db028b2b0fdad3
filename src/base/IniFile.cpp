#include "base/IniFile.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string_view>

// Everything is UTF-8 here, so the library's conversions stay out.
#define SI_NO_CONVERSION
#include <SimpleIni.h>

#include "base/AtomicFile.h"
#include "base/Text.h"

namespace base
{

struct IniFile::Content
{
    CSimpleIniA ini{true, false, false};
};

namespace
{

// The library passes over lines that it doesn't understand. A damaged file must be told to the user instead, so every
// line is looked at first.
std::string Fault(std::string_view text)
{
    int number = 0;
    while (!text.empty())
    {
        ++number;
        const std::size_t end = text.find('\n');
        const std::string_view line = Trim(text.substr(0, end));
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);

        const auto at = [&](const char* what) { return "line " + std::to_string(number) + ": " + what; };
        if (line.find('\0') != std::string_view::npos)
            return at("not a text file");
        if (Utf8(Wide(line)) != line)
            return at("not in UTF-8");
        if (line.empty() || line.front() == ';' || line.front() == '#')
            continue;
        const bool section = line.front() == '[' && line.back() == ']';
        const std::size_t equals = line.find('=');
        const bool value = line.front() != '[' && equals != std::string_view::npos && equals > 0;
        if (!section && !value)
            return at("neither a section nor a value");
    }
    return {};
}

} // namespace

IniFile::IniFile(std::filesystem::path file, Faults faults)
    : path(std::move(file)), content(std::make_unique<Content>())
{
    std::error_code failed;
    if (path.empty() || (!std::filesystem::exists(path, failed) && !failed))
        return;

    std::string text;
    std::ifstream in;
    if (std::filesystem::is_regular_file(path, failed))
        in.open(path, std::ios::binary);
    if (!in.is_open())
    {
        error = path.string() + ": it can't be read";
        return;
    }
    text.assign(std::istreambuf_iterator<char>(in), {});
    if (const std::string fault = faults == Faults::told ? Fault(text) : std::string(); !fault.empty())
    {
        error = path.string() + ", " + fault;
        return;
    }
    if (content->ini.LoadData(text) < 0)
        error = path.string() + ": it can't be read";
}

IniFile::~IniFile() = default;
IniFile::IniFile(IniFile&&) noexcept = default;

std::optional<std::string> IniFile::Find(const std::string& section, const std::string& key) const
{
    const char* value = content->ini.GetValue(section.c_str(), key.c_str(), nullptr);
    return value ? std::optional<std::string>(value) : std::nullopt;
}

std::optional<IniFile::Entries> IniFile::FindSection(const std::string& section) const
{
    if (!content->ini.GetSection(section.c_str()))
        return std::nullopt;

    CSimpleIniA::TNamesDepend keys;
    content->ini.GetAllKeys(section.c_str(), keys);
    keys.sort(CSimpleIniA::Entry::LoadOrder());

    Entries entries;
    for (const CSimpleIniA::Entry& key : keys)
        entries.emplace_back(key.pItem, content->ini.GetValue(section.c_str(), key.pItem, ""));
    return entries;
}

void IniFile::Set(const std::string& section, const std::string& key, const std::string& value)
{
    content->ini.SetValue(section.c_str(), key.c_str(), value.c_str(), nullptr, true);
}

void IniFile::Remove(const std::string& section, const std::string& key)
{
    content->ini.Delete(section.c_str(), key.c_str(), false);
}

std::string IniFile::Save() const
{
    if (!error.empty())
        return error;
    if (path.empty())
        return "there is no folder for settings";

    std::string text;
    if (content->ini.Save(text) < 0)
        return path.string() + ": out of memory";
    std::error_code failed;
    std::filesystem::create_directories(path.parent_path(), failed);
    if (failed)
        return path.parent_path().string() + ": " + failed.message();
    return WriteWholeFile(path, text);
}

} // namespace base

namespace
{

class FileReader : public VtISettingsReader
{
public:
    explicit FileReader(base::IniFile settings) : file(std::move(settings)) {}

    int ReadText(const std::wstring& section, const std::wstring& key, std::wstring& value) const override
    {
        const std::optional<std::string> text = file.Find(base::Utf8(section), base::Utf8(key));
        if (!text)
            return missing;
        value = base::Wide(*text);
        return found;
    }

private:
    base::IniFile file;
};

} // namespace

std::unique_ptr<VtISettingsReader> OpenSettings(const std::filesystem::path& path)
{
    std::error_code failed;
    if (!std::filesystem::is_regular_file(path, failed))
        return nullptr;
    base::IniFile file(path, base::IniFile::Faults::skipped);
    return file.Error().empty() ? std::make_unique<FileReader>(std::move(file)) : nullptr;
}

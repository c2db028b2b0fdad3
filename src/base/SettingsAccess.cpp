#include "base/SettingsAccess.h"

#include <fstream>
#include <iterator>

#define SI_NO_CONVERSION
#include <SimpleIni.h>

#include "base/Text.h"

namespace
{

class FileReader : public VtISettingsReader
{
public:
    explicit FileReader(const std::string& text) { readable = ini.LoadData(text) >= 0; }

    bool IsReadable() const { return readable; }

    int ReadText(const std::wstring& section, const std::wstring& key, std::wstring& value) const override
    {
        const char* text = ini.GetValue(base::Utf8(section).c_str(), base::Utf8(key).c_str());
        if (!text)
            return missing;
        value = base::Wide(text);
        return found;
    }

private:
    CSimpleIniA ini{true, false, false}; // UTF-8, no multiple keys, no multiple lines
    bool readable = false;
};

} // namespace

std::unique_ptr<VtISettingsReader> OpenSettings(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    if (!file)
        return nullptr;
    const std::string text{std::istreambuf_iterator<char>(file), {}};
    auto reader = std::make_unique<FileReader>(text);
    return reader->IsReadable() ? std::move(reader) : nullptr;
}

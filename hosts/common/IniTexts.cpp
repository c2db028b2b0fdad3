#include "hosts/common/IniTexts.h"

#include "base/Numbers.h"
#include "base/Text.h"
#include "hosts/common/IniFile.h"

namespace hosts
{

IniTexts::IniTexts(const std::filesystem::path& file)
{
    const IniFile ini(file);
    error = ini.Error();
    const auto entries = ini.FindSection("texts");
    if (!entries)
    {
        if (error.empty())
            error = file.string() + ": there are no texts";
        return;
    }
    for (const auto& [key, value] : *entries)
        if (const auto number = base::ParseInteger(key); number && *number > 0 && *number <= 0xFFFFFFFF)
            texts[static_cast<std::uint32_t>(*number)] = base::Replace(base::Wide(value), L"\\n", L"\n");
}

std::wstring IniTexts::GetText(std::uint32_t number) const
{
    const auto at = texts.find(number);
    return at == texts.end() || at->second.empty() ? std::to_wstring(number) : at->second;
}

std::wstring IniTexts::Format(const host::Texts& texts, std::uint32_t number, const std::wstring& first,
                              const std::wstring& second)
{
    const std::wstring pattern = texts.GetText(number);
    std::wstring result;
    bool used[2] = {false, false};
    // One walk, so that an insertion that holds "%2" itself stays as it is.
    for (std::size_t at = 0; at < pattern.size(); ++at)
    {
        const wchar_t next = pattern[at] == L'%' && at + 1 < pattern.size() ? pattern[at + 1] : L'\0';
        if (next != L'1' && next != L'2')
        {
            result += pattern[at];
            continue;
        }
        used[next - L'1'] = true;
        result += next == L'1' ? first : second;
        ++at;
    }
    std::wstring behind = L": ";
    for (const auto& [wasUsed, insertion] : {std::pair(used[0], &first), std::pair(used[1], &second)})
        if (!wasUsed && !insertion->empty())
        {
            result += behind + *insertion;
            behind = L", ";
        }
    return result;
}

} // namespace hosts

#include "hosts/common/HostTexts.h"

#include "base/IniFile.h"
#include "base/Numbers.h"
#include "base/Text.h"
#include "host/Messages.h"

namespace hosts
{

IniTexts::IniTexts(const std::filesystem::path& file)
{
    const base::IniFile ini(file);
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

void WarnOfFiles(host::MessageService& messages, const IniTexts& texts, const base::IniFile& configuration)
{
    const auto warn = [&messages](std::uint32_t number, const std::string& reason)
    {
        if (!reason.empty())
            messages.Show({.number = number, .first = base::Wide(reason), .severity = host::Severity::warning});
    };
    warn(messageTextsMissing, texts.Error());
    warn(messageDefaultsUsed, configuration.Error());
}

} // namespace hosts

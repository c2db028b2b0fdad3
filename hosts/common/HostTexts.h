#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>

#include "host/Messages.h"

namespace base
{
class IniFile;
}

namespace hosts
{

// Messages that the hosts themselves have for the user, by their number in the texts. The component's own numbers lie
// below 9100.
inline constexpr std::uint32_t messageInterfaceFailed = 9101; ///< %1 the interface, %2 the result code
inline constexpr std::uint32_t messageDefaultsUsed = 9102;    ///< %1 file and reason
inline constexpr std::uint32_t messageNotStored = 9103;       ///< %1 file and reason
inline constexpr std::uint32_t messageTextsMissing = 9104;    ///< %1 file and reason

/// Texts by number from a file: "417 = The scene %1 cannot be shown." in the section [texts].
class IniTexts : public host::Texts
{
public:
    explicit IniTexts(const std::filesystem::path& file);

    std::wstring GetText(std::uint32_t number) const override;

    /// Why the file couldn't be used, with its path; empty when it could.
    const std::string& Error() const { return error; }

    /// The text of `number` with %1 and %2 replaced. What is to be inserted but has no place in the text goes behind
    /// it, so that nothing is lost when a text is missing.
    static std::wstring Format(const host::Texts& texts, std::uint32_t number, const std::wstring& first,
                               const std::wstring& second);

private:
    std::map<std::uint32_t, std::wstring> texts;
    std::string error;
};

/// Tells what was wrong with the files that a host begins with; nothing when all went well.
void WarnOfFiles(host::MessageService& messages, const IniTexts& texts, const base::IniFile& configuration);

} // namespace hosts

#pragma once

#include <filesystem>
#include <map>
#include <string>

#include "host/Messages.h"

namespace hosts
{

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

} // namespace hosts

#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

/// Text inside is `std::wstring`, one code point a character; at every border (files, the scene graph library,
/// the command line) it is UTF-8. Case is folded by Unicode rules, whatever the process's locale.
namespace base
{

/// UTF-8 of `text`. Code points that UTF-8 can't hold become U+FFFD.
std::string Utf8(std::wstring_view text);

/// The text of `utf8`; each malformed byte becomes U+FFFD, so that nothing is lost silently or thrown.
std::wstring Wide(std::string_view utf8);

std::wstring ToLower(std::wstring_view text);

bool EqualsNoCase(std::wstring_view a, std::wstring_view b);

/// For tables whose keys are found without regard to case.
struct NoCaseHash
{
    std::size_t operator()(std::wstring_view text) const;
};
struct NoCaseEqual
{
    bool operator()(std::wstring_view a, std::wstring_view b) const { return EqualsNoCase(a, b); }
};

/// Splits at every `separator`, keeping empty fields; an empty text gives no fields.
std::vector<std::wstring> Split(std::wstring_view text, wchar_t separator);

/// `text` without blanks, tabs and line ends at both ends.
std::string_view Trim(std::string_view text);

/// `text` with every occurrence of `what` (not empty) replaced.
std::wstring Replace(std::wstring text, std::wstring_view what, std::wstring_view with);

} // namespace base

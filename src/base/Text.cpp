#include "base/Text.h"

#include <algorithm>
#include <cstdint>
#include <cwctype>
#include <locale.h>
#include <wctype.h>

namespace base
{

namespace
{

constexpr wchar_t replacement = 0xFFFD;

// towlower() follows the process's locale, which is "C" in most programs and knows ASCII only.
locale_t UnicodeLocale()
{
    static const locale_t locale = newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr);
    return locale;
}

wchar_t Lower(wchar_t c)
{
    if (c < 0x80)
        return c >= L'A' && c <= L'Z' ? static_cast<wchar_t>(c + (L'a' - L'A')) : c;
    if (const locale_t locale = UnicodeLocale())
        return static_cast<wchar_t>(towlower_l(static_cast<wint_t>(c), locale));
    return c;
}

// Length of the well-formed sequence at `s` with its code point, or 0 when it is malformed, overlong, a surrogate
// or beyond U+10FFFF.
std::size_t Decode(std::string_view s, char32_t& code)
{
    const auto byte = [&](std::size_t i) { return static_cast<std::uint8_t>(s[i]); };
    const std::uint8_t lead = byte(0);
    if (lead < 0x80)
    {
        code = lead;
        return 1;
    }
    const std::size_t length = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : 2;
    if (lead < 0xC2 || lead > 0xF4 || s.size() < length)
        return 0;
    code = lead & (0x7F >> length);
    for (std::size_t i = 1; i < length; ++i)
    {
        if ((byte(i) & 0xC0) != 0x80)
            return 0;
        code = (code << 6) | (byte(i) & 0x3F);
    }
    constexpr char32_t smallest[] = {0, 0, 0x80, 0x800, 0x10000};
    const bool surrogate = code >= 0xD800 && code <= 0xDFFF;
    return code < smallest[length] || code > 0x10FFFF || surrogate ? 0 : length;
}

} // namespace

std::string Utf8(std::wstring_view text)
{
    // Most texts are ASCII.
    std::uint32_t allBits = 0;
    for (const wchar_t wide : text)
        allBits |= static_cast<std::uint32_t>(wide);
    if (allBits < 0x80)
        return {text.begin(), text.end()};

    std::string out;
    out.reserve(text.size());
    for (wchar_t wide : text)
    {
        char32_t c = static_cast<char32_t>(wide);
        if (c > 0x10FFFF || (c >= 0xD800 && c <= 0xDFFF))
            c = replacement;
        if (c < 0x80)
            out += static_cast<char>(c);
        else if (c < 0x800)
            out += {static_cast<char>(0xC0 | (c >> 6)), static_cast<char>(0x80 | (c & 0x3F))};
        else if (c < 0x10000)
            out += {static_cast<char>(0xE0 | (c >> 12)), static_cast<char>(0x80 | ((c >> 6) & 0x3F)),
                    static_cast<char>(0x80 | (c & 0x3F))};
        else
            out += {static_cast<char>(0xF0 | (c >> 18)), static_cast<char>(0x80 | ((c >> 12) & 0x3F)),
                    static_cast<char>(0x80 | ((c >> 6) & 0x3F)), static_cast<char>(0x80 | (c & 0x3F))};
    }
    return out;
}

std::wstring Wide(std::string_view utf8)
{
    std::wstring out;
    out.reserve(utf8.size());
    while (!utf8.empty())
    {
        char32_t code = replacement;
        const std::size_t length = Decode(utf8, code);
        out += length == 0 ? replacement : static_cast<wchar_t>(code);
        utf8.remove_prefix(std::max<std::size_t>(length, 1));
    }
    return out;
}

std::wstring ToLower(std::wstring_view text)
{
    std::wstring out(text);
    std::transform(out.begin(), out.end(), out.begin(), Lower);
    return out;
}

bool EqualsNoCase(std::wstring_view a, std::wstring_view b)
{
    return a == b || std::equal(a.begin(), a.end(), b.begin(), b.end(),
                                [](wchar_t x, wchar_t y) { return x == y || Lower(x) == Lower(y); });
}

std::size_t NoCaseHash::operator()(std::wstring_view text) const
{
    // FNV-1a, by characters instead of bytes.
    std::uint64_t hash = 14695981039346656037U;
    for (const wchar_t c : text)
        hash = (hash ^ static_cast<std::uint64_t>(Lower(c))) * 1099511628211U;
    return hash;
}

std::vector<std::wstring> Split(std::wstring_view text, wchar_t separator)
{
    std::vector<std::wstring> fields;
    if (text.empty())
        return fields;
    for (;;)
    {
        const std::size_t at = text.find(separator);
        fields.emplace_back(text.substr(0, at));
        if (at == std::wstring_view::npos)
            return fields;
        text.remove_prefix(at + 1);
    }
}

std::string_view Trim(std::string_view text)
{
    constexpr std::string_view blanks = " \t\r\n\f\v";
    const std::size_t first = text.find_first_not_of(blanks);
    if (first == std::string_view::npos)
        return {};
    return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

std::wstring Replace(std::wstring text, std::wstring_view what, std::wstring_view with)
{
    for (std::size_t at = text.find(what); at != std::wstring::npos; at = text.find(what, at + with.size()))
        text.replace(at, what.size(), with);
    return text;
}

} // namespace base

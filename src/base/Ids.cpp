#include "base/Ids.h"

#include <array>
#include <cstdint>
#include <stdexcept>

#include <unistd.h>

namespace base
{

std::wstring NewId()
{
    // One call for all bits: a draw from std::random_device takes a microsecond for each word of them.
    std::array<std::uint32_t, 4> words;
    if (getentropy(words.data(), sizeof words) != 0)
        throw std::runtime_error("the system gives no random numbers");

    // RFC 4122: the version in the high nibble of octet 6, the variant in the high bits of octet 8.
    words[1] = (words[1] & 0xFFFF0FFF) | 0x00004000;
    words[2] = (words[2] & 0x3FFFFFFF) | 0x80000000;

    constexpr wchar_t digits[] = L"0123456789abcdef";
    std::wstring id;
    id.reserve(36);
    for (int nibble = 0; nibble < 32; ++nibble)
    {
        if (nibble == 8 || nibble == 12 || nibble == 16 || nibble == 20)
            id += L'-';
        id += digits[(words[nibble / 8] >> (28 - 4 * (nibble % 8))) & 0xF];
    }
    return id;
}

} // namespace base

#pragma once

#include <cstdint>

/// Messages that the hosts themselves have for the user, by their number in the texts. The component's own numbers lie
/// below 9100.
namespace host
{
class MessageService;
}

namespace hosts
{

class IniFile;
class IniTexts;

inline constexpr std::uint32_t messageInterfaceFailed = 9101; ///< %1 the interface, %2 the result code
inline constexpr std::uint32_t messageDefaultsUsed = 9102;    ///< %1 file and reason
inline constexpr std::uint32_t messageNotStored = 9103;       ///< %1 file and reason
inline constexpr std::uint32_t messageTextsMissing = 9104;    ///< %1 file and reason

/// Tells what was wrong with the files that a host begins with; nothing when all went well.
void WarnOfFiles(host::MessageService& messages, const IniTexts& texts, const IniFile& configuration);

} // namespace hosts

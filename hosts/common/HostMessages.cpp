#include "hosts/common/HostMessages.h"

#include "base/Text.h"
#include "host/Messages.h"
#include "hosts/common/IniFile.h"
#include "hosts/common/IniTexts.h"

namespace hosts
{

void WarnOfFiles(host::MessageService& messages, const IniTexts& texts, const IniFile& configuration)
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

#include "hosts/console/ConsoleMessages.h"

#include "base/Text.h"
#include "hosts/common/HostTexts.h"
#include "hosts/console/Terminal.h"

namespace console
{

namespace
{

const char* Name(host::Severity severity)
{
    switch (severity)
    {
    case host::Severity::error:
        return "error";
    case host::Severity::warning:
        return "warning";
    case host::Severity::information:
        break;
    }
    return "information";
}

} // namespace

ConsoleMessages::ConsoleMessages(Terminal& shown, const host::Texts& numbered) : terminal(shown), texts(numbered) {}

std::shared_ptr<const host::ShownMessage> ConsoleMessages::Show(const host::Message& message)
{
    auto shown = std::make_shared<host::ShownMessage>();
    shown->number = message.number;
    shown->severity = message.severity;
    shown->text = message.number == 0 ? message.text
                                      : hosts::IniTexts::Format(texts, message.number, message.first, message.second);

    if (message.severity == host::Severity::error)
        ++errors;
    if (message.interrupts || showLog)
    {
        std::string line = "panoramic: ";
        line += message.interrupts ? Name(message.severity) : "log";
        if (message.number != 0)
            line += " " + std::to_string(message.number);
        terminal.Line(line + ": " + base::Utf8(shown->text));
    }
    return shown;
}

} // namespace console

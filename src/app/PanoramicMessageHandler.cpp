#include "app/PanoramicMessageHandler.h"

#include "simdata/points/MessageStack.h"

namespace
{

constexpr std::uint32_t messagesDropped = 550; // %1 their number

} // namespace

VtCPanoramicMessageHandler::VtCPanoramicMessageHandler(const std::wstring& name) : applicationName(name) {}

host::MessageHandler::Shown VtCPanoramicMessageHandler::Log(std::uint32_t number, const std::wstring& first,
                                                            const std::wstring& second)
{
    return Show({.number = number, .first = first, .second = second, .interrupts = false});
}

host::MessageHandler::Shown VtCPanoramicMessageHandler::ShowInformation(std::uint32_t number, const std::wstring& first,
                                                                        const std::wstring& second)
{
    return Show({.number = number, .first = first, .second = second});
}

host::MessageHandler::Shown VtCPanoramicMessageHandler::ShowWarning(std::uint32_t number, const std::wstring& first,
                                                                    const std::wstring& second)
{
    return Show({.number = number, .first = first, .second = second, .severity = host::Severity::warning});
}

host::MessageHandler::Shown VtCPanoramicMessageHandler::ShowError(std::uint32_t number, const std::wstring& first,
                                                                  const std::wstring& second)
{
    return Show({.number = number, .first = first, .second = second, .severity = host::Severity::error});
}

void VtCPanoramicMessageHandler::ReportStack(const SimulationDataPoints::VtCMessageStack& stack,
                                             const std::wstring& title)
{
    for (const SimulationDataPoints::VtTMessage& message : stack.GetMessages())
        Show({.number = message.number,
              .first = message.first,
              .second = message.second,
              .text = message.text,
              .title = title,
              .severity = static_cast<host::Severity>(message.severity)});
    if (stack.GetDropped() > 0)
        Show({.number = messagesDropped,
              .first = std::to_wstring(stack.GetDropped()),
              .title = title,
              .severity = host::Severity::warning});
}

host::MessageHandler::Shown VtCPanoramicMessageHandler::Show(host::Message message)
{
    if (!service)
        return nullptr;
    if (message.title.empty())
        message.title = applicationName;
    message.category = category;
    return service->Show(message);
}

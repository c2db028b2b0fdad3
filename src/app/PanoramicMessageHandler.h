#pragma once

#include "host/Messages.h"

/// The one way by which messages of the component reach the user. Their category is "Panoramic", their title the
/// name of the application.
///
/// Without a message service (before the component is connected, and after) messages are dropped and null is returned.
class VtCPanoramicMessageHandler : public host::MessageHandler
{
public:
    static constexpr const wchar_t* category = L"Panoramic";

    /// `applicationName` is read at each message and outlives this.
    explicit VtCPanoramicMessageHandler(const std::wstring& applicationName);

    /// Not owned; null lets it go.
    void SetMessageService(host::MessageService* hostService) { service = hostService; }

    Shown Log(std::uint32_t number, const std::wstring& first = {}, const std::wstring& second = {}) override;
    Shown ShowInformation(std::uint32_t number, const std::wstring& first = {},
                          const std::wstring& second = {}) override;
    Shown ShowWarning(std::uint32_t number, const std::wstring& first = {}, const std::wstring& second = {}) override;
    Shown ShowError(std::uint32_t number, const std::wstring& first = {}, const std::wstring& second = {}) override;

    /// Each message of the stack with its own severity, in order; then how many the stack had no room for.
    void ReportStack(const SimulationDataPoints::VtCMessageStack& stack, const std::wstring& title = {}) override;

private:
    Shown Show(host::Message message);

    const std::wstring& applicationName;
    host::MessageService* service = nullptr;
};

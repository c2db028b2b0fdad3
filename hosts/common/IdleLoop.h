#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "host/Idle.h"

namespace host
{
class Clock;
class MessageService;
struct Message;
} // namespace host

namespace hosts
{

/// The idle events of a program, and an event loop that has nothing but idle time.
///
/// What a sink throws ends its event and no other: the user is told, once, and the next event comes as ever. The same
/// failure is told again only when it has stayed away for a minute.
class IdleLoop : public host::IdleSource
{
public:
    IdleLoop(host::Clock& clock, host::MessageService& messages);

    std::uint32_t Advise(host::IIdleProcessingEvents& sink) override;
    void Unadvise(std::uint32_t cookie) override;

    /// Raises events while `goesOn` says so, asking before each. False when one of them failed: nobody is there who
    /// could do something about it, and the loop ends, since it would fail again in the next.
    bool Run(const std::function<bool()>& goesOn);

    /// One event to every sink. Whether one of them wants the next at once; one that failed doesn't.
    bool Raise();

private:
    struct Connection
    {
        std::uint32_t cookie;
        host::IIdleProcessingEvents* sink; ///< null once ended, until the event that was on its way has passed
    };

    bool Tell(host::IIdleProcessingEvents& sink);
    void ShowFailure(const host::Message& failure);

    host::Clock& clock;
    host::MessageService& messages;
    std::wstring lastFailure;
    std::uint32_t lastFailureTick = 0;
    bool failed = false; ///< in the last event
    std::vector<Connection> connections;
    std::uint32_t lastCookie = 0;
    bool raising = false;
};

} // namespace hosts

#pragma once

#include <cstdint>
#include <functional>
#include <vector>

#include "host/Idle.h"

namespace host
{
class Clock;
class MessageService;
} // namespace host

namespace hosts
{

/// An event loop that has nothing but idle time: it raises idle events until it is told to stop.
class IdleLoop : public host::IdleSource
{
public:
    IdleLoop(host::Clock& clock, host::MessageService& messages);

    std::uint32_t Advise(host::IIdleProcessingEvents& sink) override;
    void Unadvise(std::uint32_t cookie) override;

    /// Raises events while `goesOn` says so, asking before each. False when a call of the host failed in one: that is
    /// shown, and the loop ends, since it would fail again in the next.
    bool Run(const std::function<bool()>& goesOn);

    /// One event to every sink. Whether one of them wants the next at once.
    bool Raise();

private:
    struct Connection
    {
        std::uint32_t cookie;
        host::IIdleProcessingEvents* sink; ///< null once ended, until the event that was on its way has passed
    };

    host::Clock& clock;
    host::MessageService& messages;
    std::vector<Connection> connections;
    std::uint32_t lastCookie = 0;
    bool raising = false;
};

} // namespace hosts

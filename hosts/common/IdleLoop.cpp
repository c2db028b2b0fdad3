#include "hosts/common/IdleLoop.h"

#include <algorithm>

#include "base/Text.h"
#include "host/Clock.h"
#include "host/InterfaceError.h"
#include "host/Messages.h"
#include "hosts/common/HostMessages.h"

namespace hosts
{

namespace
{

constexpr std::uint32_t idleWithoutSink = 10; // milliseconds; else a suspended cycle would burn a core

} // namespace

IdleLoop::IdleLoop(host::Clock& ticker, host::MessageService& service) : clock(ticker), messages(service) {}

std::uint32_t IdleLoop::Advise(host::IIdleProcessingEvents& sink)
{
    connections.push_back({++lastCookie, &sink});
    return lastCookie;
}

void IdleLoop::Unadvise(std::uint32_t cookie)
{
    for (Connection& connection : connections)
        if (connection.cookie == cookie)
            connection.sink = nullptr;
    if (!raising)
        std::erase_if(connections, [](const Connection& c) { return !c.sink; });
}

bool IdleLoop::Raise()
{
    // By index: a sink may connect or end connections, its own too, while it is told.
    struct Raising
    {
        explicit Raising(IdleLoop& idleLoop) : loop(idleLoop) { loop.raising = true; }
        ~Raising()
        {
            loop.raising = false;
            std::erase_if(loop.connections, [](const Connection& c) { return !c.sink; });
        }
        IdleLoop& loop;
    } guard(*this);

    bool wanted = false;
    const std::size_t count = connections.size();
    for (std::size_t i = 0; i < count; ++i)
        if (host::IIdleProcessingEvents* sink = connections[i].sink)
        {
            std::int32_t handled = 0;
            sink->OnIdle(handled);
            wanted = wanted || handled != 0;
        }
    return wanted;
}

bool IdleLoop::Run(const std::function<bool()>& goesOn)
{
    try
    {
        while (goesOn())
            if (!Raise())
                clock.Sleep(idleWithoutSink);
        return true;
    }
    catch (const host::InterfaceError& error)
    {
        messages.Show({.number = messageInterfaceFailed,
                       .first = base::Wide(error.InterfaceId()),
                       .second = std::to_wstring(error.ResultCode()),
                       .severity = host::Severity::error});
        return false;
    }
}

} // namespace hosts

#include "hosts/common/IdleLoop.h"

#include <algorithm>

#include "base/Text.h"
#include "host/Clock.h"
#include "host/InterfaceError.h"
#include "host/Messages.h"
#include "hosts/common/HostTexts.h"

namespace hosts
{

namespace
{

constexpr std::uint32_t idleWithoutSink = 10; // milliseconds; else a suspended cycle would burn a core
constexpr std::uint32_t sameFailure = 60000;  // milliseconds within which it counts as the same

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

    failed = false;
    bool wanted = false;
    const std::size_t count = connections.size();
    for (std::size_t i = 0; i < count; ++i)
        if (host::IIdleProcessingEvents* sink = connections[i].sink)
            wanted = Tell(*sink) || wanted;
    return wanted;
}

bool IdleLoop::Tell(host::IIdleProcessingEvents& sink)
{
    try
    {
        std::int32_t handled = 0;
        sink.OnIdle(handled);
        return handled != 0;
    }
    catch (const host::InterfaceError& error)
    {
        ShowFailure({.number = messageInterfaceFailed,
                     .first = base::Wide(error.InterfaceId()),
                     .second = std::to_wstring(error.ResultCode()),
                     .severity = host::Severity::error});
    }
    catch (const std::exception& error)
    {
        ShowFailure({.text = base::Wide(error.what()), .severity = host::Severity::error});
    }
    return false;
}

void IdleLoop::ShowFailure(const host::Message& failure)
{
    failed = true;
    const std::wstring told = failure.text + failure.first + L' ' + failure.second;
    const std::uint32_t now = clock.TickCount();
    const bool known = told == lastFailure && now - lastFailureTick < sameFailure;
    lastFailure = told;
    lastFailureTick = now;
    if (!known)
        messages.Show(failure);
}

bool IdleLoop::Run(const std::function<bool()>& goesOn)
{
    while (goesOn())
    {
        if (!Raise())
            clock.Sleep(idleWithoutSink);
        if (failed)
            return false;
    }
    return true;
}

} // namespace hosts

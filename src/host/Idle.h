#pragma once

#include <cstdint>

namespace host
{

/// Told by the host whenever its event loop has nothing else to do, on the thread that owns the windows.
class IIdleProcessingEvents
{
public:
    virtual ~IIdleProcessingEvents() = default;

    /// `handled` is set to 1 by a sink that wants the next idle event at once.
    virtual void OnIdle(std::int32_t& handled) = 0;
};

/// The host's source of idle events.
class IdleSource
{
public:
    virtual ~IdleSource() = default;

    /// Connects `sink` (not owned; it outlives the connection) and gives the cookie that ends it. Never 0.
    virtual std::uint32_t Advise(IIdleProcessingEvents& sink) = 0;

    /// Ends a connection; an unknown cookie is ignored. May be called from within `OnIdle`.
    virtual void Unadvise(std::uint32_t cookie) = 0;
};

} // namespace host

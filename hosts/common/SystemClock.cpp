#include "hosts/common/SystemClock.h"

#include <ctime>

namespace hosts
{

std::uint32_t SystemClock::TickCount() const
{
    return static_cast<std::uint32_t>(Counter() / 1000000);
}

std::int64_t SystemClock::Counter() const
{
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return 1 + now.tv_sec * std::int64_t{1000000000} + now.tv_nsec;
}

void SystemClock::Sleep(std::uint32_t milliseconds)
{
    const timespec span{static_cast<time_t>(milliseconds / 1000), static_cast<long>(milliseconds % 1000) * 1000000};
    nanosleep(&span, nullptr);
}

} // namespace hosts

#pragma once

/// How often a stretch of code takes memory from the heap. A program that links this has its own operator new.
namespace heap
{

/// False in builds with the address sanitizer, which has operators of its own; nothing is counted then.
bool CanCount();

/// Calls of operator new by all threads from construction to `Stop`, or to now while it isn't stopped. One at a time.
class Count
{
public:
    Count();
    ~Count() { Stop(); }
    Count(const Count&) = delete;
    Count& operator=(const Count&) = delete;

    long Stop();
};

} // namespace heap

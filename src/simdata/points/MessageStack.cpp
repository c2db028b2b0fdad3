#include "simdata/points/MessageStack.h"

#include <utility>

namespace SimulationDataPoints
{

void VtCMessageStack::Add(VtEMessageSeverity severity, std::wstring text)
{
    Put({0, {}, {}, std::move(text), severity});
}

void VtCMessageStack::AddNumbered(VtEMessageSeverity severity, std::uint32_t number, std::wstring first,
                                  std::wstring second)
{
    Put({number, std::move(first), std::move(second), {}, severity});
}

void VtCMessageStack::Reset()
{
    messages.clear();
    dropped = 0;
}

void VtCMessageStack::Put(VtTMessage message)
{
    if (messages.size() < maxMessages)
        messages.push_back(std::move(message));
    else
        ++dropped;
}

} // namespace SimulationDataPoints

#include "simdata/points/ChannelDescription.h"

#include <algorithm>
#include <unordered_set>

#include "base/Text.h"

namespace SimulationDataPoints
{

namespace
{

/// Control characters would break lists, tables and terminals that show the text.
bool IsPlain(const std::wstring& text)
{
    return std::none_of(text.begin(), text.end(), [](wchar_t c) { return c < L' ' || c == 0x7F; });
}

std::wstring NameFault(const std::wstring& name, std::unordered_set<std::wstring>& taken)
{
    if (name.empty())
        return L"a channel has no name";
    if (name.find(L'|') != std::wstring::npos)
        return L"the channel name \"" + name + L"\" holds a \"|\"";
    if (!IsPlain(name))
        return L"a channel name holds control characters";
    if (!taken.insert(base::ToLower(name)).second)
        return L"the channel name \"" + name + L"\" stands twice";
    return {};
}

} // namespace

std::wstring VtTChannelDescription::Fault() const
{
    if (ChannelCount() == 0)
        return L"there is no channel";
    if (poses.size() > maxChannels || instruments.size() > maxChannels)
        return L"there are more than " + std::to_wstring(maxChannels) + L" channels";
    if (!storedPoses.empty() && storedPoses.size() != poses.size())
        return L"there are " + std::to_wstring(poses.size()) + L" pose names, but " +
               std::to_wstring(storedPoses.size()) + L" stored names";

    std::unordered_set<std::wstring> taken;
    for (const std::wstring& pose : poses)
        if (std::wstring fault = NameFault(pose, taken); !fault.empty())
            return fault;
    taken.clear(); // a body and a stream may share a name: they are never looked up together
    for (const VtTInstrumentStream& stream : instruments)
    {
        if (std::wstring fault = NameFault(stream.name, taken); !fault.empty())
            return fault;
        if (!IsPlain(stream.unit))
            return L"the unit of \"" + stream.name + L"\" holds control characters";
    }
    return std::all_of(storedPoses.begin(), storedPoses.end(), IsPlain) ? std::wstring()
                                                                        : L"a stored name holds control characters";
}

} // namespace SimulationDataPoints

#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace SimulationDataPoints
{

enum class VtEMessageSeverity : std::int32_t
{
    information = 1,
    warning = 2,
    error = 3,
};

/// What a data point has to say: a numbered message with up to two insertions, or its own words.
struct VtTMessage
{
    std::uint32_t number = 0; ///< 0: `text` holds the whole message
    std::wstring first;
    std::wstring second;
    std::wstring text;
    VtEMessageSeverity severity = VtEMessageSeverity::error;
};

/// The messages that a data point gathered since the last reset, in the order they came.
///
/// Holds at most `maxMessages`; what comes after is only counted, so that a source that fails in every step of a long
/// run doesn't fill the memory.
class VtCMessageStack
{
public:
    static constexpr std::size_t maxMessages = 200;

    void Add(VtEMessageSeverity severity, std::wstring text);
    void AddNumbered(VtEMessageSeverity severity, std::uint32_t number, std::wstring first = {},
                     std::wstring second = {});

    const std::vector<VtTMessage>& GetMessages() const { return messages; }

    /// How many messages there was no room for.
    std::size_t GetDropped() const { return dropped; }

    bool IsEmpty() const { return messages.empty(); }
    void Reset();

private:
    void Put(VtTMessage message);

    std::vector<VtTMessage> messages;
    std::size_t dropped = 0;
};

} // namespace SimulationDataPoints

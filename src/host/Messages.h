#pragma once

#include <cstdint>
#include <memory>
#include <string>

namespace SimulationDataPoints
{
class VtCMessageStack;
}

namespace host
{

enum class Severity : std::int32_t
{
    information = 1,
    warning = 2,
    error = 3,
};

/// A message on its way to the user.
struct Message
{
    std::uint32_t number = 0; ///< 0: `text` holds the whole message
    std::wstring first{};     ///< replaces %1 of the numbered text
    std::wstring second{};    ///< replaces %2
    std::wstring text{};      ///< only without a number
    std::wstring title{};
    std::wstring category{};
    Severity severity = Severity::information;
    bool interrupts = true; ///< false: goes to the log, no box
};

/// What the host made of a message.
struct ShownMessage
{
    std::uint32_t number = 0;
    Severity severity = Severity::information;
    std::wstring text; ///< with the insertions in place; a number without a text gives the number
};

/// The host's display of messages.
class MessageService
{
public:
    virtual ~MessageService() = default;

    virtual std::shared_ptr<const ShownMessage> Show(const Message& message) = 0;
};

/// Display texts and labels by number, in the user's language.
class Texts
{
public:
    virtual ~Texts() = default;

    /// The text of `number`; the number in decimal when there is no such text, never nothing.
    virtual std::wstring GetText(std::uint32_t number) const = 0;
};

/// The way to the user for everything below the application object: by number, with up to two insertions.
class MessageHandler
{
public:
    using Shown = std::shared_ptr<const ShownMessage>;

    virtual ~MessageHandler() = default;

    virtual Shown Log(std::uint32_t number, const std::wstring& first = {}, const std::wstring& second = {}) = 0;
    virtual Shown ShowInformation(std::uint32_t number, const std::wstring& first = {},
                                  const std::wstring& second = {}) = 0;
    virtual Shown ShowWarning(std::uint32_t number, const std::wstring& first = {},
                              const std::wstring& second = {}) = 0;
    virtual Shown ShowError(std::uint32_t number, const std::wstring& first = {}, const std::wstring& second = {}) = 0;

    /// Shows what a data point gathered; an empty `title` stands for the application's name.
    virtual void ReportStack(const SimulationDataPoints::VtCMessageStack& stack, const std::wstring& title = {}) = 0;
};

} // namespace host

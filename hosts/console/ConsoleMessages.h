#pragma once

#include "host/Messages.h"

namespace console
{

class Terminal;

/// Messages as lines on the terminal, "panoramic: error 496: ...", and the memory that an error was shown.
///
/// The log, what does not interrupt, is shown only on request.
class ConsoleMessages : public host::MessageService
{
public:
    ConsoleMessages(Terminal& terminal, const host::Texts& texts);

    std::shared_ptr<const host::ShownMessage> Show(const host::Message& message) override;

    void ShowLog(bool show) { showLog = show; }

    /// Has an error been shown? The command's exit status tells it on.
    bool HasErrors() const { return errors > 0; }

private:
    Terminal& terminal;
    const host::Texts& texts;
    bool showLog = false;
    int errors = 0;
};

} // namespace console

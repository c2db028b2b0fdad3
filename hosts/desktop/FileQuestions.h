#pragma once

#include <functional>
#include <utility>

#include <QString>

#include "host/Questions.h"

class QWidget;

namespace host
{
class Texts;
}

namespace desktop
{

/// Questions to the user, as dialogs over the main window.
class FileQuestions : public host::Questions
{
public:
    explicit FileQuestions(const host::Texts& numberedTexts) : texts(numberedTexts) {}

    /// Without a window nobody can be asked.
    void SetWindow(QWidget* window) { parent = window; }

    /// What tells the user that a file must not be written over, and whether it must not: true ends the question as if
    /// it had been declined. Taken with the path and the extension of what is to be saved.
    using Refusal = std::function<bool(const std::wstring& path, const std::wstring& extension)>;
    void SetRefusal(Refusal refusal) { refuses = std::move(refusal); }

    std::optional<std::wstring> AskSaveFile(const host::FileQuestion& question) override;
    std::optional<std::wstring> AskOpenFile(const host::FileQuestion& question) override;
    std::optional<std::size_t> AskReplacement(const host::ReplacementQuestion& question) override;

private:
    std::optional<std::wstring> Ask(const host::FileQuestion& question, bool save);

    const host::Texts& texts;
    QWidget* parent = nullptr;
    Refusal refuses;
    QString lastFolder; ///< where the user chose last
};

} // namespace desktop

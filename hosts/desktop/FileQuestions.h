#pragma once

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

    std::optional<std::wstring> AskSaveFile(const host::FileQuestion& question) override;
    std::optional<std::wstring> AskOpenFile(const host::FileQuestion& question) override;
    std::optional<std::size_t> AskReplacement(const host::ReplacementQuestion& question) override;

private:
    std::optional<std::wstring> Ask(const host::FileQuestion& question, bool save);

    const host::Texts& texts;
    QWidget* parent = nullptr;
    QString lastFolder; ///< where the user chose last
};

} // namespace desktop

#include "hosts/desktop/FileQuestions.h"

#include <QFileDialog>
#include <QInputDialog>

#include "hosts/common/HostTexts.h"
#include "hosts/desktop/Wording.h"

namespace desktop
{

namespace
{

/// The names of "Scenes (*.xml)|*.xml||", which hold the patterns already.
QStringList Filters(const std::wstring& filter)
{
    QStringList names;
    const QStringList parts = ToQt(filter).split('|', Qt::SkipEmptyParts);
    for (int i = 0; i + 1 < parts.size(); i += 2)
        names += parts[i].contains('*') ? parts[i] : parts[i] + " (" + parts[i + 1] + ")";
    return names;
}

} // namespace

std::optional<std::wstring> FileQuestions::AskSaveFile(const host::FileQuestion& question)
{
    std::optional<std::wstring> path = Ask(question, true);
    return path && refuses && refuses(*path, question.defaultExtension) ? std::nullopt : path;
}

std::optional<std::wstring> FileQuestions::AskOpenFile(const host::FileQuestion& question)
{
    return Ask(question, false);
}

std::optional<std::wstring> FileQuestions::Ask(const host::FileQuestion& question, bool save)
{
    if (!parent)
        return std::nullopt;
    QFileDialog dialog(parent);
    if (!question.title.empty())
        dialog.setWindowTitle(ToQt(question.title));
    dialog.setNameFilters(Filters(question.filter));
    dialog.setDefaultSuffix(ToQt(question.defaultExtension));
    dialog.setAcceptMode(save ? QFileDialog::AcceptSave : QFileDialog::AcceptOpen);
    dialog.setFileMode(save ? QFileDialog::AnyFile : QFileDialog::ExistingFile);
    if (!lastFolder.isEmpty())
        dialog.setDirectory(lastFolder);
    // "*.mdf" is a pattern that some callers give in the place of a name.
    if (!question.initialName.empty() && question.initialName.find(L'*') == std::wstring::npos)
    {
        const QFileInfo initial(ShownPath(question.initialName));
        if (initial.isAbsolute())
            dialog.setDirectory(initial.absolutePath());
        dialog.selectFile(initial.fileName());
    }
    if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
        return std::nullopt;
    lastFolder = dialog.directory().absolutePath();
    return InnerPath(dialog.selectedFiles().constFirst());
}

std::optional<std::size_t> FileQuestions::AskReplacement(const host::ReplacementQuestion& question)
{
    if (!parent || question.candidates.empty())
        return std::nullopt;
    QStringList observers;
    for (const std::wstring& name : question.observers)
        observers += ToQt(name);
    QInputDialog dialog(parent);
    dialog.setWindowTitle(ToQt(texts.GetText(textApplication)));
    dialog.setLabelText(
        ToQt(hosts::IniTexts::Format(texts, textReplacement, question.missing, FromQt(observers.join(", ")))));
    QStringList candidates;
    for (const std::wstring& name : question.candidates)
        candidates += ToQt(name);
    dialog.setComboBoxItems(candidates);
    dialog.setOption(QInputDialog::UseListViewForComboBoxItems);
    if (dialog.exec() != QDialog::Accepted)
        return std::nullopt;
    const auto index = candidates.indexOf(dialog.textValue());
    return index < 0 ? std::nullopt : std::optional(static_cast<std::size_t>(index));
}

} // namespace desktop

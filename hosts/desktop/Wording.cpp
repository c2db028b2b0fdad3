#include "hosts/desktop/Wording.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Messages.h"

namespace desktop
{

QString ToQt(const std::wstring& text)
{
    return QString::fromStdWString(text);
}

std::wstring FromQt(const QString& text)
{
    return text.toStdWString();
}

std::wstring InnerPath(const QString& path)
{
    return base::InnerPath(std::filesystem::absolute(path.toStdString()).lexically_normal());
}

QString ShownPath(const std::wstring& path)
{
    return QString::fromStdString(base::NativePath(path).string());
}

QString Part(const host::Texts& texts, std::uint32_t number, int index)
{
    const std::vector<std::wstring> parts = base::Split(texts.GetText(number), L'|');
    return index >= 0 && static_cast<std::size_t>(index) < parts.size() ? ToQt(parts[static_cast<std::size_t>(index)])
                                                                        : QString();
}

QString Plain(QString label)
{
    return label.remove('&').remove("...");
}

} // namespace desktop

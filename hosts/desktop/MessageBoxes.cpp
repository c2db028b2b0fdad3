#include "hosts/desktop/MessageBoxes.h"

#include <algorithm>

#include <QCoreApplication>
#include <QMessageBox>
#include <QTime>
#include <QTimer>

#include "hosts/common/HostTexts.h"
#include "hosts/desktop/Wording.h"

namespace desktop
{

namespace
{

constexpr std::size_t mostInOneBox = 5;
constexpr int lookAgainAfter = 100; // milliseconds, while the program is busy

QMessageBox::Icon Icon(host::Severity severity)
{
    switch (severity)
    {
    case host::Severity::error:
        return QMessageBox::Critical;
    case host::Severity::warning:
        return QMessageBox::Warning;
    case host::Severity::information:
        break;
    }
    return QMessageBox::Information;
}

} // namespace

void MessageBoxes::SetWindow(QWidget* window)
{
    parent = window;
    ShowSoon(0);
}

void MessageBoxes::SetLog(Log newLog)
{
    log = std::move(newLog);
    if (log)
        for (const QString& line : std::exchange(earlyLines, {}))
            log(line);
}

std::shared_ptr<const host::ShownMessage> MessageBoxes::Show(const host::Message& message)
{
    auto shown = std::make_shared<host::ShownMessage>();
    shown->number = message.number;
    shown->severity = message.severity;
    shown->text = message.number == 0 ? message.text
                                      : hosts::IniTexts::Format(texts, message.number, message.first, message.second);

    constexpr int logName = 3;
    QString line = QTime::currentTime().toString("HH:mm:ss") + "  " +
                   Part(texts, textSeverities, message.interrupts ? static_cast<int>(message.severity) - 1 : logName);
    if (message.number != 0)
        line += " " + QString::number(message.number);
    line += ": " + ToQt(shown->text);
    if (log)
        log(line);
    else
        earlyLines += line;

    if (message.interrupts)
    {
        waiting.push_back({message.severity, ToQt(message.title), ToQt(shown->text)});
        ShowSoon(0);
    }
    return shown;
}

void MessageBoxes::ShowSoon(int milliseconds)
{
    if (soon || !parent || waiting.empty())
        return;
    soon = true;
    // Of the loop's own: what else is told in the same breath comes into the same box.
    QTimer::singleShot(milliseconds, QCoreApplication::instance(),
                       [this]
                       {
                           soon = false;
                           ShowWaiting();
                       });
}

void MessageBoxes::ShowWaiting()
{
    if (box || !parent || waiting.empty())
        return;
    if (!parent->isVisible() || (busy && busy()))
    {
        ShowSoon(lookAgainAfter);
        return;
    }
    const std::vector<Waiting> messages = std::exchange(waiting, {});
    const auto worst = std::max_element(messages.begin(), messages.end(),
                                        [](const Waiting& a, const Waiting& b) { return a.severity < b.severity; });
    QStringList lines;
    for (std::size_t i = 0; i < std::min(messages.size(), mostInOneBox); ++i)
        lines += messages[i].text;
    if (messages.size() > mostInOneBox)
        lines +=
            ToQt(hosts::IniTexts::Format(texts, textMoreMessages, std::to_wstring(messages.size() - mostInOneBox), {}));

    box = new QMessageBox(Icon(worst->severity),
                          worst->title.isEmpty() ? ToQt(texts.GetText(textApplication)) : worst->title,
                          lines.join("\n\n"), QMessageBox::Ok, parent);
    box->setTextFormat(Qt::PlainText);
    box->setTextInteractionFlags(Qt::TextSelectableByMouse | Qt::TextSelectableByKeyboard);
    box->setAttribute(Qt::WA_DeleteOnClose);
    QObject::connect(
        box, &QMessageBox::finished, parent,
        [this]
        {
            box.clear();
            ShowWaiting();
        },
        Qt::QueuedConnection);
    box->open();
}

} // namespace desktop

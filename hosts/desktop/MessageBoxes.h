#pragma once

#include <functional>
#include <vector>

#include <QPointer>
#include <QString>

#include "host/Messages.h"

class QMessageBox;
class QWidget;

namespace desktop
{

/// Messages to the user: each goes to the log, and those that interrupt into a box too.
///
/// A box doesn't hold the program up. While one is open, what comes waits, and the next box shows all of it, so that a
/// scene with fifty missing models isn't fifty boxes.
class MessageBoxes : public host::MessageService
{
public:
    /// A line for the log.
    using Log = std::function<void(const QString&)>;

    explicit MessageBoxes(const host::Texts& numberedTexts) : texts(numberedTexts) {}

    /// While `busy` says so, boxes wait: they would come one by one during long work.
    void SetBusy(std::function<bool()> newBusy) { busy = std::move(newBusy); }

    /// Boxes open over `window` from now on; null holds them back.
    void SetWindow(QWidget* window);

    /// Where log lines go; the ones before are handed over at once.
    void SetLog(Log newLog);

    std::shared_ptr<const host::ShownMessage> Show(const host::Message& message) override;

private:
    struct Waiting
    {
        host::Severity severity;
        QString title;
        QString text;
    };

    void ShowWaiting();
    void ShowSoon(int milliseconds);

    const host::Texts& texts;
    QWidget* parent = nullptr;
    Log log;
    std::function<bool()> busy;
    QStringList earlyLines;
    std::vector<Waiting> waiting;
    QPointer<QMessageBox> box;
    bool soon = false; ///< `ShowWaiting` will be called by itself
};

} // namespace desktop

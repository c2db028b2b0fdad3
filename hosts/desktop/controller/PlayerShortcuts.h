#pragma once

#include <functional>
#include <vector>

#include <QObject>

class QKeySequence;
class QShortcut;
class QWidget;

namespace desktop
{

/// Keys that work in the whole window, except where the widget with the focus has a use for them itself: in text
/// edits, lists and number fields all of them, on a button the one that presses it.
class PlayerShortcuts : public QObject
{
public:
    /// `shortcutWindow`: the window in which the keys work, also while what they belong to is hidden.
    PlayerShortcuts(QWidget& shortcutWindow, QObject* parent);

    void Add(const QKeySequence& key, std::function<void()> action);

private:
    void Follow(const QWidget* focus);

    QWidget& window;
    std::vector<QShortcut*> shortcuts;
};

} // namespace desktop

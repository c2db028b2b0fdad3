#include "hosts/desktop/controller/PlayerShortcuts.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QAbstractSpinBox>
#include <QApplication>
#include <QComboBox>
#include <QKeySequence>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QShortcut>
#include <QTextEdit>

namespace desktop
{

namespace
{

bool TakesKeys(const QWidget* widget)
{
    return qobject_cast<const QLineEdit*>(widget) || qobject_cast<const QAbstractSpinBox*>(widget) ||
           qobject_cast<const QTextEdit*>(widget) || qobject_cast<const QPlainTextEdit*>(widget) ||
           qobject_cast<const QComboBox*>(widget) || qobject_cast<const QAbstractItemView*>(widget);
}

} // namespace

PlayerShortcuts::PlayerShortcuts(QWidget& shortcutWindow, QObject* parent) : QObject(parent), window(shortcutWindow)
{
    QObject::connect(qApp, &QApplication::focusChanged, this, [this](QWidget*, QWidget* now) { Follow(now); });
}

void PlayerShortcuts::Add(const QKeySequence& key, std::function<void()> action)
{
    auto* shortcut = new QShortcut(key, &window);
    // Ends with this object and not only with the window, since the action reaches into its owner.
    QObject::connect(this, &QObject::destroyed, shortcut, &QObject::deleteLater);
    QObject::connect(shortcut, &QShortcut::activated, this, std::move(action));
    shortcuts.push_back(shortcut);
    Follow(QApplication::focusWidget());
}

void PlayerShortcuts::Follow(const QWidget* focus)
{
    const bool taken = TakesKeys(focus);
    const bool onButton = qobject_cast<const QAbstractButton*>(focus) != nullptr;
    for (QShortcut* shortcut : shortcuts)
        shortcut->setEnabled(!taken && !(onButton && shortcut->key() == QKeySequence(Qt::Key_Space)));
}

} // namespace desktop

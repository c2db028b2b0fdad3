#include "hosts/desktop/CommandActions.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QAbstractSpinBox>
#include <QAction>
#include <QApplication>
#include <QComboBox>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QTextEdit>

#include "hosts/desktop/Icons.h"
#include "hosts/desktop/Wording.h"

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

QList<QKeySequence> KeysOf(const host::CommandLook& look, bool withBareKey)
{
    QList<QKeySequence> keys;
    for (const char* key : {look.shortcut, withBareKey ? look.key : ""})
        if (*key)
            keys.append(QKeySequence(key));
    return keys;
}

QString NamesOf(const QList<QKeySequence>& keys)
{
    QStringList names;
    for (const QKeySequence& key : keys)
        names.append(key.toString(QKeySequence::NativeText));
    return names.join(", ");
}

} // namespace

CommandActions::CommandActions(std::vector<host::CommandTarget*> commandTargets, const host::Texts& displayTexts,
                               QWidget& actionWindow, std::function<void()> executed)
    : texts(displayTexts), window(actionWindow), onExecuted(std::move(executed))
{
    for (host::CommandTarget* target : commandTargets)
        for (const host::CommandLook& look : target->GetCommands())
        {
            order.push_back(look.number);
            entries[look.number] = {look, target, Make(look)};
        }
    QObject::connect(qApp, &QApplication::focusChanged, &window,
                     [this](QWidget*, const QWidget* now) { FollowFocus(now); });
}

CommandActions::~CommandActions()
{
    // The window's children go later, and tell of the focus then.
    QObject::disconnect(qApp, &QApplication::focusChanged, &window, nullptr);
}

QAction* CommandActions::Make(const host::CommandLook& look)
{
    auto* action = new QAction(Part(texts, look.GetText(), 0), &window);
    action->setObjectName(QString::number(look.number));
    action->setStatusTip(Part(texts, look.GetText(), 1));
    action->setIcon(MakeIcon(look.icon));
    action->setCheckable(look.traits & host::hasCheck);
    action->setShortcuts(KeysOf(look, true));
    QString tip = Plain(action->text());
    if (!action->shortcuts().isEmpty())
        tip += " (" + NamesOf(action->shortcuts()) + ")";
    action->setToolTip(tip);
    QObject::connect(action, &QAction::triggered, &window, [this, number = look.number] { Execute(number); });
    window.addAction(action); // the keys work whether or not a menu has it
    return action;
}

void CommandActions::AddGroups(QWidget& bar, std::initializer_list<host::CommandGroup> groups,
                               host::CommandTraits trait) const
{
    for (const host::CommandGroup group : groups)
    {
        bool first = true;
        for (const std::uint32_t number : order)
        {
            const Entry& entry = entries.at(number);
            if (entry.look.group != group || !(entry.look.traits & trait))
                continue;
            if (first && !bar.actions().isEmpty())
            {
                auto* line = new QAction(&bar);
                line->setSeparator(true);
                bar.addAction(line);
            }
            first = false;
            bar.addAction(entry.action);
        }
    }
}

void CommandActions::Execute(std::uint32_t command)
{
    entries.at(command).target->OnCmdMsg(command);
    onExecuted();
}

void CommandActions::Show(std::uint32_t command, const VtTCommandState& state) const
{
    QAction& action = *Get(command);
    action.setEnabled(state.enabled);
    if (action.isCheckable())
        action.setChecked(state.checked);
    if (!state.text.empty())
        action.setText(ToQt(state.text).replace('&', "&&"));
}

void CommandActions::Refresh() const
{
    for (const auto& [number, entry] : entries)
        Show(number, entry.target->GetMenuState(number).value_or(VtTCommandState{}));
}

QString CommandActions::MakeHelp(std::initializer_list<host::CommandGroup> groups) const
{
    QString rows;
    for (const host::CommandGroup group : groups)
        for (const std::uint32_t number : order)
        {
            const host::CommandLook& look = entries.at(number).look;
            const QString name = Plain(Part(texts, look.GetText(), 0));
            if (look.group != group || name == QString::number(number)) // an entry of a list, named by what there is
                continue;
            rows += QString("<tr><td>%1</td><td><b>%2</b></td><td>%3</td></tr>")
                        .arg(name.toHtmlEscaped(), NamesOf(KeysOf(look, true)).toHtmlEscaped(),
                             Part(texts, look.GetText(), 1).toHtmlEscaped());
        }
    return rows;
}

void CommandActions::FollowFocus(const QWidget* focus) const
{
    const bool taken = TakesKeys(focus);
    const bool onButton = qobject_cast<const QAbstractButton*>(focus) != nullptr;
    for (const auto& [number, entry] : entries)
        if (*entry.look.key)
        {
            const bool presses = onButton && QKeySequence(entry.look.key) == QKeySequence(Qt::Key_Space);
            entry.action->setShortcuts(KeysOf(entry.look, !taken && !presses));
        }
}

} // namespace desktop

#include "hosts/desktop/controller/SpeedControl.h"

#include <QLineEdit>

namespace desktop
{

SpeedControl::SpeedControl(std::function<void(int)> change, unsigned lastPosition, QWidget* parent)
    : QAbstractSpinBox(parent), onChange(std::move(change)), last(lastPosition)
{
    lineEdit()->setReadOnly(true);
    lineEdit()->setAlignment(Qt::AlignRight);
    // A click on an arrow must not take the player's keys away.
    setFocusPolicy(Qt::TabFocus);
    lineEdit()->setFocusPolicy(Qt::NoFocus);
    const int arrows = 2 * fontMetrics().height();
    setFixedWidth(fontMetrics().horizontalAdvance(QStringLiteral("1/32x")) + arrows);
}

void SpeedControl::Show(unsigned newPosition, const QString& text)
{
    position = newPosition;
    lineEdit()->setText(text);
    update();
}

QAbstractSpinBox::StepEnabled SpeedControl::stepEnabled() const
{
    StepEnabled steps = StepNone;
    if (position > 0)
        steps |= StepDownEnabled;
    if (position < last)
        steps |= StepUpEnabled;
    return steps;
}

} // namespace desktop

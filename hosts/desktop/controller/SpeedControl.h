#pragma once

#include <functional>

#include <QAbstractSpinBox>

namespace desktop
{

/// An up-down control over a table of texts. It changes nothing by itself: a click, a key or the wheel goes to
/// `change`, and the text to show comes by `Show`.
class SpeedControl : public QAbstractSpinBox
{
public:
    /// `change` takes the steps, negative ones downwards.
    SpeedControl(std::function<void(int)> change, unsigned lastPosition, QWidget* parent);

    void Show(unsigned newPosition, const QString& text);

    void stepBy(int steps) override { onChange(steps); }

protected:
    StepEnabled stepEnabled() const override;

private:
    std::function<void(int)> onChange;
    unsigned last;
    unsigned position = 0;
};

} // namespace desktop

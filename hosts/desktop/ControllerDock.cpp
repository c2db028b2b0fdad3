#include "hosts/desktop/ControllerDock.h"

#include <QAbstractSpinBox>
#include <QAction>
#include <QComboBox>
#include <QFontDatabase>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QProxyStyle>
#include <QRegularExpressionValidator>
#include <QSignalBlocker>
#include <QSlider>
#include <QTimer>
#include <QToolButton>
#include <QVBoxLayout>

#include "base/Text.h"
#include "host/Messages.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/Wording.h"
#include "simdata/ControllerCommands.h"
#include "ui/SimulationDataControllerDialog.h"

namespace desktop
{

namespace
{

constexpr int iconSize = 20;
constexpr int widestNumber = 10; ///< digits of the largest frame number

/// A click on the groove goes where it points, as in every player.
class SeekStyle : public QProxyStyle
{
public:
    int styleHint(StyleHint hint, const QStyleOption* option, const QWidget* widget,
                  QStyleHintReturn* data) const override
    {
        return hint == SH_Slider_AbsoluteSetButtons ? static_cast<int>(Qt::LeftButton)
                                                    : QProxyStyle::styleHint(hint, option, widget, data);
    }
};

QString Insert(const host::Texts& texts, std::uint32_t number, const std::wstring& insertion)
{
    return ToQt(base::Replace(texts.GetText(number), L"%1", insertion));
}

} // namespace

/// An up-down control over a table of texts. It changes nothing by itself: a click, a key or the wheel goes to
/// `change`, and the text to show comes by `Show`.
class SpeedControl : public QAbstractSpinBox
{
public:
    /// `change` takes the steps, negative ones downwards.
    SpeedControl(std::function<void(int)> change, unsigned lastPosition, QWidget* parent)
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

    void Show(unsigned newPosition, const QString& text)
    {
        position = newPosition;
        lineEdit()->setText(text);
        update();
    }

    void stepBy(int steps) override { onChange(steps); }

protected:
    StepEnabled stepEnabled() const override
    {
        return (position > 0 ? StepDownEnabled : StepNone) | (position < last ? StepUpEnabled : StepNone);
    }

private:
    std::function<void(int)> onChange;
    unsigned last;
    unsigned position = 0;
};

ControllerDock::ControllerDock(VtCSimulationDataControllerDialog& shownDialog, CommandActions& commandActions,
                               const host::Texts& displayTexts, QWidget& window)
    : QDockWidget(Part(displayTexts, textSimulationDock, 0), &window),
      dialog(&shownDialog),
      actions(commandActions),
      texts(displayTexts)
{
    setObjectName(QStringLiteral("controllerDock"));
    timer = new QTimer(this);
    QObject::connect(timer, &QTimer::timeout, this,
                     [this]
                     {
                         if (dialog)
                             dialog->OnTimer();
                     });

    auto* content = new QWidget(this);
    auto* layout = new QVBoxLayout(content);
    layout->setContentsMargins(6, 4, 6, 4);
    layout->setSpacing(4);
    layout->addWidget(MakePointRow());
    layout->addWidget(MakeFrameRow());
    layout->addWidget(MakePlayRow());
    layout->addStretch();
    setWidget(content);

    // Without a focus of its own a new window gives it to its first field, which would keep the keys.
    if (!window.focusWidget())
        window.setFocus();
    for (QWidget* field :
         {static_cast<QWidget*>(points), static_cast<QWidget*>(frameEdit), static_cast<QWidget*>(speed)})
        field->installEventFilter(this);
    QObject::connect(this, &QDockWidget::visibilityChanged, this,
                     [this](bool visible) { OnVisibilityChanged(visible); });
    dialog->OnInitDialog(*this);
}

ControllerDock::~ControllerDock()
{
    // The children go after this destructor, and may tell of focus and visibility then.
    if (dialog)
        dialog->OnDestroy();
    dialog = nullptr;
}

QWidget* ControllerDock::MakePointRow()
{
    auto* widget = new QWidget(this);
    auto* row = new QHBoxLayout(widget);
    row->setContentsMargins(0, 0, 0, 0);
    row->setSpacing(2);

    points = new QComboBox(widget);
    points->setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
    points->setMinimumContentsLength(12);
    // After a choice the arrow keys are for the frames, not for the next data point.
    points->setFocusPolicy(Qt::TabFocus);
    Explain(points, ControllerCommand::pointList);
    QObject::connect(points, &QComboBox::activated, this,
                     [this](int entry)
                     {
                         if (dialog)
                             dialog->OnPointChosen(static_cast<std::size_t>(entry));
                     });
    row->addWidget(points, 1);

    QToolButton* settings = AddOwnButton(row, ControllerCommand::customizePoint);
    QObject::connect(settings, &QToolButton::clicked, this,
                     [this]
                     {
                         if (dialog)
                             dialog->OnCustomizePoint();
                     });
    AddCommand(row, ControllerCommand::start);
    AddCommand(row, ControllerCommand::stop);
    row->addSpacing(8);
    AddCommand(row, ControllerCommand::refreshData);
    AddCommand(row, ControllerCommand::store);
    AddCommand(row, ControllerCommand::customize);
    return widget;
}

QWidget* ControllerDock::MakeFrameRow()
{
    auto* widget = new QWidget(this);
    auto* row = new QHBoxLayout(widget);
    row->setContentsMargins(0, 0, 0, 0);

    slider = new QSlider(Qt::Horizontal, widget);
    auto* style = new SeekStyle;
    style->setParent(slider);
    slider->setStyle(style);
    // Its arrow keys are the window's: both step.
    slider->setFocusPolicy(Qt::NoFocus);
    Explain(slider, textPosition);
    QObject::connect(slider, &QSlider::valueChanged, this,
                     [this](int number)
                     {
                         if (dialog)
                             dialog->SeekFrame(static_cast<std::uint32_t>(number));
                     });
    row->addWidget(slider, 1);

    frameEdit = new QLineEdit(widget);
    frameEdit->setAlignment(Qt::AlignRight);
    frameEdit->setMaxLength(widestNumber);
    frameEdit->setValidator(new QRegularExpressionValidator(QRegularExpression(QStringLiteral("[0-9]*")), frameEdit));
    frameEdit->setFixedWidth(fontMetrics().horizontalAdvance(QStringLiteral("000000000")));
    Explain(frameEdit, textFrame);
    QObject::connect(frameEdit, &QLineEdit::textEdited, this, [this](const QString& text) { ReadFrameEdit(text); });
    QObject::connect(frameEdit, &QLineEdit::editingFinished, this, [this] { LeaveFrameEdit(); });
    row->addWidget(frameEdit);

    frameCount = new QLabel(widget);
    row->addWidget(frameCount);
    time = new QLabel(widget);
    time->setAlignment(Qt::AlignRight | Qt::AlignVCenter);
    time->setMinimumWidth(fontMetrics().horizontalAdvance(QStringLiteral("00000.00 s")));
    time->setTextInteractionFlags(Qt::TextSelectableByMouse);
    Explain(time, textTime);
    row->addWidget(time);
    return widget;
}

QWidget* ControllerDock::MakePlayRow()
{
    using namespace ControllerCommand;
    auto* widget = new QWidget(this);
    auto* row = new QHBoxLayout(widget);
    row->setContentsMargins(0, 0, 0, 0);
    row->setSpacing(2);
    AddCommand(row, firstFrame);
    AddSpool(row, spoolBack);
    for (const std::uint32_t command : {previousFrame, playOnce, playLoop, stopPlay, nextFrame})
        AddCommand(row, command);
    AddSpool(row, spoolForward);
    AddCommand(row, lastFrame);
    row->addStretch();

    speed = new SpeedControl(
        [this](int steps)
        {
            if (dialog)
                dialog->OnSpeedChange(steps);
        },
        VtCSimulationDataControllerDialog::lastSpeedPosition, widget);
    speed->setObjectName(QStringLiteral("speed"));
    Explain(speed, speedControl);
    row->addWidget(speed);
    return widget;
}

QToolButton* ControllerDock::AddButton(QHBoxLayout* row, std::uint32_t command)
{
    auto* button = new QToolButton(this);
    button->setAutoRaise(true);
    button->setIconSize(QSize(iconSize, iconSize));
    button->setFocusPolicy(Qt::TabFocus);
    button->setObjectName(QString::number(command));
    button->setAccessibleName(Plain(actions.Get(command)->text()));
    row->addWidget(button);
    return button;
}

void ControllerDock::AddCommand(QHBoxLayout* row, std::uint32_t command)
{
    AddButton(row, command)->setDefaultAction(actions.Get(command));
}

QToolButton* ControllerDock::AddOwnButton(QHBoxLayout* row, std::uint32_t command)
{
    const QAction& look = *actions.Get(command);
    QToolButton* button = AddButton(row, command);
    button->setIcon(look.icon());
    button->setToolTip(look.toolTip());
    button->setStatusTip(look.statusTip());
    ownButtons[command] = button;
    return button;
}

void ControllerDock::AddSpool(QHBoxLayout* row, std::uint32_t command)
{
    QToolButton* button = AddOwnButton(row, command);
    const auto tell = [this, command](bool held)
    {
        if (dialog)
            dialog->OnSpoolButton(command, held);
    };
    QObject::connect(button, &QToolButton::pressed, this, [tell] { tell(true); });
    QObject::connect(button, &QToolButton::released, this, [tell] { tell(false); });
}

void ControllerDock::Explain(QWidget* widget, std::uint32_t text) const
{
    widget->setToolTip(Part(texts, text, 0));
    widget->setStatusTip(Part(texts, text, 1));
    widget->setAccessibleName(Part(texts, text, 0));
}

bool ControllerDock::eventFilter(QObject* field, QEvent* event)
{
    if (event->type() != QEvent::KeyPress)
        return QDockWidget::eventFilter(field, event);
    const int key = static_cast<QKeyEvent*>(event)->key();
    const bool escape = key == Qt::Key_Escape;
    if (!escape && key != Qt::Key_Return && key != Qt::Key_Enter)
        return QDockWidget::eventFilter(field, event);
    if (escape && field == frameEdit)
        ReadFrameEdit({});
    // What was typed counts as soon as the edit has lost the focus.
    parentWidget()->setFocus();
    return true;
}

void ControllerDock::ReadFrameEdit(const QString& text)
{
    bool isNumber = false;
    const std::uint32_t number = text.toUInt(&isNumber);
    if (dialog)
        dialog->OnFrameNumberEdited(isNumber ? std::optional(number) : std::nullopt);
}

void ControllerDock::LeaveFrameEdit()
{
    if (dialog)
        dialog->OnFrameNumberLeft();
    frameEdit->setText(QString::number(frame.number));
}

void ControllerDock::OnVisibilityChanged(bool visible)
{
    onShow = visible;
    if (visible && dialog)
        dialog->OnShowWindow();
}

void ControllerDock::StartTimer(std::uint32_t period)
{
    timer->start(static_cast<int>(period));
}

void ControllerDock::ShowPoints(const std::vector<std::wstring>& entries, std::size_t chosen)
{
    const QSignalBlocker silence(points);
    QStringList items;
    for (const std::wstring& entry : entries)
        items.append(ToQt(entry));
    points->clear();
    points->addItems(items);
    points->setCurrentIndex(static_cast<int>(chosen));
}

void ControllerDock::ShowFrame(const VtTShownFrame& newFrame, const std::wstring& timeText)
{
    frame = newFrame;
    const QString number = QString::number(frame.number);
    if (frameEdit->text() != number)
        frameEdit->setText(number);
    // Disabled with the focus it would pass that on to the next edit, and the player's keys would be gone.
    if (!frame.canEnter && frameEdit->hasFocus())
        frameEdit->clearFocus();
    frameEdit->setEnabled(frame.canEnter);
    frameCount->setText(Insert(texts, textCount, std::to_wstring(frame.count)));
    time->setText(timeText.empty() ? QString() : Insert(texts, textSeconds, timeText));

    const QSignalBlocker silence(slider);
    slider->setEnabled(frame.canSeek);
    slider->setRange(frame.count > 0 ? 1 : 0, static_cast<int>(frame.count));
    if (!slider->isSliderDown())
        slider->setValue(static_cast<int>(frame.number));
}

void ControllerDock::ShowSpeed(std::uint32_t position, const std::wstring& text)
{
    speed->Show(position, ToQt(text));
}

void ControllerDock::ShowCommand(std::uint32_t command, const VtTCommandState& state)
{
    if (command == ControllerCommand::pointList)
        return points->setEnabled(state.enabled);
    if (command == ControllerCommand::speedControl)
        return speed->setEnabled(state.enabled);
    // A spool button is held, not checked; being down shows it.
    if (const auto own = ownButtons.find(command); own != ownButtons.end())
        own->second->setEnabled(state.enabled);
    else
        actions.Show(command, state);
}

void ControllerDock::OnDialogGone()
{
    dialog = nullptr;
    timer->stop();
    widget()->setEnabled(false);
}

} // namespace desktop

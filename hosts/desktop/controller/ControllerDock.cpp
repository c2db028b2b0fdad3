#include "hosts/desktop/controller/ControllerDock.h"

#include <QApplication>
#include <QComboBox>
#include <QFontDatabase>
#include <QHBoxLayout>
#include <QKeySequence>
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
#include "host/CommandState.h"
#include "host/Messages.h"
#include "hosts/desktop/controller/PlayerShortcuts.h"
#include "hosts/desktop/controller/SpeedControl.h"
#include "hosts/desktop/controller/ThemedIcon.h"
#include "simdata/ControllerCommands.h"
#include "ui/SimulationDataControllerDialog.h"

// Resources of a static library come in by name, and only from outside every namespace.
static void LoadResources()
{
    Q_INIT_RESOURCE(controller);
}

namespace desktop
{

namespace
{

// Texts by number. Those of command buttons have the number of the command.
constexpr std::uint32_t textTitle = 6247;
constexpr std::uint32_t textFrame = 6279;
constexpr std::uint32_t textTime = 6280;
constexpr std::uint32_t textPointSettings = 9184;
constexpr std::uint32_t textPosition = 9185;
constexpr std::uint32_t textCount = 9186;   ///< %1 frames
constexpr std::uint32_t textSeconds = 9187; ///< %1 seconds

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
    return QString::fromStdWString(base::Replace(texts.GetText(number), L"%1", insertion));
}

} // namespace

ControllerDock::ControllerDock(VtCSimulationDataControllerDialog& shownDialog, const host::Texts& displayTexts,
                               QWidget* window)
    : QDockWidget(QString::fromStdWString(displayTexts.GetText(textTitle)), window),
      dialog(&shownDialog),
      texts(displayTexts)
{
    LoadResources();
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

    AddShortcuts(window ? *window : *static_cast<QWidget*>(this));
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

    QToolButton* settings = AddButton(row, ControllerCommand::customizePoint, textPointSettings, "customise-point");
    QObject::connect(settings, &QToolButton::clicked, this,
                     [this]
                     {
                         if (dialog)
                             dialog->OnCustomizePoint();
                     });
    AddCommand(row, ControllerCommand::start, "start");
    AddCommand(row, ControllerCommand::stop, "halt");
    row->addSpacing(8);
    AddCommand(row, ControllerCommand::refreshData, "refresh");
    AddCommand(row, ControllerCommand::store, "store");
    AddCommand(row, ControllerCommand::customize, "customise");
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
    QObject::connect(frameEdit, &QLineEdit::returnPressed, this,
                     [this]
                     {
                         if (dialog)
                             dialog->OnFrameNumberEntered();
                         frameEdit->selectAll();
                     });
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
    AddCommand(row, firstFrame, "first");
    AddSpool(row, spoolBack, "spool-back");
    AddCommand(row, previousFrame, "previous");
    AddCommand(row, playOnce, "play", true);
    AddCommand(row, playLoop, "loop", true);
    AddCommand(row, stopPlay, "stop");
    AddCommand(row, nextFrame, "next");
    AddSpool(row, spoolForward, "spool-forward");
    AddCommand(row, lastFrame, "last");
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

QToolButton* ControllerDock::AddButton(QHBoxLayout* row, std::uint32_t command, std::uint32_t text, const char* icon)
{
    auto* button = new QToolButton(this);
    button->setAutoRaise(true);
    button->setIcon(MakeThemedIcon(QStringLiteral(":/controller/icons/%1.svg").arg(QLatin1String(icon))));
    button->setIconSize(QSize(iconSize, iconSize));
    button->setFocusPolicy(Qt::TabFocus);
    button->setObjectName(QString::number(command));
    Explain(button, text);
    row->addWidget(button);
    buttons[command] = button;
    return button;
}

void ControllerDock::AddCommand(QHBoxLayout* row, std::uint32_t command, const char* icon, bool checkable)
{
    QToolButton* button = AddButton(row, command, command, icon);
    button->setCheckable(checkable);
    QObject::connect(button, &QToolButton::clicked, this,
                     [this, command]
                     {
                         if (dialog)
                             dialog->OnCommand(command);
                     });
}

void ControllerDock::AddSpool(QHBoxLayout* row, std::uint32_t command, const char* icon)
{
    QToolButton* button = AddButton(row, command, command, icon);
    const auto tell = [this, command](bool held)
    {
        if (dialog)
            dialog->OnSpoolButton(command, held);
    };
    QObject::connect(button, &QToolButton::pressed, this, [tell] { tell(true); });
    QObject::connect(button, &QToolButton::released, this, [tell] { tell(false); });
}

void ControllerDock::AddShortcuts(QWidget& window)
{
    using namespace ControllerCommand;
    shortcuts = new PlayerShortcuts(window, this);
    // Without a focus of its own a new window gives it to its first edit, which would keep the keys.
    if (!window.focusWidget())
        window.setFocus();
    shortcuts->Add(QKeySequence(Qt::Key_Space),
                   [this]
                   {
                       if (dialog)
                           dialog->TogglePlay();
                   });
    for (const std::uint32_t command : {playOnce, stopPlay})
        buttons[command]->setToolTip(QStringLiteral("%1 (%2)").arg(
            buttons[command]->toolTip(), QKeySequence(Qt::Key_Space).toString(QKeySequence::NativeText)));
    AddShortcut(Qt::Key_Left, previousFrame);
    AddShortcut(Qt::Key_Right, nextFrame);
    AddShortcut(Qt::Key_Home, firstFrame);
    AddShortcut(Qt::Key_End, lastFrame);
}

void ControllerDock::AddShortcut(int key, std::uint32_t command)
{
    const QKeySequence sequence(key);
    shortcuts->Add(sequence,
                   [this, command]
                   {
                       if (dialog)
                           dialog->OnCommand(command);
                   });
    QToolButton* button = buttons[command];
    button->setToolTip(QStringLiteral("%1 (%2)").arg(button->toolTip(), sequence.toString(QKeySequence::NativeText)));
}

// The first line of a text names the control, the second says what it does.
void ControllerDock::Explain(QWidget* widget, std::uint32_t text) const
{
    const QStringList lines = QString::fromStdWString(texts.GetText(text)).split(QLatin1Char('\n'));
    widget->setToolTip(lines.front());
    widget->setStatusTip(lines.back());
    widget->setAccessibleName(lines.front());
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
        items.append(QString::fromStdWString(entry));
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
    speed->Show(position, QString::fromStdWString(text));
}

void ControllerDock::ShowCommand(std::uint32_t command, const VtTCommandState& state)
{
    if (command == ControllerCommand::pointList)
        return points->setEnabled(state.enabled);
    if (command == ControllerCommand::speedControl)
        return speed->setEnabled(state.enabled);
    const auto at = buttons.find(command);
    if (at == buttons.end())
        return;
    at->second->setEnabled(state.enabled);
    // A spool button is held, not checked; being down shows it.
    if (at->second->isCheckable())
        at->second->setChecked(state.checked);
}

void ControllerDock::OnDialogGone()
{
    dialog = nullptr;
    timer->stop();
    widget()->setEnabled(false);
}

} // namespace desktop

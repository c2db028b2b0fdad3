#include "hosts/desktop/SettingsDialog.h"

#include <algorithm>

#include <QCheckBox>
#include <QComboBox>
#include <QDialog>
#include <QDialogButtonBox>
#include <QFormLayout>
#include <QHBoxLayout>
#include <QLabel>
#include <QSlider>
#include <QSpinBox>

#include "app/PanoramicApp.h"
#include "host/Host.h"
#include "hosts/desktop/StateFile.h"
#include "hosts/desktop/WindowCommands.h"
#include "hosts/desktop/Wording.h"

namespace desktop
{

namespace
{

constexpr int highestSensitivity = 50;

// Parts of the text with the labels.
enum Label
{
    labelSensitivity,
    labelRenderer,
    labelPerformance,
    labelQuality,
    labelPacing,
    labelNote,
};

} // namespace

bool IsPaced(const StateFile& state)
{
    return state.Get(desktopSection, pacedKey) != "0";
}

bool EditSettings(QWidget& parent, VtCPanoramicApp& app, StateFile& state)
{
    VtCVisualizationPPGSettings* settings = app.GetSettings();
    if (!settings)
        return false;
    const host::Texts& texts = app.GetHost().GetTexts();
    const auto label = [&texts](Label part) { return Part(texts, textSettingLabels, part); };

    QDialog dialog(&parent);
    dialog.setObjectName("settings");
    dialog.setWindowTitle(Plain(Part(texts, commandSettings, 0)));
    auto* form = new QFormLayout(&dialog);

    auto* slider = new QSlider(Qt::Horizontal);
    auto* number = new QSpinBox;
    slider->setRange(0, highestSensitivity);
    number->setRange(0, highestSensitivity);
    QObject::connect(slider, &QSlider::valueChanged, number, &QSpinBox::setValue);
    QObject::connect(number, &QSpinBox::valueChanged, slider, &QSlider::setValue);
    const int present = static_cast<int>(std::min<std::uint32_t>(settings->GetMouseSensitivity(), highestSensitivity));
    number->setValue(present);
    auto* sensitivity = new QHBoxLayout;
    sensitivity->addWidget(slider, 1);
    sensitivity->addWidget(number);
    auto* sensitivityLabel = new QLabel(label(labelSensitivity));
    sensitivityLabel->setBuddy(number);
    form->addRow(sensitivityLabel, sensitivity);

    auto* renderer = new QComboBox;
    renderer->addItems({label(labelPerformance), label(labelQuality)});
    renderer->setCurrentIndex(settings->GetRendererMode() == rmeQuality ? 1 : 0);
    form->addRow(label(labelRenderer), renderer);
    auto* note = new QLabel(label(labelNote));
    note->setEnabled(false);
    form->addRow(QString(), note);

    auto* paced = new QCheckBox(label(labelPacing));
    paced->setChecked(IsPaced(state));
    form->addRow(QString(), paced);

    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel);
    QObject::connect(buttons, &QDialogButtonBox::accepted, &dialog, &QDialog::accept);
    QObject::connect(buttons, &QDialogButtonBox::rejected, &dialog, &QDialog::reject);
    form->addRow(buttons);
    if (dialog.exec() != QDialog::Accepted)
        return false;

    if (number->value() != present) // a stored one may lie beyond what can be chosen here
        settings->PutMouseSensitivity(static_cast<std::uint32_t>(number->value()));
    settings->PutRendererMode(renderer->currentIndex() == 1 ? rmeQuality : rmePerformance);
    if (host::Settings* stored = app.GetHost().GetSettings())
        settings->StoreChanges(*stored);
    state.Set(desktopSection, pacedKey, paced->isChecked() ? "1" : "0");
    return true;
}

} // namespace desktop

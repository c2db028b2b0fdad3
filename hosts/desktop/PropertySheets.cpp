#include "hosts/desktop/PropertySheets.h"

#include <QApplication>
#include <QDialog>
#include <QDialogButtonBox>
#include <QDoubleSpinBox>
#include <QFormLayout>
#include <QLabel>
#include <QLocale>
#include <QSignalBlocker>
#include <QTabWidget>
#include <QVBoxLayout>

#include "simdata/points/SettingsPage.h"

namespace desktop
{

namespace
{

using SimulationDataPoints::VtCSettingsPage;
using SimulationDataPoints::VtTSettingsField;

/// A form over one page: what the user changes goes to the page, and the page says what there is to show.
class PageForm : public QWidget
{
public:
    PageForm(VtCSettingsPage& shownPage, QWidget* parent) : QWidget(parent), page(shownPage)
    {
        auto* form = new QFormLayout(this);
        const std::vector<VtTSettingsField> fields = page.GetFields();
        for (std::size_t i = 0; i < fields.size(); ++i)
        {
            Row row;
            if (fields[i].editable)
                row.edit = MakeEdit(i, fields[i]);
            else
                row.label = new QLabel(this);
            form->addRow(QString::fromStdWString(fields[i].label),
                         row.edit ? static_cast<QWidget*>(row.edit) : row.label);
            rows.push_back(row);
        }
        ShowFields();
    }

private:
    struct Row
    {
        QDoubleSpinBox* edit = nullptr; ///< of an editable field, the label of any other
        QLabel* label = nullptr;
    };

    QDoubleSpinBox* MakeEdit(std::size_t index, const VtTSettingsField& field)
    {
        auto* edit = new QDoubleSpinBox(this);
        edit->setDecimals(field.decimals);
        edit->setRange(field.minimum, field.maximum);
        edit->setSingleStep(field.step);
        edit->setSpecialValueText(QString::fromStdWString(field.minimumText));
        QObject::connect(edit, &QDoubleSpinBox::valueChanged, this,
                         [this, index](double value)
                         {
                             page.OnFieldChanged(index, value);
                             ShowFields();
                         });
        return edit;
    }

    void ShowFields()
    {
        const std::vector<VtTSettingsField> fields = page.GetFields();
        for (std::size_t i = 0; i < rows.size(); ++i)
            if (rows[i].edit)
            {
                const QSignalBlocker silence(rows[i].edit);
                rows[i].edit->setValue(fields[i].value);
            }
            else
                rows[i].label->setText(QLocale().toString(fields[i].value, 'f', fields[i].decimals));
    }

    VtCSettingsPage& page;
    std::vector<Row> rows;
};

} // namespace

bool PropertySheets::ShowPropertySheet(const std::wstring& title, const std::vector<VtCSettingsPage*>& pages,
                                       std::size_t start)
{
    QDialog dialog(QApplication::activeWindow());
    dialog.setWindowTitle(QString::fromStdWString(title));
    auto* tabs = new QTabWidget(&dialog);
    for (VtCSettingsPage* page : pages)
        tabs->addTab(new PageForm(*page, tabs), QString::fromStdWString(page->GetTitle()));
    tabs->setCurrentIndex(static_cast<int>(start));
    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, &dialog);
    QObject::connect(buttons, &QDialogButtonBox::accepted, &dialog, &QDialog::accept);
    QObject::connect(buttons, &QDialogButtonBox::rejected, &dialog, &QDialog::reject);
    auto* layout = new QVBoxLayout(&dialog);
    layout->addWidget(tabs);
    layout->addWidget(buttons);
    return dialog.exec() == QDialog::Accepted;
}

} // namespace desktop

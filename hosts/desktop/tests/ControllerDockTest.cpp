// The dock over a real dialog and controller, on Qt's off-screen platform unless QT_QPA_PLATFORM says otherwise. With
// PANORAMIC_TEST_PICTURES set to a folder the dock's pictures are left there.
#include <filesystem>

#include <QAbstractSpinBox>
#include <QApplication>
#include <QComboBox>
#include <QDialog>
#include <QDialogButtonBox>
#include <QDir>
#include <QDoubleSpinBox>
#include <QFormLayout>
#include <QLabel>
#include <QLineEdit>
#include <QMainWindow>
#include <QPushButton>
#include <QSlider>
#include <QTest>
#include <QTimer>
#include <QToolButton>

#include "hosts/common/HostTexts.h"
#include "hosts/desktop/CommandActions.h"
#include "hosts/desktop/ControllerDock.h"
#include "hosts/desktop/PropertySheets.h"
#include "ui/tests/DialogFixture.h"

using namespace ControllerCommand;

namespace
{

/// Asks the dock itself whether the dialog's pane is on show.
class Panes : public fake::UserInterface
{
public:
    bool IsPaneShown(std::uint32_t pane) const override { return pane == 6247 && dock && dock->IsOnShow(); }

    const desktop::ControllerDock* dock = nullptr;
};

/// The controller's commands, by way of the dialog as the application sends them.
class Target : public host::CommandTarget
{
public:
    explicit Target(VtCSimulationDataController& commandedController) : controller(commandedController) {}

    std::vector<host::CommandLook> GetCommands() const override
    {
        std::vector<host::CommandLook> looks;
        VtCSimulationDataController::GetCommands().AddTo(looks);
        return looks;
    }
    std::optional<VtTCommandState> GetMenuState(std::uint32_t command) const override
    {
        return controller.GetMenuState(command);
    }
    bool OnCmdMsg(std::uint32_t command) override
    {
        dialog ? dialog->OnCommand(command) : static_cast<void>(controller.OnCmdMsg(command));
        return true;
    }

    VtCSimulationDataController& controller;
    VtCSimulationDataControllerDialog* dialog = nullptr;
};

class Dock : public simtest::SimulationTest
{
protected:
    Dock() : realTexts(std::filesystem::path(PANORAMIC_SHARE) / "texts" / "en.ini")
    {
        live.Fill({0, 1, 2, 3, 4, 5, 6, 7, 8, 9});
        live.SetRecent(4);
        router.SelectPoint(L"Live");
        dialog = std::make_unique<VtCSimulationDataControllerDialog>(controller, nullptr, &panes);
        pane = new QWidget(&window);
        pane->setFocusPolicy(Qt::StrongFocus);
        window.setCentralWidget(pane);
        target.dialog = dialog.get();
        dock = new desktop::ControllerDock(*dialog, actions, realTexts, window);
        panes.dock = dock;
        window.addDockWidget(Qt::BottomDockWidgetArea, dock);
        window.resize(700, 300);
        window.show();
        window.activateWindow();
        EXPECT_TRUE(QTest::qWaitForWindowActive(&window));
    }
    ~Dock() override
    {
        panes.dock = nullptr;
        delete dock;
    }

    QToolButton& Button(std::uint32_t command) { return *dock->findChild<QToolButton*>(QString::number(command)); }
    QSlider& Slider() { return *dock->findChild<QSlider*>(); }
    QLineEdit& FrameEdit()
    {
        for (QLineEdit* edit : dock->findChildren<QLineEdit*>())
            if (edit->validator())
                return *edit;
        throw std::logic_error("no frame number edit");
    }
    unsigned long Cursor() { return router.GetRecent(L"Live"); }

    void Picture(const char* name)
    {
        if (const QString folder = qEnvironmentVariable("PANORAMIC_TEST_PICTURES"); !folder.isEmpty())
            dock->grab().save(QDir(folder).filePath(QString::fromLatin1(name) + QStringLiteral(".png")));
    }

    hosts::IniTexts realTexts;
    Panes panes;
    std::unique_ptr<VtCSimulationDataControllerDialog> dialog;
    QMainWindow window;
    QWidget* pane = nullptr;
    Target target{controller};
    desktop::CommandActions actions{{&target}, realTexts, window, [] {}};
    desktop::ControllerDock* dock = nullptr;
};

TEST_F(Dock, ShowsWhatTheDialogSaysAndSendsClicks)
{
    EXPECT_EQ(FrameEdit().text(), "4");
    EXPECT_EQ(Slider().value(), 4);
    EXPECT_EQ(Slider().maximum(), 10);
    EXPECT_TRUE(Button(nextFrame).isEnabled());
    EXPECT_FALSE(Button(stopPlay).isEnabled());
    Picture("dock-stopped");
    QTest::mouseClick(&Button(lastFrame), Qt::LeftButton);
    EXPECT_EQ(Cursor(), 10UL);
    EXPECT_EQ(FrameEdit().text(), "10");
    EXPECT_FALSE(Button(nextFrame).isEnabled());
    EXPECT_FALSE(Button(playOnce).isEnabled());
    QTest::mouseClick(&Button(playLoop), Qt::LeftButton);
    EXPECT_TRUE(Button(playLoop).isChecked());
    EXPECT_TRUE(Button(stopPlay).isEnabled());
    EXPECT_FALSE(dock->findChild<QAbstractSpinBox*>("speed")->isEnabled());
    EXPECT_FALSE(dock->findChild<QComboBox*>()->isEnabled());
    Picture("dock-playing");
    QTest::mouseClick(&Button(playLoop), Qt::LeftButton);
    EXPECT_TRUE(Button(playLoop).isChecked()) << "the check is the replay's, not the click's";
    QTest::mouseClick(&Button(stopPlay), Qt::LeftButton);
    EXPECT_FALSE(Button(playLoop).isChecked());
}

TEST_F(Dock, SpoolsWhileAButtonIsDown)
{
    QTest::mousePress(&Button(spoolForward), Qt::LeftButton);
    EXPECT_EQ(controller.GetPlayState(), VtEPlayState::SpoolForward);
    clock.Advance(2.0);
    controller.Step();
    EXPECT_EQ(Slider().value(), 6);
    QTest::mouseRelease(&Button(spoolForward), Qt::LeftButton);
    EXPECT_FALSE(controller.HasPlayState());

    QTest::mousePress(&Button(spoolBack), Qt::LeftButton);
    clock.Advance(20.0);
    controller.Step();
    EXPECT_EQ(Slider().value(), 1);
    EXPECT_FALSE(controller.HasPlayState()) << "the button is disabled under the mouse, and the spool ends";
    QTest::mouseRelease(&Button(spoolBack), Qt::LeftButton);
    EXPECT_EQ(Cursor(), 1UL);
}

TEST_F(Dock, TakesTypedFramesAndDragsOfTheSlider)
{
    QLineEdit& edit = FrameEdit();
    edit.setFocus();
    edit.selectAll();
    QTest::keyClicks(&edit, "7x");
    EXPECT_EQ(Cursor(), 4UL);
    QTest::keyClick(&edit, Qt::Key_Return);
    EXPECT_EQ(Cursor(), 7UL);
    QTest::keyClick(&window, Qt::Key_Right);
    EXPECT_EQ(Cursor(), 8UL) << "Return gives the keys back";
    edit.setFocus();
    edit.selectAll();
    QTest::keyClicks(&edit, "3");
    QTest::keyClick(&edit, Qt::Key_Escape);
    EXPECT_TRUE(dock->isVisible());
    EXPECT_EQ(edit.text(), "8");
    QTest::keyClick(&window, Qt::Key_Left);
    EXPECT_EQ(Cursor(), 7UL) << "and so does Escape, without the number";
    edit.setFocus();
    edit.selectAll();
    QTest::keyClicks(&edit, "5");
    QTest::mouseClick(&Button(nextFrame), Qt::LeftButton);
    EXPECT_EQ(Cursor(), 6UL) << "what was typed counts before a command";
    QTest::mouseClick(&Button(playLoop), Qt::LeftButton);
    QTest::keyClick(&window, Qt::Key_F7);
    EXPECT_FALSE(controller.HasPlayState()) << "disabled, the edit gives the keys back";

    Slider().setValue(3);
    EXPECT_EQ(Cursor(), 3UL);
    QTest::mouseClick(&Slider(), Qt::LeftButton, {}, QPoint(Slider().width() - 2, Slider().height() / 2));
    EXPECT_EQ(Cursor(), 10UL) << "a click goes where it points";
}

TEST_F(Dock, StepsTheSpeedByTheTable)
{
    auto* speed = dock->findChild<QAbstractSpinBox*>("speed");
    speed->stepBy(1);
    EXPECT_EQ(controller.GetSpeed(), 2.0);
    EXPECT_EQ(speed->text(), "2x");
    speed->stepBy(5);
    EXPECT_EQ(speed->text(), "2x");
    speed->stepBy(-6);
    EXPECT_EQ(controller.GetSpeed(), 0.03125);
    EXPECT_EQ(speed->text(), "1/32x");
}

TEST_F(Dock, ChoosesPointsAndFollowsTheirList)
{
    auto* list = dock->findChild<QComboBox*>();
    ASSERT_EQ(list->count(), 2);
    EXPECT_EQ(list->itemText(0), "<None>");
    EXPECT_EQ(list->currentIndex(), 1);
    emit list->activated(0);
    EXPECT_EQ(router.GetActivePoint(0), nullptr);
    EXPECT_EQ(list->currentIndex(), 0);
    EXPECT_FALSE(Slider().isEnabled());
    Picture("dock-without-point");
}

TEST_F(Dock, OutlivesItsDialog)
{
    dialog.reset();
    EXPECT_FALSE(dock->widget()->isEnabled());
    target.dialog = nullptr;
    dock->hide();
    dock->show();
    EXPECT_EQ(Cursor(), 4UL);
}

TEST_F(Dock, ExplainsEveryControlInWords)
{
    int explained = 0;
    for (QWidget* widget : dock->widget()->findChildren<QWidget*>())
    {
        if (widget->toolTip().isEmpty())
            continue;
        ++explained;
        EXPECT_TRUE(widget->toolTip().front().isLetter()) << widget->toolTip().toStdString();
        EXPECT_TRUE(widget->statusTip().front().isLetter()) << widget->statusTip().toStdString();
        EXPECT_NE(widget->statusTip(), widget->toolTip());
    }
    EXPECT_EQ(explained, 20); // 15 buttons, list, slider, frame, time, speed
}

TEST_F(Dock, HasIconsThatShowOnAnyPalette)
{
    const QPalette before = QApplication::palette();
    for (const auto& [ground, ink] : {std::pair(Qt::white, Qt::black), std::pair(Qt::black, Qt::white)})
    {
        QApplication::setPalette(QPalette(ground, ground, ground, ground, ground, ink, ink, ground, ground));
        QPalette palette = QApplication::palette();
        palette.setColor(QPalette::ButtonText, ink);
        palette.setColor(QPalette::WindowText, ink);
        palette.setColor(QPalette::Disabled, QPalette::ButtonText, Qt::gray);
        QApplication::setPalette(palette);
        QApplication::processEvents();
        for (QToolButton* button : dock->widget()->findChildren<QToolButton*>())
            for (const int size : {20, 48})
            {
                const QImage image = button->icon().pixmap(QSize(size, size), 1.0).toImage();
                ASSERT_EQ(image.size(), QSize(size, size)) << button->objectName().toStdString();
                int inked = 0;
                for (int y = 0; y < size; ++y)
                    for (int x = 0; x < size; ++x)
                        inked += image.pixelColor(x, y) == QColor(ink);
                EXPECT_GT(inked, size * size / 40) << button->objectName().toStdString();
                EXPECT_LT(inked, size * size / 2) << button->objectName().toStdString();
            }
        Picture(ground == Qt::white ? "dock-light" : "dock-dark");
    }
    const QImage faint = Button(playOnce).icon().pixmap(QSize(24, 24), 1.0, QIcon::Disabled).toImage();
    EXPECT_EQ(faint.pixelColor(10, 12), QColor(Qt::gray));
    QApplication::setPalette(before);
}

/// A page of two numbers that sum up to 100, with room for 10 to 90.
class SharePage : public SimulationDataPoints::VtCSettingsPage
{
public:
    std::wstring GetTitle() const override { return L"Share"; }
    std::vector<SimulationDataPoints::VtTSettingsField> GetFields() const override
    {
        return {{.label = L"One", .value = one, .editable = true, .minimum = 10, .maximum = 90},
                {.label = L"Other", .value = 100 - one}};
    }
    void OnFieldChanged(std::size_t field, double value) override
    {
        if (field == 0 && value <= 50)
            one = value;
    }
    void OnOK() override {}

    double one = 30;
};

TEST_F(Dock, ShowsPagesOfSettings)
{
    SharePage first;
    SharePage second;
    for (const bool confirm : {true, false})
    {
        QTimer::singleShot(
            0,
            [&]
            {
                auto* sheet = qobject_cast<QDialog*>(QApplication::activeModalWidget());
                ASSERT_NE(sheet, nullptr);
                EXPECT_EQ(sheet->windowTitle(), "Settings");
                auto* tabs = sheet->findChild<QTabWidget*>();
                EXPECT_EQ(tabs->currentIndex(), 1);
                auto* form = qobject_cast<QFormLayout*>(tabs->currentWidget()->layout());
                auto* edit = qobject_cast<QDoubleSpinBox*>(form->itemAt(0, QFormLayout::FieldRole)->widget());
                auto* other = qobject_cast<QLabel*>(form->itemAt(1, QFormLayout::FieldRole)->widget());
                edit->setValue(40);
                EXPECT_EQ(other->text(), "60");
                edit->setValue(70);
                EXPECT_EQ(edit->value(), 40) << "what the page doesn't take";
                if (const QString folder = qEnvironmentVariable("PANORAMIC_TEST_PICTURES"); !folder.isEmpty())
                    sheet->grab().save(QDir(folder).filePath(QStringLiteral("sheet.png")));
                auto* buttons = sheet->findChild<QDialogButtonBox*>();
                buttons->button(confirm ? QDialogButtonBox::Ok : QDialogButtonBox::Cancel)->click();
            });
        desktop::PropertySheets sheets;
        EXPECT_EQ(sheets.ShowPropertySheet(L"Settings", {&first, &second}, 1), confirm);
        EXPECT_EQ(second.one, 40);
        EXPECT_EQ(first.one, 30);
    }
}

} // namespace

int main(int argc, char** argv)
{
    if (!qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    testing::InitGoogleTest(&argc, argv);
    QApplication application(argc, argv);
    return RUN_ALL_TESTS();
}

#include <clocale>
#include <cstdlib>
#include <exception>
#include <iostream>
#include <memory>
#include <string_view>

#include <CLI/CLI.hpp>
#include <QApplication>
#include <QSurfaceFormat>

#include "base/Text.h"
#include "host/InterfaceError.h"
#include "hosts/common/HostTexts.h"
#include "hosts/desktop/PaneGraphics.h"
#include "hosts/desktop/Session.h"
#include "hosts/desktop/TestHook.h"

namespace
{

/// Shows what fails while an event is handled, and goes on.
class Application : public QApplication
{
public:
    using QApplication::QApplication;

    void SetMessages(host::MessageService* service) { messages = service; }

    bool notify(QObject* receiver, QEvent* event) override
    {
        try
        {
            return QApplication::notify(receiver, event);
        }
        catch (const host::InterfaceError& error)
        {
            Tell({.number = hosts::messageInterfaceFailed,
                  .first = base::Wide(error.InterfaceId()),
                  .second = std::to_wstring(error.ResultCode()),
                  .severity = host::Severity::error});
        }
        catch (const std::exception& error)
        {
            Tell({.text = base::Wide(error.what()), .severity = host::Severity::error});
        }
        return false;
    }

private:
    void Tell(const host::Message& message)
    {
        if (messages)
            messages->Show(message);
    }

    host::MessageService* messages = nullptr;
};

int RunDesktop(int argc, char** argv, const desktop::StartArguments& arguments)
{
    // Windows of panes are never shown to by a Wayland compositor, so X serves there too.
    if (!std::getenv("QT_QPA_PLATFORM"))
        setenv("QT_QPA_PLATFORM", "xcb", 1);
    // The toolkit would end the program with a crash report.
    if (std::string_view(std::getenv("QT_QPA_PLATFORM")) == "xcb" && !std::getenv("DISPLAY"))
    {
        std::cerr << "panoramic-desktop: error: there is no display (DISPLAY isn't set)\n";
        return 1;
    }
    QApplication::setAttribute(Qt::AA_DontCreateNativeWidgetSiblings);
    QSurfaceFormat::setDefaultFormat(desktop::PaneGraphics::Format(0));
    Application application(argc, argv);
    // The toolkit sets the user's locale; numbers in files and models have a point in every one.
    std::setlocale(LC_NUMERIC, "C");
    QApplication::setApplicationName("panoramic-desktop");
    QApplication::setQuitOnLastWindowClosed(false); // the main window ends the program itself, when it may

    desktop::Session session;
    application.SetMessages(&session.GetHost().GetMessages());
    const std::unique_ptr<desktop::TestHook> hook =
        desktop::TestHook::Open(session.GetApp(), session.GetHost(), session.GetWindow());
    session.Show(arguments);
    const int status = QApplication::exec();
    application.SetMessages(nullptr);
    return status;
}

} // namespace

int main(int argc, char** argv)
{
    CLI::App program("Panoramic shows vehicle simulations in 3D.", "panoramic-desktop");
    desktop::StartArguments arguments;
    program.add_option("scene", arguments.scene, "The scene to open.")
        ->type_name("SCENE.xml")
        ->check(CLI::ExistingFile);
    program.add_option("--data", arguments.data, "The motion data to open with it.")
        ->type_name("RUN.mdf")
        ->check(CLI::ExistingFile);
    program.add_flag("--play", arguments.play, "Play the data once.");
    program.footer("Settings of the toolkit come by its environment variables, such as QT_QPA_PLATFORM.");
    CLI11_PARSE(program, argc, argv);
    try
    {
        int own = 1; // the toolkit has no arguments here
        return RunDesktop(own, argv, arguments);
    }
    catch (const std::exception& error)
    {
        std::cerr << "panoramic-desktop: error: " << error.what() << '\n';
        return 1;
    }
}

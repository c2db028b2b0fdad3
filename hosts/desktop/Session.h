#pragma once

#include <filesystem>

#include "app/PanoramicApp.h"
#include "hosts/desktop/DesktopHost.h"
#include "hosts/desktop/MainWindow.h"

namespace desktop
{

/// What the user asked for on the command line; empty paths are not given.
struct StartArguments
{
    std::filesystem::path scene;
    std::filesystem::path data;
    bool play = false;
};

/// The component from its first stage to its last, in a window.
class Session
{
public:
    /// Runs the stages of the start. The window is made, not yet shown.
    Session();

    /// Closes the scene and runs the stages of the end.
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    /// Shows the window, and opens what is asked for once it is there.
    void Show(const StartArguments& arguments);

    DesktopHost& GetHost() { return host; }
    VtCPanoramicApp& GetApp() { return app; }
    MainWindow& GetWindow() { return window; }

private:
    void OpenFirst(const StartArguments& arguments);

    DesktopHost host;
    VtCPanoramicApp app;
    MainWindow window;
};

} // namespace desktop

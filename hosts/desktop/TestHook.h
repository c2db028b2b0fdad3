#pragma once

#include <memory>
#include <string>

class QByteArray;
class QLocalServer;
class VtCPanoramicApp;

namespace desktop
{

class DesktopHost;
class MainWindow;

/// Tells tests what the program shows: with PANORAMIC_TEST_HOOK=<path> in the environment it listens on that local
/// socket and answers each line with one line of JSON. It only reads, but for the lines "hide" and "show": the main
/// window then leaves the screen and comes back, as for views over whole screens.
class TestHook
{
public:
    /// Null without that variable, and with a log line when the socket can't be had. All outlive it.
    static std::unique_ptr<TestHook> Open(VtCPanoramicApp& app, DesktopHost& host, MainWindow& window);
    ~TestHook();
    TestHook(const TestHook&) = delete;
    TestHook& operator=(const TestHook&) = delete;

private:
    TestHook(VtCPanoramicApp& application, DesktopHost& desktopHost, MainWindow& mainWindow);
    void Obey(const QByteArray& line);
    std::string Describe() const;

    VtCPanoramicApp& app;
    DesktopHost& host;
    MainWindow& window;
    std::unique_ptr<QLocalServer> server;
};

} // namespace desktop

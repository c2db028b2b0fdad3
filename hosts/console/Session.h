#pragma once

#include <filesystem>

#include "app/PanoramicApp.h"
#include "hosts/console/ConsoleHost.h"

class VtCPanoramicDocument;
class VtCSimulationDataController;

namespace console
{

/// The component from its first stage to its last, on a console.
class Session
{
public:
    /// Runs the stages of the start; the frame cycle is live behind it.
    explicit Session(bool showLog);

    /// Stops what runs, closes the documents and runs the stages of the end.
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    ConsoleHost& GetHost() { return host; }
    VtCPanoramicApp& GetApp() { return app; }
    VtCSimulationDataController& GetController() { return *app.GetController(); }

    /// Null, after a message, when no scene can be shown.
    VtCPanoramicDocument* NewDocument();

    /// Null, after a message, when it can't be read as a scene.
    VtCPanoramicDocument* OpenDocument(const std::filesystem::path& scene);

    /// What the command ends with: 1 after an error message, else 0.
    int GetExitStatus() { return host.GetMessages().HasErrors() ? 1 : 0; }

    /// What it ends with when it couldn't do its work, whatever the message was.
    static constexpr int failed = 1;

private:
    ConsoleHost host;
    VtCPanoramicApp app;
};

} // namespace console

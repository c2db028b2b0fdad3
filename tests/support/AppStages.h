#pragma once

#include <cstdint>

#include "app/PanoramicApp.h"

/// The stages that a host takes the application object through.
namespace fake
{

/// Up to where the frame cycle is live.
inline void StartApplication(VtCPanoramicApp& app)
{
    app.InitInstance();
    app.Connect();
    app.ConnectToOtherComponents();
    app.InsertGUIElements();
    app.StartupCompleted();
    app.FinalizeInitialization();
}

/// All documents are closed by then.
inline void StopApplication(VtCPanoramicApp& app)
{
    std::int32_t answer = 0;
    app.StartShutdown(answer);
    app.RemoveGUIElements();
    app.RemoveComponentConnections();
    app.Disconnect();
}

} // namespace fake

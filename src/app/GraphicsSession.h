#pragma once

#include <memory>

/// Its existence means that the scene graph library is set up for the process. The first document makes it, and it
/// stays until the component shuts down. The idle step draws only while it exists.
class VtCGraphicsSession
{
public:
    /// Brings the library's reports down to warnings and errors: at its usual level it tells about every driver.
    VtCGraphicsSession();
    ~VtCGraphicsSession();
    VtCGraphicsSession(const VtCGraphicsSession&) = delete;
    VtCGraphicsSession& operator=(const VtCGraphicsSession&) = delete;
};

/// The one of the process; null while there is none.
extern std::unique_ptr<VtCGraphicsSession> graphicsSession;

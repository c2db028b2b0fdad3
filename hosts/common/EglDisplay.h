#pragma once

#include <string>
#include <utility>

#include <EGL/egl.h>

namespace hosts
{

/// The connection of this process to EGL, by which pbuffers and contexts of desktop OpenGL are made without any
/// display server.
///
/// A hardware device is taken first (a server with a graphics card and no X), then the surfaceless platform, behind
/// which Mesa finds a card or draws in software. The environment variable PANORAMIC_EGL=device or =surfaceless allows
/// only that one; =none allows neither. It counts when the connection is opened; =none at any time.
class EglDisplay
{
public:
    /// Opens the connection if it isn't open yet. Null with the reason in `error`. It stays open to the end of the
    /// process: a driver that is unloaded leaves data of its threads behind, and takes long to load again.
    static const EglDisplay* Open(std::string& error);

    EGLDisplay Get() const { return display; }

    /// "device" or "surfaceless", and the name of the driver's maker.
    const std::string& GetName() const { return name; }

private:
    EglDisplay(EGLDisplay opened, std::string nameOfPlatform) : display(opened), name(std::move(nameOfPlatform)) {}

    EGLDisplay display;
    std::string name;
};

/// What the last EGL call of this thread complained about: "EGL_BAD_ALLOC".
std::string EglErrorName();

} // namespace hosts

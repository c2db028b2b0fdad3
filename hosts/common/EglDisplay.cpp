#include "hosts/common/EglDisplay.h"

#include <cstdlib>
#include <optional>
#include <string_view>
#include <vector>

#include <EGL/eglext.h>

namespace hosts
{

namespace
{

/// One device as the device extension lists it.
struct Device
{
    EGLDeviceEXT handle;
    bool software;
};

bool Has(const char* extensions, std::string_view name)
{
    const std::string_view all = extensions ? extensions : "";
    for (std::size_t at = all.find(name); at != std::string_view::npos; at = all.find(name, at + 1))
    {
        const std::size_t end = at + name.size();
        if ((at == 0 || all[at - 1] == ' ') && (end == all.size() || all[end] == ' '))
            return true;
    }
    return false;
}

template <class Function>
Function Entry(const char* name)
{
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

std::vector<Device> ListDevices()
{
    const auto query = Entry<PFNEGLQUERYDEVICESEXTPROC>("eglQueryDevicesEXT");
    const auto text = Entry<PFNEGLQUERYDEVICESTRINGEXTPROC>("eglQueryDeviceStringEXT");
    EGLint count = 0;
    if (!query || !query(0, nullptr, &count) || count <= 0)
        return {};

    std::vector<EGLDeviceEXT> handles(static_cast<std::size_t>(count));
    if (!query(count, handles.data(), &count))
        return {};
    handles.resize(static_cast<std::size_t>(count));

    std::vector<Device> devices;
    for (const EGLDeviceEXT handle : handles)
        devices.push_back({handle, text && Has(text(handle, EGL_EXTENSIONS), "EGL_MESA_device_software")});
    return devices;
}

/// Can it make what is drawn to here: desktop OpenGL on a pbuffer?
bool DrawsOffscreen(EGLDisplay display)
{
    const EGLint wanted[] = {EGL_SURFACE_TYPE, EGL_PBUFFER_BIT, EGL_RENDERABLE_TYPE, EGL_OPENGL_BIT, EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    return eglBindAPI(EGL_OPENGL_API) && eglChooseConfig(display, wanted, &config, 1, &count) && count > 0;
}

EGLDisplay Initialise(EGLenum platform, void* native, const std::string& name, std::string& error)
{
    const auto get = Entry<PFNEGLGETPLATFORMDISPLAYEXTPROC>("eglGetPlatformDisplayEXT");
    const EGLDisplay display = get ? get(platform, native, nullptr) : EGL_NO_DISPLAY;
    if (display == EGL_NO_DISPLAY)
    {
        error += name + ": no such platform; ";
        return EGL_NO_DISPLAY;
    }
    if (!eglInitialize(display, nullptr, nullptr))
    {
        error += name + ": " + EglErrorName() + "; ";
        return EGL_NO_DISPLAY;
    }
    if (!DrawsOffscreen(display))
    {
        error += name + ": no desktop OpenGL off-screen; ";
        eglTerminate(display);
        return EGL_NO_DISPLAY;
    }
    return display;
}

EGLDisplay OpenDevice(bool software, const std::string& name, std::string& error)
{
    for (const Device& device : ListDevices())
        if (device.software == software)
            if (const EGLDisplay display = Initialise(EGL_PLATFORM_DEVICE_EXT, device.handle, name, error))
                return display;
    return EGL_NO_DISPLAY;
}

} // namespace

const EglDisplay* EglDisplay::Open(std::string& error)
{
    static std::optional<EglDisplay> present;

    const char* choice = std::getenv("PANORAMIC_EGL");
    const std::string_view only = choice ? choice : "";
    if (!only.empty() && only != "device" && only != "surfaceless")
    {
        error = "PANORAMIC_EGL is \"" + std::string(only) + "\", which allows no OpenGL (device or surfaceless would)";
        return nullptr;
    }
    if (present)
        return &*present;

    const char* extensions = eglQueryString(EGL_NO_DISPLAY, EGL_EXTENSIONS);
    std::string attempts;
    std::string name;
    EGLDisplay display = EGL_NO_DISPLAY;
    if (only != "surfaceless" && Has(extensions, "EGL_EXT_platform_device"))
        display = OpenDevice(false, name = "device", attempts);
    if (!display && only != "device" && Has(extensions, "EGL_MESA_platform_surfaceless"))
        display = Initialise(EGL_PLATFORM_SURFACELESS_MESA, nullptr, name = "surfaceless", attempts);
    if (!display && only == "device")
        display = OpenDevice(true, name = "device", attempts);
    if (!display)
    {
        error = "no OpenGL to be had without a display (" + (attempts.empty() ? "EGL knows no way" : attempts) +
                ") - a driver is missing; the packages libegl-mesa0 and libgl1-mesa-dri draw in software";
        return nullptr;
    }

    const char* vendor = eglQueryString(display, EGL_VENDOR);
    present = EglDisplay(display, name + ", " + (vendor ? vendor : "unknown"));
    return &*present;
}

std::string EglErrorName()
{
    struct Name
    {
        EGLint code;
        const char* text;
    };
    static constexpr Name names[] = {
        {EGL_SUCCESS, "no reason given"},         {EGL_NOT_INITIALIZED, "EGL_NOT_INITIALIZED"},
        {EGL_BAD_ACCESS, "EGL_BAD_ACCESS"},       {EGL_BAD_ALLOC, "EGL_BAD_ALLOC"},
        {EGL_BAD_ATTRIBUTE, "EGL_BAD_ATTRIBUTE"}, {EGL_BAD_CONFIG, "EGL_BAD_CONFIG"},
        {EGL_BAD_CONTEXT, "EGL_BAD_CONTEXT"},     {EGL_BAD_DISPLAY, "EGL_BAD_DISPLAY"},
        {EGL_BAD_MATCH, "EGL_BAD_MATCH"},         {EGL_BAD_PARAMETER, "EGL_BAD_PARAMETER"},
        {EGL_BAD_SURFACE, "EGL_BAD_SURFACE"},     {EGL_CONTEXT_LOST, "EGL_CONTEXT_LOST"}};
    const EGLint code = eglGetError();
    for (const Name& known : names)
        if (known.code == code)
            return known.text;
    return "EGL error " + std::to_string(code);
}

} // namespace hosts

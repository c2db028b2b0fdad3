#include "hosts/common/EglGraphics.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

#include <EGL/egl.h>
#include <EGL/eglext.h>
#include <osg/GraphicsContext>

#include "base/Text.h"
#include "hosts/common/ContextState.h"
#include "hosts/common/OffscreenViews.h"

namespace hosts
{

namespace
{

/// What the last EGL call of this thread complained about: "EGL_BAD_ALLOC".
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

/// A context of desktop OpenGL with a pbuffer of its own to draw to, current on one thread at a time.
///
/// A pbuffer has one buffer: what reads front and back reads the same, and a swap only hands the commands over.
/// The pbuffer stays as large as it was made; a new size takes a new context, because drivers leak with each pbuffer
/// that is changed under a living context.
class EglContext : public osg::GraphicsContext
{
public:
    /// Takes over `newContext` and `newSurface`. With `traits.sharedContext` its context id is shared, so that
    /// textures, programs, buffers and display lists of the scene graph serve both.
    EglContext(const EglDisplay& openDisplay, osg::GraphicsContext::Traits& traits, EGLContext newContext,
               EGLSurface newSurface);

    EGLContext GetEglContext() const { return context; }

    bool valid() const override { return context != EGL_NO_CONTEXT; }
    bool isSameKindAs(const osg::Object* object) const override
    {
        return dynamic_cast<const EglContext*>(object) != nullptr;
    }
    const char* libraryName() const override { return "hosts"; }
    const char* className() const override { return "EglContext"; }

protected:
    ~EglContext() override;

    bool realizeImplementation() override;
    bool isRealizedImplementation() const override { return realised; }
    void closeImplementation() override;
    bool makeCurrentImplementation() override;
    bool makeContextCurrentImplementation(osg::GraphicsContext* readContext) override;
    bool releaseContextImplementation() override;
    void bindPBufferToTextureImplementation(GLenum) override {}
    void swapBuffersImplementation() override;

private:
    bool MakeCurrent(EGLSurface read);

    const EglDisplay& display;
    EGLContext context;
    EGLSurface surface;
    bool realised = false;
    bool prepared = false;
};

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

EglContext::EglContext(const EglDisplay& openDisplay, osg::GraphicsContext::Traits& traits, EGLContext newContext,
                       EGLSurface newSurface)
    : display(openDisplay), context(newContext), surface(newSurface)
{
    _traits = &traits;
    GiveContextState(*this);
}

EglContext::~EglContext()
{
    close(true);
}

bool EglContext::realizeImplementation()
{
    realised = valid();
    return realised;
}

void EglContext::closeImplementation()
{
    if (context == EGL_NO_CONTEXT)
        return;

    if (eglGetCurrentContext() == context)
        eglMakeCurrent(display.Get(), EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    eglDestroySurface(display.Get(), surface);
    eglDestroyContext(display.Get(), context);
    surface = EGL_NO_SURFACE;
    context = EGL_NO_CONTEXT;
    realised = false;
}

bool EglContext::makeCurrentImplementation()
{
    return MakeCurrent(surface);
}

bool EglContext::makeContextCurrentImplementation(osg::GraphicsContext* readContext)
{
    const auto* read = dynamic_cast<EglContext*>(readContext);
    return MakeCurrent(read ? read->surface : surface);
}

bool EglContext::releaseContextImplementation()
{
    return eglMakeCurrent(display.Get(), EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT) == EGL_TRUE;
}

void EglContext::swapBuffersImplementation()
{
    glFlush();
}

bool EglContext::MakeCurrent(EGLSurface read)
{
    // The choice of desktop OpenGL belongs to the thread, not to the context.
    if (!valid() || !eglBindAPI(EGL_OPENGL_API) || !eglMakeCurrent(display.Get(), surface, read, context))
        return false;

    if (!prepared)
    {
        PrepareContextState(*this);
        prepared = true;
    }
    return true;
}

EGLint Attribute(EGLDisplay display, EGLConfig config, EGLint name)
{
    EGLint value = 0;
    eglGetConfigAttrib(display, config, name, &value);
    return value;
}

/// The configuration for `traits` with `samples` a pixel, or nothing.
std::optional<EGLConfig> ChooseConfig(EGLDisplay display, const osg::GraphicsContext::Traits& traits, EGLint samples)
{
    const EGLint wanted[] = {EGL_SURFACE_TYPE,
                             EGL_PBUFFER_BIT,
                             EGL_RENDERABLE_TYPE,
                             EGL_OPENGL_BIT,
                             EGL_RED_SIZE,
                             static_cast<EGLint>(traits.red),
                             EGL_GREEN_SIZE,
                             static_cast<EGLint>(traits.green),
                             EGL_BLUE_SIZE,
                             static_cast<EGLint>(traits.blue),
                             EGL_ALPHA_SIZE,
                             static_cast<EGLint>(traits.alpha),
                             EGL_DEPTH_SIZE,
                             static_cast<EGLint>(traits.depth),
                             EGL_STENCIL_SIZE,
                             static_cast<EGLint>(traits.stencil),
                             EGL_SAMPLE_BUFFERS,
                             samples > 0 ? 1 : 0,
                             EGL_SAMPLES,
                             samples,
                             EGL_NONE};
    std::array<EGLConfig, 64> configs{};
    EGLint count = 0;
    if (!eglChooseConfig(display, wanted, configs.data(), static_cast<EGLint>(configs.size()), &count) || count == 0)
        return std::nullopt;

    // EGL puts deeper colours first, which read back differently from what is asked.
    const auto end = configs.begin() + count;
    const auto exact =
        std::find_if(configs.begin(), end,
                     [&](EGLConfig config)
                     {
                         return Attribute(display, config, EGL_RED_SIZE) == static_cast<EGLint>(traits.red) &&
                                Attribute(display, config, EGL_SAMPLES) == samples;
                     });
    return exact == end ? configs.front() : *exact;
}

/// The one with the samples of `traits`, or with as many fewer as the driver has.
std::optional<EGLConfig> ChooseBestConfig(EGLDisplay display, const osg::GraphicsContext::Traits& traits)
{
    for (EGLint samples = static_cast<EGLint>(traits.samples); samples > 1; samples /= 2)
        if (const std::optional<EGLConfig> config = ChooseConfig(display, traits, samples))
            return config;
    return ChooseConfig(display, traits, 0);
}

std::string SizeText(int width, int height)
{
    return std::to_string(width) + " x " + std::to_string(height);
}

} // namespace

osg::ref_ptr<osg::GraphicsContext> EglGraphics::CreateContext(const host::ContextRequest& request)
{
    osg::GraphicsContext::Traits& traits = request.traits;
    const bool root = request.kind == host::WindowKind::root;
    std::string error;
    const EglDisplay* display = EglDisplay::Open(error);
    if (!display)
        return Fail(error);
    const EGLDisplay egl = display->Get();

    EGLContext sharedContext = EGL_NO_CONTEXT;
    if (const osg::ref_ptr<osg::GraphicsContext> shared = traits.sharedContext.get())
    {
        if (root)
            return Fail("a root context shares with nobody");
        const auto* ours = dynamic_cast<EglContext*>(shared.get());
        if (!ours || !ours->valid())
            return Fail("the root context is closed or another library's");
        sharedContext = ours->GetEglContext();
    }

    eglBindAPI(EGL_OPENGL_API);
    const std::optional<EGLConfig> config = ChooseBestConfig(egl, traits);
    if (!config)
        return Fail("the driver (" + display->GetName() + ") has no off-screen surface with the colours, depth and " +
                    "stencil that are needed");

    const auto* surfaceOwner = root ? nullptr : dynamic_cast<OffscreenSurface*>(&request.window);
    const host::Rectangle largest = surfaceOwner ? surfaceOwner->GetSurfaceRectangle() : host::Rectangle();
    const int width = std::max({1, traits.width, largest.width});
    const int height = std::max({1, traits.height, largest.height});
    const EGLint widest = Attribute(egl, *config, EGL_MAX_PBUFFER_WIDTH);
    const EGLint highest = Attribute(egl, *config, EGL_MAX_PBUFFER_HEIGHT);
    if (width > widest || height > highest)
        return Fail("a picture of " + SizeText(width, height) + " pixels is too large, the driver takes up to " +
                    SizeText(widest, highest));

    const EGLint size[] = {EGL_WIDTH, width, EGL_HEIGHT, height, EGL_NONE};
    const EGLSurface surface = eglCreatePbufferSurface(egl, *config, size);
    if (surface == EGL_NO_SURFACE)
        return Fail("no memory for a picture of " + SizeText(width, height) + " pixels (" + EglErrorName() + ")");

    // Without a version the driver gives its highest with the compatibility profile.
    const EGLContext context = eglCreateContext(egl, *config, sharedContext, nullptr);
    if (context == EGL_NO_CONTEXT)
    {
        const std::string reason = "no context of desktop OpenGL (" + EglErrorName() + ")";
        eglDestroySurface(egl, surface);
        return Fail(reason);
    }

    const auto samples = static_cast<unsigned int>(Attribute(egl, *config, EGL_SAMPLES));
    note.clear();
    if (samples < traits.samples)
        note = std::to_wstring(samples) + L" samples a pixel instead of " + std::to_wstring(traits.samples);
    lastError.clear();
    return new EglContext(*display, traits, context, surface);
}

osg::ref_ptr<osg::GraphicsContext> EglGraphics::Fail(const std::string& reason)
{
    lastError = L"OpenGL: " + base::Wide(reason);
    return nullptr;
}

} // namespace hosts

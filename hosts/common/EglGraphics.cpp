#include "hosts/common/EglGraphics.h"

#include <algorithm>
#include <array>
#include <optional>

#include <EGL/egl.h>

#include "base/Text.h"
#include "hosts/common/EglContext.h"
#include "hosts/common/EglDisplay.h"
#include "hosts/common/OffscreenViews.h"

namespace hosts
{

namespace
{

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

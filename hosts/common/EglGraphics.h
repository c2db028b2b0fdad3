#pragma once

#include <string>

#include "host/Graphics.h"

namespace hosts
{

/// Contexts that draw off-screen by EGL: no display server, no window system, a graphics card if there is one.
///
/// Every context draws to a pbuffer of the size in its traits (1 x 1 at least), or of the surface of its window where
/// that is larger (`OffscreenSurface`); the window only stands for it, so windows of every kind are drawn to alike. EGL
/// is opened with the first context. Contexts may outlive this object.
class EglGraphics : public host::Graphics
{
public:
    osg::ref_ptr<osg::GraphicsContext> CreateContext(const host::ContextRequest& request) override;
    std::wstring GetLastError() const override { return lastError; }

    /// In words, where a context is less than what was asked for ("4 samples a pixel instead of 8"); empty otherwise.
    const std::wstring& GetNote() const { return note; }

private:
    osg::ref_ptr<osg::GraphicsContext> Fail(const std::string& reason);

    std::wstring lastError;
    std::wstring note;
};

} // namespace hosts

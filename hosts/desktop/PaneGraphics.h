#pragma once

#include <string>

#include <QSurfaceFormat>

#include "host/Graphics.h"

namespace desktop
{

/// Contexts that draw to the panes of a main window, by the windowing toolkit.
class PaneGraphics : public host::Graphics
{
public:
    /// What surface a context with that many samples a pixel draws to.
    static QSurfaceFormat Format(int samples);

    /// A pane's window takes the format of its context, so it may be made anew here. Any other window stands for the
    /// root context.
    osg::ref_ptr<osg::GraphicsContext> CreateContext(osg::GraphicsContext::Traits& traits,
                                                     host::Window& window) override;
    std::wstring GetLastError() const override { return lastError; }

private:
    osg::ref_ptr<osg::GraphicsContext> Fail(const char* reason);

    std::wstring lastError;
};

} // namespace desktop

#pragma once

#include <memory>
#include <string>

#include <QSurfaceFormat>

#include "host/Graphics.h"

class QOpenGLContext;

namespace desktop
{

class PaneContext;
class ViewPane;

/// Contexts that draw to the panes of a main window, by the windowing toolkit.
///
/// One root context serves all scenes. The scene graph library keeps tables for every context id that has ever been,
/// and models that outlive their scene keep what they have given the driver.
class PaneGraphics : public host::Graphics
{
public:
    PaneGraphics();
    ~PaneGraphics() override;

    /// What surface a context with that many samples a pixel draws to.
    static QSurfaceFormat Format(int samples);

    /// A pane's window takes the format of its context, so it may be made anew here. Windows of editors and over whole
    /// screens are refused: this program opens none.
    osg::ref_ptr<osg::GraphicsContext> CreateContext(const host::ContextRequest& request) override;
    std::wstring GetLastError() const override { return lastError; }

private:
    osg::ref_ptr<osg::GraphicsContext> CreateRoot(osg::GraphicsContext::Traits& traits);
    osg::ref_ptr<osg::GraphicsContext> CreateForPane(osg::GraphicsContext::Traits& traits, ViewPane& pane);
    std::unique_ptr<QOpenGLContext> CreateDriverContext(const osg::GraphicsContext::Traits& traits);
    osg::ref_ptr<osg::GraphicsContext> Fail(const char* reason);

    osg::ref_ptr<PaneContext> root;
    std::wstring lastError;
};

} // namespace desktop

#pragma once

namespace osg
{
class GraphicsContext;
}

/// Turns off what a renderer without a graphics card can't do in bearable time, for all contexts that share the id of
/// `context`. Nothing on a graphics card. Call once `context` is realised.
///
/// Mesa's software renderer takes seconds for a frame with anisotropic filtering, and some views of a textured road
/// never end (Mesa 22.3: the generated loop over the samples doesn't stop).
void adaptToSoftwareRenderer(osg::GraphicsContext& context);

#pragma once

namespace osg
{
class GraphicsContext;
}

/// What all contexts that draw one scene have in common, whatever made them.
namespace hosts
{

/// Gives `context` its state with a context id: that of the context it shares objects with (`traits.sharedContext`), so
/// that textures, programs, buffers and display lists of the scene graph serve both, else a fresh one. Once, from the
/// constructor of the context, whose traits are set.
void GiveContextState(osg::GraphicsContext& context);

/// Settles what may be used of OpenGL. Once, when `context` is current for the first time.
void PrepareContextState(osg::GraphicsContext& context);

} // namespace hosts

#include "hosts/common/ContextState.h"

#include <algorithm>

#include <osg/DisplaySettings>
#include <osg/GLExtensions>
#include <osg/GraphicsContext>
#include <osg/State>

namespace hosts
{

namespace
{

/// Ids are not used a second time: models outlive a root context, and under a reused id they would call display lists
/// and textures that went with the old one.
unsigned int NewContextId()
{
    static unsigned int last = 0;
    const unsigned int id = std::max(last + 1, osg::GraphicsContext::getMaxContextID() + 1);
    last = id;
    return id;
}

} // namespace

void GiveContextState(osg::GraphicsContext& context)
{
    context.setState(new osg::State);
    context.getState()->setGraphicsContext(&context);

    const osg::ref_ptr<osg::GraphicsContext> shared = context.getTraits()->sharedContext.get();
    const unsigned int id = shared ? shared->getState()->getContextID() : NewContextId();
    context.getState()->setContextID(id);
    osg::GraphicsContext::incrementContextIDUsageCount(id);
}

void PrepareContextState(osg::GraphicsContext& context)
{
    // Vertex array objects are the one kind of object that contexts don't share, but the scene graph library keeps
    // them by context id like the others: a second context would draw with names of the first.
    osg::State& state = *context.getState();
    osg::GLExtensions::Get(state.getContextID(), true)->isVAOSupported = false;
    osg::ref_ptr<osg::DisplaySettings> settings = new osg::DisplaySettings(*osg::DisplaySettings::instance());
    if (settings->getVertexBufferHint() == osg::DisplaySettings::VERTEX_ARRAY_OBJECT)
        settings->setVertexBufferHint(osg::DisplaySettings::VERTEX_BUFFER_OBJECT);
    state.setDisplaySettings(settings.get());
    state.initializeExtensionProcs();
}

} // namespace hosts

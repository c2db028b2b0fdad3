#include "render/CompositeViewer.h"

#include <algorithm>

#include <osgDB/DatabasePager>
#include <osgDB/ImagePager>
#include <osgDB/Registry>
#include <osgGA/CameraManipulator>
#include <osgGA/EventVisitor>
#include <osgUtil/IncrementalCompileOperation>
#include <osgUtil/UpdateVisitor>
#include <osgViewer/GraphicsWindow>
#include <osgViewer/Renderer>

#include "render/SoftwareRenderer.h"
#include "render/ViewerStats.h"

namespace
{

template <class Type>
void AddOnce(std::vector<Type*>& list, Type* entry)
{
    if (std::find(list.begin(), list.end(), entry) == list.end())
        list.push_back(entry);
}

/// Lets `visitor` call the callbacks of the view's cameras, whose scene has been traversed already.
void VisitCameras(osgViewer::View& view, osg::NodeVisitor& visitor)
{
    for (unsigned int slave = 0; slave < view.getNumSlaves(); ++slave)
        if (osg::Camera* camera = view.getSlave(slave)._camera.get())
            if (!view.getSlave(slave)._useMastersSceneData)
                camera->accept(visitor);

    const osg::NodeVisitor::TraversalMode mode = visitor.getTraversalMode();
    visitor.setTraversalMode(osg::NodeVisitor::TRAVERSE_NONE);
    view.getCamera()->accept(visitor);
    for (unsigned int slave = 0; slave < view.getNumSlaves(); ++slave)
        if (osg::Camera* camera = view.getSlave(slave)._camera.get())
            if (view.getSlave(slave)._useMastersSceneData)
                camera->accept(visitor);
    visitor.setTraversalMode(mode);
}

/// Gives `event` the state that the view's input has added up to: pointer, buttons, modifiers and window.
void CopyInputState(const osgGA::GUIEventAdapter& state, osgGA::GUIEventAdapter& event)
{
    event.setGraphicsContext(const_cast<osg::GraphicsContext*>(state.getGraphicsContext()));
    event.setWindowRectangle(state.getWindowX(), state.getWindowY(), state.getWindowWidth(), state.getWindowHeight(),
                             false);
    event.setInputRange(state.getXmin(), state.getYmin(), state.getXmax(), state.getYmax());
    event.setX(state.getX());
    event.setY(state.getY());
    event.setButtonMask(state.getButtonMask());
    event.setModKeyMask(state.getModKeyMask());
    event.setMouseYOrientation(state.getMouseYOrientation());
    event.copyPointerDataFrom(state);
}

} // namespace

VtCOsgCompositeViewer::VtCOsgCompositeViewer()
{
    setThreadingModel(SingleThreaded);
    setUseConfigureAffinity(false);
    setKeyEventSetsDone(0);
    setQuitEventSetsDone(false);
}

void VtCOsgCompositeViewer::AddView(osgViewer::View& view)
{
    addView(&view);
    if (started)
        GiveStartTick(view);
}

void VtCOsgCompositeViewer::RemoveView(osgViewer::View& view)
{
    if (getViewWithFocus() == &view)
        setCameraWithFocus(nullptr);
    std::erase(_views, &view);
}

void VtCOsgCompositeViewer::SetStats(VtCOsgViewerStats& newStats)
{
    setViewerStats(&newStats);
    frameStats = &newStats;
}

void VtCOsgCompositeViewer::frame(double simulationTime)
{
    CollectContexts();
    if (contexts.empty())
        return;

    setDone(false);
    if (!started)
    {
        viewerInit();
        realize();
    }
    else
        for (osg::GraphicsContext* context : contexts)
            if (!context->isRealized())
            {
                context->realize();
                adaptToSoftwareRenderer(*context);
            }

    advance(simulationTime);
    eventTraversal();
    updateTraversal();
    renderingTraversals();
}

void VtCOsgCompositeViewer::realize()
{
    CollectContexts();
    setCameraWithFocus(nullptr);
    const osg::DisplaySettings& settings = *osg::DisplaySettings::instance();
    for (osg::GraphicsContext* context : contexts)
    {
        context->getState()->setMaxTexturePoolSize(settings.getMaxTexturePoolSize());
        context->getState()->setMaxBufferObjectPoolSize(settings.getMaxBufferObjectPoolSize());
        context->realize();
        adaptToSoftwareRenderer(*context);
    }

    setStartTick(osg::Timer::instance()->tick());
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        GiveStartTick(*view);
    started = true;
}

void VtCOsgCompositeViewer::advance(double simulationTime)
{
    if (!frameStats)
    {
        CompositeViewer::advance(simulationTime);
        return;
    }

    const double previousTime = _frameStamp->getReferenceTime();
    const unsigned int previousFrame = _frameStamp->getFrameNumber();
    const double now = elapsedTime();
    _frameStamp->setFrameNumber(previousFrame + 1);
    _frameStamp->setReferenceTime(now);
    _frameStamp->setSimulationTime(simulationTime == USE_REFERENCE_TIME ? now : simulationTime);

    // The first frame has none before it: the time since the viewer's start would count as a rate of thousands.
    if (frameStats->collectStats("frame_rate") && previousFrame > 0)
    {
        const double duration = now - previousTime;
        frameStats->SetFrameValue(previousFrame, "Frame duration", duration);
        frameStats->SetFrameValue(previousFrame, "Frame rate", 1.0 / duration);
        frameStats->SetFrameValue(previousFrame + 1, "Reference time", now);
    }
}

void VtCOsgCompositeViewer::eventTraversal()
{
    if (HasInput() || !_eventVisitor || Collects("event"))
    {
        CompositeViewer::eventTraversal();
        return;
    }

    _eventVisitor->setFrameStamp(_frameStamp.get());
    _eventVisitor->setTraversalNumber(_frameStamp->getFrameNumber());
    frameEvents.resize(_views.size());
    // Every scene hears of the frame before the first handler does, as a handler may change the scene.
    for (std::size_t index = 0; index < _views.size(); ++index)
        if (FrameEvent& frameEvent = PrepareFrameEvent(index); frameEvent.view->getSceneData())
            SendFrameEvent(frameEvent);

    for (const FrameEvent& frameEvent : frameEvents)
    {
        _eventVisitor->setActionAdapter(frameEvent.view);
        for (const osg::ref_ptr<osgGA::EventHandler>& handler : frameEvent.view->getEventHandlers())
            handler->handle(frameEvent.event.front().get(), frameEvent.view, _eventVisitor.get());
    }
    for (const FrameEvent& frameEvent : frameEvents)
    {
        _eventVisitor->setActionAdapter(frameEvent.view);
        if (osgGA::CameraManipulator* manipulator = frameEvent.view->getCameraManipulator())
            manipulator->handle(frameEvent.event.front().get(), frameEvent.view, _eventVisitor.get());
    }
}

void VtCOsgCompositeViewer::updateTraversal()
{
    if (Collects("update"))
    {
        CompositeViewer::updateTraversal();
        return;
    }

    _updateVisitor->reset();
    _updateVisitor->setFrameStamp(_frameStamp.get());
    _updateVisitor->setTraversalNumber(_frameStamp->getFrameNumber());
    CollectScenes();
    for (osgViewer::Scene* scene : scenes)
        scene->updateSceneGraph(*_updateVisitor);

    osgDB::Registry& registry = *osgDB::Registry::instance();
    if (registry.getSharedStateManager())
        registry.getSharedStateManager()->prune();
    registry.updateTimeStampOfObjectsInCacheWithExternalReferences(*_frameStamp);
    registry.removeExpiredObjectsInCache(*_frameStamp);
    if (_incrementalCompileOperation.valid())
        _incrementalCompileOperation->mergeCompiledSubgraphs(_frameStamp.get());
    if (_updateOperations.valid())
        _updateOperations->runOperations(this);

    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        UpdateView(*view);
}

void VtCOsgCompositeViewer::renderingTraversals()
{
    if (_threadsRunning || Collects("scene") || Collects("update"))
    {
        CompositeViewer::renderingTraversals();
        return;
    }

    // An event or an update may have closed a context or changed a scene.
    CollectContexts();
    CollectScenes();
    for (osgViewer::Scene* scene : scenes)
    {
        if (osgDB::DatabasePager* pager = scene->getDatabasePager())
            pager->signalBeginFrame(_frameStamp.get());
        if (osgDB::ImagePager* pager = scene->getImagePager())
            pager->signalBeginFrame(_frameStamp.get());
        scene->getSceneData()->getBound();
    }

    for (osg::GraphicsContext* context : contexts)
        if (context->valid())
        {
            makeCurrent(context);
            DrawContext(*context);
        }
    for (osg::GraphicsContext* context : contexts)
        if (context->valid())
        {
            makeCurrent(context);
            context->swapBuffers();
        }

    for (osgViewer::Scene* scene : scenes)
    {
        if (osgDB::DatabasePager* pager = scene->getDatabasePager())
            pager->signalEndFrame();
        if (osgDB::ImagePager* pager = scene->getImagePager())
            pager->signalEndFrame();
    }
    if (getReleaseContextAtEndOfFrameHint())
        releaseContext();
    _requestRedraw = false;
}

void VtCOsgCompositeViewer::CollectContexts()
{
    contexts.clear();
    const auto add = [this](const osg::Camera* camera)
    {
        auto* context = camera ? const_cast<osg::GraphicsContext*>(camera->getGraphicsContext()) : nullptr;
        if (context && context->valid())
            AddOnce(contexts, context);
    };
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
    {
        add(view->getCamera());
        for (unsigned int slave = 0; slave < view->getNumSlaves(); ++slave)
            add(view->getSlave(slave)._camera.get());
    }
}

void VtCOsgCompositeViewer::CollectScenes()
{
    scenes.clear();
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        if (view->getScene() && view->getScene()->getSceneData())
            AddOnce(scenes, view->getScene());
}

void VtCOsgCompositeViewer::GiveStartTick(osgViewer::View& view)
{
    view.setStartTick(_startTick);
    // Events of a queue with another start would lie in the future or the past of the frame that takes them.
    view.getEventQueue()->setStartTick(_startTick);
}

bool VtCOsgCompositeViewer::HasInput()
{
    if (_previousEvent.valid())
        return true;
    for (const osg::ref_ptr<osgViewer::View>& view : _views)
        if (!view->getEventQueue()->empty() || !view->getDevices().empty())
            return true;
    for (osg::GraphicsContext* context : contexts)
        if (auto* window = dynamic_cast<osgViewer::GraphicsWindow*>(context))
            if (window->checkEvents() || !window->getEventQueue()->empty())
                return true;
    return false;
}

bool VtCOsgCompositeViewer::Collects(const char* statistic) const
{
    return _stats.valid() && _stats->collectStats(statistic);
}

VtCOsgCompositeViewer::FrameEvent& VtCOsgCompositeViewer::PrepareFrameEvent(std::size_t index)
{
    FrameEvent& frameEvent = frameEvents[index];
    frameEvent.view = _views[index].get();
    if (frameEvent.event.empty())
        frameEvent.event.emplace_back();
    osg::ref_ptr<osgGA::Event>& event = frameEvent.event.front();
    if (!event || event->referenceCount() > 1)
        event = new osgGA::GUIEventAdapter;

    osgGA::GUIEventAdapter& adapter = *event->asGUIEventAdapter();
    CopyInputState(*frameEvent.view->getEventQueue()->getCurrentEventState(), adapter);
    adapter.setEventType(osgGA::GUIEventAdapter::FRAME);
    adapter.setTime(_frameStamp->getReferenceTime());
    adapter.setHandled(false);
    return frameEvent;
}

void VtCOsgCompositeViewer::SendFrameEvent(FrameEvent& frameEvent)
{
    _eventVisitor->reset();
    _eventVisitor->setActionAdapter(frameEvent.view);
    osgGA::EventQueue::Events& visited = _eventVisitor->getEvents();
    visited.splice(visited.end(), frameEvent.event);
    frameEvent.view->getSceneData()->accept(*_eventVisitor);
    VisitCameras(*frameEvent.view, *_eventVisitor);
    frameEvent.event.splice(frameEvent.event.end(), visited, visited.begin());
}

void VtCOsgCompositeViewer::UpdateView(osgViewer::View& view)
{
    VisitCameras(view, *_updateVisitor);
    if (osgGA::CameraManipulator* manipulator = view.getCameraManipulator())
    {
        view.setFusionDistance(manipulator->getFusionDistanceMode(), manipulator->getFusionDistanceValue());
        manipulator->updateCamera(*view.getCamera());
    }
    view.updateSlaves();
}

void VtCOsgCompositeViewer::DrawContext(osg::GraphicsContext& context)
{
    // The general form sorts a copy of the list of cameras, which one camera doesn't need.
    if (context.getCameras().size() != 1 || !context.getOperationsQueue().empty())
    {
        context.runOperations();
        return;
    }
    if (osg::GraphicsOperation* renderer = context.getCameras().front()->getRenderer())
        (*renderer)(&context);
}

#include "render/SceneView.h"

#include <limits>
#include <vector>

#include <osg/Camera>
#include <osg/Light>
#include <osg/Projection>
#include <osgUtil/CullVisitor>
#include <osgUtil/RenderStage>
#include <osgUtil/StateGraph>

#include "render/RenderStage.h"

namespace
{

/// A bin that stays empty, and a branch of the state graph beyond the number that may rest, is given up after so many
/// frames.
constexpr unsigned int restFrames = 100;

/// Every branch is looked at in each cull, so not too many may rest.
constexpr unsigned int restingBranches = 1000;

/// Hangs on a branch of the state graph.
struct Rest : public osg::Referenced
{
    unsigned int lastUsed = 0;
};

/// Does what `StateGraph::prune` does, but lets empty branches rest: an object at the border of the picture would
/// otherwise build its branch up and tear it down in each frame. Branches whose state set nothing in the scene has any
/// more go at once, those unused for longer than `frames` too. Counts into `resting`; true when the branch is used.
bool PruneRested(osgUtil::StateGraph& graph, unsigned int now, unsigned int frames, unsigned int& resting)
{
    bool used = !graph._leaves.empty();
    for (auto at = graph._children.begin(); at != graph._children.end();)
    {
        osgUtil::StateGraph& child = *at->second;
        auto* rest = static_cast<Rest*>(child.getUserData());
        if (!rest)
        {
            child.setUserData(rest = new Rest);
            rest->lastUsed = now;
        }

        bool stays = PruneRested(child, now, frames, resting);
        if (stays)
        {
            rest->lastUsed = now;
            used = true;
        }
        else
        {
            stays = child.getStateSet()->getNumParents() > 0 && now - rest->lastUsed <= frames;
            resting += stays;
        }
        at = stays ? std::next(at) : graph._children.erase(at);
    }
    return used;
}

/// Keeps the culling sets of the frustums of a frame, those of the camera and of projections inside the scene, with the
/// planes in them.
class RecyclingCullVisitor : public osgUtil::CullVisitor
{
public:
    RecyclingCullVisitor() = default;
    RecyclingCullVisitor(const RecyclingCullVisitor& other) : osg::Object(other), osgUtil::CullVisitor(other) {}

    osgUtil::CullVisitor* clone() const override { return new RecyclingCullVisitor(*this); }

    void reset() override
    {
        if (keptSets.empty())
            keptSets.swap(_projectionCullingStack);
        osgUtil::CullVisitor::reset();
    }

    /// The first projection of a cull; those of cameras inside the scene are pushed on top of it as ever.
    void PushCameraProjection(osg::RefMatrix* projection)
    {
        _projectionCullingStack.swap(keptSets);
        SetProjection(projection);
    }

    void PopCameraProjection()
    {
        _projectionStack.pop_back();
        _frustumVolume = -1.0f;
        popCullingSet();
    }

    using osgUtil::CullVisitor::apply;

    /// As the library does it, with a culling set that was kept.
    void apply(osg::Projection& node) override
    {
        if (getComputeNearFarMode() != DO_NOT_COMPUTE_NEAR_FAR || !_occluderList.empty())
        {
            osgUtil::CullVisitor::apply(node);
            return;
        }

        pushCurrentMask();
        osg::StateSet* const state = node.getStateSet();
        if (state)
            pushStateSet(state);

        const std::size_t level = depth++;
        if (nestedSets.size() < depth)
            nestedSets.resize(depth);
        CullingStack outer;
        outer.swap(_projectionCullingStack);
        _projectionCullingStack.swap(nestedSets[level]);
        SetProjection(createOrReuseMatrix(node.getMatrix()));

        handle_cull_callbacks_and_traverse(node);

        PopCameraProjection();
        _projectionCullingStack.swap(nestedSets[level]);
        _projectionCullingStack.swap(outer);
        depth = level;

        if (state)
            popStateSet();
        popCurrentMask();
    }

private:
    /// Puts the frustum of `projection` into the one set of the present stack.
    void SetProjection(osg::RefMatrix* projection)
    {
        _projectionStack.push_back(projection);
        if (_projectionCullingStack.empty())
            _projectionCullingStack.emplace_back();

        osg::CullingSet& set = _projectionCullingStack.front();
        // Each set-up of a frustum stacks one more mask upon those of the last.
        while (set.getFrustum().getMaskStack().size() > 1)
            set.getFrustum().popCurrentMask();
        set.getFrustum().setToUnitFrustum((_cullingMode & NEAR_PLANE_CULLING) != 0,
                                          (_cullingMode & FAR_PLANE_CULLING) != 0);
        set.getFrustum().transformProvidingInverse(*projection);
        set.setCullingMask(_cullingMode);
        set.setSmallFeatureCullingPixelSize(_smallFeatureCullingPixelSize);
        _frustumVolume = -1.0f;
        pushCullingSet();
    }

    CullingStack keptSets;
    std::vector<CullingStack> nestedSets; ///< by how deep the projections lie in one another
    std::size_t depth = 0;
};

} // namespace

VtCOsgSceneView::VtCOsgSceneView(osgUtil::SceneView& other) : osgUtil::SceneView(other, osg::CopyOp::SHALLOW_COPY)
{
    setGlobalStateSet(other.getGlobalStateSet());
    setSecondaryStateSet(other.getSecondaryStateSet());
    setLight(other.getLight());
    setState(other.getState());
    _updateVisitor = other.getUpdateVisitor();

    osg::ref_ptr<RecyclingCullVisitor> culler = new RecyclingCullVisitor;
    culler->setIdentifier(other.getCullVisitor()->getIdentifier());
    setCullVisitor(culler.get());
    setCullVisitorLeft(other.getCullVisitorLeft());
    setCullVisitorRight(other.getCullVisitorRight());
    setStateGraph(new osgUtil::StateGraph);
    setRenderStage(new VtCOsgRenderStage);
    culler->setStateGraph(getStateGraph());
    culler->setRenderStage(getRenderStage());
    MakeUniforms();
}

void VtCOsgSceneView::MakeUniforms()
{
    // The library's own update of these looks them up by name in each frame.
    setActiveUniforms(0);
    _localStateSet = new osg::StateSet;
    const auto make = [this](const char* name, osg::Uniform::Type type)
    { return _localStateSet->getOrCreateUniform(name, type); };
    uniforms.frameNumber = make("osg_FrameNumber", osg::Uniform::UNSIGNED_INT);
    uniforms.frameTime = make("osg_FrameTime", osg::Uniform::FLOAT);
    uniforms.deltaFrameTime = make("osg_DeltaFrameTime", osg::Uniform::FLOAT);
    uniforms.simulationTime = make("osg_SimulationTime", osg::Uniform::FLOAT);
    uniforms.deltaSimulationTime = make("osg_DeltaSimulationTime", osg::Uniform::FLOAT);
    uniforms.viewMatrix = make("osg_ViewMatrix", osg::Uniform::FLOAT_MAT4);
    uniforms.viewMatrixInverse = make("osg_ViewMatrixInverse", osg::Uniform::FLOAT_MAT4);
}

void VtCOsgSceneView::SetUniforms()
{
    const double time = _frameStamp->getReferenceTime();
    const double simulationTime = _frameStamp->getSimulationTime();
    const auto since = [](double now, double& before)
    {
        const double passed = before != 0.0 ? now - before : 0.0;
        before = now;
        return static_cast<float>(passed);
    };
    uniforms.frameNumber->set(_frameStamp->getFrameNumber());
    uniforms.frameTime->set(static_cast<float>(time));
    uniforms.deltaFrameTime->set(since(time, _previousFrameTime));
    uniforms.simulationTime->set(static_cast<float>(simulationTime));
    uniforms.deltaSimulationTime->set(since(simulationTime, _previousSimulationTime));
    uniforms.viewMatrix->set(getViewMatrix());
    uniforms.viewMatrixInverse->set(osg::Matrixd::inverse(getViewMatrix()));
}

bool VtCOsgSceneView::cullStage(const osg::Matrixd& projection, const osg::Matrixd& modelview,
                                osgUtil::CullVisitor* cullVisitor, osgUtil::StateGraph* rendergraph,
                                osgUtil::RenderStage* renderStage, osg::Viewport* viewport)
{
    SetUniforms();
    auto* culler = dynamic_cast<RecyclingCullVisitor*>(cullVisitor);
    if (!culler || !_camera.valid() || !viewport || _camera->containsOccluderNodes())
        return SceneView::cullStage(projection, modelview, cullVisitor, rendergraph, renderStage, viewport);

    culler->reset();
    culler->setFrameStamp(_frameStamp.get());
    culler->setTraversalNumber(_frameStamp->getFrameNumber());
    culler->inheritCullSettings(*this);
    culler->setStateGraph(rendergraph);
    culler->setRenderStage(renderStage);
    culler->setRenderInfo(_renderInfo);

    renderStage->reset();
    rendergraph->clean();

    // Only now has the last frame let go of its matrices.
    const osg::ref_ptr<osg::RefMatrix> projectionMatrix = KeepMatrix(projection);
    const osg::ref_ptr<osg::RefMatrix> viewMatrix = KeepMatrix(modelview);

    renderStage->setInitialViewMatrix(viewMatrix.get());
    renderStage->setViewport(viewport);
    renderStage->setClearColor(_camera->getClearColor());
    renderStage->setClearDepth(_camera->getClearDepth());
    renderStage->setClearAccum(_camera->getClearAccum());
    renderStage->setClearStencil(_camera->getClearStencil());
    renderStage->setClearMask(_camera->getClearMask());
    renderStage->setCamera(_camera.get());
    if (_light.valid() && _lightingMode != NO_SCENEVIEW_LIGHT)
        renderStage->addPositionedAttribute(_lightingMode == SKY_LIGHT ? viewMatrix.get() : nullptr, _light.get());

    osg::StateSet* const stateSets[] = {_globalStateSet.get(), _secondaryStateSet.get(), _localStateSet.get()};
    for (osg::StateSet* stateSet : stateSets)
        if (stateSet)
            culler->pushStateSet(stateSet);
    culler->pushViewport(viewport);
    culler->PushCameraProjection(projectionMatrix.get());
    culler->pushModelViewMatrix(viewMatrix.get(), osg::Transform::ABSOLUTE_RF);

    if (osg::Callback* callback = _camera->getCullCallback())
        callback->run(_camera.get(), culler);
    else
        culler->traverse(*_camera);

    culler->popModelViewMatrix();
    culler->PopCameraProjection();
    culler->popViewport();
    for (osg::StateSet* stateSet : stateSets)
        if (stateSet)
            culler->popStateSet();

    renderStage->sort();
    if (auto* stage = dynamic_cast<VtCOsgRenderStage*>(renderStage))
        stage->PruneBins(restFrames);
    const unsigned int allowed = resting > restingBranches ? restFrames : std::numeric_limits<unsigned int>::max();
    resting = 0;
    PruneRested(*rendergraph, _frameStamp->getFrameNumber(), allowed, resting);
    _dynamicObjectCount += renderStage->computeNumberOfDynamicRenderLeaves();
    return culler->getComputeNearFarMode() != osg::CullSettings::DO_NOT_COMPUTE_NEAR_FAR && getSceneData() != nullptr;
}

osg::RefMatrix* VtCOsgSceneView::KeepMatrix(const osg::Matrixd& matrix)
{
    for (const osg::ref_ptr<osg::RefMatrix>& kept : matrices)
        if (kept->referenceCount() == 1)
        {
            kept->set(matrix);
            return kept.get();
        }
    matrices.push_back(new osg::RefMatrix(matrix));
    return matrices.back().get();
}

#include "render/RenderStage.h"

#include <algorithm>
#include <typeinfo>

#include <osg/Camera>
#include <osg/Drawable>
#include <osg/State>

namespace
{

bool IsEmpty(osgUtil::RenderBin& bin)
{
    return bin.getStateGraphList().empty() && bin.getRenderLeafList().empty() && bin.getRenderBinList().empty();
}

} // namespace

void VtCOsgRenderStage::reset()
{
    RenderBinList kept;
    kept.swap(_bins);
    RenderStage::reset();
    _bins.swap(kept);
    for (auto& [number, bin] : _bins)
        bin->reset();
}

void VtCOsgRenderStage::PruneBins(unsigned int frames)
{
    for (auto at = _bins.begin(); at != _bins.end();)
    {
        unsigned int& empty = emptyFor[at->first];
        empty = IsEmpty(*at->second) ? empty + 1 : 0;
        if (empty > frames)
        {
            emptyFor.erase(at->first);
            at = _bins.erase(at);
        }
        else
            ++at;
    }
}

int VtCOsgRenderStage::CountEmptyBins() const
{
    return static_cast<int>(
        std::count_if(_bins.begin(), _bins.end(), [](const auto& entry) { return IsEmpty(*entry.second); }));
}

bool VtCOsgRenderStage::DrawsElsewhere() const
{
    return _cameraRequiresSetUp || !_camera.valid() ||
           _cameraAttachmentMapModifiedCount != _camera->getAttachmentMapModifiedCount() || _graphicsContext.valid() ||
           _texture.valid() || _image.valid() || !_bufferAttachmentMap.empty() || _rootStateGraph.valid();
}

void VtCOsgRenderStage::draw(osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous)
{
    if (_stageDrawnThisFrame)
        return;
    if (DrawsElsewhere())
    {
        RenderStage::draw(renderInfo, previous);
        return;
    }

    _stageDrawnThisFrame = true;
    if (_initialViewMatrix.valid())
        renderInfo.getState()->setInitialViewMatrix(_initialViewMatrix.get());
    renderInfo.pushCamera(_camera.get());

    const auto run = [&renderInfo](const osg::Camera::DrawCallback* callback)
    {
        if (callback)
            callback->run(renderInfo);
    };
    run(_camera->getInitialDrawCallback());
    drawPreRenderStages(renderInfo, previous);
    run(_camera->getPreDrawCallback());
    bool copiesTexture = false;
    drawInner(renderInfo, previous, copiesTexture);
    run(_camera->getPostDrawCallback());
    drawPostRenderStages(renderInfo, previous);
    run(_camera->getFinalDrawCallback());
    renderInfo.popCamera();
}

void VtCOsgRenderStage::drawImplementation(osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous)
{
    // With nothing in it the library's stage sets the viewport, clears, and applies lights and clip planes.
    RenderBinList bins;
    StateGraphList graphs;
    RenderLeafList leaves;
    osg::ref_ptr<osg::StateSet> stateSet;
    const auto exchange = [&]
    {
        bins.swap(_bins);
        graphs.swap(_stateGraphList);
        leaves.swap(_renderLeafList);
        stateSet.swap(_stateset);
    };
    exchange();
    RenderStage::drawImplementation(renderInfo, previous);
    exchange();

    DrawBin(*this, renderInfo, previous);
    renderInfo.getState()->apply();
}

void VtCOsgRenderStage::DrawBin(osgUtil::RenderBin& bin, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous)
{
    osg::State& state = *renderInfo.getState();
    unsigned int open = previous ? osgUtil::StateGraph::numToPop(previous->_parent) : 0;
    if (open > 1)
        --open;
    const unsigned int position = state.getStateSetStackSize() - open;
    const osg::StateSet* stateSet = bin.getStateSet();
    if (stateSet)
        InsertStateSet(state, position, *stateSet);

    RenderBinList& bins = bin.getRenderBinList();
    auto child = bins.begin();
    for (; child != bins.end() && child->first < 0; ++child)
        DrawChild(*child->second, renderInfo, previous);

    for (osgUtil::RenderLeaf* leaf : bin.getRenderLeafList())
    {
        DrawLeaf(*leaf, renderInfo, previous);
        previous = leaf;
    }
    for (const osgUtil::StateGraph* graph : bin.getStateGraphList())
        for (const osg::ref_ptr<osgUtil::RenderLeaf>& leaf : graph->_leaves)
        {
            DrawLeaf(*leaf, renderInfo, previous);
            previous = leaf.get();
        }

    for (; child != bins.end(); ++child)
        DrawChild(*child->second, renderInfo, previous);
    if (stateSet)
        RemoveStateSet(state, position);
}

void VtCOsgRenderStage::DrawChild(osgUtil::RenderBin& bin, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous)
{
    if (typeid(bin) != typeid(osgUtil::RenderBin) || bin.getDrawCallback())
    {
        bin.draw(renderInfo, previous);
        return;
    }
    renderInfo.pushRenderBin(&bin);
    DrawBin(bin, renderInfo, previous);
    renderInfo.popRenderBin();
}

void VtCOsgRenderStage::DrawLeaf(osgUtil::RenderLeaf& leaf, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf* previous)
{
    osg::State& state = *renderInfo.getState();
    if (state.getAbortRendering())
        return;

    state.applyProjectionMatrix(leaf._projection.get());
    state.applyModelViewMatrix(leaf._modelview.get());

    osgUtil::StateGraph* graph = leaf._parent;
    osgUtil::StateGraph* parentBefore = previous ? previous->_parent->_parent : nullptr;
    const bool moves = !previous || parentBefore != graph->_parent;
    if (moves)
        MoveStateGraph(state, parentBefore, graph->_parent);
    if (moves || graph != previous->_parent)
        state.apply(graph->getStateSet());

    if (state.getUseModelViewAndProjectionUniforms())
        state.applyModelViewAndProjectionUniformsIfRequired();
    leaf._drawable->draw(renderInfo);
    if (leaf._dynamic)
        state.decrementDynamicObjectCount();
}

void VtCOsgRenderStage::MoveStateGraph(osg::State& state, osgUtil::StateGraph* from, osgUtil::StateGraph* to)
{
    if (to == from || !to)
        return;

    const auto leave = [&]
    {
        if (from->getStateSet())
            state.popStateSet();
        from = from->_parent;
    };
    const auto stepUp = [&]
    {
        path.push_back(to);
        to = to->_parent;
    };
    path.clear();
    while (from && from->_depth > to->_depth)
        leave();
    while (to && (!from || to->_depth > from->_depth))
        stepUp();
    while (from != to)
    {
        leave();
        stepUp();
    }
    for (auto graph = path.rbegin(); graph != path.rend(); ++graph)
        if ((*graph)->getStateSet())
            state.pushStateSet((*graph)->getStateSet());
}

void VtCOsgRenderStage::InsertStateSet(osg::State& state, unsigned int position, const osg::StateSet& stateSet)
{
    lifted.clear();
    for (; state.getStateSetStackSize() > position; state.popStateSet())
        lifted.push_back(state.getStateSetStack().back());
    state.pushStateSet(&stateSet);
    for (; !lifted.empty(); lifted.pop_back())
        state.pushStateSet(lifted.back());
}

void VtCOsgRenderStage::RemoveStateSet(osg::State& state, unsigned int position)
{
    lifted.clear();
    for (; state.getStateSetStackSize() > position + 1; state.popStateSet())
        lifted.push_back(state.getStateSetStack().back());
    if (state.getStateSetStackSize() > position)
        state.popStateSet();
    for (; !lifted.empty(); lifted.pop_back())
        state.pushStateSet(lifted.back());
}

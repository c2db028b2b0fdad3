#pragma once

#include <map>
#include <vector>

#include <osgUtil/RenderLeaf>
#include <osgUtil/RenderStage>
#include <osgUtil/StateGraph>

/// The render stage of a view, drawn without taking anything from the heap in a steady picture.
///
/// The library's stage makes its bins anew in each cull (a scene with anything transparent has at least one), and in
/// each draw copies of its stacks and a list for each change of state. Here they are kept. What is drawn, in which
/// order and with which state, is the same; a stage that draws into a texture, an image or another context is left to
/// the library.
class VtCOsgRenderStage : public osgUtil::RenderStage
{
public:
    void reset() override;
    void draw(osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous) override;
    void drawImplementation(osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous) override;

    /// To be called after each cull: gives up bins that have stayed empty for `frames` culls.
    void PruneBins(unsigned int frames);

    /// Bins that are kept but hold nothing of this picture.
    int CountEmptyBins() const;

private:
    bool DrawsElsewhere() const;
    void DrawBin(osgUtil::RenderBin& bin, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous);
    void DrawChild(osgUtil::RenderBin& bin, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf*& previous);
    void DrawLeaf(osgUtil::RenderLeaf& leaf, osg::RenderInfo& renderInfo, osgUtil::RenderLeaf* previous);
    void MoveStateGraph(osg::State& state, osgUtil::StateGraph* from, osgUtil::StateGraph* to);
    void InsertStateSet(osg::State& state, unsigned int position, const osg::StateSet& stateSet);
    void RemoveStateSet(osg::State& state, unsigned int position);

    std::map<int, unsigned int> emptyFor;     ///< by number of the bin, in culls; 0 while it holds something
    std::vector<osgUtil::StateGraph*> path;   ///< within MoveStateGraph
    std::vector<const osg::StateSet*> lifted; ///< within InsertStateSet and RemoveStateSet
};

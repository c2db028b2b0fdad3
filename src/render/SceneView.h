#pragma once

#include <vector>

#include <osg/Matrixd>
#include <osg/Uniform>
#include <osgUtil/SceneView>

/// A scene view whose cull leaves the heap alone once a picture is steady.
///
/// What the library allocates anew in each cull is kept from frame to frame: the uniforms' names and the matrices of
/// the camera, the culling set of its frustum, the bins (`VtCOsgRenderStage`), and the branches of the state graph
/// whose drawables are out of sight for a while. What is drawn, and in which order, is the same.
class VtCOsgSceneView : public osgUtil::SceneView
{
public:
    /// Set up like `other`, which the library's renderer has made for its camera; `other` isn't used afterwards.
    explicit VtCOsgSceneView(osgUtil::SceneView& other);

protected:
    bool cullStage(const osg::Matrixd& projection, const osg::Matrixd& modelview, osgUtil::CullVisitor* cullVisitor,
                   osgUtil::StateGraph* rendergraph, osgUtil::RenderStage* renderStage,
                   osg::Viewport* viewport) override;

private:
    /// Those that every program may use: frame number, times, and the view matrix with its inverse.
    struct FrameUniforms
    {
        osg::ref_ptr<osg::Uniform> frameNumber;
        osg::ref_ptr<osg::Uniform> frameTime;
        osg::ref_ptr<osg::Uniform> deltaFrameTime;
        osg::ref_ptr<osg::Uniform> simulationTime;
        osg::ref_ptr<osg::Uniform> deltaSimulationTime;
        osg::ref_ptr<osg::Uniform> viewMatrix;
        osg::ref_ptr<osg::Uniform> viewMatrixInverse;
    };

    void MakeUniforms();
    void SetUniforms();
    osg::RefMatrix* KeepMatrix(const osg::Matrixd& matrix);

    FrameUniforms uniforms;
    std::vector<osg::ref_ptr<osg::RefMatrix>> matrices;
    unsigned int resting = 0; ///< branches of the state graph that the last cull left unused
};

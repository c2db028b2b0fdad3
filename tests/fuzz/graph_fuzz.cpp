// Any bytes as what the model reading program hands back: a graph that every walk over it survives, and that is the
// same graph once it was encoded and decoded again, or a refusal.
#include <cstdint>
#include <exception>
#include <string>
#include <string_view>

#include <osg/Geode>
#include <osg/Geometry>
#include <osg/TriangleIndexFunctor>

#include "assets/models/ModelGraph.h"
#include "assets/models/ModelPackage.h"
#include "FuzzFile.h"

namespace
{

/// Reads the vertex of every index, as a driver would.
struct Toucher
{
    const osg::Vec3Array* vertices = nullptr;
    double sum = 0;

    void operator()(unsigned a, unsigned b, unsigned c)
    {
        for (const unsigned index : {a, b, c})
            sum += static_cast<double>(vertices->at(index).x());
    }
};

class Walk : public osg::NodeVisitor
{
public:
    Walk() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables() && steps < maxSteps; ++i, ++steps)
        {
            osg::TriangleIndexFunctor<Toucher> functor;
            functor.vertices =
                dynamic_cast<const osg::Vec3Array*>(geode.getDrawable(i)->asGeometry()->getVertexArray());
            geode.getDrawable(i)->accept(functor);
        }
    }

    void apply(osg::Node& node) override
    {
        if (++steps < maxSteps) // a few bytes may stand for millions of nodes, each used often
            traverse(node);
    }

private:
    static constexpr int maxSteps = 100000;
    int steps = 0;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    try
    {
        UnpackModel(bytes);
    }
    catch (const std::exception&)
    {
    }
    osg::ref_ptr<osg::Group> graph;
    try
    {
        graph = DecodeGraph(bytes);
    }
    catch (const std::exception&)
    {
        return 0;
    }
    Walk walk;
    graph->accept(walk);
    const std::string again = EncodeGraph(*graph);
    fuzz::File::Check(EncodeGraph(*DecodeGraph(again)) == again);
    return 0;
}

#include "ReadModel.h"

#include <filesystem>
#include <fstream>
#include <set>
#include <stdexcept>

#include <osg/Geometry>
#include <osg/MatrixTransform>
#include <osg/TriangleIndexFunctor>
#include <osgDB/FileNameUtils>
#include <osgDB/ReadFile>
#include <osgUtil/MeshOptimizers>
#include <osgUtil/Optimizer>

#include "assets/models/ModelGraph.h"
#include "ColladaText.h"
#include "Confinement.h"
#include "Description.h"
#include "GraphBuilder.h"
#include "Preparation.h"
#include "StateBuilder.h"
#include "StockReader.h"
#include "VrmlText.h"

namespace fs = std::filesystem;

namespace
{

constexpr std::uintmax_t maxFileSize = std::uintmax_t{1} << 30;

std::string ReadWholeFile(const std::string& path)
{
    std::error_code error;
    if (!fs::exists(path, error))
        throw std::runtime_error("there is no such file");
    if (!fs::is_regular_file(path, error))
        throw std::runtime_error("it is no file");
    if (fs::file_size(path, error) > maxFileSize)
        throw std::runtime_error("it is larger than 1 GB");
    std::ifstream file(path, std::ios::binary);
    if (!file)
        throw std::runtime_error("it may not be read");
    std::string content(static_cast<std::size_t>(fs::file_size(path, error)), '\0');
    file.read(content.data(), static_cast<std::streamsize>(content.size()));
    content.resize(static_cast<std::size_t>(file.gcount()));
    if (content.empty())
        throw std::runtime_error("it is empty");
    return content;
}

/// Counts what the program shows as the model's size.
class Counter : public osg::NodeVisitor
{
public:
    explicit Counter(ModelReport& modelReport) : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN), report(modelReport) {}

    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
        {
            const osg::Geometry* geometry = geode.getDrawable(i)->asGeometry();
            if (!seen.insert(geometry).second)
                continue;
            ++report.drawables;
            report.vertices += geometry->getVertexArray()->getNumElements();
            for (unsigned p = 0; p < geometry->getNumPrimitiveSets(); ++p)
                report.polygons += geometry->getPrimitiveSet(p)->getNumPrimitives();
            CountTextures(*geometry->getStateSet());
        }
    }

private:
    void CountTextures(const osg::StateSet& state)
    {
        for (unsigned unit = 0; unit < StateBuilder::maxUnits; ++unit)
        {
            const auto* texture =
                dynamic_cast<const osg::Texture2D*>(state.getTextureAttribute(unit, osg::StateAttribute::TEXTURE));
            if (texture && seen.insert(texture->getImage()).second)
                report.textureBytes += texture->getImage()->getTotalSizeInBytes();
        }
    }

    ModelReport& report;
    std::set<const void*> seen;
};

/// The model below its correction of axes and unit, on request turned to z-up.
osg::ref_ptr<osg::Group> Placed(osg::ref_ptr<osg::Group> graph, osg::Matrixd matrix, const ModelRequest& request)
{
    if (request.IsOn("useVrmlTransform", false))
        matrix.postMult(osg::Matrixd(1, 0, 0, 0, 0, 0, 1, 0, 0, -1, 0, 0, 0, 0, 0, 1));
    if (matrix.isIdentity())
        return graph;
    osg::ref_ptr<osg::MatrixTransform> placing = new osg::MatrixTransform(matrix);
    placing->setDataVariance(osg::Object::STATIC);
    for (unsigned i = 0; i < graph->getNumChildren(); ++i)
        placing->addChild(graph->getChild(i));
    graph->removeChildren(0, graph->getNumChildren());
    graph->addChild(placing);
    return graph;
}

PreparedText Prepare(const std::string& extension, std::string content, ReadContext& context)
{
    if (extension == "wrl")
        return PrepareVrml(std::move(content), context);
    if (extension == "dae")
        return PrepareCollada(std::move(content), context);
    PreparedText prepared; // read as a service: nothing is filled in, and what isn't OBJ stands z-up by custom
    if (extension != "obj")
        prepared.toModel = osg::Matrixd(1, 0, 0, 0, 0, 0, -1, 0, 0, 1, 0, 0, 0, 0, 0, 1);
    return prepared;
}

std::string ReadChecked(ReadContext& context)
{
    const ModelRequest& request = context.request;
    if (!HasModelFormat(request.path))
        throw std::runtime_error(std::string("of models only these formats are read: ") + modelFormats);
    const std::string extension = osgDB::getLowerCaseFileExtension(request.path);
    context.NoteFile(request.path);
    std::string content = ReadWholeFile(request.path);
    LoadStockReaders(extension, context);
    fs::current_path(context.folder); // not before: libraries are also looked for in the working directory
    context.report.notes = Confine(context.roots);
    const Description description(context);

    PreparedText prepared = Prepare(extension, std::move(content), context);
    StateBuilder states(context, prepared.mainTextureUnit);
    osg::ref_ptr<osg::Group> graph;
    std::string complaint;
    {
        // The stock graph goes before transforms are worked into vertices, or every array would be copied once more.
        const StockGraph stock = ReadWithStockReader(extension, std::move(prepared.text), request.path);
        graph = GraphBuilder(context, states).Build(*stock.root, prepared.hasTurnedRoot);
        complaint = stock.complaint;
    }
    for (const std::string& path : context.textures) // those that the graph doesn't hold; of a material nobody uses?
        if (!osgDB::readRefImageFile(path))
            context.Warn("the texture \"" + path + "\" can't be read");
    graph = Placed(graph, prepared.toModel, request);
    graph->setName(osgDB::getStrippedName(request.path));

    // Tangents don't turn with a transform that is worked in later, so it is done now. A group stays as it is.
    if (context.report.parts.empty())
    {
        osgUtil::Optimizer optimizer;
        optimizer.optimize(graph,
                           osgUtil::Optimizer::STATIC_OBJECT_DETECTION | osgUtil::Optimizer::FLATTEN_STATIC_TRANSFORMS);
    }
    if (extension == "wrl") // the stock reader gives every corner a vertex of its own
    {
        osgUtil::IndexMeshVisitor indexer;
        graph->accept(indexer);
        indexer.makeMesh();
    }
    description.AddTextures(*graph, states);
    description.AddShaders(*graph);

    Counter counter(context.report);
    graph->accept(counter);
    if (context.report.drawables == 0 && context.report.parts.empty())
    {
        if (!context.report.warnings.empty())
            complaint = context.report.warnings.front();
        throw std::runtime_error("it holds no geometry" + (complaint.empty() ? "" : ": " + complaint));
    }
    return EncodeGraph(*graph);
}

} // namespace

std::string ReadModel(const ModelRequest& request)
{
    ReadContext context(request);
    std::string graph;
    try
    {
        graph = ReadChecked(context);
    }
    catch (const std::runtime_error& e)
    {
        context.report.error = e.what();
    }
    catch (const std::length_error&)
    {
        context.report.error = "it holds sizes that can't be";
    }
    return PackModel(context.report, graph);
}

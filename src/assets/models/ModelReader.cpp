#include "assets/models/ModelReader.h"

#include <algorithm>
#include <stdexcept>
#include <unordered_set>

#include <osg/Geode>
#include <osg/NodeVisitor>
#include <osg/ProxyNode>
#include <osg/Version>
#include <osgDB/Options>

#include "assets/models/ModelGraph.h"

namespace
{

/// Numbers the drawables of a graph as the reading program does: in visiting order, each once.
class DrawableList : public osg::NodeVisitor
{
public:
    DrawableList() : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN) {}

    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
            if (seen.insert(geode.getDrawable(i)).second)
                drawables.push_back(geode.getDrawable(i));
    }

    std::vector<osg::Drawable*> drawables;

private:
    std::unordered_set<osg::Drawable*> seen;
};

/// Parts of a group are bodies of their own, so the proxy only names them.
void AddParts(osg::Group& graph, const ModelReport& report)
{
    if (report.parts.empty())
        return;
    osg::ref_ptr<osg::ProxyNode> proxy = new osg::ProxyNode;
    proxy->setLoadingExternalReferenceMode(osg::ProxyNode::NO_AUTOMATIC_LOADING);
    for (unsigned i = 0; i < report.parts.size(); ++i)
    {
        osg::ref_ptr<osg::Group> part = new osg::Group;
        part->setName(report.parts[i].first);
        proxy->addChild(part, report.parts[i].second);
    }
    graph.addChild(proxy);
}

bool StillHolds(const ModelReport& report)
{
    return std::all_of(report.files.begin(), report.files.end(),
                       [](const FileStamp& file) { return FileStamp::Of(file.path) == file; });
}

} // namespace

VtCModelReader::VtCModelReader(VtTModelReaderSettings readerSettings)
    : settings(std::move(readerSettings)), cache(settings.cacheFolder, settings.cacheBytes)
{
}

osgDB::ReaderWriter::ReadResult VtCModelReader::readNode(const std::string& path, const osgDB::Options* options) const
{
    shaderNodes.clear();
    if (!HasModelFormat(path))
        return ReadResult(std::string("of models only these formats are read: ") + modelFormats);
    if (FileStamp::Of(path).size < 0)
        return ReadResult("there is no such file");

    const ModelRequest request = ModelRequest::Make(path, options);
    try
    {
        std::string bytes = FindFinished(request);
        if (bytes.empty())
            bytes = Run(request);
        const UnpackedModel model = UnpackModel(bytes);
        const ModelReport& report = model.report;
        for (const FileStamp& file : report.files)
            if (file.size >= 0)
                files.insert(file.path);
        if (!report.error.empty())
            return ReadResult(report.error);

        osg::ref_ptr<osg::Group> graph = DecodeGraph(model.graph);
        DrawableList list;
        graph->accept(list);
        if (list.drawables.size() != report.drawables)
            throw std::runtime_error("its reader handed back another graph than it tells of");
        for (const auto& [number, name] : report.shaders)
            if (number < list.drawables.size())
                shaderNodes[list.drawables[number]] = name;
        AddParts(*graph, report);

        if (options)
        {
            const auto joined = [](const std::vector<std::string>& sentences)
            {
                std::string all;
                for (const std::string& sentence : sentences)
                    all += (all.empty() ? "" : "; ") + sentence;
                return all;
            };
            options->setPluginStringData("polygonCount", std::to_string(report.polygons));
            options->setPluginStringData("vertexCount", std::to_string(report.vertices));
            options->setPluginStringData("textureMemoryUsed", std::to_string(report.textureBytes));
            options->setPluginStringData("xmlAttributes", report.xmlAttributes);
            options->setPluginStringData("readWarnings", joined(report.warnings));
            options->setPluginStringData("readNotes", joined(report.notes));
            options->setPluginData("shaderNodes", &shaderNodes);
        }
        return graph.get();
    }
    catch (const std::exception& e)
    {
        return ReadResult(e.what());
    }
}

void VtCModelReader::Preload(const std::vector<std::string>& paths, const osgDB::Options* options)
{
    std::vector<std::string> keys;
    std::vector<std::vector<std::string>> arguments;
    for (const std::string& path : paths)
    {
        const ModelRequest request = ModelRequest::Make(path, options);
        const bool ours = HasModelFormat(path) && FileStamp::Of(path).size >= 0;
        if (!ours || std::find(keys.begin(), keys.end(), Key(request)) != keys.end() ||
            preloaded.contains(Key(request)) || !FindFinished(request).empty())
            continue;
        keys.push_back(Key(request));
        arguments.push_back(request.Arguments());
    }
    std::vector<ModelProcessResult> results =
        RunModelProcesses(settings.program, arguments, settings.limits, settings.parallel);
    for (std::size_t i = 0; i < keys.size(); ++i)
    {
        if (!results[i].failure.empty())
        {
            ModelReport report;
            report.error = results[i].failure;
            report.files.push_back(FileStamp::Of(arguments[i].front()));
            results[i].output = PackModel(report, {});
        }
        preloaded[keys[i]] = std::move(results[i].output);
    }
}

std::string VtCModelReader::FindFinished(const ModelRequest& request) const
{
    const std::string key = Key(request);
    const auto at = preloaded.find(key);
    std::string bytes = at != preloaded.end() ? std::move(at->second) : cache.Load(key);
    const bool fresh = at != preloaded.end();
    if (fresh)
        preloaded.erase(at);
    if (bytes.empty())
        return {};
    try
    {
        const UnpackedModel model = UnpackModel(bytes);
        if (!StillHolds(model.report))
            return {};
        if (fresh && model.report.error.empty())
            cache.Store(key, bytes);
        return bytes;
    }
    catch (const std::exception&)
    {
        return {}; // a torn or foreign file, or one of another version: read anew and written over
    }
}

std::string VtCModelReader::Run(const ModelRequest& request) const
{
    std::vector<ModelProcessResult> results =
        RunModelProcesses(settings.program, {request.Arguments()}, settings.limits, 1);
    ModelProcessResult& result = results.front();
    if (!result.failure.empty())
        throw std::runtime_error(result.failure);
    try
    {
        if (UnpackModel(result.output).report.error.empty())
            cache.Store(Key(request), result.output);
    }
    catch (const std::exception& e)
    {
        throw std::runtime_error(std::string("what its reader handed back is no good: ") + e.what());
    }
    return std::move(result.output);
}

std::string VtCModelReader::Key(const ModelRequest& request)
{
    std::string key = std::to_string(modelPackageVersion) + '\n' + osgGetVersion();
    for (const std::string& argument : request.Arguments())
        key += '\n' + argument;
    return key;
}

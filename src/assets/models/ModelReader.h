#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

#include <osgDB/ReaderWriter>

#include "assets/models/ModelCache.h"
#include "assets/models/ModelPackage.h"
#include "assets/models/ModelReaderSettings.h"
#include "assets/models/ModelRequest.h"

namespace osg
{
class Drawable;
}

/// Reads model files (`modelFormats`) for this process without parsing them in it.
///
/// A program of its own parses the file, checks every number of what comes out, and hands back the finished graph; so
/// a damaged file, or one that runs the parser into a hang, costs that program and not this one. Finished models are
/// kept on disk and taken from there while none of the files they were made from has changed.
///
/// Nothing else reads a model: a file of another format is refused by its ending. Options and results are described in
/// docs/models.md. Not thread safe.
class VtCModelReader : public osgDB::ReaderWriter
{
public:
    explicit VtCModelReader(VtTModelReaderSettings settings);

    const char* className() const override { return "Panoramic model reader"; }

    /// The graph, y-up, in metres. Without one the result's message says why. `options` takes the out values;
    /// "shaderNodes" stays valid until the next read.
    ReadResult readNode(const std::string& path, const osgDB::Options* options) const override;

    /// Reads several models at once, for `readNode` to find them ready. What nobody then reads stays until the end.
    void Preload(const std::vector<std::string>& paths, const osgDB::Options* options);

    /// All files that models were made from since the start.
    const std::set<std::string>& GetFiles() const { return files; }

private:
    /// The bytes of a package that still holds, from the read before or from the disk; empty without one.
    std::string FindFinished(const ModelRequest& request) const;
    std::string Run(const ModelRequest& request) const;
    static std::string Key(const ModelRequest& request);

    VtTModelReaderSettings settings;
    VtCModelCache cache;
    mutable std::map<std::string, std::string> preloaded; ///< key -> package
    mutable std::map<osg::Drawable*, std::string> shaderNodes;
    mutable std::set<std::string> files;
};

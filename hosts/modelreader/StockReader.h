#pragma once

#include <string>

#include <osg/Node>
#include <osg/ref_ptr>

class ReadContext;

/// What the scene graph library's own reader makes of a text.
struct StockGraph
{
    osg::ref_ptr<osg::Node> root; ///< never null
    std::string complaint;        ///< the first thing it complained of, in one line; empty when it didn't
};

/// Loads what will be needed to read a file with that ending, and has it read something of our own: a library that
/// looks for code or settings while it parses would look for them where the model lies. From here on the scene graph
/// library reads no other formats than models and pictures have, and only within reach of `context`, which stays alive.
void LoadStockReaders(const std::string& extension, const ReadContext& context);

/// What the reader for `extension` makes of `text`, or of the file `path` with that text where it takes files only.
/// Relative names in it are looked for in the working directory. Throws `std::runtime_error` when the reader refuses.
StockGraph ReadWithStockReader(const std::string& extension, std::string text, const std::string& path);

/// Whether `path` ends like a picture that can be a texture.
bool HasPictureFormat(const std::string& path);

#pragma once

#include <string>

#include <osg/Node>
#include <osg/ref_ptr>

/// What the scene graph library's own reader makes of a text.
struct StockGraph
{
    osg::ref_ptr<osg::Node> root; ///< never null
    std::string complaint;        ///< the first thing it complained of, in one line; empty when it didn't
};

/// `extension` is "dae" or "wrl"; relative names in the text are looked for in the working directory. Throws
/// `std::runtime_error` when the reader refuses.
StockGraph ReadWithStockReader(const std::string& extension, std::string text);

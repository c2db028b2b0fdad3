#pragma once

#include <string>

#include <osg/Node>
#include <osg/ref_ptr>

/// The graph that the scene graph library's own reader makes of `text`. `extension` is "dae" or "wrl"; relative names
/// in the text are looked for in the working directory. Throws `std::runtime_error` when the reader refuses.
osg::ref_ptr<osg::Node> ReadWithStockReader(const std::string& extension, std::string text);

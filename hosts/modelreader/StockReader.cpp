#include "StockReader.h"

#include <stdexcept>

#include <osgDB/Registry>

#include "render/models/MemoryStream.h"

osg::ref_ptr<osg::Node> ReadWithStockReader(const std::string& extension, std::string text)
{
    // Polygons need not be convex: without this option the COLLADA reader takes them for fans.
    osg::ref_ptr<osgDB::Options> options = new osgDB::Options("daeTessellatePolygons");
    osgDB::ReaderWriter* reader =
        osgDB::Registry::instance()->getReaderWriterForExtension(extension == "wrl" ? "iv" : extension);
    if (!reader)
        throw std::runtime_error("the scene graph library's plug-in for \"" + extension + "\" is missing");
    text.push_back('\0'); // the COLLADA reader copies the bytes and takes them for a C string
    MemoryStream stream(extension == "dae" ? std::string_view(text)
                                           : std::string_view(text).substr(0, text.size() - 1));
    osgDB::ReaderWriter::ReadResult result = reader->readNode(stream, options.get());
    if (!result.validNode())
        throw std::runtime_error(result.message().empty() ? "its reader can make nothing of it" : result.message());
    return result.getNode();
}

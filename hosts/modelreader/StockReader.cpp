#include "StockReader.h"

#include <stdexcept>
#include <string_view>

#include <osg/Notify>
#include <osgDB/Registry>

#include "assets/models/MemoryStream.h"

namespace
{

/// Keeps the first complaint of a reader, which else would go to a console that nobody sees.
class Listener : public osg::NotifyHandler
{
public:
    void notify(osg::NotifySeverity, const char* message) override
    {
        if (text.size() < maxLength)
            text += message;
    }

    /// "Coin read error: Unknown node.\n\tOccurred at line   3 in <memory>\nCoin read error: ..." in a line.
    std::string First() const
    {
        std::string_view rest = text;
        if (rest.starts_with(prefix))
            rest.remove_prefix(prefix.size());
        std::string line;
        for (std::size_t i = 0; i < rest.size() && rest.substr(i) != "\n"; ++i)
        {
            if (rest[i] == '\n' && rest[i + 1] != '\t')
                break; // the next complaint
            const bool blank = rest[i] == '\n' || rest[i] == '\t' || rest[i] == ' ';
            if (!blank || (!line.empty() && line.back() != ' '))
                line += blank ? ' ' : rest[i];
        }
        if (line.ends_with(suffix))
            line.resize(line.size() - suffix.size());
        while (line.ends_with(' '))
            line.pop_back();
        return line;
    }

private:
    static constexpr std::size_t maxLength = 10000;
    static constexpr std::string_view prefix = "Coin read error: ";
    static constexpr std::string_view suffix = " in <memory>";

    std::string text;
};

/// Listens while it lives.
class Listening
{
public:
    Listening() : before(osg::getNotifyHandler()), level(osg::getNotifyLevel()), listener(new Listener)
    {
        osg::setNotifyHandler(listener);
        osg::setNotifyLevel(osg::WARN);
    }
    ~Listening()
    {
        osg::setNotifyHandler(before);
        osg::setNotifyLevel(level);
    }
    Listening(const Listening&) = delete;
    Listening& operator=(const Listening&) = delete;

    std::string First() const { return listener->First(); }

private:
    osg::ref_ptr<osg::NotifyHandler> before;
    osg::NotifySeverity level;
    osg::ref_ptr<Listener> listener;
};

} // namespace

StockGraph ReadWithStockReader(const std::string& extension, std::string text)
{
    // Polygons need not be convex: without this option the COLLADA reader takes them for fans.
    osg::ref_ptr<osgDB::Options> options = new osgDB::Options("daeTessellatePolygons");
    osgDB::ReaderWriter* reader =
        osgDB::Registry::instance()->getReaderWriterForExtension(extension == "wrl" ? "iv" : extension);
    if (!reader)
        throw std::runtime_error("the scene graph library's plug-in for \"" + extension + "\" is missing");

    if (extension == "dae")
        text.push_back('\0'); // its reader copies the bytes and takes them for a C string
    MemoryStream stream(text);
    const Listening listening;
    osgDB::ReaderWriter::ReadResult result = reader->readNode(stream, options.get());
    const std::string complaint = listening.First();
    if (!result.validNode())
        throw std::runtime_error("its reader can make nothing of it" + (complaint.empty() ? "" : ": " + complaint));
    return {result.getNode(), complaint};
}

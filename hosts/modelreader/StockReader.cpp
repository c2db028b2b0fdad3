#include "StockReader.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <string_view>

#include <osg/Notify>
#include <osgDB/Callbacks>
#include <osgDB/FileNameUtils>
#include <osgDB/Registry>

#include "assets/models/MemoryStream.h"
#include "assets/models/ModelRequest.h"
#include "Preparation.h"

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

constexpr std::string_view pictureFormats[] = {"png",  "jpg", "jpeg", "tga", "bmp",  "tif",
                                               "tiff", "gif", "dds",  "rgb", "rgba", "sgi"};
constexpr const char* pictureReaders[] = {"png", "jpeg", "tga", "bmp", "tiff", "gif", "dds", "rgb"};

/// What the VRML reader's first run is made with; it loads more when it is first used.
constexpr std::string_view vrmlSample =
    "#VRML V2.0 utf8\nShape { appearance Appearance { material Material { } } geometry Box { } }\n";

/// Lets through what the scene graph library may read on behalf of a model. Its plug-ins include scripts, archives,
/// networks and commands in file names ("x.dae.5,5,5.scale").
class Gate : public osgDB::ReadFileCallback
{
public:
    using Result = osgDB::ReaderWriter::ReadResult;
    using Options = osgDB::Options;

    explicit Gate(const ReadContext& readContext) : context(readContext) {}

    Result readImage(const std::string& name, const Options* options) override
    {
        const auto alias = context.aliases.find(osgDB::getSimpleFileName(name));
        const std::string& path = alias == context.aliases.end() ? name : alias->second;
        if (!HasPictureFormat(path) || !context.IsWithinReach(path))
            return Refused();
        Result result = ReadFileCallback::readImage(path, options);
        if (result.validImage() && alias != context.aliases.end())
            result.getImage()->setFileName(path);
        return result;
    }
    Result readNode(const std::string& path, const Options* options) override
    {
        return HasModelFormat(path) && context.IsWithinReach(path) ? ReadFileCallback::readNode(path, options)
                                                                   : Refused();
    }
    Result openArchive(const std::string&, osgDB::ReaderWriter::ArchiveStatus, unsigned, const Options*) override
    {
        return Refused();
    }
    Result readObject(const std::string&, const Options*) override { return Refused(); }
    Result readHeightField(const std::string&, const Options*) override { return Refused(); }
    Result readShader(const std::string&, const Options*) override { return Refused(); }
    Result readScript(const std::string&, const Options*) override { return Refused(); }

private:
    static Result Refused() { return Result::FILE_NOT_HANDLED; }

    const ReadContext& context;
};

osgDB::ReaderWriter& ReaderFor(const std::string& extension)
{
    osgDB::ReaderWriter* reader =
        osgDB::Registry::instance()->getReaderWriterForExtension(extension == "wrl" ? "iv" : extension);
    if (!reader)
        throw std::runtime_error("the scene graph library's plug-in for \"" + extension + "\" is missing");
    return *reader;
}

} // namespace

void LoadStockReaders(const std::string& extension, const ReadContext& context)
{
    osgDB::Registry& registry = *osgDB::Registry::instance();
    registry.setReadFileCallback(new Gate(context));
    for (const char* picture : pictureReaders)
        registry.loadLibrary(registry.createLibraryNameForExtension(picture));
    if (extension == "osgt" || extension == "osgb")
        for (const char* classes : {"serializers_osg", "serializers_osgsim", "serializers_osganimation"})
            registry.loadLibrary(registry.createLibraryNameForExtension(classes));
    ReaderFor(extension);

    const Listening quiet;
    if (extension == "wrl")
    {
        MemoryStream stream(vrmlSample);
        ReaderFor(extension).readNode(stream, nullptr);
    }
}

StockGraph ReadWithStockReader(const std::string& extension, std::string text, const std::string& path)
{
    // Polygons need not be convex: without this option the COLLADA reader takes them for fans. The OBJ reader would
    // turn y-up to z-up.
    osg::ref_ptr<osgDB::Options> options = new osgDB::Options("daeTessellatePolygons noRotation");
    options->setDatabasePath(osgDB::getFilePath(path));
    osgDB::ReaderWriter& reader = ReaderFor(extension);

    if (extension == "dae")
        text.push_back('\0'); // its reader copies the bytes and takes them for a C string
    MemoryStream stream(text);
    const Listening listening;
    osgDB::ReaderWriter::ReadResult result =
        extension == "dae" || extension == "wrl" ? reader.readNode(stream, options) : reader.readNode(path, options);
    const std::string complaint = listening.First();
    if (!result.validNode())
        throw std::runtime_error("its reader can make nothing of it" + (complaint.empty() ? "" : ": " + complaint));
    return {result.getNode(), complaint};
}

bool HasPictureFormat(const std::string& path)
{
    const std::string ending = osgDB::getLowerCaseFileExtension(path);
    return std::find(std::begin(pictureFormats), std::end(pictureFormats), ending) != std::end(pictureFormats);
}

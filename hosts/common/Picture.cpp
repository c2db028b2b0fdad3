#include "hosts/common/Picture.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <dlfcn.h>
#include <optional>
#include <sstream>

#include <osg/Camera>
#include <osg/GLExtensions>
#include <osg/GraphicsContext>
#include <osg/Viewport>
#include <osgDB/FileNameUtils>
#include <osgDB/Registry>

#include "base/AtomicFile.h"

namespace hosts
{

namespace
{

constexpr int sheetGap = 8;
constexpr unsigned char sheetGrey = 40;
constexpr unsigned char partsGrey = 96;

osg::ref_ptr<osg::Image> NewPicture(int width, int height)
{
    osg::ref_ptr<osg::Image> picture = new osg::Image;
    picture->allocateImage(width, height, 1, GL_RGB, GL_UNSIGNED_BYTE);
    return picture;
}

/// A copy of the window's colours with one sample a pixel, to be read from for its lifetime.
///
/// Reading a multisampled pbuffer itself gives one of the samples with some drivers, so edges come out jagged.
class Resolved
{
public:
    Resolved(const osg::GLExtensions& extensions, int x, int y, int width, int height) : gl(extensions)
    {
        gl.glGenRenderbuffers(1, &colours);
        gl.glBindRenderbuffer(GL_RENDERBUFFER_EXT, colours);
        gl.glRenderbufferStorage(GL_RENDERBUFFER_EXT, GL_RGBA8, width, height);
        gl.glBindRenderbuffer(GL_RENDERBUFFER_EXT, 0);
        gl.glGenFramebuffers(1, &frame);
        gl.glBindFramebuffer(GL_DRAW_FRAMEBUFFER_EXT, frame);
        gl.glFramebufferRenderbuffer(GL_DRAW_FRAMEBUFFER_EXT, GL_COLOR_ATTACHMENT0_EXT, GL_RENDERBUFFER_EXT, colours);
        gl.glBlitFramebuffer(x, y, x + width, y + height, 0, 0, width, height, GL_COLOR_BUFFER_BIT, GL_NEAREST);
        gl.glBindFramebuffer(GL_READ_FRAMEBUFFER_EXT, frame);
    }

    Resolved(const Resolved&) = delete;
    Resolved& operator=(const Resolved&) = delete;

    ~Resolved()
    {
        gl.glBindFramebuffer(GL_FRAMEBUFFER_EXT, 0);
        gl.glDeleteFramebuffers(1, &frame);
        gl.glDeleteRenderbuffers(1, &colours);
    }

private:
    const osg::GLExtensions& gl;
    GLuint colours = 0;
    GLuint frame = 0;
};

void Paste(const osg::Image& picture, osg::Image& sheet, int left, int bottom)
{
    for (int y = 0; y < picture.t(); ++y)
        std::memcpy(sheet.data(left, bottom + y), picture.data(0, y), static_cast<std::size_t>(picture.s()) * 3);
}

/// Plug-ins are asked for as "osgPlugins-3.6.5/osgdb_png.so", and the library looks for that name below the working
/// directory before it strips the folder: code of somebody else. Found at once, it looks no further.
void LookForPluginsWhereTheLibraryIs()
{
    Dl_info info = {};
    if (dladdr(reinterpret_cast<void*>(&osgDB::getLowerCaseFileExtension), &info) == 0 || !info.dli_fname)
        return;
    const std::string folder = std::filesystem::path(info.dli_fname).parent_path().string();
    osgDB::FilePathList& folders = osgDB::Registry::instance()->getLibraryFilePathList();
    if (folders.empty() || folders.front() != folder)
        folders.push_front(folder);
}

} // namespace

osg::ref_ptr<osg::Image> ReadPicture(osg::Camera& camera)
{
    const osg::Viewport* viewport = camera.getViewport();
    osg::GraphicsContext* context = camera.getGraphicsContext();
    if (!viewport || viewport->width() < 1 || viewport->height() < 1 || !context || !context->valid())
        return nullptr;
    if (!context->makeCurrent())
        return nullptr;

    int x = static_cast<int>(viewport->x());
    int y = static_cast<int>(viewport->y());
    const int width = static_cast<int>(viewport->width());
    const int height = static_cast<int>(viewport->height());
    const auto* extensions = context->getState()->get<osg::GLExtensions>();
    int sampleBuffers = 0;
    glGetIntegerv(GL_SAMPLE_BUFFERS_ARB, &sampleBuffers);
    std::optional<Resolved> resolved;
    if (sampleBuffers > 0 && extensions->isFrameBufferObjectSupported)
    {
        glDisable(GL_SCISSOR_TEST);
        resolved.emplace(*extensions, x, y, width, height);
        glEnable(GL_SCISSOR_TEST);
        x = y = 0;
    }
    osg::ref_ptr<osg::Image> picture = new osg::Image;
    picture->readPixels(x, y, width, height, GL_RGB, GL_UNSIGNED_BYTE);
    resolved.reset();
    context->releaseContext();
    return picture;
}

std::string WritePicture(const osg::Image& picture, const std::filesystem::path& path)
{
    const std::string ending = osgDB::getLowerCaseFileExtension(path.string());
    const char* format = ending == "jpg" || ending == "jpeg"   ? "jpeg"
                         : ending == "tif" || ending == "tiff" ? "tiff"
                                                               : "png";
    LookForPluginsWhereTheLibraryIs();
    osgDB::ReaderWriter* writer = osgDB::Registry::instance()->getReaderWriterForExtension(format);
    if (!writer)
        return path.string() + ": the scene graph library's plug-in for \"" + format + "\" is missing";

    const osg::ref_ptr<osgDB::Options> options = new osgDB::Options("JPEG_QUALITY 92");
    std::ostringstream bytes;
    const osgDB::ReaderWriter::WriteResult result = writer->writeImage(picture, bytes, options);
    if (!result.success())
        return path.string() + ": the picture can't be written as " + format + " " + result.message();
    return base::WriteWholeFile(path, bytes.view());
}

osg::ref_ptr<osg::Image> ScalePicture(const osg::Image& picture, int width, int height)
{
    osg::ref_ptr<osg::Image> scaled = NewPicture(width, height);
    const auto span = [](int at, int count, int sourceCount)
    {
        const int first = at * sourceCount / count;
        return std::pair(first, std::max(first + 1, (at + 1) * sourceCount / count));
    };
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
        {
            const auto [left, right] = span(x, width, picture.s());
            const auto [bottom, top] = span(y, height, picture.t());
            int sum[3] = {0, 0, 0};
            for (int sourceY = bottom; sourceY < top; ++sourceY)
                for (int sourceX = left; sourceX < right; ++sourceX)
                    for (int channel = 0; channel < 3; ++channel)
                        sum[channel] += picture.data(sourceX, sourceY)[channel];
            const int count = (right - left) * (top - bottom);
            for (int channel = 0; channel < 3; ++channel)
                scaled->data(x, y)[channel] = static_cast<unsigned char>((sum[channel] + count / 2) / count);
        }
    return scaled;
}

osg::ref_ptr<osg::Image> ComposePicture(const std::vector<PlacedPicture>& parts, int width, int height)
{
    osg::ref_ptr<osg::Image> whole = NewPicture(width, height);
    std::memset(whole->data(), partsGrey, whole->getTotalSizeInBytes());
    for (const PlacedPicture& part : parts)
        Paste(*part.picture, *whole, part.left, part.bottom);
    return whole;
}

osg::ref_ptr<osg::Image> ComposeContactSheet(const std::vector<osg::ref_ptr<osg::Image>>& pictures, int columns,
                                             int cellWidth)
{
    int cellHeight = 0;
    for (const osg::ref_ptr<osg::Image>& picture : pictures)
        if (picture)
            cellHeight = std::max(cellHeight, picture->t() * cellWidth / picture->s());
    if (cellHeight == 0 || columns < 1)
        return nullptr;

    const int count = static_cast<int>(pictures.size());
    const int usedColumns = std::min(columns, count);
    const int rows = (count + usedColumns - 1) / usedColumns;
    osg::ref_ptr<osg::Image> sheet =
        NewPicture(usedColumns * (cellWidth + sheetGap) + sheetGap, rows * (cellHeight + sheetGap) + sheetGap);
    std::memset(sheet->data(), sheetGrey, sheet->getTotalSizeInBytes());

    for (int index = 0; index < count; ++index)
    {
        const osg::Image* picture = pictures[static_cast<std::size_t>(index)].get();
        if (!picture)
            continue;
        const int row = rows - 1 - index / usedColumns; // the first row is the top one
        const int height = std::max(1, picture->t() * cellWidth / picture->s());
        Paste(*ScalePicture(*picture, cellWidth, height), *sheet,
              sheetGap + index % usedColumns * (cellWidth + sheetGap),
              sheetGap + row * (cellHeight + sheetGap) + (cellHeight - height) / 2);
    }
    return sheet;
}

} // namespace hosts

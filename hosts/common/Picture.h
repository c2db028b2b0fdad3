#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include <osg/Image>
#include <osg/ref_ptr>

namespace osg
{
class Camera;
} // namespace osg

namespace hosts
{

/// What `camera` drew last: its viewport as 8-bit RGB, lowest row first. Null without a context or with an empty
/// viewport. Call it between two frames; the camera's context is current for the time of the call only.
osg::ref_ptr<osg::Image> ReadPicture(osg::Camera& camera);

/// Writes `picture` as a file that appears whole or not at all: JPEG and TIFF by the ending of `path` (.jpg, .jpeg,
/// .tif, .tiff), else PNG. Empty on success, else the reason with the path.
std::string WritePicture(const osg::Image& picture, const std::filesystem::path& path);

/// A picture and where its lower left corner lies in a larger one, in pixels.
struct PlacedPicture
{
    osg::ref_ptr<osg::Image> picture;
    int left = 0;
    int bottom = 0;
};

/// The parts on a grey ground of that size. Parts are 8-bit RGB and lie within it.
osg::ref_ptr<osg::Image> ComposePicture(const std::vector<PlacedPicture>& parts, int width, int height);

/// `picture` at another size: each pixel is the mean of the source pixels under it, so that thin lines don't vanish.
osg::ref_ptr<osg::Image> ScalePicture(const osg::Image& picture, int width, int height);

/// All pictures in rows of `columns`, each as wide as `cellWidth` pixels (the height follows its own proportions),
/// with small gaps between. Pictures are 8-bit RGB; a null one leaves its cell empty. Null without any picture.
osg::ref_ptr<osg::Image> ComposeContactSheet(const std::vector<osg::ref_ptr<osg::Image>>& pictures, int columns,
                                             int cellWidth);

} // namespace hosts

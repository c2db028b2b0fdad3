#pragma once

#include <map>
#include <string>
#include <tuple>
#include <utility>

#include <osg/Image>
#include <osg/ref_ptr>
#include <osg/StateSet>
#include <osg/Texture2D>

class ReadContext;

/// Makes the state sets that drawables get in place of those of the stock reader.
///
/// What a body relies on stands on every one: a material, textures with the main one in unit 0, no setting of its own
/// for what bodies, lights and views decide (light model, shade model, polygon mode, depth test).
class StateBuilder
{
public:
    static constexpr unsigned maxUnits = 8;

    StateBuilder(ReadContext& context, unsigned mainTextureUnit);

    /// The state of `inner` below that of `outer`; either may be null.
    osg::ref_ptr<osg::StateSet> Merge(osg::StateSet* outer, osg::StateSet* inner);

    /// The state set for a drawable with the state `source`, which may be null. The same arguments give the same one.
    osg::ref_ptr<osg::StateSet> Make(osg::StateSet* source, bool hasColours, bool twoSided);

    /// The unit whose texture coordinates in the stock reader's geometry belong to `unit`.
    unsigned SourceUnit(unsigned unit) const;

    /// A texture as this reader makes them, from the file `path`; null after a warning when it can't be read.
    osg::ref_ptr<osg::Texture2D> LoadTexture(const std::string& path);

private:
    osg::ref_ptr<osg::Image> TakeImage(osg::Image* image);
    void Finish(osg::Texture2D& texture) const;
    void TakeMaterial(osg::StateSet& target, const osg::StateSet* source, bool hasColours) const;
    void TakeTextures(osg::StateSet& target, const osg::StateSet& source);
    static void TakeBlending(osg::StateSet& target, const osg::StateSet* source);

    using MergeKey = std::pair<osg::ref_ptr<osg::StateSet>, osg::ref_ptr<osg::StateSet>>;
    using MakeKey = std::tuple<osg::ref_ptr<osg::StateSet>, bool, bool>;

    ReadContext& context;
    unsigned mainUnit;
    std::map<MergeKey, osg::ref_ptr<osg::StateSet>> merged;
    std::map<MakeKey, osg::ref_ptr<osg::StateSet>> made;
    std::map<std::string, osg::ref_ptr<osg::Image>> images;         ///< by file name
    std::map<osg::Texture*, osg::ref_ptr<osg::Texture2D>> textures; ///< the stock reader's -> ours
};

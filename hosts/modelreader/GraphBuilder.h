#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <tuple>

#include <osg/Geode>
#include <osg/Group>
#include <osg/ref_ptr>

class ReadContext;
class StateBuilder;

/// Builds the model's graph anew from what the stock reader made, out of known kinds of nodes only: groups, matrix
/// transforms, switches, levels of detail, and geodes with checked geometries.
///
/// State ends up on the drawables. Every geode has a name: its own or that of the nearest named node above, since roads
/// are told by the names of their geodes. Nodes used several times stay shared where state and name allow it.
class GraphBuilder
{
public:
    GraphBuilder(ReadContext& context, StateBuilder& states);

    /// The graph below `root`; with `hasTurnedRoot`, without the transform that `root` itself is.
    /// Throws `std::runtime_error` when it is too deep or too large.
    osg::ref_ptr<osg::Group> Build(osg::Node& root, bool hasTurnedRoot);

private:
    /// What a node gets from those above it.
    struct Inherited
    {
        osg::ref_ptr<osg::StateSet> state;
        std::string name;
        bool twoSided = false;
        bool mirrored = false; ///< by an odd number of mirroring transforms
    };
    using Key = std::tuple<const osg::Node*, const osg::StateSet*, std::string, bool, bool>;
    struct Built
    {
        osg::ref_ptr<osg::Node> node;
        std::uint64_t paths = 0; ///< nodes below, those used twice counted twice
    };

    Built BuildNode(osg::Node& source, const Inherited& above, int depth);
    osg::ref_ptr<osg::Node> BuildGeode(osg::Geode& source, const Inherited& inherited);
    void AddDrawable(osg::Geode& geode, osg::Drawable* drawable, const Inherited& inherited);

    ReadContext& context;
    StateBuilder& states;
    std::map<Key, Built> known;
};

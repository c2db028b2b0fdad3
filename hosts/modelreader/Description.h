#pragma once

#include <map>
#include <string>
#include <vector>

#include <osg/Group>

class ReadContext;
class StateBuilder;

/// The file `Imported.xml` beside a model, and what of it concerns the reader.
///
/// Its text goes to the program as it stands. The reader itself takes the attributes `shader:NAME`, the shader of the
/// surfaces called NAME, and `texture:UNIT:NAME`, a texture in one of the units 1 to 7 of the surfaces called NAME. A
/// surface is called by its material or its geode; "*" means all. Case doesn't matter.
class Description
{
public:
    /// Reads the file, if there is one, and puts its text into the report.
    explicit Description(ReadContext& context);

    /// Puts the wanted textures on the drawables below `graph`.
    void AddTextures(osg::Group& graph, StateBuilder& states) const;

    /// Gives tangents and binormals to the geometries that a shader is wanted for: all of a road, or those of
    /// `shader:NAME`. Then takes down the wishes by number of the drawable.
    void AddShaders(osg::Group& graph) const;

private:
    struct Wish
    {
        std::string surface;
        unsigned unit = 0;
        std::string value;
    };

    static const std::string* Match(const std::vector<Wish>& wishes, unsigned unit, const std::string& material,
                                    const std::string& geode);

    ReadContext& context;
    std::vector<Wish> shaders;
    std::vector<Wish> textures;
    bool isRoad = false;
};

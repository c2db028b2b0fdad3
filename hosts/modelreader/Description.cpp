#include "Description.h"

#include <algorithm>
#include <fstream>
#include <functional>
#include <iterator>
#include <set>

#include <osg/Geode>
#include <osg/Geometry>
#include <osg/NodeVisitor>
#include <osgUtil/TangentSpaceGenerator>
#include <pugixml.hpp>

#include "base/Numbers.h"
#include "base/Text.h"
#include "Preparation.h"
#include "StateBuilder.h"

namespace
{

constexpr const char* fileName = "Imported.xml";
constexpr std::size_t maxText = std::size_t{16} << 20;
constexpr unsigned tangentLocation = 6;  ///< "Tangent" of the shaders
constexpr unsigned binormalLocation = 7; ///< "Binormal"

/// The three that make a model a road; a road's shader reads tangents everywhere.
const char* const roadAttributes[] = {"basetexture", "decalMap", "batterTexture"};

bool IsSame(const std::string& a, const std::string& b)
{
    return base::EqualsNoCase(base::Wide(a), base::Wide(b));
}

class GeometryVisitor : public osg::NodeVisitor
{
public:
    using Action = std::function<void(osg::Geode&, osg::Geometry&)>;

    explicit GeometryVisitor(Action what) : osg::NodeVisitor(TRAVERSE_ALL_CHILDREN), action(std::move(what)) {}

    /// Each geometry once, in the order in which drawables are numbered.
    void apply(osg::Geode& geode) override
    {
        for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
            if (osg::Geometry* geometry = geode.getDrawable(i)->asGeometry(); seen.insert(geometry).second)
                action(geode, *geometry);
    }

private:
    Action action;
    std::set<const osg::Geometry*> seen;
};

void AddTangents(osg::Geometry& geometry)
{
    if (!geometry.getTexCoordArray(0) || !geometry.getNormalArray() ||
        geometry.getNormalArray()->getBinding() != osg::Array::BIND_PER_VERTEX)
        return;
    osg::ref_ptr<osgUtil::TangentSpaceGenerator> generator = new osgUtil::TangentSpaceGenerator;
    generator->generate(&geometry, 0);
    const std::pair<unsigned, osg::Array*> arrays[] = {{tangentLocation, generator->getTangentArray()},
                                                       {binormalLocation, generator->getBinormalArray()}};
    for (const auto& [location, array] : arrays)
        if (array && array->getNumElements() == geometry.getVertexArray()->getNumElements())
            geometry.setVertexAttribArray(location, array, osg::Array::BIND_PER_VERTEX);
}

} // namespace

Description::Description(ReadContext& readContext) : context(readContext)
{
    const std::string path = context.folder + "/" + fileName;
    context.NoteFile(path);
    std::ifstream file(path, std::ios::binary);
    if (!file)
        return;
    std::string text{std::istreambuf_iterator<char>(file), {}};
    if (text.size() > maxText)
    {
        context.Warn("its description is larger than it can be");
        return;
    }

    pugi::xml_document document;
    if (const auto parsed = document.load_buffer(text.data(), text.size(), pugi::parse_default | pugi::parse_fragment);
        !parsed)
        context.Warn(std::string("its description is no well-formed XML (") + parsed.description() + ")");

    std::set<std::string> names;
    for (const pugi::xpath_node& found : document.select_nodes("//*[local-name()='Attribute']"))
    {
        const std::string name = found.node().attribute("name").value();
        const std::string value(base::Trim(found.node().select_node("*[local-name()='value']").node().child_value()));
        names.insert(name);
        if (name.starts_with("shader:"))
            shaders.push_back({name.substr(7), 0, value});
        else if (name.starts_with("texture:"))
        {
            const std::size_t colon = name.find(':', 8);
            const auto unit = base::ParseInteger(name.substr(8, colon == std::string::npos ? colon : colon - 8));
            if (colon == std::string::npos || !unit || *unit < 1 || *unit >= std::int64_t{StateBuilder::maxUnits})
                context.Warn("its description asks for \"" + name + "\"; the form is texture:UNIT:NAME, with 1 to 7");
            else
                textures.push_back({name.substr(colon + 1), static_cast<unsigned>(*unit), value});
        }
    }
    isRoad = std::all_of(std::begin(roadAttributes), std::end(roadAttributes),
                         [&](const char* name) { return names.contains(name); });
    context.report.xmlAttributes = std::move(text);
}

const std::string* Description::Match(const std::vector<Wish>& wishes, unsigned unit, const std::string& material,
                                      const std::string& geode)
{
    const Wish* general = nullptr;
    for (const Wish& wish : wishes)
    {
        if (wish.unit != unit)
            continue;
        if (IsSame(wish.surface, material) || IsSame(wish.surface, geode))
            return &wish.value;
        if (wish.surface == "*")
            general = &wish;
    }
    return general ? &general->value : nullptr;
}

void Description::AddTextures(osg::Group& graph, StateBuilder& states) const
{
    if (textures.empty())
        return;
    std::map<std::string, osg::ref_ptr<osg::Texture2D>> loaded;
    const auto load = [&](const std::string& name)
    {
        if (const auto at = loaded.find(name); at != loaded.end())
            return at->second.get();
        const std::string path = context.Find(name, "texture");
        return (loaded[name] = path.empty() ? nullptr : states.LoadTexture(path)).get();
    };
    GeometryVisitor visitor(
        [&](const osg::Geode& geode, osg::Geometry& geometry)
        {
            osg::ref_ptr<osg::StateSet> own;
            for (unsigned unit = 1; unit < StateBuilder::maxUnits; ++unit)
            {
                const osg::StateSet& shared = *geometry.getStateSet();
                const std::string* name = Match(textures, unit, shared.getName(), geode.getName());
                osg::Texture2D* texture = name ? load(*name) : nullptr;
                if (!texture)
                    continue;
                if (!own) // the state set may be shared with a geode of another name
                    own = new osg::StateSet(shared);
                // Not switched on: only a shader reads it, and without one it must not be blended over the main
                // texture.
                own->setTextureAttribute(unit, texture);
            }
            if (own)
                geometry.setStateSet(own);
        });
    graph.accept(visitor);
}

void Description::AddShaders(osg::Group& graph) const
{
    if (shaders.empty() && !isRoad)
        return;
    std::uint32_t number = 0;
    std::map<std::pair<osg::ref_ptr<osg::StateSet>, std::string>, osg::ref_ptr<osg::StateSet>> own;
    GeometryVisitor visitor(
        [&](const osg::Geode& geode, osg::Geometry& geometry)
        {
            const osg::ref_ptr<osg::StateSet> shared = geometry.getStateSet();
            const std::string* shader = Match(shaders, 0, shared->getName(), geode.getName());
            if (shader || isRoad)
                AddTangents(geometry);
            if (shader && context.request.IsOn("glidePanelAssignsShaders", false))
            {
                // The program will stand on the state set, which others that don't want it may share.
                osg::ref_ptr<osg::StateSet>& copy = own[{shared, *shader}];
                if (!copy)
                    copy = new osg::StateSet(*shared);
                geometry.setStateSet(copy);
                context.report.shaders[number] = *shader;
            }
            ++number;
        });
    graph.accept(visitor);
}

#include "ColladaText.h"

#include <filesystem>
#include <map>
#include <set>
#include <sstream>
#include <stdexcept>
#include <vector>

#include <pugixml.hpp>

#include "base/Numbers.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "Preparation.h"

namespace
{

constexpr int deepestElement = 300;
constexpr std::uint64_t maxNodes = 1000000;

/// Everything of the file by name, found in one walk that doesn't recurse.
class Elements : public pugi::xml_tree_walker
{
public:
    bool for_each(pugi::xml_node& element) override
    {
        if (depth() > deepestElement)
            throw std::runtime_error("its elements are nested too deeply");
        if (element.type() == pugi::node_element)
        {
            all.push_back(element);
            byName[element.name()].push_back(element);
        }
        return true;
    }

    const std::vector<pugi::xml_node>& Named(const std::string& name) { return byName[name]; }

    /// Removes elements, inner ones before those around them, so that no handle is used after its element has gone.
    void Remove(const std::vector<pugi::xml_node>& elements)
    {
        const std::set<pugi::xml_node> doomed(elements.begin(), elements.end());
        for (auto element = all.rbegin(); element != all.rend(); ++element)
            if (doomed.contains(*element))
                element->parent().remove_child(*element);
        all.clear();
        byName.clear();
    }

private:
    std::vector<pugi::xml_node> all; ///< in the order of the file
    std::map<std::string, std::vector<pugi::xml_node>> byName;
};

std::string UriOf(const std::string& path)
{
    static const char* const plain = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-._~/";
    static const char* const digits = "0123456789ABCDEF";
    std::string uri = "file://";
    for (const char c : path)
    {
        const auto byte = static_cast<unsigned char>(c);
        if (std::string_view(plain).find(c) != std::string_view::npos)
            uri += c;
        else
            (uri += '%').append({digits[byte >> 4], digits[byte & 15]});
    }
    return uri;
}

/// How many nodes a scene has once every instance stands for itself.
class InstanceCounter
{
public:
    explicit InstanceCounter(Elements& elements)
    {
        for (const pugi::xml_node node : elements.Named("node"))
            byId.emplace(node.attribute("id").value(), node);
        for (const pugi::xml_node scene : elements.Named("visual_scene"))
            Count(scene, 0);
    }

private:
    std::uint64_t Count(pugi::xml_node node, int depth)
    {
        if (depth > deepestElement)
            throw std::runtime_error("its nodes are nested too deeply");
        if (const auto known = counts.find(node.internal_object()); known != counts.end())
            return known->second;
        if (!open.insert(node.internal_object()).second)
            throw std::runtime_error(std::string("its node \"") + node.attribute("id").value() + "\" contains itself");

        std::uint64_t count = 1;
        for (const pugi::xml_node child : node.children())
        {
            const std::string_view name = child.name();
            const std::string url = child.attribute("url").value();
            if (name == "node")
                count += Count(child, depth + 1);
            else if (name == "instance_node" && url.starts_with('#'))
                if (const auto target = byId.find(url.substr(1)); target != byId.end())
                    count += Count(target->second, depth + 1);
            if (count > maxNodes)
                throw std::runtime_error("it has more than a million nodes");
        }
        open.erase(node.internal_object());
        counts[node.internal_object()] = count;
        return count;
    }

    std::map<std::string, pugi::xml_node> byId;
    std::map<const void*, std::uint64_t> counts;
    std::set<const void*> open;
};

struct Axes
{
    const char* name;
    double rows[3][3]; ///< where x, y and z of the file point to in a y-up model
};

const Axes axes[] = {
    {"X_UP", {{0, 1, 0}, {-1, 0, 0}, {0, 0, 1}}},
    {"Y_UP", {{1, 0, 0}, {0, 1, 0}, {0, 0, 1}}},
    {"Z_UP", {{1, 0, 0}, {0, 0, -1}, {0, 1, 0}}},
};

/// Reads axes and unit, and declares the axes as those that the stock reader leaves alone.
osg::Matrixd TakeAxes(pugi::xml_node root, ReadContext& context)
{
    pugi::xml_node asset = root.child("asset");
    if (!asset)
        asset = root.prepend_child("asset");

    double meter = 1;
    if (const pugi::xml_attribute given = asset.child("unit").attribute("meter"))
    {
        const std::optional<double> value = base::ParseDouble(given.value());
        if (value && *value >= 1e-6 && *value <= 1e6)
            meter = *value;
        else
            context.Warn(std::string("its unit of \"") + given.value() + "\" metres is taken for one metre");
    }

    pugi::xml_node up = asset.child("up_axis");
    const std::string name(base::Trim(up.child_value()));
    const Axes* chosen = &axes[1];
    for (const Axes& candidate : axes)
        if (name == candidate.name)
            chosen = &candidate;
    if (!up)
        up = asset.append_child("up_axis");
    up.text().set("Z_UP");

    osg::Matrixd matrix;
    for (int row = 0; row < 3; ++row)
        for (int column = 0; column < 3; ++column)
            matrix(row, column) = chosen->rows[row][column] * meter;
    return matrix;
}

/// The children of a shading element in the order that the format demands.
const char* const shadingOrder[] = {"emission", "ambient", "diffuse", "specular", "shininess"};

pugi::xml_node InsertShading(pugi::xml_node shading, const std::string& name)
{
    pugi::xml_node before;
    for (const char* other : shadingOrder)
    {
        if (name == other)
            break;
        if (const pugi::xml_node child = shading.child(other))
            before = child;
    }
    return before ? shading.insert_child_after(name.c_str(), before) : shading.prepend_child(name.c_str());
}

std::string Colour(double r, double g, double b)
{
    return base::FormatDouble(r) + " " + base::FormatDouble(g) + " " + base::FormatDouble(b) + " 1";
}

/// Fills in what the file leaves open. A Lambert surface has no highlight by its nature.
void FillShading(pugi::xml_node shading, bool hasHighlight, const ModelRequest& request)
{
    if (const auto intensity = request.Number("useAmbientIntensity"); intensity && !shading.child("ambient"))
    {
        double rgb[3] = {1, 1, 1};
        std::istringstream given(shading.child("diffuse").child("color").child_value());
        given.imbue(std::locale::classic());
        if (double r, g, b; given >> r >> g >> b)
            rgb[0] = r, rgb[1] = g, rgb[2] = b;
        InsertShading(shading, "ambient")
            .append_child("color")
            .text()
            .set(Colour(rgb[0] * *intensity, rgb[1] * *intensity, rgb[2] * *intensity).c_str());
    }
    // By itself it counts for an opaque white, which the stock reader takes for one that is not there.
    if (const pugi::xml_node transparency = shading.child("transparency");
        transparency && !shading.child("transparent"))
    {
        pugi::xml_node transparent = shading.insert_child_before("transparent", transparency);
        transparent.append_attribute("opaque").set_value("A_ONE");
        transparent.append_child("color").text().set("1 1 1 1");
    }
    if (!hasHighlight)
        return;
    if (const auto specularity = request.Number("useSpecularity"); specularity && !shading.child("specular"))
        InsertShading(shading, "specular")
            .append_child("color")
            .text()
            .set(Colour(*specularity, *specularity, *specularity).c_str());
    if (const auto shininess = request.Number("useShininess"); shininess && !shading.child("shininess"))
        InsertShading(shading, "shininess").append_child("float").text().set(base::FormatDouble(*shininess).c_str());
}

/// What stands in another file: a part of its own when parts aren't loaded, else the same by its full path. True when
/// the element is to go.
bool TakeReference(pugi::xml_node instance, ReadContext& context)
{
    pugi::xml_attribute url = instance.attribute("url");
    const std::string text = url.value();
    const std::size_t hash = text.find('#');
    if (hash == 0 || text.empty())
        return false;
    const std::string path = context.Find(text.substr(0, hash), "part");
    if (context.request.IsOn("autoloadProxies", true) && !path.empty())
    {
        url.set_value((UriOf(path) + (hash == std::string::npos ? "" : text.substr(hash))).c_str());
        return false;
    }
    if (!path.empty())
    {
        const pugi::xml_node owner = instance.parent();
        const char* name = owner.attribute("name").value();
        context.report.parts.emplace_back(*name ? name : owner.attribute("id").value(),
                                          base::Utf8(base::InnerPath(path)));
    }
    return true;
}

} // namespace

PreparedText PrepareCollada(std::string content, ReadContext& context)
{
    pugi::xml_document document;
    const pugi::xml_parse_result parsed = document.load_buffer(content.data(), content.size());
    if (!parsed)
        throw std::runtime_error("it is no well-formed XML (" + std::string(parsed.description()) + " at byte " +
                                 std::to_string(parsed.offset) + ")");
    content = {};
    pugi::xml_node root = document.child("COLLADA");
    if (!root)
        throw std::runtime_error("it is no COLLADA file");
    if (const std::string version = root.attribute("version").value(); !version.starts_with("1.4"))
        throw std::runtime_error("it is COLLADA \"" + version + "\"; 1.4 can be read");

    Elements elements;
    document.traverse(elements);
    InstanceCounter counter(elements);

    PreparedText prepared;
    prepared.mainTextureUnit = 1;
    prepared.toModel = TakeAxes(root, context);

    std::set<std::string> used; // images of the effects; others may be missing without a loss
    for (const pugi::xml_node image : elements.Named("init_from"))
        if (std::string_view(image.parent().name()) == "surface")
            used.emplace(base::Trim(image.child_value()));
    for (pugi::xml_node image : elements.Named("init_from"))
    {
        if (std::string_view(image.parent().name()) != "image" ||
            !used.contains(image.parent().attribute("id").value()))
            continue;
        const std::string path = context.Find(std::string(base::Trim(image.child_value())), "texture");
        if (path.empty())
            continue;
        image.text().set(context.AliasOf(path).c_str());
        context.textures.insert(path);
    }
    for (const pugi::xml_node shading : elements.Named("lambert"))
        FillShading(shading, false, context.request);
    for (const char* kind : {"phong", "blinn"})
        for (const pugi::xml_node shading : elements.Named(kind))
            FillShading(shading, true, context.request);
    std::vector<pugi::xml_node> doomed;
    for (const char* kind : {"instance_node", "instance_geometry"})
        for (const pugi::xml_node instance : elements.Named(kind))
            if (TakeReference(instance, context))
                doomed.push_back(instance);
    // Lights and cameras of a modelling program would light the scene; nothing plays its animations.
    for (const char* kind : {"instance_light", "instance_camera", "library_animations", "library_animation_clips"})
        doomed.insert(doomed.end(), elements.Named(kind).begin(), elements.Named(kind).end());
    elements.Remove(doomed);

    std::ostringstream text;
    document.save(text, "", pugi::format_raw);
    prepared.text = std::move(text).str();
    return prepared;
}

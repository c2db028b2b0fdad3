#include "assets/models/ModelGraph.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <map>
#include <stdexcept>
#include <type_traits>
#include <vector>

#include <osg/AlphaFunc>
#include <osg/BlendColor>
#include <osg/BlendFunc>
#include <osg/Geode>
#include <osg/Geometry>
#include <osg/LOD>
#include <osg/Material>
#include <osg/MatrixTransform>
#include <osg/Switch>
#include <osg/TexEnv>
#include <osg/TexMat>
#include <osg/Texture2D>

#include "assets/models/GeometryCheck.h"

namespace
{

constexpr std::uint32_t nothing = 0xFFFFFFFF; ///< in place of an object's number
constexpr std::uint32_t follows = 0xFFFFFFFE; ///< the object itself comes behind; the next free number is its own

constexpr unsigned units = 8;
constexpr unsigned firstAttribute = 6; ///< tangents, binormals
constexpr unsigned lastAttribute = 7;
constexpr int maxDepth = 700;
constexpr std::uint64_t maxPaths = 4000000; ///< nodes, those used twice counted twice
constexpr int maxImageSide = 16384;
constexpr unsigned maxMipmaps = 16;
constexpr std::uint64_t maxImageBytes = std::uint64_t{1} << 31;
constexpr double farthest = 1e15;
constexpr std::size_t matrixBytes = 16 * sizeof(double);

enum class Kind : std::uint8_t
{
    group,
    transform,
    choice,
    detail,
    geode,
};

/// Settings of a state set that are on or off.
enum Flag : std::uint32_t
{
    bothSides = 1,
    unlit = 2,
    transparent = 4, ///< drawn behind the opaque
};

struct Surface
{
    osg::Vec4f ambient, diffuse, specular, emission;
    float shininess;
};
constexpr osg::Material::Face faces[] = {osg::Material::FRONT, osg::Material::BACK};

template <class Value, std::size_t count>
bool IsOneOf(Value value, const Value (&known)[count])
{
    return std::find(std::begin(known), std::end(known), value) != std::end(known);
}

constexpr GLenum pixelFormats[] = {GL_LUMINANCE, GL_ALPHA, GL_LUMINANCE_ALPHA, GL_RGB, GL_RGBA, GL_BGR,
                                   GL_BGRA,      GL_RED};
constexpr GLenum compressedFormats[] = {
    GL_COMPRESSED_RGB_S3TC_DXT1_EXT,
    GL_COMPRESSED_RGBA_S3TC_DXT1_EXT,
    GL_COMPRESSED_RGBA_S3TC_DXT3_EXT,
    GL_COMPRESSED_RGBA_S3TC_DXT5_EXT,
};
constexpr GLenum pixelTypes[] = {GL_UNSIGNED_BYTE,
                                 GL_UNSIGNED_SHORT,
                                 GL_FLOAT,
                                 GL_UNSIGNED_SHORT_5_6_5,
                                 GL_UNSIGNED_SHORT_4_4_4_4,
                                 GL_UNSIGNED_SHORT_5_5_5_1,
                                 GL_UNSIGNED_SHORT_1_5_5_5_REV,
                                 GL_UNSIGNED_SHORT_4_4_4_4_REV};
constexpr unsigned packings[] = {1, 2, 4, 8};
constexpr GLint wraps[] = {GL_REPEAT, GL_CLAMP, GL_CLAMP_TO_EDGE, GL_CLAMP_TO_BORDER, GL_MIRRORED_REPEAT};
constexpr GLenum blendFactors[] = {GL_ZERO,
                                   GL_ONE,
                                   GL_SRC_COLOR,
                                   GL_ONE_MINUS_SRC_COLOR,
                                   GL_DST_COLOR,
                                   GL_ONE_MINUS_DST_COLOR,
                                   GL_SRC_ALPHA,
                                   GL_ONE_MINUS_SRC_ALPHA,
                                   GL_DST_ALPHA,
                                   GL_ONE_MINUS_DST_ALPHA,
                                   GL_SRC_ALPHA_SATURATE,
                                   GL_CONSTANT_COLOR,
                                   GL_ONE_MINUS_CONSTANT_COLOR,
                                   GL_CONSTANT_ALPHA,
                                   GL_ONE_MINUS_CONSTANT_ALPHA};
constexpr GLint textureModes[] = {GL_MODULATE, GL_DECAL, GL_BLEND, GL_REPLACE, GL_ADD};

/// Arrays by what they hold: a type, how many numbers an element has, and how to make one.
struct ArrayKind
{
    osg::Array::Type type;
    std::size_t elementSize;
    osg::Array* (*make)(std::size_t count);
};
template <class Array>
osg::Array* MakeArray(std::size_t count)
{
    return new Array(static_cast<unsigned>(count));
}
constexpr ArrayKind arrayKinds[] = {
    {osg::Array::Vec2ArrayType, sizeof(osg::Vec2), MakeArray<osg::Vec2Array>},
    {osg::Array::Vec3ArrayType, sizeof(osg::Vec3), MakeArray<osg::Vec3Array>},
    {osg::Array::Vec4ArrayType, sizeof(osg::Vec4), MakeArray<osg::Vec4Array>},
    {osg::Array::Vec4ubArrayType, sizeof(osg::Vec4ub), MakeArray<osg::Vec4ubArray>},
};
constexpr osg::Array::Binding bindings[] = {osg::Array::BIND_OVERALL, osg::Array::BIND_PER_PRIMITIVE_SET,
                                            osg::Array::BIND_PER_VERTEX};

/// Bytes of one level of an image, worked out wider than the library does it: its 32 bits overflow.
std::uint64_t LevelBytes(const osg::Image& image, int level)
{
    const auto side = [level](int whole) { return static_cast<std::uint64_t>(std::max(whole >> level, 1)); };
    if (IsOneOf<GLenum>(image.getPixelFormat(), compressedFormats))
    {
        const bool small =
            image.getPixelFormat() == compressedFormats[0] || image.getPixelFormat() == compressedFormats[1];
        return (side(image.s()) + 3) / 4 * ((side(image.t()) + 3) / 4) * (small ? 8 : 16);
    }
    return std::uint64_t{osg::Image::computeRowWidthInBytes(static_cast<int>(side(image.s())), image.getPixelFormat(),
                                                            image.getDataType(),
                                                            static_cast<int>(image.getPacking()))} *
           side(image.t());
}

/// The bytes that all levels together reach to; 0 when a level lies before the one above it.
std::uint64_t ImageBytes(const osg::Image& image)
{
    std::uint64_t end = LevelBytes(image, 0);
    for (unsigned level = 1; level < image.getNumMipmapLevels(); ++level)
    {
        const std::uint64_t begin = image.getMipmapOffset(level);
        if (begin < end)
            return 0;
        end = begin + LevelBytes(image, static_cast<int>(level));
    }
    return end;
}

bool HasKnownForm(const osg::Image& image)
{
    const bool compressed = IsOneOf<GLenum>(image.getPixelFormat(), compressedFormats);
    return image.s() > 0 && image.t() > 0 && image.s() <= maxImageSide && image.t() <= maxImageSide && image.r() == 1 &&
           (compressed || IsOneOf<GLenum>(image.getPixelFormat(), pixelFormats)) &&
           IsOneOf<GLenum>(image.getDataType(), pixelTypes) && IsOneOf<unsigned>(image.getPacking(), packings) &&
           image.getNumMipmapLevels() <= maxMipmaps;
}

/// What a texture is stored as in graphics memory: as the picture is.
GLint InternalFormat(const osg::Image& image)
{
    const GLint given = image.getInternalTextureFormat();
    return !IsOneOf<GLenum>(image.getPixelFormat(), compressedFormats) && given >= 1 && given <= 4
               ? given
               : static_cast<GLint>(image.getPixelFormat());
}

class Encoder
{
public:
    std::string Run(const osg::Group& graph)
    {
        PutNode(&graph);
        return std::move(out);
    }

private:
    template <class Value>
    void Put(const Value& value)
    {
        static_assert(std::is_trivially_copyable_v<Value>);
        out.append(reinterpret_cast<const char*>(&value), sizeof value);
    }

    void PutCount(std::size_t count) { Put(static_cast<std::uint32_t>(count)); }

    void PutBlock(const void* data, std::size_t size)
    {
        Put(static_cast<std::uint64_t>(size));
        out.append(static_cast<const char*>(data), size);
    }

    void PutText(const std::string& text) { PutBlock(text.data(), text.size()); }

    template <class Object, class Write>
    void PutShared(std::map<const Object*, std::uint32_t>& known, const Object* object, Write write)
    {
        if (!object)
            return Put(nothing);
        if (const auto at = known.find(object); at != known.end())
            return Put(at->second);
        Put(follows);
        write(*object);
        known.emplace(object, static_cast<std::uint32_t>(known.size()));
    }

    void PutNode(const osg::Node* given)
    {
        PutShared(nodes, given,
                  [this](const osg::Node& node)
                  {
                      const Kind kind = KindOf(node);
                      Put(kind);
                      PutText(node.getName());
                      Put(static_cast<std::uint8_t>(node.getDataVariance()));
                      if (const auto* transform = dynamic_cast<const osg::MatrixTransform*>(&node))
                          PutBlock(transform->getMatrix().ptr(), matrixBytes);
                      const osg::Group& group = *node.asGroup();
                      PutCount(group.getNumChildren());
                      for (unsigned i = 0; i < group.getNumChildren(); ++i)
                          kind == Kind::geode ? PutGeometry(group.getChild(i)->asGeometry())
                                              : PutNode(group.getChild(i));
                      if (const osg::Switch* choice = node.asSwitch())
                          for (unsigned i = 0; i < group.getNumChildren(); ++i)
                              Put(static_cast<std::uint8_t>(choice->getValue(i)));
                      if (kind == Kind::detail)
                          PutDetail(static_cast<const osg::LOD&>(node));
                  });
    }

    static Kind KindOf(const osg::Node& node)
    {
        return node.asGeode()                         ? Kind::geode
               : node.asSwitch()                      ? Kind::choice
               : node.asTransform()                   ? Kind::transform
               : dynamic_cast<const osg::LOD*>(&node) ? Kind::detail
                                                      : Kind::group;
    }

    void PutDetail(const osg::LOD& lod)
    {
        Put(static_cast<std::uint8_t>(lod.getCenterMode()));
        Put(static_cast<std::uint8_t>(lod.getRangeMode()));
        Put(osg::Vec3d(lod.getCenter()));
        Put(double{lod.getRadius()});
        for (unsigned i = 0; i < lod.getNumChildren(); ++i)
        {
            Put(i < lod.getNumRanges() ? lod.getMinRange(i) : 0.0f);
            Put(i < lod.getNumRanges() ? lod.getMaxRange(i) : 0.0f);
        }
    }

    void PutGeometry(const osg::Geometry* given)
    {
        PutShared(geometries, given,
                  [this](const osg::Geometry& geometry)
                  {
                      PutText(geometry.getName());
                      Put(static_cast<std::uint8_t>(geometry.getDataVariance()));
                      PutState(geometry.getStateSet());
                      PutArray(geometry.getVertexArray());
                      PutArray(geometry.getNormalArray());
                      PutArray(geometry.getColorArray());
                      for (unsigned unit = 0; unit < units; ++unit)
                          PutArray(geometry.getTexCoordArray(unit));
                      for (unsigned i = firstAttribute; i <= lastAttribute; ++i)
                          PutArray(geometry.getVertexAttribArray(i));
                      PutCount(geometry.getNumPrimitiveSets());
                      for (unsigned i = 0; i < geometry.getNumPrimitiveSets(); ++i)
                          PutPrimitives(*geometry.getPrimitiveSet(i));
                  });
    }

    void PutArray(const osg::Array* given)
    {
        PutShared(arrays, given,
                  [this](const osg::Array& array)
                  {
                      Put(static_cast<std::uint32_t>(array.getType()));
                      Put(static_cast<std::uint8_t>(array.getBinding()));
                      Put(static_cast<std::uint8_t>(array.getNormalize()));
                      PutBlock(array.getDataPointer(), array.getTotalDataSize());
                  });
    }

    void PutPrimitives(const osg::PrimitiveSet& set)
    {
        Put(static_cast<std::uint32_t>(set.getType()));
        Put(static_cast<std::uint32_t>(set.getMode()));
        if (const auto* range = dynamic_cast<const osg::DrawArrays*>(&set))
        {
            Put(range->getFirst());
            Put(range->getCount());
            return;
        }
        if (const auto* lengths = dynamic_cast<const osg::DrawArrayLengths*>(&set))
        {
            Put(lengths->getFirst());
            PutBlock(&lengths->front(), lengths->size() * sizeof(GLint));
            return;
        }
        PutBlock(set.getDataPointer(), set.getTotalDataSize());
    }

    void PutState(const osg::StateSet* given)
    {
        PutShared(
            states, given,
            [this](const osg::StateSet& state)
            {
                PutText(state.getName());
                Put(std::uint32_t{(state.getMode(GL_CULL_FACE) == osg::StateAttribute::OFF ? bothSides : 0u) |
                                  (state.getMode(GL_LIGHTING) == osg::StateAttribute::OFF ? unlit : 0u) |
                                  (state.getRenderingHint() == osg::StateSet::TRANSPARENT_BIN ? transparent : 0u)});
                PutMaterial(Of<osg::Material>(state, osg::StateAttribute::MATERIAL));
                PutBlending(state);
                for (unsigned unit = 0; unit < units; ++unit)
                    PutUnit(state, unit);
            });
    }

    template <class Attribute>
    static const Attribute* Of(const osg::StateSet& state, osg::StateAttribute::Type type)
    {
        return dynamic_cast<const Attribute*>(state.getAttribute(type));
    }

    void PutMaterial(const osg::Material* material)
    {
        Put(static_cast<std::uint8_t>(material != nullptr));
        if (!material)
            return;
        Put(static_cast<std::uint32_t>(material->getColorMode()));
        for (const osg::Material::Face face : faces)
            Put(Surface{material->getAmbient(face), material->getDiffuse(face), material->getSpecular(face),
                        material->getEmission(face), material->getShininess(face)});
    }

    void PutBlending(const osg::StateSet& state)
    {
        const auto* function = Of<osg::BlendFunc>(state, osg::StateAttribute::BLENDFUNC);
        Put(static_cast<std::uint8_t>(function != nullptr));
        if (function)
            for (const GLenum factor : {function->getSource(), function->getDestination(), function->getSourceAlpha(),
                                        function->getDestinationAlpha()})
                Put(static_cast<std::uint32_t>(factor));
        const auto* colour = Of<osg::BlendColor>(state, osg::StateAttribute::BLENDCOLOR);
        Put(static_cast<std::uint8_t>(colour != nullptr));
        if (colour)
            Put(osg::Vec4f(colour->getConstantColor()));
        const auto* alpha = Of<osg::AlphaFunc>(state, osg::StateAttribute::ALPHAFUNC);
        Put(static_cast<std::uint8_t>(alpha != nullptr));
        if (alpha)
        {
            Put(static_cast<std::uint32_t>(alpha->getFunction()));
            Put(alpha->getReferenceValue());
        }
    }

    void PutUnit(const osg::StateSet& state, unsigned unit)
    {
        const auto of = [&](osg::StateAttribute::Type type) { return state.getTextureAttribute(unit, type); };
        const auto* texture = dynamic_cast<const osg::Texture2D*>(of(osg::StateAttribute::TEXTURE));
        PutTexture(texture && texture->getImage() && IsKnownImage(*texture->getImage()) ? texture : nullptr);
        Put(static_cast<std::uint8_t>((state.getTextureMode(unit, GL_TEXTURE_2D) & osg::StateAttribute::ON) != 0));
        const auto* mode = dynamic_cast<const osg::TexEnv*>(of(osg::StateAttribute::TEXENV));
        Put(static_cast<std::uint8_t>(mode != nullptr));
        if (mode)
        {
            Put(static_cast<std::uint32_t>(mode->getMode()));
            Put(mode->getColor());
        }
        const auto* matrix = dynamic_cast<const osg::TexMat*>(of(osg::StateAttribute::TEXMAT));
        Put(static_cast<std::uint8_t>(matrix != nullptr));
        if (matrix)
            PutBlock(matrix->getMatrix().ptr(), matrixBytes);
    }

    void PutTexture(const osg::Texture2D* given)
    {
        PutShared(textures, given,
                  [this](const osg::Texture2D& texture)
                  {
                      Put(static_cast<std::uint32_t>(texture.getWrap(osg::Texture::WRAP_S)));
                      Put(static_cast<std::uint32_t>(texture.getWrap(osg::Texture::WRAP_T)));
                      Put(texture.getMaxAnisotropy());
                      PutImage(texture.getImage());
                  });
    }

    void PutImage(const osg::Image* given)
    {
        PutShared(images, given,
                  [this](const osg::Image& image)
                  {
                      PutText(image.getFileName());
                      Put(static_cast<std::int32_t>(image.s()));
                      Put(static_cast<std::int32_t>(image.t()));
                      Put(static_cast<std::uint32_t>(image.getPixelFormat()));
                      Put(static_cast<std::uint32_t>(image.getDataType()));
                      Put(static_cast<std::uint32_t>(image.getPacking()));
                      Put(static_cast<std::int32_t>(image.getInternalTextureFormat()));
                      Put(static_cast<std::uint8_t>(image.getOrigin()));
                      PutCount(image.getNumMipmapLevels() - 1);
                      for (unsigned level = 1; level < image.getNumMipmapLevels(); ++level)
                          Put(static_cast<std::uint32_t>(image.getMipmapOffset(level)));
                      PutBlock(image.data(), ImageBytes(image));
                  });
    }

    std::string out;
    std::map<const osg::Node*, std::uint32_t> nodes;
    std::map<const osg::Geometry*, std::uint32_t> geometries;
    std::map<const osg::Array*, std::uint32_t> arrays;
    std::map<const osg::StateSet*, std::uint32_t> states;
    std::map<const osg::Texture2D*, std::uint32_t> textures;
    std::map<const osg::Image*, std::uint32_t> images;
};

[[noreturn]] void Refuse(const char* what)
{
    throw std::runtime_error(std::string("the graph that its reader handed back has ") + what);
}

class Decoder
{
public:
    explicit Decoder(std::string_view bytes) : rest(bytes) {}

    osg::ref_ptr<osg::Group> Run()
    {
        const osg::ref_ptr<osg::Node> root = TakeNode(0).node;
        if (!root || !root->asGroup() || !rest.empty())
            Refuse("no root, or something behind its end");
        return root->asGroup();
    }

private:
    struct Built
    {
        osg::ref_ptr<osg::Node> node;
        std::uint64_t paths = 0;
    };

    std::string_view TakeBytes(std::uint64_t size)
    {
        if (size > rest.size())
            Refuse("an end in its middle");
        const std::string_view taken = rest.substr(0, static_cast<std::size_t>(size));
        rest.remove_prefix(taken.size());
        return taken;
    }

    template <class Value>
    Value Take()
    {
        static_assert(std::is_trivially_copyable_v<Value>);
        Value value;
        std::memcpy(static_cast<void*>(&value), TakeBytes(sizeof value).data(), sizeof value);
        return value;
    }

    std::string_view TakeBlock() { return TakeBytes(Take<std::uint64_t>()); }
    std::string TakeText() { return std::string(TakeBlock()); }
    bool TakeBool() { return Take<std::uint8_t>() != 0; }

    /// A number of things that have at least a byte each.
    std::uint32_t TakeCount()
    {
        const auto count = Take<std::uint32_t>();
        if (count > rest.size())
            Refuse("a count beyond its end");
        return count;
    }

    float TakeNumber()
    {
        const auto number = Take<float>();
        return std::fabs(number) <= farthest ? number : 0.0f;
    }

    osg::Vec4f TakeColour()
    {
        osg::Vec4f colour;
        for (int i = 0; i < 4; ++i)
            colour[i] = TakeNumber();
        return colour;
    }

    osg::Matrixd TakeMatrix()
    {
        const std::string_view data = TakeBlock();
        if (data.size() != matrixBytes)
            Refuse("a matrix of another size");
        osg::Matrixd matrix;
        std::memcpy(matrix.ptr(), data.data(), matrixBytes);
        for (int i = 0; i < 16; ++i)
            if (!(std::fabs(matrix.ptr()[i]) <= farthest))
                Refuse("a matrix whose numbers are none");
        return matrix;
    }

    template <class Value, std::size_t count>
    Value TakeOneOf(const Value (&known)[count])
    {
        const auto value = static_cast<Value>(Take<std::uint32_t>());
        if (!IsOneOf(value, known))
            Refuse("a setting that isn't known");
        return value;
    }

    osg::Object::DataVariance TakeVariance()
    {
        const auto value = Take<std::uint8_t>();
        return value <= osg::Object::UNSPECIFIED ? static_cast<osg::Object::DataVariance>(value)
                                                 : osg::Object::UNSPECIFIED;
    }

    template <class Object, class Read>
    Object TakeShared(std::vector<Object>& known, Read read)
    {
        const auto number = Take<std::uint32_t>();
        if (number == nothing)
            return {};
        if (number != follows)
        {
            if (number >= known.size())
                Refuse("a number of nothing");
            return known[number];
        }
        known.push_back(read());
        return known.back();
    }

    Built TakeNode(int depth)
    {
        if (depth > maxDepth)
            Refuse("too many nodes below each other");
        return TakeShared(nodes, [this, depth] { return TakeNewNode(depth); });
    }

    Built TakeNewNode(int depth)
    {
        const auto kind = Take<Kind>();
        const std::string name = TakeText();
        const osg::Object::DataVariance variance = TakeVariance();
        osg::ref_ptr<osg::Group> group;
        switch (kind)
        {
        case Kind::group:
            group = new osg::Group;
            break;
        case Kind::transform:
            group = new osg::MatrixTransform(TakeMatrix());
            break;
        case Kind::choice:
            group = new osg::Switch;
            break;
        case Kind::detail:
            group = new osg::LOD;
            break;
        case Kind::geode:
            group = new osg::Geode;
            break;
        default:
            Refuse("a node of no kind");
        }
        group->setName(name);
        group->setDataVariance(variance);

        Built built{group, 1};
        const std::uint32_t children = TakeCount();
        for (std::uint32_t i = 0; i < children; ++i)
        {
            const Built child = kind == Kind::geode ? Built{TakeGeometry(), 1} : TakeNode(depth + 1);
            built.paths += child.paths;
            if (!child.node || built.paths > maxPaths)
                Refuse("a node that is missing, or too many");
            group->osg::Group::addChild(child.node);
        }
        if (osg::Switch* choice = group->asSwitch())
        {
            osg::Switch::ValueList values;
            for (std::uint32_t i = 0; i < children; ++i)
                values.push_back(TakeBool());
            choice->setValueList(values);
        }
        if (kind == Kind::detail)
            TakeDetail(static_cast<osg::LOD&>(*group), children);
        return built;
    }

    void TakeDetail(osg::LOD& lod, std::uint32_t children)
    {
        const bool byUser = Take<std::uint8_t>() == osg::LOD::USER_DEFINED_CENTER;
        const bool byPixels = Take<std::uint8_t>() == osg::LOD::PIXEL_SIZE_ON_SCREEN;
        const auto centre = Take<osg::Vec3d>();
        const auto radius = Take<double>();
        const double sum = centre.x() + centre.y() + centre.z() + radius;
        if (!(std::fabs(sum) <= farthest))
            Refuse("a level of detail that is nowhere");
        if (byUser)
        {
            lod.setCenter(centre);
            lod.setRadius(radius);
        }
        lod.setRangeMode(byPixels ? osg::LOD::PIXEL_SIZE_ON_SCREEN : osg::LOD::DISTANCE_FROM_EYE_POINT);
        osg::LOD::RangeList ranges;
        for (std::uint32_t i = 0; i < children; ++i)
        {
            const auto from = Take<float>();
            const auto to = Take<float>(); // infinite is usual here
            ranges.emplace_back(std::isnan(from) ? 0 : from, std::isnan(to) ? 0 : to);
        }
        lod.setRangeList(ranges);
    }

    osg::ref_ptr<osg::Geometry> TakeGeometry()
    {
        return TakeShared(geometries,
                          [this]
                          {
                              osg::ref_ptr<osg::Geometry> geometry = new osg::Geometry;
                              geometry->setName(TakeText());
                              geometry->setDataVariance(TakeVariance());
                              geometry->setStateSet(TakeState());
                              geometry->setVertexArray(TakeArray());
                              geometry->setNormalArray(TakeArray());
                              geometry->setColorArray(TakeArray());
                              for (unsigned unit = 0; unit < units; ++unit)
                                  if (const osg::ref_ptr<osg::Array> array = TakeArray())
                                      geometry->setTexCoordArray(unit, array);
                              std::vector<osg::ref_ptr<osg::Array>> attributes;
                              for (unsigned i = firstAttribute; i <= lastAttribute; ++i)
                                  attributes.push_back(TakeArray());
                              const std::uint32_t sets = TakeCount();
                              for (std::uint32_t i = 0; i < sets; ++i)
                                  geometry->addPrimitiveSet(TakePrimitives());
                              Check(*geometry, attributes);
                              return geometry;
                          });
    }

    void Check(osg::Geometry& geometry, const std::vector<osg::ref_ptr<osg::Array>>& attributes)
    {
        if (const std::string fault = CheckGeometry(geometry); !fault.empty())
            Refuse(fault.c_str());
        if (!geometry.getStateSet())
            Refuse("a shape without state");
        for (unsigned i = 0; i < attributes.size(); ++i)
            if (const osg::ref_ptr<osg::Array>& array = attributes[i])
            {
                if (array->getNumElements() != geometry.getVertexArray()->getNumElements())
                    Refuse("tangents for other vertices");
                geometry.setVertexAttribArray(firstAttribute + i, array, osg::Array::BIND_PER_VERTEX);
            }
    }

    osg::ref_ptr<osg::Array> TakeArray()
    {
        return TakeShared(
            arrays,
            [this]
            {
                const auto type = Take<std::uint32_t>();
                const auto binding = static_cast<osg::Array::Binding>(Take<std::uint8_t>());
                const bool normalize = TakeBool();
                const std::string_view data = TakeBlock();
                for (const ArrayKind& kind : arrayKinds)
                    if (type == kind.type && IsOneOf(binding, bindings) && data.size() % kind.elementSize == 0)
                    {
                        osg::ref_ptr<osg::Array> array = kind.make(data.size() / kind.elementSize);
                        if (!data.empty())
                            std::memcpy(const_cast<GLvoid*>(array->getDataPointer()), data.data(), data.size());
                        array->setBinding(binding);
                        array->setNormalize(normalize);
                        return array;
                    }
                Refuse("an array of no known kind");
            });
    }

    template <class Elements>
    osg::ref_ptr<osg::PrimitiveSet> TakeElements(GLenum mode)
    {
        const std::string_view data = TakeBlock();
        using Index = typename Elements::value_type;
        osg::ref_ptr<Elements> elements = new Elements(mode, static_cast<unsigned>(data.size() / sizeof(Index)));
        if (!elements->empty())
            std::memcpy(&elements->front(), data.data(), elements->size() * sizeof(Index));
        return elements;
    }

    osg::ref_ptr<osg::PrimitiveSet> TakePrimitives()
    {
        const auto type = Take<std::uint32_t>();
        const GLenum mode = Take<std::uint32_t>();
        switch (type)
        {
        case osg::PrimitiveSet::DrawArraysPrimitiveType:
        {
            const auto first = Take<GLint>();
            return new osg::DrawArrays(mode, first, Take<GLsizei>());
        }
        case osg::PrimitiveSet::DrawArrayLengthsPrimitiveType:
        {
            osg::ref_ptr<osg::DrawArrayLengths> lengths = new osg::DrawArrayLengths(mode, Take<GLint>());
            const std::string_view data = TakeBlock();
            lengths->resize(data.size() / sizeof(GLint));
            if (!lengths->empty())
                std::memcpy(&lengths->front(), data.data(), lengths->size() * sizeof(GLint));
            return lengths;
        }
        case osg::PrimitiveSet::DrawElementsUBytePrimitiveType:
            return TakeElements<osg::DrawElementsUByte>(mode);
        case osg::PrimitiveSet::DrawElementsUShortPrimitiveType:
            return TakeElements<osg::DrawElementsUShort>(mode);
        case osg::PrimitiveSet::DrawElementsUIntPrimitiveType:
            return TakeElements<osg::DrawElementsUInt>(mode);
        default:
            Refuse("primitives of no known kind");
        }
    }

    osg::ref_ptr<osg::StateSet> TakeState()
    {
        return TakeShared(states,
                          [this]
                          {
                              osg::ref_ptr<osg::StateSet> state = new osg::StateSet;
                              state->setName(TakeText());
                              const auto flags = Take<std::uint32_t>();
                              if (flags & bothSides)
                                  state->setMode(GL_CULL_FACE, osg::StateAttribute::OFF);
                              if (flags & unlit)
                                  state->setMode(GL_LIGHTING, osg::StateAttribute::OFF);
                              if (flags & transparent)
                                  state->setRenderingHint(osg::StateSet::TRANSPARENT_BIN);
                              TakeMaterial(*state);
                              TakeBlending(*state);
                              for (unsigned unit = 0; unit < units; ++unit)
                                  TakeUnit(*state, unit);
                              return state;
                          });
    }

    void TakeMaterial(osg::StateSet& state)
    {
        if (!TakeBool())
            return;
        osg::ref_ptr<osg::Material> material = new osg::Material;
        constexpr osg::Material::ColorMode colourModes[] = {osg::Material::OFF, osg::Material::DIFFUSE};
        material->setColorMode(TakeOneOf(colourModes));
        for (const osg::Material::Face face : faces)
        {
            material->setAmbient(face, TakeColour());
            material->setDiffuse(face, TakeColour());
            material->setSpecular(face, TakeColour());
            material->setEmission(face, TakeColour());
            material->setShininess(face, std::clamp(TakeNumber(), 0.0f, 128.0f));
        }
        state.setAttribute(material);
    }

    void TakeBlending(osg::StateSet& state)
    {
        if (TakeBool())
        {
            const GLenum source = TakeOneOf(blendFactors);
            const GLenum target = TakeOneOf(blendFactors);
            const GLenum sourceAlpha = TakeOneOf(blendFactors);
            state.setAttributeAndModes(new osg::BlendFunc(source, target, sourceAlpha, TakeOneOf(blendFactors)));
        }
        if (TakeBool())
            state.setAttributeAndModes(new osg::BlendColor(TakeColour()));
        if (TakeBool())
        {
            const auto function = Take<std::uint32_t>();
            if (function < GL_NEVER || function > GL_ALWAYS)
                Refuse("a test of alpha that isn't known");
            state.setAttributeAndModes(
                new osg::AlphaFunc(static_cast<osg::AlphaFunc::ComparisonFunction>(function), TakeNumber()));
        }
    }

    void TakeUnit(osg::StateSet& state, unsigned unit)
    {
        const osg::ref_ptr<osg::Texture2D> texture = TakeTexture();
        const bool isOn = TakeBool();
        if (texture && isOn)
            state.setTextureAttributeAndModes(unit, texture);
        else if (texture)
            state.setTextureAttribute(unit, texture);
        if (TakeBool())
        {
            osg::ref_ptr<osg::TexEnv> mode = new osg::TexEnv(static_cast<osg::TexEnv::Mode>(TakeOneOf(textureModes)));
            mode->setColor(TakeColour());
            state.setTextureAttribute(unit, mode);
        }
        if (TakeBool())
            state.setTextureAttribute(unit, new osg::TexMat(TakeMatrix()));
    }

    osg::ref_ptr<osg::Texture2D> TakeTexture()
    {
        return TakeShared(textures,
                          [this]
                          {
                              const GLint across = TakeOneOf(wraps);
                              const GLint up = TakeOneOf(wraps);
                              const float anisotropy = std::clamp(TakeNumber(), 1.0f, 16.0f);
                              osg::ref_ptr<osg::Texture2D> texture = new osg::Texture2D(TakeImage());
                              if (!texture->getImage())
                                  Refuse("a texture without a picture");
                              texture->setWrap(osg::Texture::WRAP_S, static_cast<osg::Texture::WrapMode>(across));
                              texture->setWrap(osg::Texture::WRAP_T, static_cast<osg::Texture::WrapMode>(up));
                              texture->setMaxAnisotropy(anisotropy);
                              texture->setFilter(osg::Texture::MIN_FILTER, osg::Texture::LINEAR_MIPMAP_LINEAR);
                              texture->setFilter(osg::Texture::MAG_FILTER, osg::Texture::LINEAR);
                              texture->setUnRefImageDataAfterApply(false);
                              texture->setResizeNonPowerOfTwoHint(false);
                              return texture;
                          });
    }

    osg::ref_ptr<osg::Image> TakeImage()
    {
        return TakeShared(images,
                          [this]
                          {
                              osg::ref_ptr<osg::Image> image = new osg::Image;
                              const std::string name = TakeText();
                              const auto width = Take<std::int32_t>();
                              const auto height = Take<std::int32_t>();
                              const GLenum format = Take<std::uint32_t>();
                              const GLenum type = Take<std::uint32_t>();
                              const auto packing = Take<std::uint32_t>();
                              const auto internal = Take<std::int32_t>();
                              const bool isTopFirst = Take<std::uint8_t>() == osg::Image::TOP_LEFT;
                              osg::Image::MipmapDataType mipmaps;
                              const std::uint32_t levels = TakeCount();
                              for (std::uint32_t i = 0; i < levels; ++i)
                                  mipmaps.push_back(Take<std::uint32_t>());
                              const std::string_view data = TakeBlock();

                              // Without data first, for the checks; what was handed over is copied only when it fits.
                              image->setImage(width, height, 1, internal, format, type, nullptr,
                                              osg::Image::USE_NEW_DELETE, packing <= 8 ? static_cast<int>(packing) : 0);
                              image->setMipmapLevels(mipmaps);
                              if (!HasKnownForm(*image) || data.empty() || ImageBytes(*image) != data.size() ||
                                  data.size() > maxImageBytes)
                                  Refuse("a picture that can't be");
                              auto* pixels = new unsigned char[data.size()];
                              std::memcpy(pixels, data.data(), data.size());
                              image->setImage(width, height, 1, InternalFormat(*image), format, type, pixels,
                                              osg::Image::USE_NEW_DELETE, static_cast<int>(packing));
                              image->setMipmapLevels(mipmaps);
                              image->setFileName(name);
                              image->setOrigin(isTopFirst ? osg::Image::TOP_LEFT : osg::Image::BOTTOM_LEFT);
                              image->setDataVariance(osg::Object::DYNAMIC);
                              return image;
                          });
    }

    std::string_view rest;
    std::vector<Built> nodes;
    std::vector<osg::ref_ptr<osg::Geometry>> geometries;
    std::vector<osg::ref_ptr<osg::Array>> arrays;
    std::vector<osg::ref_ptr<osg::StateSet>> states;
    std::vector<osg::ref_ptr<osg::Texture2D>> textures;
    std::vector<osg::ref_ptr<osg::Image>> images;
};

} // namespace

std::string EncodeGraph(const osg::Group& graph)
{
    return Encoder().Run(graph);
}

osg::ref_ptr<osg::Group> DecodeGraph(std::string_view bytes)
{
    return Decoder(bytes).Run();
}

bool IsKnownImage(const osg::Image& image)
{
    const std::uint64_t bytes = HasKnownForm(image) ? ImageBytes(image) : 0;
    return image.data() && image.isDataContiguous() && bytes > 0 && bytes <= maxImageBytes &&
           bytes <= image.getTotalSizeInBytesIncludingMipmaps();
}

#include "assets/models/GeometryCheck.h"

#include <cmath>

#include <osg/PrimitiveSet>
#include <osg/TriangleIndexFunctor>

namespace
{

constexpr unsigned maxVertices = 50000000;
constexpr float nearlySame = 1e-6f;    ///< square of a step of colour that no screen shows
constexpr float farthestPlace = 1e12f; ///< metres; beyond it products of coordinates overflow

template <class Vector>
bool IsSound(const Vector& value)
{
    for (int i = 0; i < Vector::num_components; ++i)
        if (!(std::fabs(value[i]) <= farthestPlace))
            return false;
    return true;
}

template <class Array>
void Mend(osg::Array* array, const typename Array::ElementDataType& instead)
{
    if (auto* typed = dynamic_cast<Array*>(array))
        for (auto& value : *typed)
            if (!IsSound(value))
                value = instead;
}

/// The kinds of arrays that are handed on.
bool IsKnownKind(const osg::Array& array)
{
    switch (array.getType())
    {
    case osg::Array::Vec2ArrayType:
    case osg::Array::Vec3ArrayType:
    case osg::Array::Vec4ArrayType:
    case osg::Array::Vec4ubArrayType:
        return true;
    default:
        return false;
    }
}

/// An array that is there for nothing, or for fewer vertices than there are, is worse than none.
bool Fits(const osg::Array* array, unsigned vertices, unsigned primitiveSets)
{
    if (!array || !IsKnownKind(*array))
        return false;
    switch (array->getBinding())
    {
    case osg::Array::BIND_PER_VERTEX:
        return array->getNumElements() == vertices;
    case osg::Array::BIND_OVERALL:
        return array->getNumElements() >= 1;
    case osg::Array::BIND_PER_PRIMITIVE_SET:
        return array->getNumElements() >= primitiveSets;
    default:
        return false;
    }
}

bool IsKnownMode(GLenum mode)
{
    return mode <= GL_POLYGON;
}

template <class Elements>
std::string CheckElements(const Elements& elements, unsigned vertices)
{
    for (const auto index : elements)
        if (static_cast<std::uint64_t>(index) >= vertices)
            return "an index of " + std::to_string(index) + " where there are " + std::to_string(vertices) +
                   " vertices";
    return {};
}

std::string CheckRange(std::int64_t first, std::int64_t count, unsigned vertices)
{
    if (first < 0 || count < 0 || first + count > std::int64_t{vertices})
        return "a range of vertices outside the " + std::to_string(vertices) + " there are";
    return {};
}

std::string CheckPrimitives(const osg::PrimitiveSet& primitives, unsigned vertices)
{
    if (!IsKnownMode(primitives.getMode()))
        return "an unknown kind of primitive";
    switch (primitives.getType())
    {
    case osg::PrimitiveSet::DrawArraysPrimitiveType:
    {
        const auto& range = static_cast<const osg::DrawArrays&>(primitives);
        return CheckRange(range.getFirst(), range.getCount(), vertices);
    }
    case osg::PrimitiveSet::DrawArrayLengthsPrimitiveType:
    {
        const auto& lengths = static_cast<const osg::DrawArrayLengths&>(primitives);
        std::int64_t total = 0;
        for (const GLint length : lengths)
        {
            if (length < 0)
                return "a negative length";
            total += length;
        }
        return CheckRange(lengths.getFirst(), total, vertices);
    }
    case osg::PrimitiveSet::DrawElementsUBytePrimitiveType:
        return CheckElements(static_cast<const osg::DrawElementsUByte&>(primitives), vertices);
    case osg::PrimitiveSet::DrawElementsUShortPrimitiveType:
        return CheckElements(static_cast<const osg::DrawElementsUShort&>(primitives), vertices);
    case osg::PrimitiveSet::DrawElementsUIntPrimitiveType:
        return CheckElements(static_cast<const osg::DrawElementsUInt&>(primitives), vertices);
    default:
        return "an unknown kind of primitive";
    }
}

std::string CheckVertices(osg::Geometry& geometry)
{
    if (const auto* wide = dynamic_cast<const osg::Vec3dArray*>(geometry.getVertexArray()))
    {
        osg::ref_ptr<osg::Vec3Array> narrow = new osg::Vec3Array(osg::Array::BIND_PER_VERTEX);
        narrow->assign(wide->begin(), wide->end());
        geometry.setVertexArray(narrow);
    }
    const auto* vertices = dynamic_cast<const osg::Vec3Array*>(geometry.getVertexArray());
    if (!vertices || vertices->empty())
        return "no vertices";
    if (vertices->size() > maxVertices)
        return "more vertices than can be";
    for (const osg::Vec3& vertex : *vertices)
        if (!IsSound(vertex))
            return "a vertex that is nowhere";
    return {};
}

} // namespace

std::string CheckGeometry(osg::Geometry& geometry)
{
    if (std::string fault = CheckVertices(geometry); !fault.empty())
        return fault;
    const unsigned vertices = geometry.getVertexArray()->getNumElements();

    for (unsigned i = geometry.getNumPrimitiveSets(); i-- > 0;)
    {
        const osg::PrimitiveSet* primitives = geometry.getPrimitiveSet(i);
        if (!primitives || primitives->getNumIndices() == 0)
            geometry.removePrimitiveSet(i);
        else if (std::string fault = CheckPrimitives(*primitives, vertices); !fault.empty())
            return fault;
        else if (primitives->getNumInstances() != 0)
            return "instanced primitives";
    }
    const unsigned primitiveSets = geometry.getNumPrimitiveSets();
    if (primitiveSets == 0)
        return "no primitives";

    Mend<osg::Vec3Array>(geometry.getNormalArray(), osg::Vec3(0, 1, 0));
    if (!Fits(geometry.getNormalArray(), vertices, primitiveSets))
        geometry.setNormalArray(nullptr);
    Mend<osg::Vec4Array>(geometry.getColorArray(), osg::Vec4(1, 1, 1, 1));
    if (!Fits(geometry.getColorArray(), vertices, primitiveSets))
        geometry.setColorArray(nullptr);
    for (unsigned unit = 0; unit < geometry.getNumTexCoordArrays(); ++unit)
    {
        Mend<osg::Vec2Array>(geometry.getTexCoordArray(unit), osg::Vec2());
        Mend<osg::Vec3Array>(geometry.getTexCoordArray(unit), osg::Vec3());
        // Taken as one for each vertex by what draws, whatever it says.
        if (!Fits(geometry.getTexCoordArray(unit), vertices, primitiveSets) ||
            geometry.getTexCoordArray(unit)->getNumElements() != vertices)
            geometry.setTexCoordArray(unit, nullptr);
    }
    geometry.setSecondaryColorArray(nullptr);
    geometry.setFogCoordArray(nullptr);
    geometry.setVertexAttribArrayList({});
    return {};
}

bool DropPlainColours(osg::Geometry& geometry, const osg::Vec4& diffuse)
{
    if (!geometry.getColorArray())
        return false;
    const auto* colours = dynamic_cast<const osg::Vec4Array*>(geometry.getColorArray());
    if (!colours)
        return true;
    for (const osg::Vec4& colour : *colours)
        if ((colour - diffuse).length2() > nearlySame)
            return true;
    geometry.setColorArray(nullptr);
    return false;
}

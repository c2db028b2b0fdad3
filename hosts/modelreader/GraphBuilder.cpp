#include "GraphBuilder.h"

#include <cstring>
#include <stdexcept>

#include <osg/Camera>
#include <osg/Geometry>
#include <osg/LOD>
#include <osg/Material>
#include <osg/MatrixTransform>
#include <osg/Switch>
#include <osg/TriangleIndexFunctor>
#include <osgUtil/SmoothingVisitor>

#include "assets/models/GeometryCheck.h"
#include "Preparation.h"
#include "StateBuilder.h"

namespace
{

constexpr int deepestNode = 600;
constexpr std::uint64_t maxPaths = 2000000;

/// The empty node of `source`'s kind, children to be added. Null for what has no place in a model.
osg::ref_ptr<osg::Group> EmptyLike(osg::Node& source)
{
    if (source.asCamera())
        return nullptr;
    if (osg::Transform* transform = source.asTransform())
    {
        osg::Matrix matrix;
        transform->computeLocalToWorldMatrix(matrix, nullptr);
        if (matrix.isNaN())
            throw std::runtime_error("it has a transform whose numbers are none");
        return matrix.isIdentity() ? new osg::Group : new osg::MatrixTransform(matrix);
    }
    if (const auto* lod = dynamic_cast<const osg::LOD*>(&source); lod && std::strcmp(lod->className(), "LOD") == 0)
    {
        osg::ref_ptr<osg::LOD> copy = new osg::LOD;
        copy->setCenterMode(lod->getCenterMode());
        copy->setCenter(lod->getCenter());
        copy->setRadius(lod->getRadius());
        copy->setRangeMode(lod->getRangeMode());
        copy->setRangeList(lod->getRangeList());
        return copy;
    }
    if (const osg::Switch* choice = source.asSwitch())
    {
        osg::ref_ptr<osg::Switch> copy = new osg::Switch;
        copy->setValueList(choice->getValueList());
        return copy;
    }
    return source.asGroup() ? new osg::Group : nullptr;
}

/// The shape of `source` and nothing else: skins and morph targets are shown as they stand, and callbacks of classes
/// that nobody here knows stay behind.
osg::ref_ptr<osg::Geometry> PlainCopy(osg::Geometry& source)
{
    if (source.containsDeprecatedData())
        source.fixDeprecatedData();
    osg::ref_ptr<osg::Geometry> geometry = new osg::Geometry;
    geometry->setStateSet(source.getStateSet());
    geometry->setVertexArray(source.getVertexArray());
    geometry->setNormalArray(source.getNormalArray());
    geometry->setColorArray(source.getColorArray());
    geometry->setTexCoordArrayList(source.getTexCoordArrayList());
    geometry->setPrimitiveSetList(source.getPrimitiveSetList());
    geometry->setDataVariance(osg::Object::STATIC);
    return geometry;
}

bool NeedsNormals(const osg::Geometry& geometry)
{
    if (geometry.getNormalArray())
        return false;
    for (unsigned i = 0; i < geometry.getNumPrimitiveSets(); ++i)
        if (geometry.getPrimitiveSet(i)->getMode() >= GL_TRIANGLES)
            return true;
    return false;
}

bool IsMirroring(const osg::Transform& transform)
{
    osg::Matrix matrix;
    transform.computeLocalToWorldMatrix(matrix, nullptr);
    const osg::Vec3d x(matrix(0, 0), matrix(0, 1), matrix(0, 2));
    const osg::Vec3d y(matrix(1, 0), matrix(1, 1), matrix(1, 2));
    const osg::Vec3d z(matrix(2, 0), matrix(2, 1), matrix(2, 2));
    return (x ^ y) * z < 0;
}

/// Triangles in the opposite sense. In a mirror they would show their backs, which aren't drawn.
void TurnRound(osg::Geometry& geometry)
{
    struct Turner
    {
        osg::ref_ptr<osg::DrawElementsUInt> triangles = new osg::DrawElementsUInt(GL_TRIANGLES);

        void operator()(unsigned a, unsigned b, unsigned c)
        {
            for (const unsigned index : {a, c, b})
                triangles->push_back(index);
        }
    };
    osg::TriangleIndexFunctor<Turner> turner;
    osg::Geometry::PrimitiveSetList sets;
    for (unsigned i = 0; i < geometry.getNumPrimitiveSets(); ++i)
    {
        osg::PrimitiveSet* set = geometry.getPrimitiveSet(i);
        if (set->getMode() >= GL_TRIANGLES)
            set->accept(turner);
        else
            sets.push_back(set);
    }
    if (!turner.triangles->empty())
        sets.push_back(turner.triangles);
    geometry.setPrimitiveSetList(sets);
}

osg::Vec4 Diffuse(const osg::StateSet* state)
{
    const auto* material =
        dynamic_cast<const osg::Material*>(state ? state->getAttribute(osg::StateAttribute::MATERIAL) : nullptr);
    return material ? material->getDiffuse(osg::Material::FRONT) : osg::Vec4(1, 1, 1, 1);
}

} // namespace

GraphBuilder::GraphBuilder(ReadContext& readContext, StateBuilder& stateBuilder)
    : context(readContext), states(stateBuilder)
{
}

osg::ref_ptr<osg::Group> GraphBuilder::Build(osg::Node& root, bool hasTurnedRoot)
{
    osg::ref_ptr<osg::Group> group = new osg::Group;
    osg::Group* turned = hasTurnedRoot && root.asTransform() ? root.asGroup() : nullptr;
    Inherited none;
    if (!turned)
    {
        if (const Built built = BuildNode(root, none, 0); built.node)
            group->addChild(built.node);
        return group;
    }
    none.state = states.Merge(nullptr, turned->getStateSet());
    for (unsigned i = 0; i < turned->getNumChildren(); ++i)
        if (const Built built = BuildNode(*turned->getChild(i), none, 0); built.node)
            group->addChild(built.node);
    return group;
}

GraphBuilder::Built GraphBuilder::BuildNode(osg::Node& source, const Inherited& above, int depth)
{
    if (depth > deepestNode)
        throw std::runtime_error("its nodes are nested too deeply");

    Inherited inherited = above;
    std::string name = source.getName();
    if (name.ends_with(twoSidedMark))
    {
        name.resize(name.size() - std::strlen(twoSidedMark));
        inherited.twoSided = true;
    }
    if (!name.empty())
        inherited.name = name;
    inherited.state = states.Merge(above.state.get(), source.getStateSet());

    if (const osg::Transform* transform = source.asTransform(); transform && IsMirroring(*transform))
        inherited.mirrored = !inherited.mirrored;

    const Key key(&source, inherited.state.get(), inherited.name, inherited.twoSided, inherited.mirrored);
    if (const auto at = known.find(key); at != known.end())
        return at->second;

    Built built{nullptr, 1};
    if (osg::Geode* geode = source.asGeode())
        built.node = BuildGeode(*geode, inherited);
    else if (osg::Drawable* drawable = source.asDrawable())
    {
        osg::ref_ptr<osg::Geode> around = new osg::Geode;
        around->setName(inherited.name);
        AddDrawable(*around, drawable, {above.state, inherited.name, inherited.twoSided, inherited.mirrored});
        if (around->getNumDrawables() > 0)
            built.node = around;
    }
    else if (osg::ref_ptr<osg::Group> group = EmptyLike(source))
    {
        const osg::Group* from = source.asGroup();
        // Ranges and values of these go by index, so a child that falls away leaves its place empty.
        const bool byIndex = group->asSwitch() || dynamic_cast<osg::LOD*>(group.get());
        auto* choice = group->asSwitch();
        const osg::Switch::ValueList values = choice ? choice->getValueList() : osg::Switch::ValueList{};
        for (unsigned i = 0; i < from->getNumChildren(); ++i)
        {
            const Built child = BuildNode(const_cast<osg::Node&>(*from->getChild(i)), inherited, depth + 1);
            built.paths += child.paths;
            if (built.paths > maxPaths)
                throw std::runtime_error("it has more than two million nodes");
            if (byIndex)
                group->osg::Group::addChild(child.node ? child.node.get() : new osg::Group);
            else if (child.node)
                group->addChild(child.node);
        }
        if (choice)
            choice->setValueList(values);
        group->setName(name);
        group->setDataVariance(osg::Object::STATIC);
        built.node = group;
    }
    known[key] = built;
    return built;
}

osg::ref_ptr<osg::Node> GraphBuilder::BuildGeode(osg::Geode& source, const Inherited& inherited)
{
    osg::ref_ptr<osg::Geode> geode = new osg::Geode;
    geode->setName(inherited.name);
    for (unsigned i = 0; i < source.getNumDrawables(); ++i)
        AddDrawable(*geode, source.getDrawable(i), inherited);
    return geode->getNumDrawables() > 0 ? geode : nullptr;
}

void GraphBuilder::AddDrawable(osg::Geode& geode, osg::Drawable* drawable, const Inherited& inherited)
{
    osg::Geometry* source = drawable ? drawable->asGeometry() : nullptr;
    if (!source)
        return;
    osg::ref_ptr<osg::Geometry> geometry = PlainCopy(*source);

    osg::Geometry::ArrayList coordinates;
    for (unsigned unit = 0; unit < StateBuilder::maxUnits; ++unit)
        coordinates.push_back(geometry->getTexCoordArray(states.SourceUnit(unit)));
    // Without a texture of its own the stock reader leaves them where the file numbers them.
    if (const unsigned main = states.SourceUnit(0); main != 0 && !coordinates.front())
        std::swap(coordinates.front(), coordinates[main]);
    while (!coordinates.empty() && !coordinates.back()) // a trailing null keeps the optimizer from merging
        coordinates.pop_back();
    geometry->setTexCoordArrayList(coordinates);

    if (const std::string fault = CheckGeometry(*geometry); !fault.empty())
    {
        // An empty shape is nothing to tell: modelling programs leave them behind.
        if (fault != "no primitives" && fault != "no vertices")
            context.Warn("the shape \"" + geode.getName() + "\" has " + fault + " and is left out");
        return;
    }
    const osg::ref_ptr<osg::StateSet> state = states.Merge(inherited.state.get(), geometry->getStateSet());
    const bool hasColours = DropPlainColours(*geometry, Diffuse(state.get()));
    if (inherited.mirrored)
        TurnRound(*geometry);
    geometry->setStateSet(states.Make(state.get(), hasColours, inherited.twoSided).get());
    if (NeedsNormals(*geometry))
        osgUtil::SmoothingVisitor::smooth(*geometry, osg::DegreesToRadians(60.0));
    geode.addDrawable(geometry);
}

#include "scene/Collectors.h"

#include <algorithm>

VtCOsgMatMapObject::VtCOsgMatMapObject(osg::Material& source)
    : material(&source),
      diffuse(source.getDiffuse(osg::Material::FRONT)),
      specular(source.getSpecular(osg::Material::FRONT)),
      ambient(source.getAmbient(osg::Material::FRONT)),
      shininess(source.getShininess(osg::Material::FRONT))
{
}

VtCOsgMatMapObject::VtCOsgMatMapObject(const VtCOsgMatMapObject& other)
    : osg::Referenced(other),
      material(other.material),
      diffuse(other.diffuse),
      specular(other.specular),
      ambient(other.ambient),
      shininess(other.shininess)
{
}

VtTMaterialMap CopyRecords(const VtTMaterialMap& source)
{
    VtTMaterialMap copy;
    for (const auto& [drawable, record] : source)
        copy.emplace_hint(copy.end(), drawable, new VtCOsgMatMapObject(*record));
    return copy;
}

void VtCOsgNodeMaterialCollector::apply(osg::Geode& geode)
{
    for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
    {
        osg::Drawable* drawable = geode.getDrawable(i);
        osg::StateSet* stateSet = drawable ? drawable->getStateSet() : nullptr;
        if (!stateSet)
            continue;
        if (auto* material = dynamic_cast<osg::Material*>(stateSet->getAttribute(osg::StateAttribute::MATERIAL)))
            materials[drawable] = new VtCOsgMatMapObject(*material);
    }
    traverse(geode);
}

void VtCOsgShaderCollector::apply(osg::Node& node)
{
    osg::StateSet* stateSet = node.getStateSet();
    auto* program =
        stateSet ? dynamic_cast<osg::Program*>(stateSet->getAttribute(osg::StateAttribute::PROGRAM)) : nullptr;
    const auto known = [&](const auto& entry) { return entry.first == stateSet; };
    if (program && std::none_of(programs.begin(), programs.end(), known))
        programs.emplace_back(stateSet, program);
    traverse(node);
}

#include "scene/ShaderCollector.h"

#include <algorithm>

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

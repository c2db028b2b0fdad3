#include "assets/TextureCollector.h"

#include <algorithm>

#include <osg/Geode>
#include <osg/StateSet>
#include <osg/Texture2D>

#include "base/Text.h"

void VtCOsgTextureCollector::apply(osg::Node& node)
{
    if (WasSeen(node))
        return;
    Examine(node.getStateSet());
    traverse(node);
}

void VtCOsgTextureCollector::apply(osg::Geode& geode)
{
    if (WasSeen(geode))
        return;
    for (unsigned i = 0; i < geode.getNumDrawables(); ++i)
        Examine(geode.getDrawable(i)->getStateSet());
}

bool VtCOsgTextureCollector::WasSeen(const osg::Node& node)
{
    return node.getNumParents() > 1 && !shared.insert(&node).second;
}

void VtCOsgTextureCollector::Examine(const osg::StateSet* state)
{
    const auto* texture = dynamic_cast<const osg::Texture2D*>(
        state ? state->getTextureAttribute(0, osg::StateAttribute::TEXTURE) : nullptr);
    if (!texture || !texture->getImage())
        return;
    std::wstring name = base::Wide(texture->getImage()->getFileName());
    if (std::find(fileNames.begin(), fileNames.end(), name) == fileNames.end())
        fileNames.push_back(std::move(name));
}

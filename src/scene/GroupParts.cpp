#include "scene/GroupParts.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "scene/ProxyFinder.h"

#include <filesystem>

std::wstring PartFile(osg::Group& node, const std::wstring& id, const std::wstring& groupFile)
{
    VtCOsgProxyFinder finder;
    node.accept(finder);
    if (finder.proxies.empty())
        return {};

    const osg::ProxyNode& proxy = *finder.proxies.back();
    for (unsigned i = 0; i < proxy.getNumChildren() && i < proxy.getNumFileNames(); ++i)
        if (base::Wide(proxy.getChild(i)->getName()) == id && !proxy.getFileName(i).empty())
        {
            const std::filesystem::path file = base::NativePath(base::Wide(proxy.getFileName(i)));
            // Plain forms compare equal, which tells a group that holds itself.
            return base::InnerPath((base::NativePath(groupFile).parent_path() / file).lexically_normal());
        }
    return {};
}

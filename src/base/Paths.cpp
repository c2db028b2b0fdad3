#include "base/Paths.h"

#include <algorithm>

#include "base/Text.h"

namespace base
{

std::filesystem::path NativePath(std::wstring_view path)
{
    std::string native = Utf8(path);
    std::replace(native.begin(), native.end(), '\\', '/');
    return native;
}

std::wstring InnerPath(const std::filesystem::path& path)
{
    std::wstring inner = Wide(path.native());
    std::replace(inner.begin(), inner.end(), L'/', L'\\');
    return inner;
}

} // namespace base

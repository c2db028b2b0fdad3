#include "scene/StoredModel.h"

#include "base/Paths.h"
#include "scene/LibraryPath.h"

#include <filesystem>
#include <system_error>

bool IsModelFile(const std::wstring& path)
{
    std::error_code failure;
    return std::filesystem::is_regular_file(base::NativePath(path), failure);
}

std::wstring FindStoredModel(const std::wstring& stored, const std::wstring& sceneFile, const host::LibraryPaths& paths)
{
    const std::wstring resolved = ResolveModelPath(stored, paths);
    if (IsModelFile(resolved))
        return resolved;

    if (const std::wstring expanded = NormalizeSeparators(ExpandLibraryTokens(stored, paths)); IsModelFile(expanded))
        return expanded;

    std::wstring_view rest = stored;
    if (rest.starts_with(L'%'))
        if (const std::size_t end = rest.find(L'%', 1); end != std::wstring_view::npos && HasLibraryToken(stored))
            rest.remove_prefix(end + 1);
    const std::wstring whole = NormalizeSeparators(rest);
    if (IsModelFile(whole) && std::filesystem::path(base::NativePath(whole)).is_absolute())
        return whole;

    const std::wstring below = whole.starts_with(L'\\') ? whole.substr(1) : whole;
    const std::wstring beside =
        base::InnerPath((base::NativePath(sceneFile).parent_path() / base::NativePath(below)).lexically_normal());
    return IsModelFile(beside) ? beside : resolved;
}

#include "scene/LibraryPath.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "host/LibraryPaths.h"

#include <algorithm>
#include <filesystem>
#include <vector>

namespace
{

constexpr std::wstring_view productToken = L"%Vantor_Objects%";
constexpr std::wstring_view customerToken = L"%Customer_Objects%";
constexpr std::wstring_view presentFolder = L"\\advanced";
constexpr std::wstring_view oldFolder = L"\\old(prior gld 2.3)";

// Folders that mark a path as lying in the product's library, on whatever machine it was stored.
constexpr std::wstring_view productFolders[] = {
    L"vantor objects\\advanced",
    L"vantor objects\\old(prior gld 2.3)",
    L"vantor_objects",
};
constexpr std::wstring_view customerFolder = L"customer_objects";

/// Whether `path` is `root` or lies below it; both in lower case. An empty root holds nothing.
bool LiesIn(std::wstring_view path, std::wstring_view root)
{
    return !root.empty() && path.starts_with(root) && (path.size() == root.size() || path[root.size()] == L'\\');
}

bool IsAbsolute(std::wstring_view path)
{
    return path.starts_with(L'\\') || (path.size() > 1 && path[1] == L':');
}

// By the text alone: relative paths start at the present folder, "." and ".." are resolved.
std::wstring FullPath(const std::wstring& path)
{
    if (path.empty())
        return path;
    std::wstring full = path;
    if (!IsAbsolute(path))
    {
        std::error_code unknown;
        full = base::InnerPath(std::filesystem::current_path(unknown)) + L'\\' + path;
    }
    full = NormalizeSeparators(full);

    std::vector<std::wstring> kept;
    for (const std::wstring& folder : base::Split(full, L'\\'))
        if (folder == L"..")
        {
            if (!kept.empty() && !kept.back().empty() && kept.back().back() != L':')
                kept.pop_back();
        }
        else if (folder != L"." && (kept.empty() || !folder.empty()))
            kept.push_back(folder);

    std::wstring result;
    for (std::size_t i = 0; i < kept.size(); ++i)
        (i == 0 ? result : result += L'\\') += kept[i];
    return result;
}

/// The part of `path` that stands for a library's root, and which library it is.
struct Root
{
    bool inProduct = false;
    std::size_t end = 0; ///< behind the root and its backslash
};

Root FindRoot(std::wstring_view lower, bool isWrl, std::wstring_view objectsRoot, std::wstring_view customerRoot)
{
    Root root;
    bool found = false;
    const auto take = [&](std::size_t at, std::size_t length)
    {
        root.end = at + length + 1;
        found = true;
    };

    // The library of this machine needn't have a folder of the list in its path, so it is known by its root.
    if (LiesIn(lower, objectsRoot))
    {
        root.inProduct = true;
        take(0, objectsRoot.size());
    }
    for (std::wstring_view folder : productFolders)
        if (const std::size_t at = lower.find(folder); !found && at != std::wstring_view::npos)
        {
            root.inProduct = true;
            take(at, folder.size());
        }
    if (const std::size_t at = lower.find(customerFolder); isWrl && at != std::wstring_view::npos)
        take(at, customerFolder.size());
    if (!found)
        take(0, customerRoot.size());
    return root;
}

/// The start of the file's name in `path`, and its parts.
struct FileName
{
    std::size_t at = 0;
    std::wstring base;
    std::wstring extension;
};

FileName SplitFileName(const std::wstring& path)
{
    FileName name;
    const std::size_t slash = path.rfind(L'\\');
    name.at = slash == std::wstring::npos ? 0 : slash + 1;
    const std::size_t dot = path.rfind(L'.');
    if (dot == std::wstring::npos || dot < name.at)
        name.base = path.substr(name.at);
    else
    {
        name.base = path.substr(name.at, dot - name.at);
        name.extension = path.substr(dot + 1);
    }
    return name;
}

} // namespace

std::wstring ToPortablePath(const std::wstring& path, const host::LibraryPaths& paths)
{
    const std::wstring lower = base::ToLower(path);
    if (HasLibraryToken(lower))
        return path;

    const std::wstring present = base::ToLower(paths.GetObjectsPath());
    const std::wstring subfolder = base::ToLower(paths.GetObjectsSubfolder());
    const std::wstring above = subfolder.empty() ? present : base::Replace(present, subfolder, L"");
    const std::wstring customer = base::ToLower(paths.GetCustomerPath());

    std::wstring token(productToken);
    std::size_t rootLength = 0;
    const std::wstring productRoots[] = {above + std::wstring(presentFolder), above + std::wstring(oldFolder), present};
    for (const std::wstring& root : productRoots)
        if (rootLength == 0 && !above.empty() && LiesIn(lower, root))
            rootLength = root.size();
    if (rootLength == 0 && LiesIn(lower, customer))
    {
        rootLength = customer.size();
        token = customerToken;
    }

    const std::wstring rest = path.substr(rootLength);
    if (!rest.starts_with(L'\\'))
        token += L'\\';
    return token + rest;
}

std::wstring ResolveModelPath(const std::wstring& stored, const host::LibraryPaths& paths)
{
    const std::wstring objectsRoot = FullPath(paths.GetObjectsPath());
    const std::wstring customerRoot = FullPath(paths.GetCustomerPath());

    std::wstring path = base::Replace(stored, customerToken, customerRoot);
    path = NormalizeSeparators(base::Replace(std::move(path), productToken, objectsRoot));

    const FileName file = SplitFileName(path);
    const std::wstring folderName = L'$' + file.base;
    const bool isWrl = base::ToLower(file.extension).find(L"wrl") != std::wstring::npos;
    const std::wstring lower = base::ToLower(path);
    const Root root = FindRoot(lower, isWrl, base::ToLower(objectsRoot), base::ToLower(customerRoot));

    // A ".wrl" lay in the folder of its group, every other file in a "$" folder of its own.
    std::size_t end = file.at;
    const std::wstring ownFolder = base::ToLower(L'\\' + folderName + L'\\');
    if (!isWrl && std::wstring_view(lower).substr(0, end).ends_with(ownFolder))
        end -= folderName.size() + 1;

    const std::wstring folders = root.end < end ? path.substr(root.end, end - root.end) : std::wstring();
    return (root.inProduct ? objectsRoot : customerRoot) + L'\\' + folders + folderName + L'\\' + file.base + L".dae";
}

std::wstring MakeLibraryPath(std::int32_t kind, const std::wstring& entry, const host::LibraryPaths& paths)
{
    const std::size_t slash = entry.rfind(L'\\');
    const std::size_t nameAt = slash == std::wstring::npos ? 0 : slash + 1;
    const std::wstring name = entry.substr(nameAt);
    const std::wstring root = kind == 0 ? paths.GetObjectsPath() : kind == 1 ? paths.GetCustomerPath() : std::wstring();
    return root + L'\\' + entry.substr(0, nameAt) + L"\\$" + name + L'\\' + name + L".dae";
}

std::wstring ExpandLibraryTokens(const std::wstring& path, const host::LibraryPaths& paths)
{
    const std::wstring expanded = base::Replace(path, customerToken, paths.GetCustomerPath());
    return base::Replace(expanded, productToken, paths.GetObjectsPath());
}

bool HasLibraryToken(std::wstring_view path)
{
    static const std::wstring tokens[] = {base::ToLower(productToken), base::ToLower(customerToken)};
    const std::wstring lower = base::ToLower(path);
    return std::any_of(std::begin(tokens), std::end(tokens),
                       [&](const std::wstring& token) { return lower.find(token) != std::wstring::npos; });
}

std::wstring NormalizeSeparators(std::wstring_view path)
{
    std::wstring normal;
    normal.reserve(path.size());
    for (wchar_t c : path)
    {
        const wchar_t separator = c == L'/' ? L'\\' : c;
        if (separator != L'\\' || normal.empty() || normal.back() != L'\\')
            normal += separator;
    }
    return normal;
}

#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace host
{
class LibraryPaths;
}

/// Paths of models in the product's and the customer's library. All paths are in the inner form, with backslashes;
/// none of these functions looks at the file system, and all take any text.

/// The form for records, with a token for the library's root: "%Vantor_Objects%\Cars\$Sedan\Sedan.dae". A path in
/// neither library comes whole behind the product's token. A root counts only where the path begins with it, and up
/// to a folder's end. A path that has a token already stays as it is.
std::wstring ToPortablePath(const std::wstring& path, const host::LibraryPaths& paths);

/// The file of this machine that a stored path means: always "<root>\<folders>\$Name\Name.dae". Takes portable
/// paths, complete ones of either library, and those of older libraries and file types.
///
/// Outcomes where `path` fits no rule: a path outside both libraries is cut as long as the customer's root is, as if
/// it began with it, and gives no folders when it is shorter; a ".wrl" path without a library's folder counts as such
/// a path; a file whose folder isn't "$Name" keeps all its folders; a name without extension is a name all the same.
std::wstring ResolveModelPath(const std::wstring& path, const host::LibraryPaths& paths);

/// The path of a library's `entry` ("Cars\Sedan"). `kind`: 0 the product's library, 1 the customer's, any other no
/// root. A doubled backslash behind the folder belongs to it.
std::wstring MakeLibraryPath(std::int32_t kind, const std::wstring& entry, const host::LibraryPaths& paths);

/// The path with the roots of this machine for the libraries' tokens, and nothing else changed.
std::wstring ExpandLibraryTokens(const std::wstring& path, const host::LibraryPaths& paths);

/// Whether the path holds a library's token, in any case.
bool HasLibraryToken(std::wstring_view path);

/// Every "/" a backslash, and every run of backslashes one.
std::wstring NormalizeSeparators(std::wstring_view path);

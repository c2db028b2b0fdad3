#pragma once

#include <string>

namespace host
{
class LibraryPaths;
}

/// The file that `file_path` of a record means, in the inner form. `sceneFile` is the file that holds the record.
///
/// First the place that the rules of the libraries give (`ResolveModelPath`), which is always a ".dae"; then the file
/// of the library as it is stored, which may be a ".wrl". A model outside the libraries is stored
/// with its whole path behind the token, which no rule leads back to, so it is tried as it stands, and from the folder
/// of the scene file. Where there is no file at any of them, the first place comes back.
std::wstring FindStoredModel(const std::wstring& stored, const std::wstring& sceneFile,
                             const host::LibraryPaths& paths);

bool IsModelFile(const std::wstring& path);

#pragma once

#include <string>

namespace host
{

/// Where things lie on this machine. All paths in the inner form, with backslashes.
class LibraryPaths
{
public:
    virtual ~LibraryPaths() = default;

    /// Root of the product's object library with its present subfolder, without a trailing backslash:
    /// "\usr\share\panoramic\objects\advanced".
    virtual std::wstring GetObjectsPath() const = 0;

    /// The part of that root to take away for the folder above the subfolders: "\advanced".
    virtual std::wstring GetObjectsSubfolder() const = 0;

    /// Root of the customer's object library, without a trailing backslash.
    virtual std::wstring GetCustomerPath() const = 0;

    /// Folder of the program, with a trailing backslash; empty when it can't be told.
    virtual std::wstring GetModuleDirectory() const = 0;
};

} // namespace host

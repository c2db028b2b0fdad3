#pragma once

#include <cstdint>
#include <string>

/// What tells one state of a file from another, without reading it.
struct FileStamp
{
    std::string path;       ///< as the file system takes it
    std::int64_t time = -1; ///< last write, nanoseconds since 1970; -1: there is no such file
    std::int64_t size = -1; ///< bytes; -1: there is no such file

    static FileStamp Of(const std::string& path);

    bool operator==(const FileStamp&) const = default;
};

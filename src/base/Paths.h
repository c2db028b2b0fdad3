#pragma once

#include <filesystem>
#include <string>
#include <string_view>

/// Paths inside keep the backslash form of stored scenes ("C:\lib\$Car\Car.dae"); the file system sees them only
/// through these two.
namespace base
{

/// The path as the file system takes it: every backslash a slash, UTF-8.
std::filesystem::path NativePath(std::wstring_view path);

/// The inner form of a file system's path: every slash a backslash.
std::wstring InnerPath(const std::filesystem::path& path);

} // namespace base

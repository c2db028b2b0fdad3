#pragma once

#include <string>

namespace base
{

/// A fresh random UUID (version 4) in lower-case hexadecimal with hyphens, no braces.
std::wstring NewId();

} // namespace base

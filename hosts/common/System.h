#pragma once

#include <filesystem>
#include <string>

#include "host/Clock.h"
#include "host/LibraryPaths.h"

namespace base
{
class IniFile;
}

namespace hosts
{

/// The machine's monotonic clock.
class SystemClock : public host::Clock
{
public:
    std::uint32_t TickCount() const override;

    /// Nanoseconds.
    std::int64_t Counter() const override;
    std::int64_t CounterFrequency() const override { return 1000000000; }

    /// A signal ends it early, so that a loop can look at what the signal asked for.
    void Sleep(std::uint32_t milliseconds) override;
};

/// Folder of the running program, links resolved; empty when it can't be told.
std::filesystem::path ModuleFolder();

/// Folder of texts and example: $PANORAMIC_DATA, else the share/panoramic that belongs to a program in `module`,
/// in a build tree or where it is installed. Empty when there is none.
std::filesystem::path FindDataFolder(const std::filesystem::path& module);

/// The same, or where it would lie beside the program, so that a message can name it.
std::filesystem::path DataFolder(const std::filesystem::path& module);

/// The user's own folder of settings, $XDG_CONFIG_HOME/panoramic or ~/.config/panoramic. It need not exist. Empty
/// when the user has no home.
std::filesystem::path ConfigurationFolder();

/// A file in it; empty when there is no home, and nothing is kept then.
std::filesystem::path ConfigurationFile(const char* name);

/// Where the object libraries and the program lie.
///
/// A library's root is, in this order: $PANORAMIC_OBJECTS and $PANORAMIC_CUSTOMER_OBJECTS, the entries "Objects" and
/// "CustomerObjects" of the section [Libraries] of the configuration, the library of the example in `data`.
/// The product's root ends in its present subfolder, "advanced"; it is appended to a root without it.
class SystemPaths : public host::LibraryPaths
{
public:
    SystemPaths(const base::IniFile& configuration, const std::filesystem::path& data,
                const std::filesystem::path& module);

    std::wstring GetObjectsPath() const override { return objects; }
    std::wstring GetObjectsSubfolder() const override;
    std::wstring GetCustomerPath() const override { return customer; }
    std::wstring GetModuleDirectory() const override { return module; }

private:
    std::wstring objects;
    std::wstring customer;
    std::wstring module;
};

} // namespace hosts

#include "hosts/common/System.h"

#include <cstdlib>
#include <ctime>
#include <initializer_list>

#include "base/IniFile.h"
#include "base/Paths.h"
#include "base/Text.h"

namespace hosts
{

std::uint32_t SystemClock::TickCount() const
{
    return static_cast<std::uint32_t>(Counter() / 1000000);
}

std::int64_t SystemClock::Counter() const
{
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return 1 + now.tv_sec * std::int64_t{1000000000} + now.tv_nsec;
}

void SystemClock::Sleep(std::uint32_t milliseconds)
{
    const timespec span{static_cast<time_t>(milliseconds / 1000), static_cast<long>(milliseconds % 1000) * 1000000};
    nanosleep(&span, nullptr);
}

namespace
{

constexpr const wchar_t* presentSubfolder = L"\\advanced";

std::string Environment(const char* name)
{
    const char* value = std::getenv(name);
    return value ? value : "";
}

std::wstring WithoutTrailingSeparators(std::wstring path)
{
    while (path.size() > 1 && path.back() == L'\\')
        path.pop_back();
    return path;
}

std::wstring LibraryRoot(const char* variable, const base::IniFile& configuration, const char* key,
                         const std::filesystem::path& fallback)
{
    std::filesystem::path root = Environment(variable);
    if (root.empty())
        root = configuration.Find("Libraries", key).value_or("");
    if (root.empty())
        root = fallback;
    return WithoutTrailingSeparators(base::InnerPath(std::filesystem::absolute(root).lexically_normal()));
}

} // namespace

std::filesystem::path ModuleFolder()
{
    std::error_code failed;
    const std::filesystem::path program = std::filesystem::read_symlink("/proc/self/exe", failed);
    return failed ? std::filesystem::path() : program.parent_path();
}

std::filesystem::path FindDataFolder(const std::filesystem::path& module)
{
    if (const std::filesystem::path given = Environment("PANORAMIC_DATA"); !given.empty())
        return given;
    for (const char* place : {"../share/panoramic", "../../../share/panoramic"})
    {
        std::error_code failed;
        const std::filesystem::path folder = (module / place).lexically_normal();
        if (std::filesystem::is_directory(folder / "texts", failed))
            return folder;
    }
    return {};
}

std::filesystem::path DataFolder(const std::filesystem::path& module)
{
    const std::filesystem::path found = FindDataFolder(module);
    return found.empty() ? module.parent_path() / "share" / "panoramic" : found;
}

std::filesystem::path ConfigurationFolder()
{
    // A relative $XDG_CONFIG_HOME is invalid by its own standard and to be ignored.
    if (const std::filesystem::path given = Environment("XDG_CONFIG_HOME"); given.is_absolute())
        return given / "panoramic";
    if (const std::filesystem::path home = Environment("HOME"); home.is_absolute())
        return home / ".config" / "panoramic";
    return {};
}

std::filesystem::path ConfigurationFile(const char* name)
{
    const std::filesystem::path folder = ConfigurationFolder();
    return folder.empty() ? folder : folder / name;
}

SystemPaths::SystemPaths(const base::IniFile& configuration, const std::filesystem::path& data,
                         const std::filesystem::path& moduleFolder)
    : objects(
          LibraryRoot("PANORAMIC_OBJECTS", configuration, "Objects", data / "example" / "Vantor Objects" / "advanced")),
      customer(LibraryRoot("PANORAMIC_CUSTOMER_OBJECTS", configuration, "CustomerObjects",
                           data / "example" / "Customer_Objects"))
{
    if (!base::ToLower(objects).ends_with(presentSubfolder))
        objects += presentSubfolder;
    if (!moduleFolder.empty())
        module = base::InnerPath(moduleFolder) + L"\\";
}

std::wstring SystemPaths::GetObjectsSubfolder() const
{
    return presentSubfolder;
}

} // namespace hosts

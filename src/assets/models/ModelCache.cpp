#include "assets/models/ModelCache.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <vector>

#include "assets/models/ModelReaderSettings.h"
#include "base/AtomicFile.h"
#include "base/Numbers.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace fs = std::filesystem;

namespace
{

constexpr const char* ending = ".model";

std::string Environment(const char* name)
{
    const char* value = std::getenv(name);
    return value ? value : "";
}

fs::path CacheFolder()
{
    const std::string wanted = Environment("PANORAMIC_MODEL_CACHE");
    if (wanted == "off")
        return {};
    if (!wanted.empty())
        return wanted;
    if (const std::string cache = Environment("XDG_CACHE_HOME"); !cache.empty())
        return fs::path(cache) / "panoramic" / "models";
    if (const std::string home = Environment("HOME"); !home.empty())
        return fs::path(home) / ".cache" / "panoramic" / "models";
    return {};
}

} // namespace

VtTModelReaderSettings VtTModelReaderSettings::FromEnvironment(const fs::path& program)
{
    VtTModelReaderSettings settings;
    settings.program = program;
    settings.cacheFolder = CacheFolder();
    settings.parallel = std::max(1u, std::thread::hardware_concurrency());
    if (const auto seconds = base::ParseDouble(Environment("PANORAMIC_MODEL_SECONDS")); seconds && *seconds > 0)
        settings.limits.seconds = std::min(*seconds, 1e6);
    if (const auto megabytes = base::ParseInteger(Environment("PANORAMIC_MODEL_MEGABYTES"));
        megabytes && *megabytes > 0)
        settings.limits.megabytes = static_cast<std::size_t>(*megabytes);
    return settings;
}

VtCModelCache::VtCModelCache(fs::path cacheFolder, std::uint64_t bytes)
    : folder(std::move(cacheFolder)), maxBytes(bytes)
{
}

std::string VtCModelCache::Load(std::string_view key) const
{
    std::string bytes;
    if (folder.empty())
        return bytes;
    const int file = ::open(EntryPath(key).c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return bytes;

    struct stat status = {};
    if (::fstat(file, &status) == 0 && S_ISREG(status.st_mode) &&
        static_cast<std::uint64_t>(status.st_size) <= maxBytes)
        bytes.resize(static_cast<std::size_t>(status.st_size));
    std::size_t have = 0;
    while (have < bytes.size())
    {
        const ssize_t got = ::read(file, bytes.data() + have, bytes.size() - have);
        if (got <= 0)
            break;
        have += static_cast<std::size_t>(got);
    }
    bytes.resize(have);
    ::futimens(file, nullptr); // the time of last use is what the oldest are dropped by
    ::close(file);
    return bytes;
}

void VtCModelCache::Store(std::string_view key, std::string_view bytes) const
{
    if (folder.empty() || bytes.size() > maxBytes)
        return;
    std::error_code ignored;
    fs::create_directories(folder, ignored);
    base::WriteWholeFile(EntryPath(key), bytes);
    DropOldest();
}

fs::path VtCModelCache::EntryPath(std::string_view key) const
{
    const XXH128_hash_t hash = XXH3_128bits(key.data(), key.size());
    char name[33];
    std::snprintf(name, sizeof name, "%016llx%016llx", static_cast<unsigned long long>(hash.high64),
                  static_cast<unsigned long long>(hash.low64));
    return folder / (std::string(name) + ending);
}

void VtCModelCache::DropOldest() const
{
    struct Entry
    {
        fs::path path;
        fs::file_time_type used;
        std::uint64_t size;
    };
    std::vector<Entry> entries;
    std::uint64_t total = 0;
    std::error_code error;
    for (const fs::directory_entry& item : fs::directory_iterator(folder, error))
    {
        if (item.path().extension() != ending)
            continue;
        std::error_code gone; // another program may be dropping entries, too
        const std::uint64_t size = item.file_size(gone);
        const fs::file_time_type used = item.last_write_time(gone);
        if (gone)
            continue;
        entries.push_back({item.path(), used, size});
        total += size;
    }
    if (total <= maxBytes)
        return;
    std::sort(entries.begin(), entries.end(), [](const Entry& a, const Entry& b) { return a.used < b.used; });
    for (const Entry& entry : entries)
    {
        if (total <= maxBytes)
            return;
        fs::remove(entry.path, error);
        total -= entry.size;
    }
}

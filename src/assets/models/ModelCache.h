#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>

/// Finished models on disk, by what was asked for.
///
/// It keeps bytes and knows nothing of them: who loads an entry finds out whether it still holds. All failures are
/// silent: without a cache a model is read anew.
class VtCModelCache
{
public:
    /// An empty `folder` makes a cache that holds nothing.
    VtCModelCache(std::filesystem::path folder, std::uint64_t maxBytes);

    /// The entry of `key`, marked as used now; empty without one.
    std::string Load(std::string_view key) const;

    /// Puts `bytes` under `key` in place of an older entry, and drops those not used for longest while all together
    /// are too large.
    void Store(std::string_view key, std::string_view bytes) const;

private:
    std::filesystem::path EntryPath(std::string_view key) const;
    void DropOldest() const;

    std::filesystem::path folder;
    std::uint64_t maxBytes;
};

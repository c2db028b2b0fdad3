#pragma once

#include <cstdint>
#include <string>
#include <vector>

/// The channels of the first active data point, in the order they have in its frames: poses, then instrument streams.
struct VtTChannelLists
{
    std::vector<std::wstring> poses;
    std::vector<std::wstring> instruments;

    /// Another number after every reading of the lists, so that positions found in them can be kept until then.
    std::uint64_t revision = 0;
};

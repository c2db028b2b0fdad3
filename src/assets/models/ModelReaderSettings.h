#pragma once

#include <cstdint>
#include <filesystem>

#include "assets/models/ModelProcess.h"

/// How models are read on this machine.
struct VtTModelReaderSettings
{
    std::filesystem::path program;     ///< the program that parses model files
    std::filesystem::path cacheFolder; ///< finished models; empty: nothing is kept on disk
    std::uint64_t cacheBytes = std::uint64_t{2} << 30;
    ModelLimits limits;
    unsigned parallel = 1; ///< reading processes at a time

    /// The user's settings: PANORAMIC_MODEL_CACHE ("off", or the folder instead of $XDG_CACHE_HOME/panoramic/models),
    /// PANORAMIC_MODEL_SECONDS and PANORAMIC_MODEL_MEGABYTES. As many processes as there are cores.
    static VtTModelReaderSettings FromEnvironment(const std::filesystem::path& program);
};

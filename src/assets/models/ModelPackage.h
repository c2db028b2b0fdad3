#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "assets/models/FileStamp.h"

/// Counts with whatever the reading process does; a finished model of another version is read again.
inline constexpr std::uint32_t modelPackageVersion = 3;

/// What is known of one model that was read, beside its graph.
struct ModelReport
{
    std::string error;                 ///< why there is no graph; empty when there is one
    std::vector<std::string> warnings; ///< what was left out or put right, a sentence each
    std::vector<std::string> notes;    ///< for the log: what the reading process couldn't be kept from
    std::int64_t polygons = 0;
    std::int64_t vertices = 0;
    std::int64_t textureBytes = 0;
    std::string xmlAttributes;                    ///< the description beside the model, as it stands
    std::uint32_t drawables = 0;                  ///< in the graph, each once, however often it is used
    std::map<std::uint32_t, std::string> shaders; ///< number of the drawable, in visiting order -> shader it wants
    std::vector<std::pair<std::string, std::string>> parts; ///< of a group: id -> file; they are not loaded
    std::vector<FileStamp> files; ///< what the model was made from, files looked for in vain too
};

/// A report with its graph in the library's binary form, as bytes for a pipe or a file: magic, version, lengths and a
/// checksum, so that a torn or foreign one is told from a good one before the graph is looked at.
std::string PackModel(const ModelReport& report, std::string_view graph);

struct UnpackedModel
{
    ModelReport report;
    std::string_view graph; ///< into the bytes given
};

/// What `bytes` hold. Throws `std::runtime_error` with the reason when they are not a whole package of this version.
UnpackedModel UnpackModel(std::string_view bytes);

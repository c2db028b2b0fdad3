#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

/// What a model may cost before it is given up.
struct ModelLimits
{
    double seconds = 60;          ///< wall clock
    std::size_t megabytes = 4096; ///< address space of the reading process
};

/// What came of one reading process.
struct ModelProcessResult
{
    std::string output;  ///< its package
    std::string failure; ///< why there is none, in words for the user; empty when it ended well
};

/// Runs `program` once for each list of arguments, at most `parallel` at a time, and waits for all of them.
///
/// A process that runs over its time is killed; one that breaks down costs its own model. The limits go to the process
/// as further arguments. Results come in the order of `arguments`.
std::vector<ModelProcessResult> RunModelProcesses(const std::filesystem::path& program,
                                                  const std::vector<std::vector<std::string>>& arguments,
                                                  const ModelLimits& limits, unsigned parallel);

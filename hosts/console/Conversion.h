#pragma once

#include <filesystem>

#include "simdata/points/MotionDataCsv.h"

namespace console
{

struct ConversionFiles
{
    std::filesystem::path from;
    std::filesystem::path to;
};

/// `VtCMotionDataCsv::Import` or `Export`.
using Converter = bool (*)(const std::filesystem::path& from, const std::filesystem::path& to,
                           SimulationDataPoints::VtTConversionReport& report,
                           SimulationDataPoints::VtILoadProgress* progress, long activity);

/// Runs a conversion with its progress, warnings and error; the command's status.
int Convert(const ConversionFiles& files, Converter converter);

} // namespace console

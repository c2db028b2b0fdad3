#pragma once

#include <cstdint>

namespace SimulationDataPoints
{
class VtCSimulationDataPoint;

/// The version of what a module and the program around it share: the operations of `VtCSimulationDataPoint`, their
/// order, and the layout of its fields and of frames. Every change of these makes it one more; a module that was built
/// with another version isn't loaded.
inline constexpr std::uint32_t interfaceVersion = 1;

/// The names and types of what a module exports, for the one who loads it.
inline constexpr char factoryName[] = "DllCreateSimulationDataPointFactory";
inline constexpr char versionName[] = "DllSimulationDataPointVersion";
using FactoryFunction = VtCSimulationDataPoint* (*)();
using VersionFunction = std::uint32_t (*)();

} // namespace SimulationDataPoints

/// Exports a data point module's factory, and beside it the version that the module is built with:
///
///     SIMULATION_DATA_POINT_FACTORY
///     {
///         return new VtCMyPoint;
///     }
///
/// Each call makes one point, which the caller owns; null when it can't be made. The caller calls `Release` on the
/// point once before it deletes it, and keeps the module loaded until then.
// NOLINTBEGIN(bugprone-macro-parentheses): the head of a function, not an expression
#define SIMULATION_DATA_POINT_FACTORY                                                                                  \
    extern "C" __attribute__((visibility("default"))) std::uint32_t DllSimulationDataPointVersion()                    \
    {                                                                                                                  \
        return SimulationDataPoints::interfaceVersion;                                                                 \
    }                                                                                                                  \
    extern "C" __attribute__((visibility("default"))) SimulationDataPoints::VtCSimulationDataPoint*                    \
    DllCreateSimulationDataPointFactory()
// NOLINTEND(bugprone-macro-parentheses)

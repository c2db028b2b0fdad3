#pragma once

/// Marks the one function that a data point module exports:
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
    extern "C" __attribute__((visibility("default"))) SimulationDataPoints::VtCSimulationDataPoint*                    \
    DllCreateSimulationDataPointFactory()
// NOLINTEND(bugprone-macro-parentheses)

namespace SimulationDataPoints
{
class VtCSimulationDataPoint;

/// The exported function's name and type, for the one who loads the module.
inline constexpr char factoryName[] = "DllCreateSimulationDataPointFactory";
using FactoryFunction = VtCSimulationDataPoint* (*)();

} // namespace SimulationDataPoints

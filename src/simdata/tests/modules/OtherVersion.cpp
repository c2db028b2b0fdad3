// A module of a later version, whose point must not be made.
#include <cstdlib>

#include "simdata/points/ExportFactory.h"

extern "C" __attribute__((visibility("default"))) std::uint32_t DllSimulationDataPointVersion()
{
    return SimulationDataPoints::interfaceVersion + 1;
}

extern "C" __attribute__((visibility("default"))) SimulationDataPoints::VtCSimulationDataPoint*
DllCreateSimulationDataPointFactory()
{
    std::abort();
}

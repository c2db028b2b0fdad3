#include <new>

#include "offsim/SimulationDataPointOffSim.h"
#include "simdata/points/ExportFactory.h"

SIMULATION_DATA_POINT_FACTORY
{
    return new (std::nothrow) SimulationDataPoints::VtCSimulationDataPointOffSim;
}

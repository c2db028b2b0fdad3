// A module whose factory has nothing to give.
#include "simdata/points/ExportFactory.h"

SIMULATION_DATA_POINT_FACTORY
{
    return nullptr;
}

// A module whose factory fails.
#include <stdexcept>

#include "simdata/points/ExportFactory.h"

SIMULATION_DATA_POINT_FACTORY
{
    throw std::runtime_error("no licence");
}

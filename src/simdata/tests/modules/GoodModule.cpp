// A module as it should be: one point, whose code goes with the module.
#include "simdata/points/ExportFactory.h"
#include "simdata/points/SimulationDataPoint.h"

namespace
{

class ModulePoint : public SimulationDataPoints::VtCSimulationDataPoint
{
public:
    ModulePoint() : VtCSimulationDataPoint(L"From a module") {}

    void Disconnect() override {}
    int Connect() override { return 1; }
    void GetSourceType(std::wstring& type) const override { type = L"KIND"; }
    void GetSourcePath(std::wstring& path) const override { path = std::to_wstring(GetKind()); }
    int Configure(const std::wstring&, const std::wstring&, int, int) override { return 1; }
    SimulationDataPoints::VtCSimulationDataFrame* GetCurrentFrame(unsigned long&) override { return nullptr; }
};

} // namespace

SIMULATION_DATA_POINT_FACTORY
{
    return new ModulePoint;
}

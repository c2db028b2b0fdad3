#include "hosts/common/MotionDataFile.h"

#include "base/Paths.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/Progress.h"
#include "simdata/points/SimulationDataPoint.h"

namespace hosts
{

namespace
{

constexpr std::uint32_t textLoadingData = 7004;
constexpr long loadingData = 41;

} // namespace

bool LoadMotionData(SimulationDataPoints::VtCSimulationDataPoint& point, const std::wstring& file,
                    host::Progress& progress, const host::Texts& texts)
{
    progress.ConnectProgressActivity(loadingData, texts.GetText(textLoadingData),
                                     base::Wide(base::NativePath(file).filename().string()));
    point.SetProgressBarActivityID(loadingData);
    const bool loaded = point.Configure(L"MDF", file, 1, 0) != 0;
    progress.DisconnectProgressActivity(loadingData);
    return loaded;
}

} // namespace hosts

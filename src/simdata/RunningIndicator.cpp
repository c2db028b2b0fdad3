#include "simdata/RunningIndicator.h"

#include "host/Frame.h"

void VtCRunningIndicator::Update(bool running) const
{
    if (variables)
        variables->SetBool(L"simulationRunning", running && navigator && navigator->IsTrackCurrent());
}

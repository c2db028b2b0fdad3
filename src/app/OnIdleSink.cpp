#include "app/OnIdleSink.h"

#include "app/FrameCycle.h"

void VtCOnIdleSink::OnIdle(std::int32_t& handled)
{
    handled = 1;
    cycle.IdleStep();
}

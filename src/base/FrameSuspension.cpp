#include "base/FrameSuspension.h"

VtCFrameSuspension::VtCFrameSuspension(Extent extent) : held(extent)
{
    Count(1);
}

VtCFrameSuspension::~VtCFrameSuspension()
{
    Count(-1);
}

void VtCFrameSuspension::Count(int by) const
{
    if (held != Extent::pictures)
        steps += by;
    if (held != Extent::steps)
        pictures += by;
}

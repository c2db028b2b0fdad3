#include "simdata/points/MotionDataDamage.h"

#include <fmt/format.h>
#include <fmt/xchar.h>

namespace SimulationDataPoints
{

bool VtTMotionDataDamage::IsAny() const
{
    return framesWhole < framesExpected || partialBytes > 0 || excessBytes > 0 || framesOutOfOrder > 0 ||
           nonFinitePoses > 0 || nonFiniteValues > 0;
}

std::vector<std::wstring> VtTMotionDataDamage::Texts() const
{
    std::vector<std::wstring> texts;
    if (framesWhole < framesExpected)
        texts.push_back(
            fmt::format(L"the file is cut off: {} of {} frames are whole and used", framesWhole, framesExpected));
    else if (partialBytes > 0)
        texts.push_back(fmt::format(L"the file ends within a frame: {} frames are whole and used", framesWhole));
    if (excessBytes > 0)
        texts.push_back(fmt::format(L"{} bytes behind the last frame are left out", excessBytes));
    if (framesOutOfOrder > 0)
        texts.push_back(fmt::format(L"the time decreases at frame {}, from {} s to {} s: the frames before it are "
                                    L"used, {} are left out",
                                    decreaseFrame, timeBefore, timeAfter, framesOutOfOrder));
    if (nonFinitePoses + nonFiniteValues > 0)
    {
        std::wstring where;
        for (const VtTNonFiniteValue& value : nonFinite)
            where += fmt::format(L"{}\"{}\" in frame {}", where.empty() ? L"" : L", ", value.channel, value.frame);
        texts.push_back(fmt::format(L"{} poses and {} instrument values are not finite, first {}: poses keep their "
                                    L"last good value, instruments get none",
                                    nonFinitePoses, nonFiniteValues, where));
    }
    return texts;
}

} // namespace SimulationDataPoints

#include "interaction/SmoothFollower.h"

namespace
{

constexpr double delayedShare = 0.07;

}

void VtCSmoothFollower::Follow(const VtCFollowData& current, VtCFollowData& result)
{
    VtCFollowData delayed;
    ring.Add(current);
    ring.GetDelayed(delayed, delay);
    result.rotation.slerp(delayedShare, current.rotation, delayed.rotation);
}

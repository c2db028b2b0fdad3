#pragma once

#include <cstdint>

#include <osg/Quat>
#include <osg/Vec3f>

/// Where a followed body was, and how it was turned, at one tick.
struct VtCFollowData
{
    std::uint32_t time = 0xFFFFFFFF; ///< milliseconds, the host's tick
    osg::Vec3f position;             ///< scene, metres, z up
    osg::Quat rotation;              ///< body to scene
};

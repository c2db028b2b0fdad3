#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include <osg/Matrixd>
#include <osg/MatrixTransform>

/// What every frame reads and writes of a movable body, kept apart from the rest of it.
///
/// With thousands of bodies the time of a frame goes into memory that lies far apart, so these lie behind one another.
struct VtTBodyMotion
{
    osg::MatrixTransform* node = nullptr; ///< the body's; not owned, null without one
    std::int32_t simulationDataIndex = -1;
    std::array<double, 12> base{};    ///< places the model at the simulated origin: four rows without the fourth column
    osg::Matrixd lastTransformMatrix; ///< of the last frame; (3,3) is always 1

    /// Takes the affine map `matrix` as the base.
    void SetBase(const osg::Matrixd& matrix);

    /// Takes the 16 floats of a frame's entry, column after column, as the last matrix and moves the node.
    void SetLastTransformColumns(const float* values);

    /// Sets the node to the base * `lastTransformMatrix`.
    void MoveNode();
};

/// What `SetLastTransformColumns` does for affine maps on processors without wide registers; with the same results.
void MoveByColumnsPortable(VtTBodyMotion& motion, const float* values);

/// Storage of motions in blocks that never move. Bodies that are made one after another get neighbours.
class VtCMotionPool
{
public:
    VtTBodyMotion& Take();
    void GiveBack(VtTBodyMotion& motion) { unused.push_back(&motion); }

private:
    static constexpr std::size_t blockSize = 256;

    std::vector<std::unique_ptr<VtTBodyMotion[]>> blocks;
    std::vector<VtTBodyMotion*> unused; ///< last first
};

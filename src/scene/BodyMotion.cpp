#include "scene/BodyMotion.h"

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace
{

/// Opens the matrix of any transform to be written in place: a copy through `setMatrix` costs half as much again as
/// everything else that a frame does to a body.
class OpenTransform : public osg::MatrixTransform
{
public:
    static double* Open(osg::MatrixTransform& node) { return (node.*&OpenTransform::_matrix).ptr(); }

    static void Close(osg::MatrixTransform& node)
    {
        // Written only where it changes: both are so already in a steady run, and lie in lines of their own.
        if (bool& stale = node.*&OpenTransform::_inverseDirty; !stale)
            stale = true;
        if (node.*&OpenTransform::_boundingSphereComputed)
            node.dirtyBound();
    }
};

// Both forms add in the order of the scene graph library's product and leave out only products with the zeros of the
// placement's last column, so their results are equal to its own. They are for affine maps.

#if defined(__x86_64__)
__attribute__((target("avx"))) void MoveWide(VtTBodyMotion& motion, const float* values)
{
    __m128 row0 = _mm_loadu_ps(values);
    __m128 row1 = _mm_loadu_ps(values + 4);
    __m128 row2 = _mm_loadu_ps(values + 8);
    __m128 row3 = _mm_loadu_ps(values + 12);
    _MM_TRANSPOSE4_PS(row0, row1, row2, row3);
    const __m256d last0 = _mm256_cvtps_pd(row0);
    const __m256d last1 = _mm256_cvtps_pd(row1);
    const __m256d last2 = _mm256_cvtps_pd(row2);
    const __m256d last3 = _mm256_blend_pd(_mm256_cvtps_pd(row3), _mm256_set1_pd(1.0), 8);
    double* last = motion.lastTransformMatrix.ptr();
    _mm256_storeu_pd(last, last0);
    _mm256_storeu_pd(last + 4, last1);
    _mm256_storeu_pd(last + 8, last2);
    _mm256_storeu_pd(last + 12, last3);

    const double* base = motion.base.data();
    double* placed = OpenTransform::Open(*motion.node);
    for (int row = 0; row < 4; ++row, base += 3, placed += 4)
    {
        const __m256d first = _mm256_add_pd(_mm256_mul_pd(_mm256_broadcast_sd(base), last0),
                                            _mm256_mul_pd(_mm256_broadcast_sd(base + 1), last1));
        const __m256d sum = _mm256_add_pd(first, _mm256_mul_pd(_mm256_broadcast_sd(base + 2), last2));
        _mm256_storeu_pd(placed, row == 3 ? _mm256_add_pd(sum, last3) : sum);
    }
    OpenTransform::Close(*motion.node);
}

const auto moveAffine = __builtin_cpu_supports("avx") ? MoveWide : MoveByColumnsPortable;
#else
constexpr auto moveAffine = MoveByColumnsPortable;
#endif

} // namespace

void MoveByColumnsPortable(VtTBodyMotion& motion, const float* values)
{
    double* last = motion.lastTransformMatrix.ptr();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            last[row * 4 + column] = values[column * 4 + row];
    last[15] = 1.0;

    const double* base = motion.base.data();
    double* placed = OpenTransform::Open(*motion.node);
    for (int row = 0; row < 4; ++row, base += 3, placed += 4)
        for (int column = 0; column < 4; ++column)
        {
            const double sum = base[0] * last[column] + base[1] * last[4 + column] + base[2] * last[8 + column];
            placed[column] = row == 3 ? sum + last[12 + column] : sum;
        }
    OpenTransform::Close(*motion.node);
}

void VtTBodyMotion::SetBase(const osg::Matrixd& matrix)
{
    double* to = base.data();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 3; ++column)
            *to++ = matrix(row, column);
}

void VtTBodyMotion::SetLastTransformColumns(const float* values)
{
    if (node && values[12] == 0.0F && values[13] == 0.0F && values[14] == 0.0F) [[likely]]
    {
        moveAffine(*this, values);
        return;
    }
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            lastTransformMatrix(row, column) = values[column * 4 + row];
    lastTransformMatrix(3, 3) = 1.0;
    MoveNode();
}

void VtTBodyMotion::MoveNode()
{
    if (!node)
        return;
    osg::Matrixd placement;
    const double* from = base.data();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 3; ++column)
            placement(row, column) = *from++;
    node->setMatrix(placement * lastTransformMatrix);
}

VtTBodyMotion& VtCMotionPool::Take()
{
    if (unused.empty())
    {
        blocks.push_back(std::make_unique<VtTBodyMotion[]>(blockSize));
        for (std::size_t i = blockSize; i > 0; --i)
            unused.push_back(&blocks.back()[i - 1]);
    }
    VtTBodyMotion& motion = *unused.back();
    unused.pop_back();
    motion = {};
    return motion;
}

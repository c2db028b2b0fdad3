#pragma once

#include <osg/Matrixd>

/// Whether the last column of `matrix` is (0, 0, 0, 1): with row vectors, whether it is an affine map.
inline bool IsAffine(const osg::Matrixd& matrix)
{
    const double* m = matrix.ptr();
    return m[3] == 0.0 && m[7] == 0.0 && m[11] == 0.0 && m[15] == 1.0;
}

/// `product` = `first` * `second` of two affine maps; `product` is neither of them.
///
/// The sums run in the order of the scene graph library's own product and leave out only what is zero there, so the
/// results are equal.
inline void AffineProduct(const osg::Matrixd& first, const osg::Matrixd& second, osg::Matrixd& product)
{
    const double* a = first.ptr();
    const double* b = second.ptr();
    double* p = product.ptr();
    for (int row = 0; row < 16; row += 4)
    {
        const double x = a[row], y = a[row + 1], z = a[row + 2];
        for (int column = 0; column < 3; ++column)
            p[row + column] = x * b[column] + y * b[4 + column] + z * b[8 + column];
        p[row + 3] = 0.0;
    }
    for (int column = 0; column < 3; ++column)
        p[12 + column] += b[12 + column];
    p[15] = 1.0;
}

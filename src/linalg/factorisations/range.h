#ifndef QX_LINALG_FACTORISATIONS_RANGE_H
#define QX_LINALG_FACTORISATIONS_RANGE_H

#include "frame/views.h"
#include "linalg/scalar.h"

#include <algorithm>
#include <cmath>

namespace qx {

// Multiplies a matrix of extreme elements by a power of two so that squares of them neither
// overflow nor vanish, and returns the exponent that takes its values back. No digit changes.
// Matrices of ordinary size are left alone; which are too small, the caller says.
template <ElementType E>
int BringIntoRange(const MatrixView<E> &a, double tooSmall) {
    double largest = 0.0;
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            largest = std::max(largest, AbsSum(a(i, j) * 0.5));
    if (largest == 0.0 || (largest >= tooSmall && largest <= 0x1p400))
        return 0;
    int exponent;
    std::frexp(largest, &exponent);
    // Large values stay large, for there are tests against absolute numbers.
    exponent -= largest > 1.0 ? 200 : 0;
    // In two steps, since one factor could overflow.
    const double factor = std::ldexp(1.0, -exponent / 2);
    const double rest = std::ldexp(1.0, -exponent - (-exponent / 2));
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            a(i, j) = a(i, j) * factor * rest;
    return exponent;
}

} // namespace qx

#endif

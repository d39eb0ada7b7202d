#ifndef QX_LINALG_FACTORISATIONS_RANGE_H
#define QX_LINALG_FACTORISATIONS_RANGE_H

#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {

// a becomes a / 2^exponent: in two steps, since a single factor could overflow.
template <ElementType E>
void DivideByPower(const MatrixView<E> &a, int exponent) {
    const double factor = std::ldexp(1.0, -exponent / 2);
    const double rest = std::ldexp(1.0, -exponent - (-exponent / 2));
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            a(i, j) = a(i, j) * factor * rest;
}

// Multiplies a matrix of extreme elements by a power of two so that squares of them neither
// overflow nor vanish, and returns the exponent that restores its values. No digit changes.
// Matrices of ordinary size are left alone; `tooSmall` is the limit below which a matrix is scaled
// up.
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
    // Large values stay large, because they are compared with absolute numbers.
    exponent -= largest > 1.0 ? 200 : 0;
    DivideByPower<E>(a, exponent);
    return exponent;
}

// Multiplies a matrix by the power of two that brings its largest element near 2^target, and
// returns the exponent that restores its values; 0 for a matrix of zeros. No digit of an element
// changes, unless it is so much smaller than the largest one that it vanishes.
template <ElementType E>
int ScaleTo(const MatrixView<E> &a, int target) {
    double largest = 0.0; // of real and imaginary parts: the sum of two could overflow
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            largest =
                std::max({largest, std::fabs(RealPart(a(i, j))), std::fabs(ImagPart(a(i, j)))});
    if (largest == 0.0)
        return 0;
    int exponent;
    std::frexp(largest, &exponent);
    exponent -= target;
    DivideByPower<E>(a, exponent);
    return exponent;
}

// A copy of a matrix that ScaleTo has brought near 1, or near 2^target: the matrix is the copy
// times 2^exponent.
template <ElementType E>
struct ScaledCopy {
    ErrorCode make(const ConstMatrixView<E> &a, int target = 0) {
        if (const ErrorCode failed = memory.take(Sized(matrix, a.rows(), a.cols())))
            return failed;
        CopyMatrix<E>(a, matrix);
        exponent = ScaleTo<E>(matrix, target);
        return 0;
    }
    ScratchParts memory;
    MatrixView<E> matrix;
    int exponent = 0;
};

// a 2^exponent with one rounding; infinite on overflow.
inline double TimesPower(double a, int exponent) { return std::ldexp(a, exponent); }
inline CDB TimesPower(CDB a, int exponent) {
    return {std::ldexp(a.re, exponent), std::ldexp(a.im, exponent)};
}

// A copy whose columns are scaled one by one, for right sides of very different magnitude.
template <ElementType E>
struct ScaledColumns {
    ErrorCode make(const ConstMatrixView<E> &b) {
        if (const ErrorCode failed =
                memory.take(Sized(matrix, b.rows(), b.cols()), Sized(exponents, b.cols())))
            return failed;
        CopyMatrix<E>(b, matrix);
        for (int32_t j = 0; j < b.cols(); ++j)
            exponents[j] = ScaleTo<E>(matrix.block(0, j, b.rows(), 1), 0);
        return 0;
    }
    // Scales back x, the solutions for the copy and for a matrix that was divided by 2^exponent.
    void scaleBack(const MatrixView<E> &x, int exponent) const {
        for (int32_t i = 0; i < x.rows(); ++i)
            for (int32_t j = 0; j < x.cols(); ++j)
                x(i, j) = TimesPower(x(i, j), exponents[j] - exponent);
    }
    ScratchParts memory;
    MatrixView<E> matrix;
    IndexVector exponents;
};

} // namespace qx

#endif

#include "frame/scratch.h"
#include "linalg/eigenproblems/complex_qr.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <cmath>

namespace qx {
namespace {

constexpr auto E = ElementType::CDB;

class ComplexEigenproblem {
public:
    explicit ComplexEigenproblem(int32_t n) : n_(n), stride_(PaddedStride(n)) {}

    ErrorCode solve(const CDB *a, bool withVectors, CDB *values, CDB *vectors) {
        const int64_t square = n_ * int64_t{stride_};
        if (const ErrorCode failed = matrix_.allocate(square))
            return failed;
        if (const ErrorCode failed = schur_.allocate(withVectors ? 2 * square : 0))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(2 * int64_t{n_}))
            return failed;
        if (const ErrorCode failed = scale_.allocate(n_))
            return failed;

        CDB *const h = matrix_.data();
        CopyMatrix<E>(a, n_, n_, n_, h, stride_);
        const int exponent = BringIntoRange<E>(h, stride_, n_, n_, 0x1p-400);
        const Balanced range = Balance<E>(h, stride_, n_, true, true, scale_.data());
        CDB *const transposed = withVectors ? schur_.data() : nullptr;
        CDB *const q = withVectors ? transposed + square : nullptr;
        if (const ErrorCode failed =
                ReduceToHessenberg<E>(h, stride_, n_, range.low, range.high, q, stride_))
            return failed;
        if (withVectors)
            CopyTransposed<E>(q, stride_, n_, n_, transposed, stride_);
        if (const ErrorCode failed =
                ComplexSchurIteration(h, stride_, n_, range, 0.0, values, transposed))
            return failed;
        if (withVectors)
            writeVectors(range, vectors);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = {std::ldexp(values[i].re, exponent), std::ldexp(values[i].im, exponent)};
        return 0;
    }

private:
    const CDB *row(int32_t i) const { return matrix_.data() + i * stride_; }

    void writeVectors(Balanced range, CDB *vectors) {
        double norm = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i; j < n_; ++j)
                norm += AbsSum(row(i)[j]);
        const double least = epsilon * (norm > 0.0 ? norm : 1.0);
        CDB *const x = vectors_.data(), *const v = x + n_;
        for (int32_t j = 0; j < n_; ++j) {
            substituteBack(j, least, x);
            for (int32_t i = 0; i < n_; ++i)
                v[i] = {0.0, 0.0};
            AddTransposedProduct(schur_.data(), stride_, j + 1, n_, x, v);
            UndoScaling<E>(scale_.data(), range, EigenvectorSide::Right, v, 1, 1);
            UndoPermutation<E>(scale_.data(), range, n_, v, 1, 1);
            normalise(v);
            for (int32_t i = 0; i < n_; ++i)
                vectors[i * n_ + j] = v[i];
        }
    }

    // The eigenvector of the triangular matrix for its diagonal element j.
    void substituteBack(int32_t j, double least, CDB *x) const {
        x[j] = {1.0, 0.0};
        for (int32_t i = j - 1; i >= 0; --i) {
            CDB sum;
            RowProducts(row(i) + i + 1, stride_, 1, j - i, x + i + 1, &sum);
            CDB distance = row(i)[i] - row(j)[j];
            if (AbsSum(distance) < least)
                distance = {least, 0.0};
            x[i] = -(sum / distance);
            const double size = AbsSum(x[i]);
            for (int32_t k = i; epsilon * size * size > 1.0 && k <= j; ++k)
                x[k] = x[k] / size;
        }
    }

    void normalise(CDB *v) const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += SquaredModulus(v[i]);
        if (!(squares > 0.0))
            return;
        const double length = std::sqrt(squares);
        for (int32_t i = 0; i < n_; ++i)
            v[i] = v[i] / length;
    }

    int32_t n_;
    std::ptrdiff_t stride_;
    Scratch<E> matrix_, schur_, vectors_;
    Scratch<ElementType::DBL> scale_;
};

ErrorCode SolveHermitian(const CDB *a, int32_t n, int32_t output, CDB *values, CDB *vectors) {
    Scratch<ElementType::DBL> real;
    if (const ErrorCode failed = real.allocate(n))
        return failed;
    if (const ErrorCode failed = SymmetricEigen(a, n, output, real.data(), vectors))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        values[i] = {real[i], 0.0};
    return 0;
}

} // namespace

ErrorCode CxEigenGeneral(const CDB *a, int32_t n, int32_t matrixType, int32_t output, CDB *values,
                         CDB *vectors) {
    if (n < 1)
        return ErrEmptyInput;
    if (matrixType != generalMatrix && matrixType != hermitianMatrix)
        return ErrInvalidSelector;
    if (output != eigenValuesOnly && output != eigenValuesAndVectors)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    if (matrixType == hermitianMatrix)
        return SolveHermitian(a, n, output, values, vectors);
    return ComplexEigenproblem(n).solve(a, output == eigenValuesAndVectors, values, vectors);
}

} // namespace qx

#include "linalg/eigenproblems/general.h"

#include "frame/scratch.h"
#include "linalg/eigenproblems/real_qr.h"
#include "linalg/factorisations/balance.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// Eigenvectors of the quasi-triangular matrix that the iteration leaves, by back substitution. x and y are
// the real and the imaginary part of a vector, of which elements 0 to `last` are not 0.
class QuasiTriangular {
public:
    QuasiTriangular(const DBL *t, std::ptrdiff_t stride, double norm, const CDB *values, DBL *x,
                    DBL *y)
        : t_(t), stride_(stride), norm_(norm > 0.0 ? norm : 1.0), values_(values), x_(x), y_(y) {}

    void realVector(int32_t last) {
        const double value = values_[last].re;
        int32_t known = last;
        x_[last] = 1.0;
        double lowerDiagonal = 0.0, lowerSum = 0.0;
        for (int32_t i = last - 1; i >= 0; --i) {
            const double diagonal = at(i, i) - value;
            const double sum = product(i, known, last, x_);
            if (values_[i].im < 0.0) { // the lower row of a pair waits for the upper one
                lowerDiagonal = diagonal;
                lowerSum = sum;
                continue;
            }
            known = i;
            if (values_[i].im == 0.0)
                x_[i] = -sum / (diagonal != 0.0 ? diagonal : epsilon * norm_);
            else
                solveRealPair(i, value, diagonal, sum, lowerDiagonal, lowerSum);
            shrink(i, last, std::fabs(x_[i]), false);
        }
    }

    // The vector of the value with positive imaginary part, at last - 1.
    void complexVector(int32_t last) {
        const double value = values_[last].re, q = values_[last].im;
        startComplex(last, value, q);
        int32_t known = last - 1;
        CDB lower = {0.0, 0.0};
        double lowerDiagonal = 0.0;
        for (int32_t i = last - 2; i >= 0; --i) {
            const double diagonal = at(i, i) - value;
            const CDB sum = {product(i, known, last, x_), product(i, known, last, y_)};
            if (values_[i].im < 0.0) {
                lowerDiagonal = diagonal;
                lower = sum;
                continue;
            }
            known = i;
            if (values_[i].im == 0.0)
                set(i, -sum / CDB{diagonal, q});
            else
                solveComplexPair(i, {value, q}, diagonal, sum, lowerDiagonal, lower);
            shrink(i, last, std::max(std::fabs(x_[i]), std::fabs(y_[i])), true);
        }
    }

private:
    double at(int32_t i, int32_t j) const { return t_[i * stride_ + j]; }
    void set(int32_t i, CDB value) {
        x_[i] = value.re;
        y_[i] = value.im;
    }
    double product(int32_t i, int32_t from, int32_t to, const DBL *v) const {
        DBL sum;
        RowProductsReal(t_ + i * stride_ + from, stride_, 1, to + 1 - from, v + from, &sum);
        return sum;
    }

    void solveRealPair(int32_t i, double value, double diagonal, double sum, double lowerDiagonal,
                       double lowerSum) {
        const double right = at(i, i + 1), below = at(i + 1, i);
        const double distance = values_[i].re - value;
        const double determinant = distance * distance + values_[i].im * values_[i].im;
        const double upper = (right * lowerSum - lowerDiagonal * sum) / determinant;
        x_[i] = upper;
        x_[i + 1] = std::fabs(right) > std::fabs(lowerDiagonal)
                        ? (-sum - diagonal * upper) / right
                        : (-lowerSum - below * upper) / lowerDiagonal;
    }

    void startComplex(int32_t last, double value, double q) {
        const int32_t first = last - 1;
        if (std::fabs(at(last, first)) > std::fabs(at(first, last)))
            set(first, {q / at(last, first), -(at(last, last) - value) / at(last, first)});
        else
            set(first, CDB{0.0, -at(first, last)} / CDB{at(first, first) - value, q});
        set(last, {0.0, 1.0});
    }

    void solveComplexPair(int32_t i, CDB value, double diagonal, CDB sum, double lowerDiagonal,
                          CDB lower) {
        const double right = at(i, i + 1), below = at(i + 1, i), q = value.im;
        const double distance = values_[i].re - value.re;
        CDB determinant = {distance * distance + values_[i].im * values_[i].im - q * q,
                           distance * 2.0 * q};
        if (determinant.re == 0.0 && determinant.im == 0.0)
            determinant.re = epsilon * norm_ *
                             (std::fabs(diagonal) + std::fabs(q) + std::fabs(right) +
                              std::fabs(below) + std::fabs(lowerDiagonal));
        const CDB numerator = {right * lower.re - lowerDiagonal * sum.re + q * sum.im,
                               right * lower.im - lowerDiagonal * sum.im - q * sum.re};
        const CDB upper = numerator / determinant;
        set(i, upper);
        if (std::fabs(right) > std::fabs(lowerDiagonal) + std::fabs(q))
            set(i + 1, {(-sum.re - diagonal * upper.re + q * upper.im) / right,
                        (-sum.im - diagonal * upper.im - q * upper.re) / right});
        else
            set(i + 1, (-lower - upper * below) / CDB{lowerDiagonal, q});
    }

    // Keeps what has been found so small that its products do not overflow.
    void shrink(int32_t from, int32_t to, double size, bool isComplex) {
        if (!(epsilon * size * size > 1.0))
            return;
        for (int32_t j = from; j <= to; ++j) {
            x_[j] /= size;
            if (isComplex)
                y_[j] /= size;
        }
    }

    const DBL *t_;
    std::ptrdiff_t stride_;
    double norm_;
    const CDB *values_;
    DBL *x_, *y_;
};

class RealEigenproblem {
public:
    explicit RealEigenproblem(int32_t n) : n_(n), stride_(PaddedStride(n)) {}

    ErrorCode solve(const DBL *a, bool withVectors, CDB *values, CDB *vectors) {
        const int64_t square = n_ * int64_t{stride_};
        if (const ErrorCode failed = matrix_.allocate(square))
            return failed;
        if (const ErrorCode failed = schur_.allocate(withVectors ? 2 * square : 0))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(5 * int64_t{n_}))
            return failed;

        DBL *const h = matrix_.data(), *const scale = vectors_.data();
        CopyMatrix<ElementType::DBL>(a, n_, n_, n_, h, stride_);
        const int exponent = BringIntoRange<ElementType::DBL>(h, stride_, n_, n_, 0x1p-400);
        const Balanced range = Balance<ElementType::DBL>(h, stride_, n_, true, true, scale);
        DBL *const q = withVectors ? schur_.data() + square : nullptr;
        if (const ErrorCode failed = ReduceToHessenberg<ElementType::DBL>(h, stride_, n_, range.low,
                                                                          range.high, q, stride_))
            return failed;

        const double norm = SumOfHessenberg(h, stride_, n_);
        if (withVectors)
            CopyTransposed<ElementType::DBL>(q, stride_, n_, n_, schur_.data(), stride_);
        DBL *const transposed = withVectors ? schur_.data() : nullptr;
        if (const ErrorCode failed =
                RealSchurIteration(h, stride_, n_, range, 0.0, values, transposed))
            return failed;
        if (withVectors)
            writeVectors(norm, range, values, vectors);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = {std::ldexp(values[i].re, exponent), std::ldexp(values[i].im, exponent)};
        return 0;
    }

private:
    void writeVectors(double norm, Balanced range, const CDB *values, CDB *vectors) {
        DBL *const x = vectors_.data() + n_, *const y = x + n_;
        DBL *const re = y + n_, *const im = re + n_;
        QuasiTriangular triangle(matrix_.data(), stride_, norm, values, x, y);
        for (int32_t j = n_ - 1; j >= 0; --j) {
            const bool isPair = values[j].im < 0.0;
            Fill(y, n_, 0.0);
            Fill(im, n_, 0.0);
            if (isPair) {
                triangle.complexVector(j);
                transformBack(y, j, range, im);
            } else {
                triangle.realVector(j);
            }
            transformBack(x, j, range, re);
            normalise(re, im);
            for (int32_t i = 0; i < n_; ++i) {
                vectors[i * n_ + j] = {re[i], isPair ? -im[i] : im[i]};
                if (isPair)
                    vectors[i * n_ + j - 1] = {re[i], im[i]};
            }
            j -= isPair;
        }
    }
    void transformBack(const DBL *x, int32_t last, Balanced range, DBL *v) {
        Fill(v, n_, 0.0);
        AddTransposedProductReal(schur_.data(), stride_, last + 1, n_, x, v);
        constexpr auto side = EigenvectorSide::Right;
        UndoScaling<ElementType::DBL>(vectors_.data(), range, side, v, 1, 1);
        UndoPermutation<ElementType::DBL>(vectors_.data(), range, n_, v, 1, 1);
    }
    void normalise(DBL *re, DBL *im) const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += re[i] * re[i] + im[i] * im[i];
        if (!(squares > 0.0))
            return;
        const double length = std::sqrt(squares);
        for (int32_t i = 0; i < n_; ++i) {
            re[i] /= length;
            im[i] /= length;
        }
    }

    int32_t n_;
    std::ptrdiff_t stride_;
    Scratch<ElementType::DBL> matrix_, schur_, vectors_; // scale, x, y and the finished vector
};

} // namespace

ErrorCode EigenGeneral(const DBL *a, int32_t n, int32_t output, CDB *values, CDB *vectors) {
    if (n < 1)
        return ErrEmptyInput;
    if (output != eigenValuesOnly && output != eigenValuesAndVectors)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    return RealEigenproblem(n).solve(a, output == eigenValuesAndVectors, values, vectors);
}

} // namespace qx

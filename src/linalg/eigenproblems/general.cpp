#include "linalg/eigenproblems/general.h"

#include "linalg/eigenproblems/real_qr.h"
#include "linalg/factorisations/balance.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr auto E = ElementType::DBL;

// Eigenvectors of the quasi-triangular matrix that the iteration leaves, by back substitution. x
// and y are the real and the imaginary part of a vector, whose elements after `last` are 0.
class QuasiTriangular {
public:
    QuasiTriangular(const ConstRealMatrix &t, double norm, ConstComplexVector values, RealVector x,
                    RealVector y)
        : t_(t), norm_(norm > 0.0 ? norm : 1.0), values_(values), x_(x), y_(y) {}

    void realVector(int32_t last) {
        const double value = values_[last].re;
        int32_t known = last;
        x_[last] = 1.0;
        double lowerDiagonal = 0.0, lowerSum = 0.0;
        for (int32_t i = last - 1; i >= 0; --i) {
            const double diagonal = at(i, i) - value;
            const double sum = product(i, known, last, x_);
            if (values_[i].im < 0.0) { // the lower row of a pair is processed with the upper one
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

    // The vector of the eigenvalue with positive imaginary part, which is number last - 1.
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
    double at(int32_t i, int32_t j) const { return t_(i, j); }
    void set(int32_t i, CDB value) {
        x_[i] = value.re;
        y_[i] = value.im;
    }
    double product(int32_t i, int32_t from, int32_t to, ConstRealVector v) const {
        DBL sum;
        const int32_t count = to + 1 - from;
        RowProducts<E>(t_.block(i, from, 1, count), v.part(from, count), {&sum, 1});
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

    // Scales down the elements found so far so that their products do not overflow.
    void shrink(int32_t from, int32_t to, double size, bool isComplex) {
        if (!(epsilon * size * size > 1.0))
            return;
        for (int32_t j = from; j <= to; ++j) {
            x_[j] /= size;
            if (isComplex)
                y_[j] /= size;
        }
    }

    ConstRealMatrix t_;
    double norm_;
    ConstComplexVector values_;
    RealVector x_, y_;
};

class RealEigenproblem {
public:
    ErrorCode solve(const ConstRealMatrix &a, ComplexVector values, const ComplexMatrix &vectors) {
        n_ = a.rows();
        const int32_t order = vectors.isEmpty() ? 0 : n_; // of the matrices for vectors
        RealMatrix q;
        if (const ErrorCode failed =
                memory_.take(SizedPadded(matrix_, n_, n_), SizedPadded(transposed_, order, order),
                             SizedPadded(q, order, order), Sized(scale_, n_), Sized(x_, n_),
                             Sized(y_, n_), Sized(re_, n_), Sized(im_, n_)))
            return failed;

        CopyMatrix<E>(a, matrix_);
        const int exponent = BringIntoRange<E>(matrix_, 0x1p-400);
        const Balanced range = Balance<E>(matrix_, true, true, scale_);
        if (const ErrorCode failed = ReduceToHessenberg<E>(matrix_, range.low, range.high, q))
            return failed;
        const double norm = SumOfHessenberg(matrix_);
        CopyTransposed<E>(q, transposed_);
        if (const ErrorCode failed = RealSchurIteration(matrix_, range, 0.0, values, transposed_))
            return failed;
        if (!vectors.isEmpty())
            writeVectors(norm, range, values, vectors);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = {std::ldexp(values[i].re, exponent), std::ldexp(values[i].im, exponent)};
        return 0;
    }

private:
    void writeVectors(double norm, Balanced range, ConstComplexVector values,
                      const ComplexMatrix &vectors) {
        QuasiTriangular triangle(matrix_, norm, values, x_, y_);
        for (int32_t j = n_ - 1; j >= 0; --j) {
            const bool isPair = values[j].im < 0.0;
            Fill(y_.data(), n_, 0.0);
            Fill(im_.data(), n_, 0.0);
            if (isPair) {
                triangle.complexVector(j);
                transformBack(y_, j, range, im_);
            } else {
                triangle.realVector(j);
            }
            transformBack(x_, j, range, re_);
            normalise();
            for (int32_t i = 0; i < n_; ++i) {
                vectors(i, j) = {re_[i], isPair ? -im_[i] : im_[i]};
                if (isPair)
                    vectors(i, j - 1) = {re_[i], im_[i]};
            }
            j -= isPair;
        }
    }
    void transformBack(ConstRealVector x, int32_t last, Balanced range, RealVector v) {
        Fill(v.data(), n_, 0.0);
        AddTransposedProduct<E>(transposed_.block(0, 0, last + 1, n_), x.part(0, last + 1), v);
        UndoScaling<E>(scale_, range, EigenvectorSide::Right, AsColumn(v));
        UndoPermutation<E>(scale_, range, AsColumn(v));
    }
    void normalise() const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += re_[i] * re_[i] + im_[i] * im_[i];
        if (!(squares > 0.0))
            return;
        const double length = std::sqrt(squares);
        for (int32_t i = 0; i < n_; ++i) {
            re_[i] /= length;
            im_[i] /= length;
        }
    }

    int32_t n_ = 0;
    ScratchParts memory_;
    RealMatrix matrix_, transposed_;
    RealVector scale_, x_, y_, re_, im_;
};

} // namespace

template <>
ErrorCode EigenGeneral(const ConstRealMatrix &a, ComplexVector values,
                       const ComplexMatrix &vectors) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && values.size() == a.rows());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    return RealEigenproblem().solve(a, values, vectors);
}

} // namespace qx

#include "linalg/systems/lu.h"

#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"
#include "linalg/products/products.h"
#include "linalg/properties/norm_estimate.h"
#include "linalg/systems/substitution.h"

#include <cmath>

namespace qx {

namespace {

// The factorisation halves the columns until only a few are left, so that nearly all terms are
// subtracted in products of blocks (S. Toledo, "Locality of reference in LU decomposition with
// partial pivoting", 1997). The terms of one element are still subtracted in ascending order.
constexpr int32_t fewColumns = 16;
constexpr int32_t fewRows = 4;

template <ElementType E>
class Factorisation {
    typedef typename Element<E>::type T;

public:
    Factorisation(const MatrixView<E> &a, IndexVector pivots)
        : a_(a), m_(a.rows()), n_(a.cols()), pivots_(pivots) {}

    ErrorCode run(int32_t *parity) {
        const int32_t steps = m_ < n_ ? m_ : n_;
        for (int32_t k = 0; k < m_; ++k)
            pivots_[k] = k;
        factorColumns(0, steps);
        if (steps < n_)
            updateRight(0, steps, n_);
        *parity = parity_;
        return status_;
    }

private:
    T *row(int32_t i) const { return a_.row(i); }

    // Factors the columns from `first` to `end`, from which the terms of the columns left of them
    // have been subtracted.
    void factorColumns(int32_t first, int32_t end) {
        if (end - first <= fewColumns) {
            for (int32_t k = first; k < end; ++k)
                eliminate(k, end);
            return;
        }
        const int32_t middle = first + (end - first) / 2;
        factorColumns(first, middle);
        updateRight(first, middle, end);
        factorColumns(middle, end);
    }

    // Processes column k, whose terms have all been subtracted: finds the pivot, divides, and
    // subtracts the terms of column k from the columns right of it up to `end`.
    void eliminate(int32_t k, int32_t end) {
        const int32_t p = pivotRow(k);
        if (p < 0)
            status_ = WarnSingular;
        else if (p != k)
            exchange(k, p);
        for (int32_t i = k + 1; i < m_; ++i) {
            if (p >= 0)
                row(i)[k] = row(i)[k] / row(k)[k];
            if constexpr (E == ElementType::DBL) {
                const double factor = row(i)[k];
                for (int32_t j = k + 1; j < end; ++j)
                    row(i)[j] = row(i)[j] - factor * row(k)[j];
            }
        }
        if constexpr (E == ElementType::CDB)
            if (k + 1 < m_ && k + 1 < end)
                SubtractOuterProductComplex(row(k + 1) + k + 1, a_.stride(), m_ - k - 1,
                                            end - k - 1, row(k + 1) + k, row(k) + k + 1);
    }

    // An upper bound of the modulus, in a few operations.
    static double boundOfModulus(double x) { return std::fabs(x); }
    static double boundOfModulus(const CDB &x) {
        return (std::fabs(x.re) + std::fabs(x.im)) * (1.0 + 0x1p-40);
    }

    int32_t pivotRow(int32_t k) const {
        double best = 0.0;
        int32_t p = -1;
        for (int32_t i = k; i < m_; ++i) {
            if (boundOfModulus(row(i)[k]) <= best)
                continue;
            const double size = Modulus(row(i)[k]);
            if (size > best) {
                best = size;
                p = i;
            }
        }
        return p;
    }

    void exchange(int32_t k, int32_t p) {
        for (int32_t j = 0; j < n_; ++j) {
            const auto held = row(k)[j];
            row(k)[j] = row(p)[j];
            row(p)[j] = held;
        }
        pivots_[k] = p;
        parity_ ^= 1;
    }

    // Subtracts the terms of the columns from `first` to `middle`, which are done, from the columns
    // up to `end`: first in their own rows, which depend on each other, then in all rows below.
    void updateRight(int32_t first, int32_t middle, int32_t end) {
        const int32_t cols = end - middle;
        updateRows(first, middle, middle, cols);
        subtractTerms(first, middle, m_, middle, cols);
    }
    // Subtracts them from rows `middle` to `end`, in `cols` columns from `col` on.
    void subtractTerms(int32_t first, int32_t middle, int32_t end, int32_t col, int32_t cols) {
        SubtractProduct<E>(a_.block(middle, first, end - middle, middle - first),
                           a_.block(first, col, middle - first, cols),
                           a_.block(middle, col, end - middle, cols));
    }
    void updateRows(int32_t first, int32_t end, int32_t col, int32_t cols) {
        if (end - first <= fewRows) {
            for (int32_t i = first + 1; i < end; ++i)
                for (int32_t k = first; k < i; ++k) {
                    const auto factor = row(i)[k];
                    for (int32_t j = col; j < col + cols; ++j)
                        row(i)[j] = row(i)[j] - factor * row(k)[j];
                }
            return;
        }
        const int32_t middle = first + (end - first) / 2;
        updateRows(first, middle, col, cols);
        subtractTerms(first, middle, end, col, cols);
        updateRows(middle, end, col, cols);
    }

    MatrixView<E> a_;
    int32_t m_, n_;
    IndexVector pivots_;
    ErrorCode status_ = 0;
    int32_t parity_ = 0;
};

template <ElementType E>
void Exchange(const MatrixView<E> &x, ConstIndexVector pivots) {
    typedef ElementOf<E> T;
    for (int32_t k = 0; k < x.rows(); ++k) {
        const int32_t p = pivots[k];
        if (p == k)
            continue;
        for (int32_t j = 0; j < x.cols(); ++j) {
            const T held = x(k, j);
            x(k, j) = x(p, j);
            x(p, j) = held;
        }
    }
}

// The factors of a copy of a matrix.
template <ElementType E>
struct FactoredCopy {
    ErrorCode make(const ConstMatrixView<E> &a) {
        if (const ErrorCode failed =
                memory.take(Sized(lu, a.rows(), a.rows()), Sized(pivots, a.rows())))
            return failed;
        Copy<E>(a.elements(), lu.elements());
        int32_t parity;
        return LUDecompose<E>(lu, pivots, &parity) == 0 ? 0 : ErrSingularMatrix;
    }
    ScratchParts memory;
    MatrixView<E> lu;
    IndexVector pivots;
};

// Solves for all columns of the identity matrix at once.
template <ElementType E>
ErrorCode Invert(const ConstMatrixView<E> &lu, ConstIndexVector pivots, const MatrixView<E> &out) {
    SetIdentity<E>(out);
    return LUSolve<E>(lu, pivots, out, out);
}

// x becomes a^-H x, from the factors of P a = L U.
template <ElementType E>
void SolveAdjoint(const ConstMatrixView<E> &lu, ConstIndexVector pivots, VectorView<E> x) {
    const int32_t n = lu.rows();
    for (int32_t i = 0; i < n; ++i) {
        x[i] = x[i] / Conj(lu(i, i));
        for (int32_t j = i + 1; j < n; ++j)
            x[j] = x[j] - Conj(lu(i, j)) * x[i];
    }
    for (int32_t i = n - 1; i > 0; --i)
        for (int32_t j = 0; j < i; ++j)
            x[j] = x[j] - Conj(lu(i, j)) * x[i];
    for (int32_t k = n - 1; k >= 0; --k)
        Swap(&x[k], &x[pivots[k]]);
}

template <ElementType E>
ErrorCode ReciprocalCondition(double norm, const ConstMatrixView<E> &lu, ConstIndexVector pivots,
                              double *reciprocal) {
    VectorView<E> x;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(x, lu.rows())))
        return failed;
    const double inverseNorm = EstimateOneNorm<E>(
        x, [&](VectorView<E> v) { LUSolve<E>(lu, pivots, AsColumn(v), AsColumn(v)); },
        [&](VectorView<E> v) { SolveAdjoint<E>(lu, pivots, v); });
    *reciprocal = 1.0 / norm / inverseNorm;
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode LUDecompose(const MatrixView<E> &a, IndexVector pivots, int32_t *parity) {
    QX_EXPECTS(pivots.size() == a.rows());
    return Factorisation<E>(a, pivots).run(parity);
}

template <ElementType E>
ErrorCode LUSolve(const ConstMatrixView<E> &lu, ConstIndexVector pivots,
                  const ConstMatrixView<E> &b, const MatrixView<E> &x) {
    QX_EXPECTS(lu.isSquare() && pivots.size() == lu.rows() && b.rows() == lu.rows() &&
               x.rows() == b.rows() && x.cols() == b.cols());
    for (const int32_t pivot : pivots)
        if (pivot < 0 || pivot >= lu.rows())
            return ErrIndexOutOfRange;
    if (x.data() != b.data())
        Copy<E>(b.elements(), x.elements());
    Exchange<E>(x, pivots);
    return Substitute<E>(Factors::lu, lu.elements(), x);
}

template <ElementType E>
ErrorCode SolveByLU(const ConstMatrixView<E> &a, ConstVectorView<E> b, VectorView<E> x) {
    FactoredCopy<E> factored;
    if (const ErrorCode failed = factored.make(a))
        return failed;
    return LUSolve<E>(factored.lu, factored.pivots, AsColumn(b), AsColumn(x));
}

template <ElementType E>
ErrorCode SolveSetByLU(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                       const MatrixView<E> &x, double *reciprocalCondition) {
    if (!HoldsOnlyNumbers<E>(a) || !HoldsOnlyNumbers<E>(b))
        return ErrNonFiniteInput;
    const int32_t n = a.rows();
    ScaledCopy<E> scaled;
    ScaledColumns<E> sides;
    IndexVector pivots;
    ScratchParts memory;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (const ErrorCode failed = sides.make(b))
        return failed;
    if (const ErrorCode failed = memory.take(Sized(pivots, n)))
        return failed;
    const double norm = OneNorm<E>(scaled.matrix);
    int32_t parity;
    if (LUDecompose<E>(scaled.matrix, pivots, &parity) != 0)
        return ErrSingularMatrix;
    if (const ErrorCode failed =
            ReciprocalCondition<E>(norm, scaled.matrix, pivots, reciprocalCondition))
        return failed;
    if (const ErrorCode failed = LUSolve<E>(scaled.matrix, pivots, sides.matrix, sides.matrix))
        return failed;
    CopyMatrix<E>(sides.matrix, x);
    sides.scaleBack(x, scaled.exponent);
    return *reciprocalCondition < epsilon ? WarnLowAccuracy : 0;
}

template <ElementType E>
ErrorCode InvertByLU(const ConstMatrixView<E> &a, const MatrixView<E> &out) {
    FactoredCopy<E> factored;
    if (const ErrorCode failed = factored.make(a))
        return failed;
    return Invert<E>(factored.lu, factored.pivots, out);
}

template <ElementType E>
ErrorCode InvertFactors(const MatrixView<E> &lu, ConstIndexVector pivots) {
    MatrixView<E> copy;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(copy, lu.rows(), lu.rows())))
        return failed;
    Copy<E>(lu.elements(), copy.elements());
    return Invert<E>(copy, pivots, lu);
}

template ErrorCode LUDecompose(const RealMatrix &, IndexVector, int32_t *);
template ErrorCode LUDecompose(const ComplexMatrix &, IndexVector, int32_t *);
template ErrorCode LUSolve(const ConstRealMatrix &, ConstIndexVector, const ConstRealMatrix &,
                           const RealMatrix &);
template ErrorCode LUSolve(const ConstComplexMatrix &, ConstIndexVector, const ConstComplexMatrix &,
                           const ComplexMatrix &);
template ErrorCode SolveByLU(const ConstRealMatrix &, ConstRealVector, RealVector);
template ErrorCode SolveByLU(const ConstComplexMatrix &, ConstComplexVector, ComplexVector);
template ErrorCode SolveSetByLU(const ConstRealMatrix &, const ConstRealMatrix &,
                                const RealMatrix &, double *);
template ErrorCode SolveSetByLU(const ConstComplexMatrix &, const ConstComplexMatrix &,
                                const ComplexMatrix &, double *);
template ErrorCode InvertByLU(const ConstRealMatrix &, const RealMatrix &);
template ErrorCode InvertByLU(const ConstComplexMatrix &, const ComplexMatrix &);
template ErrorCode InvertFactors(const RealMatrix &, ConstIndexVector);
template ErrorCode InvertFactors(const ComplexMatrix &, ConstIndexVector);

} // namespace qx

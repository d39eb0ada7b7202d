#include "linalg/properties/determinant_and_norms.h"

#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/svd.h"
#include "linalg/properties/norm_estimate.h"
#include "linalg/systems/lu.h"

#include <algorithm>
#include <limits>

namespace qx {

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();

template <ElementType E>
typename ScalarOf<E>::type ProductOfDiagonal(const ConstMatrixView<E> &a) {
    auto product = ScalarOf<E>::Of(1.0);
    for (int32_t i = 0; i < a.rows(); ++i)
        product = product * a(i, i);
    return product;
}

template <ElementType E>
ErrorCode DeterminantByLU(const ConstMatrixView<E> &a, ElementOf<E> *det) {
    MatrixView<E> lu;
    IndexVector pivots;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(lu, a.rows(), a.cols()), Sized(pivots, a.rows())))
        return failed;
    CopyMatrix<E>(a, lu);
    int32_t parity;
    if (LUDecompose<E>(lu, pivots, &parity) != 0) {
        *det = ScalarOf<E>::Of(0.0);
        return 0;
    }
    const auto product = ProductOfDiagonal<E>(lu);
    *det = parity != 0 ? -product : product;
    return 0;
}

template <ElementType E>
ErrorCode DeterminantByCholesky(const ConstMatrixView<E> &a, ElementOf<E> *det) {
    const int32_t n = a.rows();
    VectorView<E> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(n))))
        return failed;
    PackMatrix<E>(a, symmetric, packed);
    if (const ErrorCode failed = PackedCholesky<E>(packed, n))
        return failed;
    auto product = ScalarOf<E>::Of(1.0);
    std::ptrdiff_t diagonal = 0;
    for (int32_t j = 0; j < n; ++j) {
        product = product * packed[diagonal];
        diagonal += n - j;
    }
    *det = product * product;
    return 0;
}

// The largest sum of moduli of a row.
template <ElementType E>
double LargestRowSum(const ConstMatrixView<E> &a) {
    const std::ptrdiff_t rows = a.rows(), cols = a.cols();
    const ConstVectorView<E> elements = a.elements();
    double largest = 0.0;
    for (std::ptrdiff_t i = 0; i < rows; ++i) {
        double sum = 0.0;
        for (std::ptrdiff_t j = 0; j < cols; ++j)
            sum += Modulus(elements[i * cols + j]);
        largest = sum > largest ? sum : largest;
    }
    return largest;
}
template <ElementType E>
double Frobenius(const ConstMatrixView<E> &a) {
    double sum = 0.0;
    for (const ElementOf<E> &element : a.elements())
        sum += SquaredModulus(element);
    return std::sqrt(sum);
}

// The singular values of a matrix of finite elements.
template <ElementType E>
struct Values {
    ErrorCode find(const ConstMatrixView<E> &a, SVDScaling scaling = SVDScaling::LargeNorms) {
        if (const ErrorCode failed = memory.take(Sized(s, std::min(a.rows(), a.cols()))))
            return failed;
        return SingularValues<E>(a, s, scaling);
    }
    double largest() const { return s[0]; }
    double smallest() const { return s[s.size() - 1]; }
    ScratchParts memory;
    RealVector s;
};

template <ElementType E>
ErrorCode LargestSingularValue(const ConstMatrixView<E> &a, double *largest) {
    Values<E> values;
    const ErrorCode failed = values.find(a);
    if (failed == 0)
        *largest = values.largest();
    return failed;
}

template <ElementType E>
ErrorCode ConditionByInverse(const ConstMatrixView<E> &a, int32_t normType, double *cond) {
    double norm, inverseNorm;
    if (const ErrorCode failed = MatrixNorm<E>(a, normType, &norm))
        return failed;
    MatrixView<E> inverse;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(inverse, a.rows(), a.rows())))
        return failed;
    const ErrorCode status = InvertByLU<E>(a, inverse);
    if (status != 0 && status != ErrSingularMatrix)
        return status;
    // An inverse may overflow without the matrix being singular.
    if (status == ErrSingularMatrix || !AllFinite<E>(inverse)) {
        *cond = infinity;
        return 0;
    }
    if (const ErrorCode failed = MatrixNorm<E>(inverse, normType, &inverseNorm))
        return failed;
    *cond = norm * inverseNorm;
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode MatrixDeterminant(const ConstMatrixView<E> &a, MatrixType type, ElementOf<E> *det) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    if (a.rows() == 2) {
        *det = a(1, 1) * a(0, 0) - a(1, 0) * a(0, 1);
        return 0;
    }
    if (type == MatrixType::general)
        return DeterminantByLU<E>(a, det);
    if (type == MatrixType::positiveDefinite)
        return DeterminantByCholesky<E>(a, det);
    *det = ProductOfDiagonal<E>(a);
    return 0;
}

template <ElementType E>
ErrorCode MatrixNorm(const ConstMatrixView<E> &a, int32_t normType, double *norm) {
    QX_EXPECTS(!a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    switch (normType) {
    case twoNorm:
        return LargestSingularValue<E>(a, norm);
    case oneNorm:
        *norm = OneNorm<E>(a);
        return 0;
    case frobeniusNorm:
        *norm = Frobenius<E>(a);
        return 0;
    case infinityNorm:
        *norm = LargestRowSum<E>(a);
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

template <ElementType E>
ErrorCode ConditionNumber(const ConstMatrixView<E> &a, int32_t normType, double *cond) {
    QX_EXPECTS(!a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    if (normType < twoNorm || normType > infinityNorm)
        return ErrInvalidSelector;
    if (normType != twoNorm)
        return a.isSquare() ? ConditionByInverse<E>(a, normType, cond) : ErrNotSquare;
    Values<E> values;
    if (const ErrorCode failed = values.find(a))
        return failed;
    *cond = values.smallest() == 0.0 ? infinity : values.largest() / values.smallest();
    return 0;
}

template <ElementType E>
ErrorCode MatrixRank(const ConstMatrixView<E> &a, double tolerance, int32_t *rank) {
    QX_EXPECTS(!a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    Values<E> values;
    if (const ErrorCode failed = values.find(a))
        return failed;
    const double cut =
        tolerance < 0.0 ? std::max(a.rows(), a.cols()) * values.largest() * epsilon : tolerance;
    *rank = 0;
    for (const DBL &value : values.s)
        *rank += value > cut;
    return 0;
}

template <ElementType E>
ErrorCode ScaledNorm(const ConstMatrixView<E> &a, int32_t normType, double *norm) {
    QX_EXPECTS(!a.isEmpty());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    if (normType < twoNorm || normType > infinityNorm)
        return ErrInvalidSelector;
    ScaledCopy<E> scaled;
    Values<E> values;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (normType == twoNorm) {
        if (const ErrorCode failed = values.find(scaled.matrix, SVDScaling::Always))
            return failed;
        *norm = values.largest();
    } else {
        *norm = normType == oneNorm         ? OneNorm<E>(scaled.matrix)
                : normType == frobeniusNorm ? Frobenius<E>(scaled.matrix)
                                            : LargestRowSum<E>(scaled.matrix);
    }
    *norm = TimesPower(*norm, scaled.exponent);
    return 0;
}

template <ElementType E>
ErrorCode ScaledConditionNumber(const ConstMatrixView<E> &a, int32_t normType, double *cond) {
    QX_EXPECTS(!a.isEmpty());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    if (normType < twoNorm || normType > infinityNorm)
        return ErrInvalidSelector;
    if (normType != twoNorm && !a.isSquare())
        return ErrNotSquare;
    ScaledCopy<E> scaled;
    Values<E> values;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (normType != twoNorm)
        return ConditionByInverse<E>(scaled.matrix, normType, cond);
    if (const ErrorCode failed = values.find(scaled.matrix, SVDScaling::Always))
        return failed;
    *cond = values.smallest() == 0.0 ? infinity : values.largest() / values.smallest();
    return 0;
}

template <ElementType E>
ErrorCode ScaledRank(const ConstMatrixView<E> &a, double tolerance, int32_t *rank) {
    QX_EXPECTS(!a.isEmpty());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    ScaledCopy<E> scaled;
    Values<E> values;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (const ErrorCode failed = values.find(scaled.matrix, SVDScaling::Always))
        return failed;
    const double cut = std::max(a.rows(), a.cols()) * values.largest() * epsilon;
    *rank = 0;
    for (const DBL &value : values.s)
        *rank += tolerance >= 0.0 ? TimesPower(value, scaled.exponent) > tolerance : value > cut;
    return 0;
}

template ErrorCode ScaledNorm(const ConstRealMatrix &, int32_t, double *);
template ErrorCode ScaledNorm(const ConstComplexMatrix &, int32_t, double *);
template ErrorCode ScaledConditionNumber(const ConstRealMatrix &, int32_t, double *);
template ErrorCode ScaledConditionNumber(const ConstComplexMatrix &, int32_t, double *);
template ErrorCode ScaledRank(const ConstRealMatrix &, double, int32_t *);
template ErrorCode ScaledRank(const ConstComplexMatrix &, double, int32_t *);
template ErrorCode MatrixDeterminant(const ConstRealMatrix &, MatrixType, DBL *);
template ErrorCode MatrixDeterminant(const ConstComplexMatrix &, MatrixType, CDB *);
template ErrorCode MatrixNorm(const ConstRealMatrix &, int32_t, double *);
template ErrorCode MatrixNorm(const ConstComplexMatrix &, int32_t, double *);
template ErrorCode ConditionNumber(const ConstRealMatrix &, int32_t, double *);
template ErrorCode ConditionNumber(const ConstComplexMatrix &, int32_t, double *);
template ErrorCode MatrixRank(const ConstRealMatrix &, double, int32_t *);
template ErrorCode MatrixRank(const ConstComplexMatrix &, double, int32_t *);

} // namespace qx

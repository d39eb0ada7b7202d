#include "linalg/properties/scalars.h"

#include "frame/scratch.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/factorisations/svd.h"
#include "linalg/matrix.h"
#include "linalg/systems/lu.h"

#include <cstring>
#include <limits>

namespace qx {

namespace {

constexpr double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double infinity = std::numeric_limits<double>::infinity();

template <ElementType E>
ErrorCode CopyOf(const ElementOf<E> *a, int64_t count, Scratch<E> &copy) {
    if (const ErrorCode failed = copy.allocate(count))
        return failed;
    std::memcpy(copy.data(), a, static_cast<std::size_t>(count) * sizeof *a);
    return 0;
}

template <ElementType E>
typename ScalarOf<E>::type ProductOfDiagonal(const ElementOf<E> *first, std::ptrdiff_t step,
                                             int32_t n) {
    auto product = ScalarOf<E>::Of(1.0);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        product = product * first[i * step];
    return product;
}

template <ElementType E>
ErrorCode DeterminantByLU(const ElementOf<E> *a, int32_t n, ElementOf<E> *det) {
    Scratch<E> lu;
    Scratch<ElementType::I32> pivots;
    if (const ErrorCode failed = CopyOf<E>(a, int64_t{n} * n, lu))
        return failed;
    if (const ErrorCode failed = pivots.allocate(n))
        return failed;
    int32_t parity;
    if (LUDecompose(lu.data(), n, n, pivots.data(), &parity) != 0) {
        *det = ScalarOf<E>::Of(0.0);
        return 0;
    }
    const auto product = ProductOfDiagonal<E>(lu.data(), std::ptrdiff_t{n} + 1, n);
    *det = parity != 0 ? -product : product;
    return 0;
}

template <ElementType E>
ErrorCode DeterminantByCholesky(const ElementOf<E> *a, int32_t n, ElementOf<E> *det) {
    Scratch<E> packed;
    if (const ErrorCode failed = packed.allocate(PackedLength(n)))
        return failed;
    PackMatrix(a, n, symmetric, packed.data());
    if (const ErrorCode failed = PackedCholesky(packed.data(), n))
        return failed;
    auto product = ScalarOf<E>::Of(1.0);
    std::ptrdiff_t diagonal = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        product = product * packed[diagonal];
        diagonal += n - j;
    }
    *det = product * product;
    return 0;
}

template <ElementType E>
ErrorCode Determinant(const ElementOf<E> *a, int32_t n, int32_t matrixType, ElementOf<E> *det) {
    Fill(reinterpret_cast<DBL *>(det), partsOf<E>, nan);
    if (n < 1)
        return ErrEmptyInput;
    const auto type = static_cast<MatrixType>(matrixType);
    if (type < MatrixType::general || type > MatrixType::upperTriangular)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{n} * n) != 0)
        return ErrNonFiniteInput;
    if (n == 2) {
        *det = a[3] * a[0] - a[2] * a[1];
        return 0;
    }
    if (type == MatrixType::general)
        return DeterminantByLU<E>(a, n, det);
    if (type == MatrixType::positiveDefinite)
        return DeterminantByCholesky<E>(a, n, det);
    *det = ProductOfDiagonal<E>(a, std::ptrdiff_t{n} + 1, n);
    return 0;
}

// The largest sum of moduli: of rows, or of columns, which are summed row by row all the same.
template <ElementType E>
double LargestRowSum(const ElementOf<E> *a, int32_t m, int32_t n) {
    double largest = 0.0;
    for (std::ptrdiff_t i = 0; i < m; ++i) {
        double sum = 0.0;
        for (std::ptrdiff_t j = 0; j < n; ++j)
            sum += Modulus(a[i * n + j]);
        largest = sum > largest ? sum : largest;
    }
    return largest;
}
template <ElementType E>
double LargestColumnSum(const ElementOf<E> *a, int32_t m, int32_t n) {
    double largest = 0.0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        double sum = 0.0;
        for (std::ptrdiff_t i = 0; i < m; ++i)
            sum += Modulus(a[i * n + j]);
        largest = sum > largest ? sum : largest;
    }
    return largest;
}
template <ElementType E>
double Frobenius(const ElementOf<E> *a, int64_t count) {
    double sum = 0.0;
    for (int64_t i = 0; i < count; ++i)
        sum += SquaredModulus(a[i]);
    return std::sqrt(sum);
}

struct SingularValueRange {
    double largest, smallest;
};
template <ElementType E>
ErrorCode RangeOfSingularValues(const ElementOf<E> *a, int32_t m, int32_t n,
                                Scratch<ElementType::DBL> &s, SingularValueRange &range) {
    const int32_t k = m < n ? m : n;
    if (const ErrorCode failed = s.allocate(k))
        return failed;
    if (const ErrorCode failed = SingularValues(a, m, n, s.data()))
        return failed;
    range = {s[0], s[k - 1]};
    return 0;
}

ErrorCode CheckSizeAndData(const DBL *a, int32_t m, int32_t n) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    return CheckFinite(a, int64_t{m} * n) != 0 ? ErrNonFiniteInput : 0;
}
ErrorCode CheckSizeAndData(const CDB *a, int32_t m, int32_t n) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    return CheckFinite(a, int64_t{m} * n) != 0 ? ErrNonFiniteInput : 0;
}

template <ElementType E>
ErrorCode Norm(const ElementOf<E> *a, int32_t m, int32_t n, int32_t normType, DBL *norm) {
    *norm = nan;
    if (const ErrorCode failed = CheckSizeAndData(a, m, n))
        return failed;
    Scratch<ElementType::DBL> s;
    SingularValueRange range;
    switch (normType) {
    case twoNorm:
        if (const ErrorCode failed = RangeOfSingularValues<E>(a, m, n, s, range))
            return failed;
        *norm = range.largest;
        return 0;
    case oneNorm:
        *norm = LargestColumnSum<E>(a, m, n);
        return 0;
    case frobeniusNorm:
        *norm = Frobenius<E>(a, int64_t{m} * n);
        return 0;
    case infinityNorm:
        *norm = LargestRowSum<E>(a, m, n);
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

template <ElementType E>
ErrorCode ConditionByInverse(const ElementOf<E> *a, int32_t n, int32_t normType, DBL *cond) {
    double norm, inverseNorm;
    if (const ErrorCode failed = Norm<E>(a, n, n, normType, &norm))
        return failed;
    Scratch<E> inverse;
    if (const ErrorCode failed = inverse.allocate(int64_t{n} * n))
        return failed;
    const ErrorCode status = InvertByLU(a, n, inverse.data());
    if (status == ErrSingularMatrix) {
        *cond = infinity;
        return 0;
    }
    if (status != 0)
        return status;
    // An inverse may overflow without the matrix being singular.
    if (CheckFinite(inverse.data(), int64_t{n} * n) != 0) {
        *cond = infinity;
        return 0;
    }
    if (const ErrorCode failed = Norm<E>(inverse.data(), n, n, normType, &inverseNorm))
        return failed;
    *cond = norm * inverseNorm;
    return 0;
}

template <ElementType E>
ErrorCode Condition(const ElementOf<E> *a, int32_t m, int32_t n, int32_t normType, DBL *cond) {
    *cond = nan;
    if (const ErrorCode failed = CheckSizeAndData(a, m, n))
        return failed;
    if (normType < twoNorm || normType > infinityNorm)
        return ErrInvalidSelector;
    if (normType != twoNorm)
        return m != n ? ErrNotSquare : ConditionByInverse<E>(a, n, normType, cond);
    Scratch<ElementType::DBL> s;
    SingularValueRange range;
    if (const ErrorCode failed = RangeOfSingularValues<E>(a, m, n, s, range))
        return failed;
    *cond = range.smallest == 0.0 ? infinity : range.largest / range.smallest;
    return 0;
}

template <ElementType E>
ErrorCode Rank(const ElementOf<E> *a, int32_t m, int32_t n, double tolerance, int32_t *rank) {
    *rank = -1;
    if (const ErrorCode failed = CheckSizeAndData(a, m, n))
        return failed;
    Scratch<ElementType::DBL> s;
    SingularValueRange range;
    if (const ErrorCode failed = RangeOfSingularValues<E>(a, m, n, s, range))
        return failed;
    const double cut = tolerance < 0.0 ? (m > n ? m : n) * range.largest * epsilon : tolerance;
    *rank = 0;
    for (int32_t i = 0; i < (m < n ? m : n); ++i)
        *rank += s[i] > cut;
    return 0;
}

} // namespace

ErrorCode MatrixDeterminant(const DBL *a, int32_t n, int32_t matrixType, DBL *det) {
    return Determinant<ElementType::DBL>(a, n, matrixType, det);
}
ErrorCode MatrixDeterminant(const CDB *a, int32_t n, int32_t matrixType, CDB *det) {
    return Determinant<ElementType::CDB>(a, n, matrixType, det);
}
ErrorCode MatrixNorm(const DBL *a, int32_t m, int32_t n, int32_t normType, DBL *norm) {
    return Norm<ElementType::DBL>(a, m, n, normType, norm);
}
ErrorCode MatrixNorm(const CDB *a, int32_t m, int32_t n, int32_t normType, DBL *norm) {
    return Norm<ElementType::CDB>(a, m, n, normType, norm);
}
ErrorCode ConditionNumber(const DBL *a, int32_t m, int32_t n, int32_t normType, DBL *cond) {
    return Condition<ElementType::DBL>(a, m, n, normType, cond);
}
ErrorCode ConditionNumber(const CDB *a, int32_t m, int32_t n, int32_t normType, DBL *cond) {
    return Condition<ElementType::CDB>(a, m, n, normType, cond);
}
ErrorCode MatrixRank(const DBL *a, int32_t m, int32_t n, double tolerance, int32_t *rank) {
    return Rank<ElementType::DBL>(a, m, n, tolerance, rank);
}
ErrorCode MatrixRank(const CDB *a, int32_t m, int32_t n, double tolerance, int32_t *rank) {
    return Rank<ElementType::CDB>(a, m, n, tolerance, rank);
}

} // namespace qx

#include "linalg/systems/triangular.h"

#include "frame/scratch.h"
#include "linalg/factorisations/cholesky.h"
#include "linalg/matrix.h"
#include "linalg/systems/substitution.h"

#include <cstring>

namespace qx {

namespace {

template <ElementType E>
bool HasSmallPivot(const typename Element<E>::type *packed, int32_t n, int32_t triangle) {
    double largest = 0.0;
    for (int64_t i = 0; i < PackedLength(n); ++i) {
        const double size = Modulus(packed[i]);
        largest = size > largest ? size : largest;
    }
    std::ptrdiff_t diagonal = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        if (!(Modulus(packed[diagonal]) > epsilon * largest))
            return true;
        diagonal += triangle == upperTriangle ? j + 2 : n - j;
    }
    return false;
}

template <ElementType E>
ErrorCode Solve(const typename Element<E>::type *packed, int32_t n, int32_t triangle,
                int32_t rightSides, typename Element<E>::type *x) {
    if (CheckFinite(packed, PackedLength(n)) != 0 || CheckFinite(x, int64_t{n} * rightSides) != 0)
        return ErrNonFiniteInput;
    if (HasSmallPivot<E>(packed, n, triangle))
        return ErrSingularMatrix;
    const Factors factors = triangle == upperTriangle ? Factors::upperPacked : Factors::lowerPacked;
    return Substitute(factors, packed, n, rightSides, x);
}

template <ElementType E>
ErrorCode SolveDefinite(const typename Element<E>::type *a, int32_t n, int32_t useUpper,
                        const typename Element<E>::type *b, int32_t rightSides,
                        typename Element<E>::type *x) {
    const int64_t count = int64_t{n} * rightSides;
    if (CheckFinite(a, int64_t{n} * n) != 0 || CheckFinite(b, count) != 0)
        return ErrNonFiniteInput;
    Scratch<E> packed;
    if (const ErrorCode failed = packed.allocate(PackedLength(n)))
        return failed;
    if (useUpper == 0) {
        PackMatrix(a, n, lowerTriangle, packed.data());
    } else {
        // The rows of the upper triangle are the columns of the lower one, conjugated.
        std::ptrdiff_t next = 0;
        for (std::ptrdiff_t i = 0; i < n; ++i)
            for (std::ptrdiff_t j = i; j < n; ++j)
                packed[next++] = Conj(a[i * n + j]);
    }
    if (const ErrorCode failed = PackedCholesky(packed.data(), n))
        return failed;
    std::memcpy(x, b, static_cast<std::size_t>(count) * sizeof *b);
    return Substitute(Factors::cholesky, packed.data(), n, rightSides, x);
}

} // namespace

ErrorCode SolveTriangular(const DBL *packed, int32_t n, int32_t triangle, int32_t rightSides,
                          DBL *x) {
    return Solve<ElementType::DBL>(packed, n, triangle, rightSides, x);
}
ErrorCode SolveTriangular(const CDB *packed, int32_t n, int32_t triangle, int32_t rightSides,
                          CDB *x) {
    return Solve<ElementType::CDB>(packed, n, triangle, rightSides, x);
}
ErrorCode CholeskySolve(const DBL *a, int32_t n, int32_t useUpper, const DBL *b, int32_t rightSides,
                        DBL *x) {
    return SolveDefinite<ElementType::DBL>(a, n, useUpper, b, rightSides, x);
}
ErrorCode CholeskySolve(const CDB *a, int32_t n, int32_t useUpper, const CDB *b, int32_t rightSides,
                        CDB *x) {
    return SolveDefinite<ElementType::CDB>(a, n, useUpper, b, rightSides, x);
}

} // namespace qx

#include "frame/scratch.h"
#include "linalg/complex_functions.h"
#include "linalg/factorisations/schur.h"
#include "linalg/functions/functions.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"

namespace qx {

namespace {
constexpr double negligible = 1e-12;
}

void TriangularSquareRoot(const CDB *t, int32_t n, CDB *r) {
    const auto at = [n](auto *a, int32_t i, int32_t j) { return a + std::ptrdiff_t{i} * n + j; };
    for (std::ptrdiff_t i = 0; i < std::ptrdiff_t{n} * n; ++i)
        r[i] = {0.0, 0.0};
    for (int32_t j = 0; j < n; ++j) {
        *at(r, j, j) = SquareRoot(*at(t, j, j));
        for (int32_t i = j - 1; i >= 0; --i) {
            CDB s = *at(t, i, j);
            for (int32_t k = i + 1; k < j; ++k)
                s -= *at(r, i, k) * *at(r, k, j);
            const CDB d = *at(r, i, i) + *at(r, j, j);
            const bool isZero = AbsSum(d) < negligible && AbsSum(s) < negligible;
            *at(r, i, j) = isZero ? CDB{0.0, 0.0} : s / d;
        }
    }
}

ErrorCode MatrixSquareRoot(CDB *a, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{n} * n;
    Scratch<ElementType::CDB> blocks;
    if (const ErrorCode failed = blocks.allocate(3 * count + n))
        return failed;
    CDB *const u = blocks.data(), *const t = u + count, *const r = t + count, *const w = r + count;
    if (const ErrorCode failed = SchurDecompose(a, n, schurModulusDescending, u, t, w))
        return failed;
    if (CheckFinite(t, count) != 0) // eigenvalues may be larger than the elements
        return ErrNonFiniteInput;
    const ErrorCode status = n > 1 && AbsSum(w[n - 2]) < negligible ? WarnLowAccuracy : 0;
    TriangularSquareRoot(t, n, r);
    if (const ErrorCode failed = MatrixProductPlain(u, r, n, n, n, t))
        return failed;
    if (const ErrorCode failed = ProductWithConjugate(t, u, n, n, n, a))
        return failed;
    return status;
}

ErrorCode MatrixSquareRoot(const DBL *a, int32_t n, CDB *root) {
    for (int64_t i = 0; i < int64_t{n} * n; ++i)
        root[i] = {a[i], 0.0};
    return MatrixSquareRoot(root, n);
}

} // namespace qx

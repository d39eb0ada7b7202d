#include "linalg/complex_functions.h"
#include "linalg/factorisations/schur.h"
#include "linalg/functions/functions.h"
#include "linalg/products/products.h"

namespace qx {

namespace {

constexpr double negligible = 1e-12;

// r r = t for upper triangular t: the columns from left to right, each from the diagonal up (A.
// Bjorck and S. Hammarling, "A Schur method for the square root of a matrix", 1983).
void TriangularSquareRoot(const ConstComplexMatrix &t, const ComplexMatrix &r) {
    for (CDB &element : r.elements())
        element = {0.0, 0.0};
    for (int32_t j = 0; j < t.cols(); ++j) {
        r(j, j) = SquareRoot(t(j, j));
        for (int32_t i = j - 1; i >= 0; --i) {
            CDB s = t(i, j);
            for (int32_t k = i + 1; k < j; ++k)
                s -= r(i, k) * r(k, j);
            const CDB d = r(i, i) + r(j, j);
            const bool isZero = AbsSum(d) < negligible && AbsSum(s) < negligible;
            r(i, j) = isZero ? CDB{0.0, 0.0} : s / d;
        }
    }
}

} // namespace

ErrorCode MatrixSquareRoot(const ConstComplexMatrix &a, const ComplexMatrix &root) {
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && n > 0 && root.rows() == n && root.cols() == n);
    ComplexMatrix u, t, r;
    ComplexVector w;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(u, n, n), Sized(t, n, n), Sized(r, n, n), Sized(w, n)))
        return failed;
    if (const ErrorCode failed =
            SchurDecompose<ElementType::CDB>(a, schurModulusDescending, u, t, w))
        return failed;
    if (!AllFinite<ElementType::CDB>(t)) // eigenvalues may be larger than the elements
        return ErrNonFiniteInput;
    const ErrorCode status = n > 1 && AbsSum(w[n - 2]) < negligible ? WarnLowAccuracy : 0;
    TriangularSquareRoot(t, r);
    MatrixProduct<ElementType::CDB>(u, r, t);
    ProductWithConjugate(t, u, root);
    return status;
}

} // namespace qx

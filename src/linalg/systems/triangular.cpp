#include "linalg/systems/triangular.h"

#include "linalg/factorisations/cholesky.h"
#include "linalg/systems/substitution.h"

namespace qx {

namespace {

template <ElementType E>
bool HasSmallPivot(ConstVectorView<E> packed, int32_t n, Triangle triangle) {
    double largest = 0.0;
    for (const ElementOf<E> &element : packed) {
        const double size = Modulus(element);
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

} // namespace

template <ElementType E>
ErrorCode SolveTriangular(ConstVectorView<E> packed, Triangle triangle, const MatrixView<E> &x) {
    QX_EXPECTS(packed.size() == PackedLength(x.rows()));
    QX_EXPECTS(triangle == lowerTriangle || triangle == upperTriangle);
    if (!AllFinite<E>(packed) || !AllFinite<E>(x))
        return ErrNonFiniteInput;
    if (HasSmallPivot<E>(packed, x.rows(), triangle))
        return ErrSingularMatrix;
    const Factors factors = triangle == upperTriangle ? Factors::upperPacked : Factors::lowerPacked;
    return Substitute<E>(factors, packed, x);
}

template <ElementType E>
ErrorCode CholeskySolve(const ConstMatrixView<E> &a, Triangle read, const ConstMatrixView<E> &b,
                        const MatrixView<E> &x) {
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && b.rows() == n && x.rows() == n && x.cols() == b.cols());
    if (!AllFinite<E>(a) || !AllFinite<E>(b))
        return ErrNonFiniteInput;
    VectorView<E> packed;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(packed, PackedLength(n))))
        return failed;
    if (read == lowerTriangle) {
        PackMatrix<E>(a, lowerTriangle, packed);
    } else {
        // The rows of the upper triangle are the columns of the lower one, conjugated.
        std::ptrdiff_t next = 0;
        for (std::ptrdiff_t i = 0; i < n; ++i)
            for (std::ptrdiff_t j = i; j < n; ++j)
                packed[next++] = Conj(a(i, j));
    }
    if (const ErrorCode failed = PackedCholesky<E>(packed, n))
        return failed;
    Copy<E>(b.elements(), x.elements());
    return Substitute<E>(Factors::cholesky, packed, x);
}

template ErrorCode SolveTriangular(ConstRealVector, Triangle, const RealMatrix &);
template ErrorCode SolveTriangular(ConstComplexVector, Triangle, const ComplexMatrix &);
template ErrorCode CholeskySolve(const ConstRealMatrix &, Triangle, const ConstRealMatrix &,
                                 const RealMatrix &);
template ErrorCode CholeskySolve(const ConstComplexMatrix &, Triangle, const ConstComplexMatrix &,
                                 const ComplexMatrix &);

} // namespace qx

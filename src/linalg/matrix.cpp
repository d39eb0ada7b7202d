#include "linalg/matrix.h"

#include "linalg/transpose.h"

#include <algorithm>

namespace qx {

namespace {

// kept: the lower bound is a truncated constant, so the last numbers above -DBL_MAX are refused.
bool IsRefused(double x) { return !(x < 0x1.fffffffffffffp1023 && x > -1.7976931348623e308); }

// Visits the packed elements in their order: at(i, j, packed element).
template <class At>
void ForEachPacked(std::ptrdiff_t n, Triangle triangle, At at) {
    std::ptrdiff_t next = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const std::ptrdiff_t first = triangle == upperTriangle ? 0 : j;
        const std::ptrdiff_t last = triangle == upperTriangle ? j : n - 1;
        for (std::ptrdiff_t i = first; i <= last; ++i)
            at(i, j, next++);
    }
}

} // namespace

ErrorCode CheckFinite(const DBL *x, int64_t n) {
    for (int64_t i = 0; i < n; ++i)
        if (IsRefused(x[i]))
            return 1;
    return 0;
}

template <ElementType E>
void CopyMatrix(const ConstMatrixView<E> &from, const MatrixView<E> &to) {
    QX_EXPECTS(to.rows() == from.rows() && to.cols() == from.cols());
    for (int32_t i = 0; i < from.rows(); ++i)
        Copy<E>({from.row(i), from.cols()}, {to.row(i), to.cols()});
}

template <ElementType E>
void CopyTransposed(const ConstMatrixView<E> &from, const MatrixView<E> &to) {
    QX_EXPECTS(to.rows() == from.cols() && to.cols() == from.rows());
    Transpose<E>(from.data(), from.stride(), from.rows(), from.cols(), to.data(), to.stride());
}

template <ElementType E>
void SetIdentity(const MatrixView<E> &a) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            a(i, j) = ScalarOf<E>::Of(i == j ? 1.0 : 0.0);
}

int32_t OrderOfPacked(int64_t length) {
    if (length < 0)
        return -1;
    const auto n = static_cast<int32_t>(std::floor(std::sqrt(2.0 * static_cast<double>(length))));
    return PackedLength(n) == length ? n : -1;
}

template <ElementType E>
void PackMatrix(const ConstMatrixView<E> &a, Triangle triangle, VectorView<E> packed) {
    QX_EXPECTS(a.isSquare() && packed.size() >= PackedLength(a.rows()));
    ForEachPacked(a.rows(), triangle, [=](std::ptrdiff_t i, std::ptrdiff_t j, std::ptrdiff_t at) {
        packed[at] = a(i, j);
    });
}

template <ElementType E>
void ExpandPacked(ConstVectorView<E> packed, Triangle triangle, const MatrixView<E> &a) {
    QX_EXPECTS(a.isSquare() && packed.size() >= PackedLength(a.rows()));
    ForEachPacked(a.rows(), triangle, [=](std::ptrdiff_t i, std::ptrdiff_t j, std::ptrdiff_t at) {
        // The mirror image is written first, so that the diagonal keeps the element itself.
        if (triangle == symmetric)
            a(j, i) = packed[at];
        else if (triangle == hermitian)
            a(j, i) = Conj(packed[at]);
        else
            a(j, i) = ScalarOf<E>::Of(0.0);
        a(i, j) = packed[at];
    });
}

template void CopyMatrix(const ConstRealMatrix &, const RealMatrix &);
template void CopyMatrix(const ConstComplexMatrix &, const ComplexMatrix &);
template void CopyTransposed(const ConstRealMatrix &, const RealMatrix &);
template void CopyTransposed(const ConstComplexMatrix &, const ComplexMatrix &);
template void SetIdentity(const RealMatrix &);
template void SetIdentity(const ComplexMatrix &);
template void PackMatrix(const ConstRealMatrix &, Triangle, RealVector);
template void PackMatrix(const ConstComplexMatrix &, Triangle, ComplexVector);
template void ExpandPacked(ConstRealVector, Triangle, const RealMatrix &);
template void ExpandPacked(ConstComplexVector, Triangle, const ComplexMatrix &);

} // namespace qx

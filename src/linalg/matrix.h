#ifndef QX_LINALG_MATRIX_H
#define QX_LINALG_MATRIX_H

#include "frame/scratch.h"
#include "frame/views.h"
#include "linalg/scalar.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Definitions that all matrix routines share. The real and complex forms of a routine are one
// template over the element, called as CopyMatrix<E>(from, to). Unless a routine says otherwise,
// its outputs share no element with its inputs.

typedef VectorView<ElementType::I32> IndexVector;
typedef ConstVectorView<ElementType::I32> ConstIndexVector;

// A vector as a matrix of one column, or of one row.
template <ElementType E, bool Writable>
BasicMatrixView<E, Writable> AsColumn(BasicVectorView<E, Writable> x) {
    return {x.data(), static_cast<int32_t>(x.size()), 1};
}
template <ElementType E, bool Writable>
BasicMatrixView<E, Writable> AsRow(BasicVectorView<E, Writable> x) {
    return {x.data(), 1, static_cast<int32_t>(x.size())};
}
// A matrix as the real numbers of which its elements consist.
template <ElementType E>
RealMatrix PartsOf(const MatrixView<E> &a) {
    return {reinterpret_cast<DBL *>(a.data()), a.rows(), a.cols() * partsOf<E>,
            a.stride() * partsOf<E>};
}

// Whether no element is NaN or infinite; the largest finite number is accepted like any other.
template <ElementType E>
bool HoldsOnlyNumbers(const ConstMatrixView<E> &a) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            if (!std::isfinite(RealPart(a(i, j))) || !std::isfinite(ImagPart(a(i, j))))
                return false;
    return true;
}

// Returns 0, or 1 if one of n numbers is NaN or infinite. The largest finite number is refused as
// well, and so are all numbers that are not above -1.7976931348623e308.
ErrorCode CheckFinite(const DBL *x, int64_t n);
template <ElementType E>
bool AllFinite(ConstVectorView<E> x) {
    return CheckFinite(reinterpret_cast<const DBL *>(x.data()), partsOf<E> * x.size()) == 0;
}
template <ElementType E>
bool AllFinite(const ConstMatrixView<E> &a) {
    if (a.isWhole())
        return AllFinite<E>(a.elements());
    for (int32_t i = 0; i < a.rows(); ++i)
        if (!AllFinite<E>(ConstVectorView<E>(a.row(i), a.cols())))
            return false;
    return true;
}

template <ElementType E>
void CopyMatrix(const ConstMatrixView<E> &from, const MatrixView<E> &to);
// to[j][i] = from[i][j], without conjugation.
template <ElementType E>
void CopyTransposed(const ConstMatrixView<E> &from, const MatrixView<E> &to);
template <ElementType E>
void SetIdentity(const MatrixView<E> &a);

// Packed triangular storage of a matrix of order n: n(n+1)/2 elements, column by column, of the
// lower triangle (rows j to n-1) or of the upper one (rows 0 to j).
enum Triangle : int32_t { lowerTriangle = 0, upperTriangle = 1, symmetric = 2, hermitian = 3 };
constexpr int64_t PackedLength(int32_t n) { return int64_t{n} * (int64_t{n} + 1) / 2; }
// The order to which a packed length belongs, floor(sqrt(2 length)), or -1 if there is none.
int32_t OrderOfPacked(int64_t length);

// Copies a square matrix into packed storage and back. Packing with the last two values reads the
// lower triangle; expanding fills the other triangle with zeros, or with its mirror image, which is
// conjugated in a Hermitian matrix.
template <ElementType E>
void PackMatrix(const ConstMatrixView<E> &a, Triangle triangle, VectorView<E> packed);
template <ElementType E>
void ExpandPacked(ConstVectorView<E> packed, Triangle triangle, const MatrixView<E> &a);

// The distance of rows in scratch matrices: an odd number of cache lines, because a column whose
// rows are a power of two apart falls into few sets of the cache.
constexpr std::ptrdiff_t PaddedStride(int32_t cols) {
    const std::ptrdiff_t lines = (std::ptrdiff_t{cols} + 7) / 8;
    return 8 * (lines | 1);
}
// A scratch matrix with such a stride, for ScratchParts::take.
template <ElementType E>
auto SizedPadded(MatrixView<E> &view, int32_t rows, int32_t cols) {
    typedef typename MatrixView<E>::T T;
    const auto place = [&view, rows, cols](void *at) {
        view = MatrixView<E>(static_cast<T *>(at), rows, cols, PaddedStride(cols));
    };
    const int64_t count = int64_t{rows} * PaddedStride(cols);
    return ScratchPart<decltype(place)>{place, BytesOf(count, sizeof(T))};
}

} // namespace qx

#endif

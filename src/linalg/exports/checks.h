#ifndef QX_LINALG_EXPORTS_CHECKS_H
#define QX_LINALG_EXPORTS_CHECKS_H

#include "frame/export.h"
#include "linalg/factorisations/schur.h"
#include "linalg/matrix.h"

namespace qx {

// Checks and resizes that several exports of this family share.

template <class Handle>
constexpr ElementType elementOf = HandleTraits<Handle>::code;

// kept: of the exports with an `err`, the last failed check decides
template <class Matrix>
ErrorCode SquareLast(const Block<Matrix> &a) {
    return LastFailed({{a.isEmpty(), ErrEmptyInput}, {!a.isSquare(), ErrNotSquare}});
}
template <class Matrix>
ErrorCode SquareFirst(const Block<Matrix> &a) {
    return FirstFailed({{a.isEmpty(), ErrEmptyInput}, {!a.isSquare(), ErrNotSquare}});
}

// Resizes an output to a square matrix, or to an empty one if it is not wanted.
template <class Matrix>
Outcome ResizeIf(bool wanted, Out<Matrix> &matrix, int32_t n) {
    return wanted ? matrix.resize(n, n) : matrix.resize(0, 0);
}

inline bool IsNoSchurOrder(int32_t order) {
    return order < schurUnordered || order > schurModulusDescending;
}
inline bool IsNoTriangle(int32_t triangle) {
    return triangle != lowerTriangle && triangle != upperTriangle;
}

} // namespace qx

#endif

#ifndef QX_LINALG_SYSTEMS_BANDED_H
#define QX_LINALG_SYSTEMS_BANDED_H

#include "linalg/matrix.h"

namespace qx {

// Solves a band system; the solution replaces b. Row upper + i - j, column j of `band` holds a(i,
// j); band has lower + upper + 1 rows, and at least as many columns. ErrOutOfMemory,
// ErrSingularMatrix.
template <ElementType E>
ErrorCode SolveBand(const ConstMatrixView<E> &band, int32_t lower, int32_t upper,
                    const MatrixView<E> &b);

// A tridiagonal matrix of order n by its diagonals, of which `lower` and `upper` have n - 1
// elements, and `upper2`, which only the factors have, has n - 2.
template <bool Writable>
struct Diagonals {
    BasicVectorView<ElementType::DBL, Writable> lower, main, upper, upper2;
};

// Factors in place; `pivots` has n elements, counted from 1. ErrOutOfMemory, WarnSingular.
ErrorCode FactorTridiagonal(const Diagonals<true> &matrix, IndexVector pivots);
// Solves with the factors; the solution replaces b. ErrIndexOutOfRange (no such pivots),
// ErrOutOfMemory.
ErrorCode SolveTridiagonal(bool transposed, const Diagonals<false> &factors,
                           ConstIndexVector pivots, const RealMatrix &b);

} // namespace qx

#endif

#ifndef QX_LINALG_SYSTEMS_BANDED_H
#define QX_LINALG_SYSTEMS_BANDED_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Solves a band system in place of b, n by `rightSides`. Row upper + i - j, column j of `band`
// holds a(i, j); band has lower + upper + 1 rows of n.
//
// ErrEmptyInput, ErrSizesDisagree (a count of bands is negative, or both are above n together),
// ErrOutOfMemory, ErrSingularMatrix.
ErrorCode SolveBand(const DBL *band, int32_t n, int32_t lower, int32_t upper, int32_t rightSides,
                    DBL *b);
ErrorCode SolveBand(const CDB *band, int32_t n, int32_t lower, int32_t upper, int32_t rightSides,
                    CDB *b);

// The factors of a tridiagonal matrix in place; upper2 has n - 2 elements, pivots n, counted
// from 1. WarnSingular.
ErrorCode FactorTridiagonal(int32_t n, DBL *lower, DBL *diagonal, DBL *upper, DBL *upper2,
                            I32 *pivots);
// Solves with them in place of b, n by `rightSides`. ErrIndexOutOfRange (no such pivots),
// ErrOutOfMemory.
ErrorCode SolveTridiagonal(bool transposed, int32_t n, const DBL *lower, const DBL *diagonal,
                           const DBL *upper, const DBL *upper2, const I32 *pivots,
                           int32_t rightSides, DBL *b);

} // namespace qx

#endif

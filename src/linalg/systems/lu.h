#ifndef QX_LINALG_SYSTEMS_LU_H
#define QX_LINALG_SYSTEMS_LU_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Factors P a = L U in place, m by n, by rows with the largest pivot of each column: Crout's order
// of arithmetic, a[i][k] minus a[i][j] a[j][k] term by term, j ascending. L has a unit diagonal.
// pivots holds m rows: in step k row k was exchanged with row pivots[k]. parity is 0 or 1
// for an even or odd number of exchanges. Ties take the earlier row; NaN is never a pivot.
//
// WarnSingular where a column has no pivot other than 0; the factors are complete all the same.
ErrorCode LUDecompose(DBL *a, int32_t m, int32_t n, I32 *pivots, int32_t *parity);
ErrorCode LUDecompose(CDB *a, int32_t m, int32_t n, I32 *pivots, int32_t *parity);

// Solves with the factors of a square matrix: n by `rightSides`, row after row; x may be b.
// ErrIndexOutOfRange (a pivot is no row of the matrix), ErrOutOfMemory.
ErrorCode LUSolve(const DBL *lu, const I32 *pivots, const DBL *b, int32_t n, int32_t rightSides,
                  DBL *x);
ErrorCode LUSolve(const CDB *lu, const I32 *pivots, const CDB *b, int32_t n, int32_t rightSides,
                  CDB *x);

// a x = b for a square a; the inputs stay. ErrOutOfMemory, ErrSingularMatrix.
ErrorCode SolveByLU(const DBL *a, int32_t n, const DBL *b, DBL *x);
ErrorCode SolveByLU(const CDB *a, int32_t n, const CDB *b, CDB *x);

// The inverse; out may be a. ErrOutOfMemory, ErrSingularMatrix.
ErrorCode InvertByLU(const DBL *a, int32_t n, DBL *out);
ErrorCode InvertByLU(const CDB *a, int32_t n, CDB *out);

// The inverse from the factors, in their place. ErrIndexOutOfRange, ErrOutOfMemory.
ErrorCode InvertFactors(DBL *lu, const I32 *pivots, int32_t n);
ErrorCode InvertFactors(CDB *lu, const I32 *pivots, int32_t n);

} // namespace qx

#endif

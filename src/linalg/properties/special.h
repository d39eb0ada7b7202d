#ifndef QX_LINALG_PROPERTIES_SPECIAL_H
#define QX_LINALG_PROPERTIES_SPECIAL_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Matrices of a named kind, row after row into memory of their full size.
void FillIdentity(DBL *out, int32_t n);
void FillIdentity(CDB *out, int32_t n);
void FillDiagonal(const DBL *x, int32_t n, DBL *out);
void FillDiagonal(const CDB *x, int32_t n, CDB *out);
// First column x, the rest of the first row from y[1] on; rows by cols.
void FillToeplitz(const DBL *x, int32_t rows, const DBL *y, int32_t cols, DBL *out);
void FillToeplitz(const CDB *x, int32_t rows, const CDB *y, int32_t cols, CDB *out);
// Row i: the powers n-1 to 0 of x[i].
void FillVandermonde(const DBL *x, int32_t n, DBL *out);
void FillVandermonde(const CDB *x, int32_t n, CDB *out);
// Of the polynomial x[0] t^n + x[1] t^(n-1) + ... + x[n]: -x[j+1] / x[0] in the first row.
void FillCompanion(const DBL *x, int32_t n, DBL *out);
void FillCompanion(const CDB *x, int32_t n, CDB *out);

// Q diag(values) Q with the reflection Q = 1 - (2/n) e e^T, e being all ones: a full symmetric
// matrix with these eigenvalues.
void FillWithEigenvalues(const DBL *values, int32_t n, DBL *out);

// The coefficients of det(t - a), ascending, n + 1 of them, the last one 1: by the product of (t -
// w) over the eigenvalues w.
// ErrEmptyInput, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrOverflow.
ErrorCode CharacteristicPolynomial(const DBL *a, int32_t n, DBL *polynomial);
ErrorCode CharacteristicPolynomial(const CDB *a, int32_t n, CDB *polynomial);

// out[i][j] = r(i - j) for a matrix of order maxLag + 1, where r(k) is the sum over i of x[i + k]
// conj(y[i]) wherever both exist, divided by 1, by the number of terms or by n.
enum CorrelationScale : int32_t { unscaled, unbiased, biased };
// ErrOutOfMemory.
ErrorCode CorrelationMatrix(const DBL *x, const DBL *y, int32_t n, int32_t maxLag, int32_t scale,
                            DBL *out);
ErrorCode CorrelationMatrix(const CDB *x, const CDB *y, int32_t n, int32_t maxLag, int32_t scale,
                            CDB *out);

} // namespace qx

#endif

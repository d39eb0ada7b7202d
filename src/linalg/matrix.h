#ifndef QX_LINALG_MATRIX_H
#define QX_LINALG_MATRIX_H

#include "linalg/scalar.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// What all matrix routines share. Matrices are bare pointers to their elements, row after row.
// Names are overloaded by element: real and complex forms of a routine are one text, a template
// keyed by ElementType behind these names.

// 1 if an element is NaN or infinite, else 0. The largest finite number is refused as well, and
// so is whatever is not above -1.7976931348623e308.
ErrorCode CheckFinite(const DBL *x, int64_t n);
ErrorCode CheckFinite(const CDB *x, int64_t n);

// The transpose, without conjugation; a null `out` means in place. A matrix with one dimension of
// 1 is copied, or in place left as it is.
// ErrOutOfMemory where the place is needed and there is no scratch memory.
ErrorCode TransposeMatrix(DBL *a, int32_t rows, int32_t cols, DBL *out);
ErrorCode TransposeMatrix(CDB *a, int32_t rows, int32_t cols, CDB *out);
void TransposeInto(const DBL *a, int32_t rows, int32_t cols, DBL *out);
void TransposeInto(const CDB *a, int32_t rows, int32_t cols, CDB *out);

// Packed triangular storage of a matrix of order n: n(n+1)/2 elements, column after column of the
// lower triangle (rows j to n-1) or of the upper one (rows 0 to j).
enum Triangle : int32_t { lowerTriangle = 0, upperTriangle = 1, symmetric = 2, hermitian = 3 };
constexpr int64_t PackedLength(int32_t n) { return int64_t{n} * (int64_t{n} + 1) / 2; }
// The order that a packed length belongs to, floor(sqrt(2 length)), or -1 where it fits none.
int32_t OrderOfPacked(int32_t length);

// A square matrix into packed storage and back. Packing the last two takes the lower triangle;
// expanding fills the other triangle with zeros, or with its mirror image, which is conjugated in a
// Hermitian matrix.
void PackMatrix(const DBL *a, int32_t n, int32_t triangle, DBL *packed);
void PackMatrix(const CDB *a, int32_t n, int32_t triangle, CDB *packed);
void ExpandPacked(const DBL *packed, int32_t n, int32_t triangle, DBL *a);
void ExpandPacked(const CDB *packed, int32_t n, int32_t triangle, CDB *a);

} // namespace qx

#endif

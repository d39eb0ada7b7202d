#ifndef QX_LINALG_PRODUCTS_PRODUCTS_H
#define QX_LINALG_PRODUCTS_PRODUCTS_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// c = a b for a of m by k and b of k by n, through BLAS; where k is 0, c is NaN. With `alignedCopy`
// the operands are copied into fresh blocks first. Small products run term by term in ascending
// order and give the same bits on every processor; a product counts as small by its number of
// terms alone.
//
// ErrNegativeDimension, ErrOutOfMemory.
ErrorCode MatrixProduct(const DBL *a, const DBL *b, int32_t m, int32_t k, int32_t n, DBL *c,
                        int32_t alignedCopy);
ErrorCode MatrixProduct(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n, CDB *c,
                        int32_t alignedCopy);
inline ErrorCode MatrixProductPlain(const DBL *a, const DBL *b, int32_t m, int32_t k, int32_t n,
                                    DBL *c) {
    return MatrixProduct(a, b, m, k, n, c, 0);
}
inline ErrorCode MatrixProductPlain(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n,
                                    CDB *c) {
    return MatrixProduct(a, b, m, k, n, c, 0);
}

// c = a b term by term in ascending order at every size: half as fast as BLAS, with the same bits
// on every processor. The sizes are not negative.
void OrderedProduct(const DBL *a, const DBL *b, int32_t m, int32_t k, int32_t n, DBL *c);
void OrderedProduct(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n, CDB *c);

// c = a b^H for a of m by k and b of n by k.
ErrorCode ProductWithConjugate(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n, CDB *c);

// y = a x for a of m by n: one sum per row, its terms added in ascending order. An empty matrix
// writes nothing. ErrNegativeDimension.
ErrorCode MatrixVectorProduct(const DBL *a, int32_t m, int32_t n, const DBL *x, DBL *y);
ErrorCode MatrixVectorProduct(const CDB *a, int32_t m, int32_t n, const CDB *x, CDB *y);

} // namespace qx

#endif

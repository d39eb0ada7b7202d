#ifndef QX_LINALG_PRODUCTS_ORDERED_H
#define QX_LINALG_PRODUCTS_ORDERED_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>

namespace qx {

// The kernels of AddProduct and SubtractProduct (products/products.h): c += a b and c -= a b with
// the order of arithmetic of the plain triple loop: to every c[i][j] the terms a[i][p] b[p][j] are
// added one by one, p ascending. a is m by k, b is k by n; c shares no element with them. No BLAS,
// and the same bits on every processor.
QX_BY_WIDTH(void, AddProductReal,
            (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const DBL *a,
             std::ptrdiff_t aStride, const DBL *b, std::ptrdiff_t bStride, DBL *c,
             std::ptrdiff_t cStride))
QX_BY_WIDTH(void, SubtractProductReal,
            (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const DBL *a,
             std::ptrdiff_t aStride, const DBL *b, std::ptrdiff_t bStride, DBL *c,
             std::ptrdiff_t cStride))
QX_BY_WIDTH(void, AddProductComplex,
            (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const CDB *a,
             std::ptrdiff_t aStride, const CDB *b, std::ptrdiff_t bStride, CDB *c,
             std::ptrdiff_t cStride))
QX_BY_WIDTH(void, SubtractProductComplex,
            (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const CDB *a,
             std::ptrdiff_t aStride, const CDB *b, std::ptrdiff_t bStride, CDB *c,
             std::ptrdiff_t cStride))

} // namespace qx

#endif

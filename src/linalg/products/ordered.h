#ifndef QX_LINALG_PRODUCTS_ORDERED_H
#define QX_LINALG_PRODUCTS_ORDERED_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>

namespace qx {

// A factor of a product: element (i, j) is data[i * down + j * across], so a transpose is an
// operand with its strides exchanged. Strides may be negative.
struct RealOperand {
    const DBL *data;
    std::ptrdiff_t down, across;
};
struct ComplexOperand {
    const CDB *data;
    std::ptrdiff_t down, across;
    bool isConjugated;
};

// The factor of every term of a product.
struct RealFactor {
    double value;
};
struct ComplexFactor {
    double re, im;
};

// c += factor a b: to every c[i][j] the terms (factor a[i][p]) b[p][j] are added one by one, p
// ascending, with one rounding for each product and one for each sum; the factors 1 and -1 cause no
// multiplication. a is m by k, b is k by n, the rows of c are cStride elements apart; c shares no
// element with a and b. The real and the imaginary part of a complex term are x x' - y y' and x y'
// + y x'. The order depends on nothing else, so the bits are the same at every width, and however
// the matrices are cut into blocks.
//
// Large products copy blocks of both operands into pages that are kept for the next caller
// (products/panel_memory.h). Without such memory they are slower and give the same bits.
QX_BY_WIDTH_TO_8(void, AddProductReal,
                 (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, RealFactor factor,
                  RealOperand a, RealOperand b, DBL *c, std::ptrdiff_t cStride))
QX_BY_WIDTH_TO_8(void, AddProductComplex,
                 (std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, ComplexFactor factor,
                  ComplexOperand a, ComplexOperand b, CDB *c, std::ptrdiff_t cStride))

} // namespace qx

#endif

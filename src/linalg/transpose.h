#ifndef QX_LINALG_TRANSPOSE_H
#define QX_LINALG_TRANSPOSE_H

#include "linalg/scalar.h"

#include <algorithm>
#include <cstddef>

namespace qx {

// y[j][i] = x[i][j], inline for the smallest matrices; others call CopyTransposed (linalg/matrix.h).
template <ElementType E>
inline void Transpose(const ElementOf<E> *x, std::ptrdiff_t xStride, std::ptrdiff_t rows,
                      std::ptrdiff_t cols, ElementOf<E> *y, std::ptrdiff_t yStride) {
    // The number of rows that fit into the first cache together, so that neither side is read or
    // written in long strides.
    constexpr std::ptrdiff_t rowsAtOnce = 16;
    for (std::ptrdiff_t top = 0; top < rows; top += rowsAtOnce) {
        const std::ptrdiff_t bottom = std::min(top + rowsAtOnce, rows);
        for (std::ptrdiff_t j = 0; j < cols; ++j)
            for (std::ptrdiff_t i = top; i < bottom; ++i)
                y[j * yStride + i] = x[i * xStride + j];
    }
}

} // namespace qx

#endif

#ifndef QX_LINALG_TRANSPOSE_H
#define QX_LINALG_TRANSPOSE_H

#include "linalg/scalar.h"

namespace qx {

// to[j][i] = from[i][j] for a rows by cols matrix `from`, in tiles that fit the cache. No overlap.
template <ElementType E>
void CopyTransposed(const ElementOf<E> *from, std::ptrdiff_t fromStride, int32_t rows, int32_t cols,
                    ElementOf<E> *to, std::ptrdiff_t toStride) {
    constexpr int32_t tile = 8;
    for (int32_t top = 0; top < rows; top += tile)
        for (int32_t left = 0; left < cols; left += tile) {
            const int32_t bottom = top + tile < rows ? top + tile : rows;
            const int32_t right = left + tile < cols ? left + tile : cols;
            for (int32_t i = top; i < bottom; ++i)
                for (int32_t j = left; j < right; ++j)
                    to[j * toStride + i] = from[i * fromStride + j];
        }
}

template <ElementType E>
void CopyMatrix(const ElementOf<E> *from, std::ptrdiff_t fromStride, int32_t rows, int32_t cols,
                ElementOf<E> *to, std::ptrdiff_t toStride) {
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j)
            to[i * toStride + j] = from[i * fromStride + j];
}

} // namespace qx

#endif

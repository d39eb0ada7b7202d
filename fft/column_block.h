#ifndef QX_FFT_COLUMN_BLOCK_H
#define QX_FFT_COLUMN_BLOCK_H

#include "frame/elements.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace qx {

// Columns of a row-major matrix, copied out side by side so that a transform finds each of them
// contiguous. Several are moved at a time, because a fetched cache line holds several.
constexpr int32_t ColumnsAtOnce = 8;

// The distance between copied columns. The spare line keeps columns of a power-of-two length
// from falling into the same cache set.
inline int64_t ColumnPitch(int32_t rows) { return int64_t{rows} + 8; }

inline int32_t ColumnsInBlock(int32_t first, int32_t cols) {
    return std::min(ColumnsAtOnce, cols - first);
}

template <ElementType Code>
void GatherColumns(const typename Element<Code>::type *matrix, int64_t matrixPitch, int32_t rows,
                   int32_t count, typename Element<Code>::type *columns, int64_t columnPitch) {
    for (int32_t r = 0; r < rows; ++r)
        for (int32_t c = 0; c < count; ++c)
            columns[c * columnPitch + r] = matrix[r * matrixPitch + c];
}

template <ElementType Code>
void ScatterColumns(const typename Element<Code>::type *columns, int64_t columnPitch, int32_t rows,
                    int32_t count, typename Element<Code>::type *matrix, int64_t matrixPitch) {
    for (int32_t r = 0; r < rows; ++r)
        for (int32_t c = 0; c < count; ++c)
            matrix[r * matrixPitch + c] = columns[c * columnPitch + r];
}

} // namespace qx

#endif

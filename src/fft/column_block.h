#ifndef QX_FFT_COLUMN_BLOCK_H
#define QX_FFT_COLUMN_BLOCK_H

#include "frame/elements.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace qx {

// Columns of a row-major matrix are copied out, so that each is contiguous for its transform. Several are
// moved at a time, because each cache line holds values of several columns.
constexpr int32_t ColumnsAtOnce = 16;

// The distance between rows or columns of n values in work memory. The spare line keeps rows or columns
// of a power-of-two length from mapping to the same cache set.
inline int64_t PaddedPitch(int32_t n) { return int64_t{n} + 8; }

inline int32_t ColumnsInBlock(int32_t first, int32_t cols) {
    return std::min(ColumnsAtOnce, cols - first);
}

// Calls body(row, column) for every element of a block, with the usual number of columns known
// to the compiler.
template <class Body>
void ForEachInBlock(int32_t rows, int32_t count, const Body &body) {
    if (count == ColumnsAtOnce) {
        for (int32_t r = 0; r < rows; ++r)
            for (int32_t c = 0; c < ColumnsAtOnce; ++c)
                body(r, c);
    } else {
        for (int32_t r = 0; r < rows; ++r)
            for (int32_t c = 0; c < count; ++c)
                body(r, c);
    }
}

template <ElementType Code>
void GatherColumns(const typename Element<Code>::type *matrix, int64_t matrixPitch, int32_t rows,
                   int32_t count, typename Element<Code>::type *columns, int64_t columnPitch) {
    ForEachInBlock(rows, count, [=](int32_t r, int32_t c) {
        columns[c * columnPitch + r] = matrix[r * matrixPitch + c];
    });
}

template <ElementType Code>
void ScatterColumns(const typename Element<Code>::type *columns, int64_t columnPitch, int32_t rows,
                    int32_t count, typename Element<Code>::type *matrix, int64_t matrixPitch) {
    ForEachInBlock(rows, count, [=](int32_t r, int32_t c) {
        matrix[r * matrixPitch + c] = columns[c * columnPitch + r];
    });
}

} // namespace qx

#endif

#include "transforms/separable.h"

#include "fft/column_block.h"

#include <algorithm>
#include <cstring>

namespace qx {
namespace {

// One block for both directions: the work of the larger need, then the gathered columns.
//
// The longer direction is not always the one that needs more work, since an odd length takes
// twice the work of an even one.
struct WorkBlock {
    HeapBlock<ElementType::DBL> block;
    DBL *columns;

    ErrorCode take(int64_t columnWork, int64_t rowWork, int32_t rows) {
        const int64_t work = std::max(columnWork, rowWork);
        const ErrorCode failed = block.allocate(work + ColumnsAtOnce * PaddedPitch(rows));
        columns = block.data() + (failed ? 0 : work);
        return failed;
    }
};

// transform(const DBL *in, DBL *out) for each row.
template <class Transform>
ErrorCode TransformRows(const DBL *in, DBL *out, int32_t rows, int32_t cols, Transform transform) {
    for (int64_t r = 0; r < rows; ++r)
        if (const ErrorCode failed = transform(in + r * cols, out + r * cols))
            return failed;
    return 0;
}

template <class Transform>
ErrorCode TransformColumns(const DBL *in, DBL *out, int32_t rows, int32_t cols, DBL *columns,
                           Transform transform) {
    const int64_t pitch = PaddedPitch(rows);
    for (int32_t c = 0; c < cols; c += ColumnsAtOnce) {
        const int32_t count = ColumnsInBlock(c, cols);
        GatherColumns<ElementType::DBL>(in + c, cols, rows, count, columns, pitch);
        for (int32_t i = 0; i < count; ++i)
            if (const ErrorCode failed = transform(columns + i * pitch, columns + i * pitch))
                return failed;
        ScatterColumns<ElementType::DBL>(columns, pitch, rows, count, out + c, cols);
    }
    return 0;
}

} // namespace

ErrorCode MatrixWindow::take(const DBL *in, int32_t inRows, int32_t inCols, int32_t rows,
                             int32_t cols) {
    data = in;
    if (rows == inRows && cols == inCols)
        return 0;
    if (const ErrorCode failed = copy.allocateCleared(int64_t{rows} * cols))
        return failed;
    const std::size_t bytes = static_cast<std::size_t>(std::min(cols, inCols)) * sizeof(DBL);
    for (int64_t r = 0; r < std::min(rows, inRows); ++r)
        std::memcpy(copy.data() + r * cols, in + r * inCols, bytes);
    data = copy.data();
    return 0;
}

namespace {

// `transform` makes one transform of n values: plan, from, to, n.
template <class Transform>
ErrorCode InBothDirections(const FFTPlan *columnPlan, const FFTPlan *rowPlan, const DBL *in,
                           DBL *out, int32_t rows, int32_t cols, bool columnsFirst, DBL *columns,
                           const Transform &transform) {
    const auto along = [&](const FFTPlan *plan, int32_t n) {
        return [=, &transform](const DBL *from, DBL *to) { return transform(plan, from, to, n); };
    };
    if (columnsFirst) {
        if (const ErrorCode failed =
                TransformColumns(in, out, rows, cols, columns, along(columnPlan, rows)))
            return failed;
        return TransformRows(out, out, rows, cols, along(rowPlan, cols));
    }
    if (const ErrorCode failed = TransformRows(in, out, rows, cols, along(rowPlan, cols)))
        return failed;
    return TransformColumns(out, out, rows, cols, columns, along(columnPlan, rows));
}

} // namespace

template <class Transform>
ErrorCode SeparableForward(const FFTPlan *columnPlan, const FFTPlan *rowPlan, const DBL *in,
                           DBL *out, int32_t rows, int32_t cols) {
    WorkBlock work;
    if (const ErrorCode failed =
            work.take(Transform::forwardWork(rows), Transform::forwardWork(cols), rows))
        return failed;
    return InBothDirections(columnPlan, rowPlan, in, out, rows, cols, false, work.columns,
                            [&](const FFTPlan *plan, const DBL *from, DBL *to, int32_t n) {
                                return Transform::forward(plan, from, n, to, 1, 1, n,
                                                          work.block.data());
                            });
}

template <class Transform>
ErrorCode SeparableInverse(const FFTPlan *columnPlan, const FFTPlan *rowPlan, const DBL *in,
                           DBL *out, int32_t rows, int32_t cols) {
    WorkBlock work;
    if (const ErrorCode failed =
            work.take(Transform::inverseWork(rows), Transform::inverseWork(cols), rows))
        return failed;
    return InBothDirections(
        columnPlan, rowPlan, in, out, rows, cols, Transform::inverseRunsColumnsFirst, work.columns,
        [&](const FFTPlan *plan, const DBL *from, DBL *to, int32_t n) {
            return Transform::inverse(from, to, 1, 1, n, work.block.data(), plan);
        });
}

template ErrorCode SeparableForward<CosineTransform>(const FFTPlan *, const FFTPlan *, const DBL *,
                                                     DBL *, int32_t, int32_t);
template ErrorCode SeparableForward<SineTransform>(const FFTPlan *, const FFTPlan *, const DBL *,
                                                   DBL *, int32_t, int32_t);
template ErrorCode SeparableInverse<CosineTransform>(const FFTPlan *, const FFTPlan *, const DBL *,
                                                     DBL *, int32_t, int32_t);
template ErrorCode SeparableInverse<SineTransform>(const FFTPlan *, const FFTPlan *, const DBL *,
                                                   DBL *, int32_t, int32_t);

} // namespace qx

#include "transforms/separable.h"

#include "fft/column_block.h"

#include <algorithm>
#include <cstring>

namespace qx {
namespace {

// One block for both directions: the larger of the two work areas, then the gathered columns.
//
// The longer direction does not always need more work memory, because an odd length needs twice as much as
// an even one.
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
ErrorCode TransformRows(const ConstRealMatrix &in, const RealMatrix &out, Transform transform) {
    for (std::ptrdiff_t r = 0; r < in.rows(); ++r)
        if (const ErrorCode failed = transform(in.row(r), out.row(r)))
            return failed;
    return 0;
}

template <class Transform>
ErrorCode TransformColumns(const ConstRealMatrix &in, const RealMatrix &out, DBL *columns,
                           Transform transform) {
    const int32_t rows = in.rows(), cols = in.cols();
    const int64_t pitch = PaddedPitch(rows);
    for (int32_t c = 0; c < cols; c += ColumnsAtOnce) {
        const int32_t count = ColumnsInBlock(c, cols);
        GatherColumns<ElementType::DBL>(in.data() + c, cols, rows, count, columns, pitch);
        for (int32_t i = 0; i < count; ++i)
            if (const ErrorCode failed = transform(columns + i * pitch, columns + i * pitch))
                return failed;
        ScatterColumns<ElementType::DBL>(columns, pitch, rows, count, out.data() + c, cols);
    }
    return 0;
}

// transform(plan, from, to, n) computes one transform of n values.
template <class Transform>
ErrorCode InBothDirections(const FFTPlan *columnPlan, const FFTPlan *rowPlan,
                           const ConstRealMatrix &in, const RealMatrix &out, bool columnsFirst,
                           DBL *columns, const Transform &transform) {
    QX_EXPECTS(in.isWhole() && out.isWhole() && in.rows() == out.rows() && in.cols() == out.cols());
    const auto along = [&](const FFTPlan *plan, int32_t n) {
        return [=, &transform](const DBL *from, DBL *to) { return transform(plan, from, to, n); };
    };
    const auto alongColumns = along(columnPlan, in.rows());
    const auto alongRows = along(rowPlan, in.cols());
    if (columnsFirst) {
        if (const ErrorCode failed = TransformColumns(in, out, columns, alongColumns))
            return failed;
        return TransformRows(out, out, alongRows);
    }
    if (const ErrorCode failed = TransformRows(in, out, alongRows))
        return failed;
    return TransformColumns(out, out, columns, alongColumns);
}

} // namespace

ErrorCode MatrixWindow::take(const ConstRealMatrix &in, int32_t rows, int32_t cols) {
    view = in;
    if (rows == in.rows() && cols == in.cols())
        return 0;
    if (const ErrorCode failed = copy.allocateCleared(int64_t{rows} * cols))
        return failed;
    const RealMatrix padded(copy.data(), rows, cols);
    const std::size_t bytes = static_cast<std::size_t>(std::min(cols, in.cols())) * sizeof(DBL);
    for (std::ptrdiff_t r = 0; r < std::min(rows, in.rows()); ++r)
        std::memcpy(padded.row(r), in.row(r), bytes);
    view = padded;
    return 0;
}

template <class Transform>
ErrorCode SeparableForward(const FFTPlan *columnPlan, const FFTPlan *rowPlan,
                           const ConstRealMatrix &in, const RealMatrix &out) {
    WorkBlock work;
    if (const ErrorCode failed = work.take(Transform::forwardWork(in.rows()),
                                           Transform::forwardWork(in.cols()), in.rows()))
        return failed;
    return InBothDirections(
        columnPlan, rowPlan, in, out, false, work.columns,
        [&](const FFTPlan *plan, const DBL *from, DBL *to, int32_t n) {
            return Transform::forward(plan, {from, n}, {to, n}, work.block.data());
        });
}

template <class Transform>
ErrorCode SeparableInverse(const FFTPlan *columnPlan, const FFTPlan *rowPlan,
                           const ConstRealMatrix &in, const RealMatrix &out) {
    WorkBlock work;
    if (const ErrorCode failed = work.take(Transform::inverseWork(in.rows()),
                                           Transform::inverseWork(in.cols()), in.rows()))
        return failed;
    return InBothDirections(
        columnPlan, rowPlan, in, out, Transform::inverseRunsColumnsFirst, work.columns,
        [&](const FFTPlan *plan, const DBL *from, DBL *to, int32_t n) {
            return Transform::inverse(plan, {from, n}, {to, n}, work.block.data());
        });
}

#define QX_INSTANTIATE(Transform)                                                                  \
    template ErrorCode SeparableForward<Transform>(const FFTPlan *, const FFTPlan *,               \
                                                   const ConstRealMatrix &, const RealMatrix &);   \
    template ErrorCode SeparableInverse<Transform>(const FFTPlan *, const FFTPlan *,               \
                                                   const ConstRealMatrix &, const RealMatrix &);

QX_INSTANTIATE(CosineTransform)
QX_INSTANTIATE(SineTransform)

} // namespace qx

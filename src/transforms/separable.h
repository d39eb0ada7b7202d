#ifndef QX_TRANSFORMS_SEPARABLE_H
#define QX_TRANSFORMS_SEPARABLE_H

#include "frame/heap_block.h"
#include "frame/views.h"
#include "transforms/dct.h"
#include "transforms/dst.h"

#include <cstdint>

namespace qx {

// The cosine and the sine transform under one set of names, for the loops and frames that they
// share.

struct CosineTransform {
    static int64_t planLength(int32_t n) { return DCTPlanLength(n); }
    static int64_t forwardWork(int32_t n) { return DCTForwardWork(n); }
    static int64_t inverseWork(int32_t n) { return DCTInverseWork(n); }
    static constexpr auto forward = DCTForward;
    static constexpr auto inverse = DCTInverse;
    static constexpr bool inverseRunsColumnsFirst = true;
};

struct SineTransform {
    static int64_t planLength(int32_t n) { return DSTPlanLength(n); }
    static int64_t forwardWork(int32_t n) { return DSTWork(n); }
    static int64_t inverseWork(int32_t n) { return DSTWork(n); }
    static constexpr auto forward = DSTForward;
    static constexpr auto inverse = DSTInverse;
    // kept: the directions commute up to rounding, and results are compared across revisions.
    static constexpr bool inverseRunsColumnsFirst = false;
};

// The upper left rows by cols values of a matrix, with zeros to the right and below if it is smaller:
// the matrix itself if the shapes agree, else a heap copy. Returns 0 or ErrOutOfMemory.
struct MatrixWindow {
    ConstRealMatrix view;
    HeapBlock<ElementType::DBL> copy;

    ErrorCode take(const ConstRealMatrix &in, int32_t rows, int32_t cols);
};

// Both matrices have the same size; columnPlan is for the transforms of the columns, rowPlan for those of
// the rows. The codes are those of the 1-D routines.
template <class Transform>
ErrorCode SeparableForward(const FFTPlan *columnPlan, const FFTPlan *rowPlan,
                           const ConstRealMatrix &in, const RealMatrix &out);
template <class Transform>
ErrorCode SeparableInverse(const FFTPlan *columnPlan, const FFTPlan *rowPlan,
                           const ConstRealMatrix &in, const RealMatrix &out);

} // namespace qx

#endif

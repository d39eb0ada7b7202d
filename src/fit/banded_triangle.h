#ifndef QX_FIT_BANDED_TRIANGLE_H
#define QX_FIT_BANDED_TRIANGLE_H

#include "frame/scratch.h"

namespace qx {

// Least squares with a banded matrix: rows are rotated one after the other into an upper triangle
// of `band` diagonals (W. Givens' rotations; M. G. Cox, The least squares solution of
// overdetermined linear equations having band or augmented band structure, 1981). Rows come in the
// order of their first columns.
class BandedTriangle {
public:
    static constexpr int32_t widest = 10;

    ErrorCode make(int32_t order, int32_t band) {
        order_ = order;
        band_ = band;
        return memory_.allocate(int64_t{order} * (band + 1));
    }
    void clear() const;
    // `values` are the elements from column `first` on: `band` of them, zeros
    // behind the last column.
    void add(int32_t first, const DBL *values, double target) const;
    // Element (i, i + j), j < band; at j = band the target.
    DBL *row(int32_t i) const { return memory_.data() + std::ptrdiff_t{i} * (band_ + 1); }
    // No diagonal element is negligible beside its column.
    bool hasFullRank() const;
    void solve(DBL *x) const;

private:
    int32_t order_ = 0, band_ = 0;
    Scratch<ElementType::DBL> memory_;
};

} // namespace qx

#endif

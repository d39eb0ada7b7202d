#ifndef QX_FIT_REFINED_MODEL_H
#define QX_FIT_REFINED_MODEL_H

#include "fit/model_rows.h"
#include "frame/scratch.h"
#include "frame/views.h"
#include "mathlib/pair.h"
#include "qx/errors.h"

namespace qx {

// The inner problem of fit/refined.h, whose columns and targets have magnitudes near 1.

inline Pair PairProduct(Pair a, Pair b) {
    const Pair product = ExactProduct(a.hi, b.hi);
    return QuickSum(product.hi, product.lo + (a.hi * b.lo + a.lo * b.hi));
}

// Rows of a model in pairs of doubles: the columns, then the target, as in a RowBlock; `low` has
// the low parts in the same places, and is null if they are not requested.
struct PairBlock {
    RowBlock high;
    DBL *low;
};
class PairRows {
public:
    virtual void write(const PairBlock &block) const = 0;
    // Whether low parts may be other than 0; the coefficients are then computed in pairs, too.
    virtual bool hasLow() const = 0;

protected:
    ~PairRows() = default;
};

// Coefficients as sums of two vectors.
struct PairVector {
    RealVector high, low;
    Pair at(std::ptrdiff_t j) const { return {high[j], low[j]}; }
    void set(std::ptrdiff_t j, Pair value) const {
        high[j] = value.hi;
        low[j] = value.lo;
    }
};

// n rows, k columns and nonnegative weights, or no weights.
struct PairModel {
    const PairRows &rows;
    int32_t n, k;
    const DBL *w;
};

// The coefficients, and the inverse of H^T W H if `covariance` is not empty.
ErrorCode SolveRefined(const PairModel &model, double tolerance, const PairVector &c,
                       const RealMatrix &covariance);

// y - H c for all rows, and the sum of w r^2. If there are no columns, r is y.
ErrorCode RefinedResiduals(const PairModel &model, const PairVector &c, RealVector residuals,
                           double *squares);

} // namespace qx

#endif

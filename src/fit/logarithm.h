#ifndef QX_FIT_LOGARITHM_H
#define QX_FIT_LOGARITHM_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Logarithms to a base. 2.71828, these six digits, stands for the natural logarithm and 10 for the
// common one; any other base, e in all its digits included, goes by ln(v) / ln(base).
class LogBase {
public:
    explicit LogBase(double base);
    double log(double v) const;
    double power(double exponent) const;

private:
    enum class Kind { Natural, Common, Other };
    Kind kind_;
    double base_, logOfBase_;
};

// +1 where all x are above 0, -1 where all are below, else 0.
double SameSign(const DBL *x, int32_t n);

// y = a log_base(b x) by the line through (log_base |x|, y), for x of one sign, which b takes.
// `fit` may be y; it may be null, and so may mse.
//
// ErrNotStrictlyPositive (base <= 0), codes of SettleWeights, ErrMixedSigns, ErrOutOfMemory.
ErrorCode FitLog(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, double base, DBL *a,
                 DBL *b, DBL *mse);

} // namespace qx

#endif

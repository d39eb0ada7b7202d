#ifndef QX_FIT_LOGARITHM_H
#define QX_FIT_LOGARITHM_H

#include "fit/samples.h"
#include "qx/errors.h"

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
double SameSign(ConstRealVector x);

// y = p[0] log_base(p[1] x) by the line through (log_base |x|, y), for x of one sign, which p[1]
// takes.
//
// ErrNotStrictlyPositive (base <= 0), codes of SettleWeights, ErrMixedSigns, ErrOutOfMemory.
ErrorCode FitLog(FitSamples samples, double base, DBL *p, const FitOutput &out);

} // namespace qx

#endif

#ifndef QX_FIT_LOGARITHM_H
#define QX_FIT_LOGARITHM_H

#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// Logarithms to a base. 2.71828, these six digits, means the natural logarithm and 10 the common
// one; any other base, including e to full precision, uses ln(v) / ln(base).
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

// +1 if all x are above 0, -1 if all are below 0, otherwise 0.
double SameSign(ConstRealVector x);

// y = p[0] log_base(p[1] x) by the line through (log_base |x|, y), for x of one sign, which is also
// that of p[1].
//
// ErrNotStrictlyPositive (base <= 0), codes of SettleWeights, ErrMixedSigns, ErrOutOfMemory.
ErrorCode FitLog(FitSamples samples, double base, DBL *p, const FitOutput &out);

} // namespace qx

#endif

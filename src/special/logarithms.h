#ifndef QX_SPECIAL_LOGARITHMS_H
#define QX_SPECIAL_LOGARITHMS_H

#include "frame/extended.h"

namespace qx {

// ln x of a finite x > 0 in twice the precision: error below 2^-90 of the result, or of 2^-90
// absolute near x = 1.
Extended LogOf(Extended x);

// e - ln(1 + e), e > -1, in twice the precision relative to the result. Both e and 1 + e are
// passed, because near e = -1 and near e = 0 each has digits that do not follow from the other.
Extended ExcessOfLog(Extended e, Extended onePlusE);

// exp(x) within an ulp for a sum of two doubles; overflows and underflows like std::exp.
double ExpOf(Extended x);

// ln gamma(x) - ((x - 1/2) ln x - x + ln sqrt(2 pi)), x >= 10, to full precision when added to 1.
double StirlingCorrection(double x);

} // namespace qx

#endif

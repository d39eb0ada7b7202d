#ifndef QX_SPECIAL_LOGARITHMS_H
#define QX_SPECIAL_LOGARITHMS_H

#include "frame/extended.h"

namespace qx {

// ln x of a finite x > 0 in twice the precision: error below 2^-90 of the result, or of 1 near x
// = 1.
Extended LogOf(Extended x);

// e - ln(1 + e), e > -1, in twice the precision relative to the result. Both e and 1 + e are given,
// since near e = -1 and near 0 the one has digits that do not follow from the other.
Extended ExcessOfLog(Extended e, Extended onePlusE);

// exp(x) within an ulp for a sum of two doubles; overflows and underflows as std::exp.
double ExpOf(Extended x);

// ln gamma(x) - ((x - 1/2) ln x - x + ln sqrt(2 pi)), x >= 10, to full precision of its sum with 1.
double StirlingCorrection(double x);

} // namespace qx

#endif

#ifndef QX_SPECIAL_KELVIN_H
#define QX_SPECIAL_KELVIN_H

#include <cstdint>

namespace qx {

struct KelvinPair {
    double re, im;
};

// ber + i bei = i^n I_n(x exp(i pi / 4)), ker + i kei = i^-n K_n(x exp(i pi / 4)). Both pairs for
// order -n are (-1)^n times those of order n; ber and bei of -x are (-1)^n times those of x; ker
// and kei are NaN for x <= 0. The error is relative to the modulus of the pair.
//
// ber, bei: the ascending series up to x = 5 and while its terms fall; from x = 40 and n^2 on the
// asymptotic form, because the other exponential is negligible there; in between the continued
// fraction of I_(n+1) / I_n with the Wronskian. ker, kei: the series with the logarithm up to
// x = 2, above which its terms exceed the sum by exp(1.7 x); above that Temme's continued fraction
// for orders 0 and 1 and upward recurrence. Orders from 100 on use the expansion for large order.
// Source: N. M. Temme, J. Comput. Phys. 19, 1975.
KelvinPair KelvinI(double x, int32_t n);
KelvinPair KelvinK(double x, int32_t n);

} // namespace qx

#endif

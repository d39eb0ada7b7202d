#ifndef QX_SPECIAL_RECIPROCAL_GAMMA_H
#define QX_SPECIAL_RECIPROCAL_GAMMA_H

namespace qx {

// 1 / gamma(x), an entire function: 0 at the poles of gamma, infinite with the sign of gamma where
// gamma underflows, and no overflow for large x.
double ReciprocalGamma(double x);

// y^order / gamma(order + 1), y > 0, the prefactor of the ascending series of the Bessel functions.
// Keeps its digits for large orders, where the power and the gamma function each leave the range.
double PowerOverGamma(double y, double order);

} // namespace qx

#endif

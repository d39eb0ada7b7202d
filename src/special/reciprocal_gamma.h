#ifndef QX_SPECIAL_RECIPROCAL_GAMMA_H
#define QX_SPECIAL_RECIPROCAL_GAMMA_H

namespace qx {

// 1 / gamma(x), entire: 0 at the poles of gamma, infinite with the sign of gamma where that
// vanishes, and no overflow for large x.
double ReciprocalGamma(double x);

// y^order / gamma(order + 1), y > 0, the factor before the ascending series of the Bessel
// functions; keeps its digits for large orders, where power and gamma each leave the range.
double PowerOverGamma(double y, double order);

} // namespace qx

#endif

#ifndef QX_FILTERS_ELLIPTIC_FUNCTIONS_H
#define QX_FILTERS_ELLIPTIC_FUNCTIONS_H

#include <cstdint>

namespace qx {

// The elliptic integrals and functions that elliptic filters need, by arithmetic-geometric means. A
// modulus k is given by its complement kc = sqrt(1 - k^2) where that is the more accurate one.

// The complete integral of the first kind, K(k).
double CompleteEllipticK(double kc);

// The modulus k for which K(kc) / K(k) is the ratio; below 1.
double ModulusFromNomeRatio(double ratio);

struct JacobiFunctions {
    double sn, cn, dn;
};
JacobiFunctions JacobiElliptic(double u, double kc);

// The u for which sn(u) / cn(u) is x.
double InverseSc(double x, double kc);

// The parameters of the elliptic lowpass of order n, from ripple and attenuation in decibels: the
// modulus k with its complement kc and K(k), the ripple factor e of 1 / (1 + e^2 R^2), and the
// functions of modulus kc at the shift of the poles' arguments off the real axis.
struct EllipticParameters {
    double e, k, kc, K;
    JacobiFunctions at0;
    EllipticParameters(double ripple, double attenuation, int32_t n);
};

} // namespace qx

#endif

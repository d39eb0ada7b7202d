#ifndef QX_SPECIAL_ELLIPTIC_H
#define QX_SPECIAL_ELLIPTIC_H

namespace qx {

// Elliptic integrals of the first and second kind as functions of the parameter m = k^2; NaN for m
// outside [0, 1]. Complete: pi/2 and m times a rational form up to m = 1/2; above it P(1 - m) -
// ln(1 - m) Q(1 - m), which represents the logarithmic singularity exactly.
double EllipticK(double m);
double EllipticE(double m);

// Incomplete: multiples of pi split off, then the descending Landen transformation with the
// amplitude doubled in each step, until c / a <= eps.
// Source: Abramowitz and Stegun, 17.6.
double EllipticF(double phi, double m);
double EllipticE(double phi, double m);

// F(phi, 1), the inverse of the Gudermannian function, accurate to the last digits for small angles
// and near a quarter turn. From a quarter turn on the same as EllipticF.
double EllipticFOfOne(double phi);

// Jacobi's sn, cn, dn and the amplitude. m < 1e-9 and m > 0.999999999: first-order forms about the
// circular and the hyperbolic functions, the latter only while the second order is below eps.
// Otherwise at most 8 steps of the arithmetic-geometric mean and back through the amplitudes.
struct JacobiValues {
    double sn, cn, dn, phi;
};
JacobiValues EllipticJacobi(double u, double m);

} // namespace qx

#endif

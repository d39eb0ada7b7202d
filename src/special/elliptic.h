#ifndef QX_SPECIAL_ELLIPTIC_H
#define QX_SPECIAL_ELLIPTIC_H

namespace qx {

// Elliptic integrals of the first and second kind by their parameter m = k^2, NaN outside [0, 1].
// Complete: pi/2 and m times a rational form up to m = 1/2, beyond it P(1 - m) - ln(1 - m) Q(1 -
// m), which carries the logarithmic end exactly.
double EllipticK(double m);
double EllipticE(double m);

// Incomplete: multiples of pi split off, then the descending Landen transformation with the
// amplitude doubled in each step, until c / a <= eps.
// Source: Abramowitz and Stegun, 17.6.
double EllipticF(double phi, double m);
double EllipticE(double phi, double m);

// F(phi, 1), the inverse of the Gudermannian function, to the last digits of small angles and next to a
// quarter turn; what EllipticF gives from a quarter turn on.
double EllipticFOfOne(double phi);

// Jacobi's sn, cn, dn and the amplitude. m < 1e-9 and m > 0.999999999: first-order forms about the
// circular and the hyperbolic functions, the latter only while the second order stays below eps;
// otherwise at most 8 arithmetic-geometric means and back through the amplitudes.
struct JacobiValues {
    double sn, cn, dn, phi;
};
JacobiValues EllipticJacobi(double u, double m);

} // namespace qx

#endif

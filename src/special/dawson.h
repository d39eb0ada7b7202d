#ifndef QX_SPECIAL_DAWSON_H
#define QX_SPECIAL_DAWSON_H

namespace qx {

// Dawson's integral exp(-x^2) times the integral of exp(t^2) from 0 to x; NaN for NaN and
// infinities. |x| < 3.25: x R(x^2). Beyond: (1 + y R(y)) / (2 x) with y = 1 / x^2, with one set for
// |x| < 6.25, where the growing exponential is still significant, and one for larger arguments.
// Above 1e9 the correction is below half an ulp.
double Dawson(double x);

struct FresnelValues {
    double c, s;
};

// C and S: the integrals of cos(pi t^2 / 2) and sin(pi t^2 / 2) from 0 to x. |x| < 1.6: rational
// forms in x^4. Beyond: the auxiliary functions f and g in two intervals, divided at 3, with x^2
// reduced modulo 4 exactly, so that the phase loses no digits. C(+-infinity) = S(+-infinity) =
// +-1/2.
FresnelValues Fresnel(double x);

} // namespace qx

#endif

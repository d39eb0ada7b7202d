#ifndef QX_SPECIAL_PARABOLIC_CYLINDER_H
#define QX_SPECIAL_PARABOLIC_CYLINDER_H

namespace qx {

// The parabolic cylinder function D_v(x). 0 at x = +infinity. At -infinity: 0 for v = 0, 1, 2, ...
// and an infinity of the sign of gamma(-v) otherwise; NaN for infinite v.
//
// For |x| > 5 the asymptotic series is tried first and used if it reaches 1e-15 (1e-12 from
// |x| = 40 on) within 100 terms, which it does from about x = 8 on. Otherwise: orders 0, 1, 2, ...
// by upward recurrence from exp(-x^2/4). For x < 1 the two series at x = 0, summed in two doubles,
// which do not cancel there. From x = 1 on their difference would lose a factor exp(x^2 / 2);
// therefore orders below 0 come from downward recurrence in the order, normalised by exp(x^2/4) sum
// binomial(v, k) (-x)^k D_(v-k)(x) = D_v(0), whose terms are all positive, and orders above 0 from
// upward recurrence starting there.
double ParabolicCylinder(double x, double v);

} // namespace qx

#endif

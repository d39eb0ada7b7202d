#ifndef QX_SPECIAL_STRUVE_H
#define QX_SPECIAL_STRUVE_H

namespace qx {

// Struve's H_v(x). NaN for NaN and infinities, for x = 0 with v < 0, and for x < 0 with an order
// that is not an integer; H_v(-x) = (-1)^(v+1) H_v(x). Orders -(n + 1/2) are (-1)^n J_(n+1/2).
//
// Two candidates, each with an estimate of its own error; the better one is returned: the ascending
// 1F2(1; 3/2, v + 3/2; -x^2/4) for |x| <= 30 or |x| <= 1.5 |v|, summed in two doubles because its
// terms exceed the sum by exp(x), and the asymptotic 3F0(1, 1/2, 1/2 - v; -4/x^2) for x >= 18, to
// which Y_v(x) is added. A sum ends after at most 200 terms.
double Struve(double x, double v);

} // namespace qx

#endif

#ifndef QX_SPECIAL_MODIFIED_COMPLEX_H
#define QX_SPECIAL_MODIFIED_COMPLEX_H

#include "special/complex_exponent.h"

namespace qx {

// I and K of order v >= 0 for z in the right half-plane, Re z >= 0, z other than 0, |z| and v up to
// 2^31. All complex Bessel and Airy functions are computed from these. The methods are symmetrical
// about the real axis; below, y = |Im z|.
//
//   I  |z|^2 <= 4 (v + 1)          the power series, whose terms fall from the start
//      |z| from 3 to 22, Re z <= 1, y > v, no expansion below: K at z and -z
//      |z| < 22, v < 10            Miller's recurrence, normalised by Neumann's series of exp(z)
//   K  |z| + Re z <= 2             the power series of N. M. Temme (1975) for two orders next to 0
//      |z| < 22                    Miller's recurrence for the confluent function (Temme, 1975)
//      both then upwards in the order, along which K grows; half orders from their closed form
//   both, where |z| >= 22 and v^2 <= 2 |z|: Hankel's expansion
//   both, where |v + i z| >= 8.2 max(|z|, v)^(1/3), and |z| >= 22 or v >= 10: Debye's expansion,
//      which beyond the Stokes line of the turning point z = i v takes a second exponential for I
//   both near the turning point: recurrence from where Debye's expansion holds, 8.2 |z|^(1/3)
//      orders away, downwards for I and upwards for K; below order 25 from near 0. Each is stable
//      in its direction.
//
// The steps that would lose digits use more than double precision: exponents and phases
// (complex_exponent.h) at unrounded orders, the recurrences in the order (order_recurrence.h), and
// the corrections to Miller's recurrence for the rounding of 2 / z and of the orders.
//
// Where |v + i z| = 8.2 max(|z|, v)^(1/3), the exponents of the two exponentials differ by at least
// 44, at which Debye's first 20 terms leave an error of 2^-55; the same holds in Hankel's case.
// Sources: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapters 7 and 10; D. E. Amos,
// Algorithm 644, 1986; N. M. Temme, On the numerical evaluation of the modified Bessel function of
// the third kind, 1975.

// The second term is 0 if there is only one.
struct ExponentialPair {
    Exponential first, second;
};
ExponentialPair ModifiedI(double order, Complex z);
Exponential ModifiedK(double order, Complex z);

// Both functions, in less time than separately.
struct ModifiedBoth {
    ExponentialPair i;
    Exponential k;
};
ModifiedBoth ModifiedIAndK(double order, Complex z);

} // namespace qx

#endif

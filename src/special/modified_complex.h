#ifndef QX_SPECIAL_MODIFIED_COMPLEX_H
#define QX_SPECIAL_MODIFIED_COMPLEX_H

#include "special/complex_exponent.h"

namespace qx {

// I and K of order v >= 0 and z in the right half-plane, Re z >= 0, z other than 0, |z| and v to
// 2^31; what all complex Bessel and Airy functions are made of. The methods are symmetrical about
// the real axis; below, y = |Im z|.
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
//   both next to the turning point: recurrence from where Debye's holds, which is 8.2 |z|^(1/3)
//      orders off, downwards for I and upwards for K, below order 25 from next to 0. Each is the
//      solution that this does not harm.
//
// What would cost digits is done in more than double precision: exponents and phases
// (complex_exponent.h) at orders that are not rounded, the recurrences in the order
// (order_recurrence.h), and what Miller's loses to the rounding of 2 / z and of the orders.
//
// Where |v + i z| = 8.2 max(|z|, v)^(1/3) the difference of the two exponentials' exponents is at
// least 44, the size at which Debye's first 20 terms leave 2^-55; so they do in Hankel's case.
// Sources: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapters 7 and 10; D. E. Amos,
// Algorithm 644, 1986; N. M. Temme, On the numerical evaluation of the modified Bessel function of
// the third kind, 1975.

// The second term is 0 where there is none.
struct ExponentialPair {
    Exponential first, second;
};
ExponentialPair ModifiedI(double order, Complex z);
Exponential ModifiedK(double order, Complex z);

// Both, in less time than one after the other.
struct ModifiedBoth {
    ExponentialPair i;
    Exponential k;
};
ModifiedBoth ModifiedIAndK(double order, Complex z);

} // namespace qx

#endif

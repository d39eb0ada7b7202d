#ifndef QX_SPECIAL_COMPLEX_EXPONENT_H
#define QX_SPECIAL_COMPLEX_EXPONENT_H

#include "frame/complex.h"
#include "frame/extended.h"

namespace qx {

typedef CDB Complex;

struct ExtendedComplex {
    Extended re, im;
};

// factor exp(exponent). The exponent is separate because it may be beyond the range of exp and
// because it needs more digits than the factor: an error in it is a relative error of the product.
struct Exponential {
    Complex factor;
    ExtendedComplex exponent;
};

// The value times exp(scale); infinite parts on overflow, 0 on underflow.
Complex Value(const Exponential &term, const ExtendedComplex &scale);
inline ExtendedComplex Plain(Complex z) { return {{z.re, 0}, {z.im, 0}}; }

// sqrt(z) in the first quadrant, for Im z >= 0.
Complex RootOfUpperHalf(Complex z);
// The same in twice the precision, to all but a few digits.
ExtendedComplex ExtendedRoot(ExtendedComplex z);

// The exponent of Debye's expansions, s - order ln((order + s) / z) with s = sqrt(order^2 + z^2),
// for z in the first quadrant; absolute error about 2^-72 (order + |z|).
struct DebyeExponent {
    Complex s;
    ExtendedComplex exponent;
};
DebyeExponent ExponentOfDebye(Extended order, Complex z);

// The argument of re + i im, in [-pi, pi]; absolute error about 2^-70.
Extended ExtendedArgument(Extended re, Extended im);

} // namespace qx

#endif

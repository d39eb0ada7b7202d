#ifndef QX_SPECIAL_WIDE_NUMBER_H
#define QX_SPECIAL_WIDE_NUMBER_H

#include "frame/extended.h"

namespace qx {

// value 2^exponent: the digits of two doubles with a range beyond that of a double, for factors of
// a product that is itself a double. An exponent beyond 2^30 in either direction is not
// distinguished from infinity or 0.
struct Wide {
    Extended value; // 0, or of modulus 1/2 to 1
    int exponent;

    bool isZero() const { return value.high == 0; }
    double rounded() const;   // rounded once; infinite or 0 beyond the range
    double logarithm() const; // log2 |value 2^exponent|, to a few digits; -infinity for 0
};

Wide WideOf(Extended value, int exponent = 0);
Wide operator*(const Wide &a, const Wide &b);
Wide operator/(const Wide &a, const Wide &b);
Wide operator+(const Wide &a, const Wide &b);

// A value and the estimate of its relative error, infinite if there is no value.
struct Estimated {
    Wide value;
    double error;
};

// exp(x) of an exact x, and base^power, base > 0: error about 2^-90 (1 + |power ln base|).
Wide WideExp(Extended x);
Estimated PowerOf(Extended base, Extended power);

// gamma(x) for x from -2000 to 1e15: by Stirling's series from 30 on, below by the recurrence from
// a polynomial on [1, 2]. The error is about 2^-90 or, from 30 on, 2^-90 ln gamma(x); it is infinite
// if x is out of range.
struct WideGamma {
    Estimated gamma;
    bool isPole; // 0, -1, -2, ...
};
WideGamma GammaOf(Extended x);

// The product of gamma over the numerators divided by the product over the denominators; 0 at a
// pole of a denominator, an infinite error at a pole of a numerator.
Estimated GammaQuotientOf(const Extended (&numerators)[2], const Extended (&denominators)[2]);

} // namespace qx

#endif

#ifndef QX_SPECIAL_HYPERGEOMETRIC_TERMS_H
#define QX_SPECIAL_HYPERGEOMETRIC_TERMS_H

#include "special/wide_number.h"

namespace qx {

// The series of (a)_k (b)_k / ((c)_k k!) x^k, or without (b)_k, whose sum is F(a, b; c; x) or
// M(a, c, x). It may end; c + k must not be 0 before.
struct HyperTerms {
    Extended a, b, c, x;
    bool hasB;
};

// The sum of two parts, with what each part's error is in it.
Estimated SumOfParts(const Estimated &a, const Estimated &b);

// The straight line through a value at -1 and one at 1.
Estimated Between(const Estimated &low, const Estimated &high, double at);

// One form of a value: a sum times base^power, or times exp(power) where the base is 0.
struct HyperForm {
    HyperTerms terms;
    Extended base, power;
};

// The value by the first of its forms whose sum in double precision has an estimated error below
// 9e-15. Else by the form whose terms exceed the value least: in two doubles where these hold its
// digits, and otherwise in integers of as many digits as cancel. The error is rounding alone; what the
// terms behind the last add is below it. No value where 10000 terms in double precision, 4000 in two
// doubles or, in integers, the time of some milliseconds do not suffice.
Estimated BestForm(const HyperForm *forms, int count);

// The sum of one series in two doubles, or in integers where the error of that is above the tolerance.
Estimated CarefulSum(const HyperTerms &terms, double tolerance);

// The sum in integers of at least `bits` binary digits more than its largest term has; `largest` is
// log2 of that. The terms are products and quotients of exact integers, cut to that length.
Estimated IntegerSum(const HyperTerms &terms, double largest, int bits);

} // namespace qx

#endif

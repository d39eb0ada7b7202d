#ifndef QX_SPECIAL_HYPERGEOMETRIC_TERMS_H
#define QX_SPECIAL_HYPERGEOMETRIC_TERMS_H

#include "special/wide_number.h"

namespace qx {

// The series with terms (a)_k (b)_k / ((c)_k k!) x^k, or without (b)_k, whose sum is F(a, b; c; x)
// or M(a, c, x). It may end; c + k must not be 0 before that.
struct HyperTerms {
    Extended a, b, c, x;
    bool hasB;
};

// The sum of two parts, with the errors of both parts relative to it.
Estimated SumOfParts(const Estimated &a, const Estimated &b);

// Linear interpolation between a value at -1 and a value at 1.
Estimated Between(const Estimated &low, const Estimated &high, double at);

// One form of a value: a sum times base^power, or times exp(power) if the base is 0.
struct HyperForm {
    HyperTerms terms;
    Extended base, power;
};

// A value in double precision; the error is infinite if the estimate is above 9e-15.
struct PlainValue {
    double value, error;
};
PlainValue PlainForm(const HyperForm &form);

// The same, or in two doubles if the terms cancel by less than these have digits; none otherwise.
Estimated StraightForm(const HyperForm &form);

// The value by the first of the forms whose sum in double precision has an estimated error below
// 9e-15. If there is none, by the form whose terms exceed the value least: in two doubles if these
// have enough digits, otherwise in integers with as many more digits as cancel. The error is that
// of rounding alone; the truncated terms are below it. There is no value if 10000 terms in double
// precision, 4000 in two doubles or, in integers, a few milliseconds do not suffice.
Estimated BestForm(const HyperForm *forms, int count);

// The sum of one series in two doubles, or in integers if its error in two doubles is above the
// tolerance.
Estimated CarefulSum(const HyperTerms &terms, double tolerance);

// The sum in integers, with at least `bits` binary digits from the leading digit of the largest
// term on; `largest` is log2 of that term. The terms are products and quotients of exact integers,
// truncated to that length.
Estimated IntegerSum(const HyperTerms &terms, double largest, int bits);

} // namespace qx

#endif

#ifndef QX_SPECIAL_SERIES_H
#define QX_SPECIAL_SERIES_H

#include "special/extended.h"

#include <cmath>
#include <limits>

namespace qx {

// The result of summing a hypergeometric series. The largest term relative to the sum shows the
// digits lost to cancellation.
struct SeriesSum {
    double sum;
    double last;
    double largest;
    bool isComplete; // the series ended, or met its stop test
};

// a + k, exact in two doubles.
template <class Number>
Number Shifted(double a, double k);
template <>
inline double Shifted<double>(double a, double k) {
    return a + k;
}
template <>
inline Extended Shifted<Extended>(double a, double k) {
    return ExactSum(a, k);
}

inline double Size(double x) { return std::fabs(x); }
inline double Size(Extended x) { return std::fabs(x.high); }
inline double Rounded(double x) { return x; }
inline double Rounded(Extended x) { return x.high; }

constexpr double kVanished = 1e-200;

// Replaces a NaN of either sign by the NaN that the functions return.
inline double OneNaN(double x) {
    return std::isnan(x) ? std::numeric_limits<double>::quiet_NaN() : x;
}

// Sums a series with first term 1, where `terms.ratio<Number>(k)` is the quotient of the terms
// k + 1 and k. The sum ends when a ratio is 0, when it overflows, and when a term has fallen to
// `tolerance` times (offset + |sum|) and the terms cannot rise again: the next ratio must be below
// 1 and `terms.isPastPoles(k)` true, because a negative lower parameter makes the terms first small
// and then large. A term of 1e-200 times the sum always ends it.
template <class Number, class Terms>
SeriesSum SumSeries(const Terms &terms, double tolerance, double offset, int mostTerms) {
    Number term = Shifted<Number>(1, 0);
    Number sum = term;
    double largest = 1;
    for (int k = 0; k < mostTerms; ++k) {
        const Number ratio = terms.template ratio<Number>(k);
        const double size = Size(term);
        if (Size(ratio) == 0 || size <= kVanished * Size(sum))
            return {Rounded(sum), 0, largest, true};
        if (size <= tolerance * (offset + Size(sum)) && Size(ratio) < 1 && terms.isPastPoles(k))
            return {Rounded(sum), size, largest, true};
        term = term * ratio;
        sum = sum + term;
        if (Size(term) > largest)
            largest = Size(term);
        if (!std::isfinite(Size(sum)))
            return {Rounded(sum), Size(term), largest, false};
    }
    return {Rounded(sum), Size(term), largest, false};
}

} // namespace qx

#endif

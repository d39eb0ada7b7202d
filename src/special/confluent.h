#ifndef QX_SPECIAL_CONFLUENT_H
#define QX_SPECIAL_CONFLUENT_H

namespace qx {

// The value of M(a, b, x) by one method, with the method's own estimate of the relative error, 1e38
// if the method has no value.
struct KummerEstimate {
    double value;
    double error;
    double truncation; // the last term of a series relative to its sum
};

// The expansion in Bessel functions 13.3.7, at most 300 terms, to 2.2e-14: for a and x of opposite
// signs and (b - 2 a) x > 0. The argument of the Bessel functions is sqrt(2 (b - 2 a) x).
KummerEstimate KummerBessel(double a, double b, double x);

// The power series, to 8.9e-16; summed in two doubles where terms cancel.
KummerEstimate KummerSeries(double a, double b, double x);

// The asymptotic form for large |x|, 13.5.1, with both sums truncated at their smallest terms.
KummerEstimate KummerAsymptotic(double a, double b, double x);

// The confluent hypergeometric function M(a, b, x): the first of the three methods above whose
// estimated error is below 1.8e-11. If there is none: the series if its error is no larger than
// that of the asymptotic form or below 1.2e-4, otherwise the asymptotic form if below 1.2e-4,
// otherwise NaN. From |x| = 25 on the asymptotic form is tried first and used where its estimate is
// below 2.2e-14.
//
// At b = 0, -1, -2, ..., the poles of M, there is a value only if the series ends before the pole.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, chapter 13.
double Kummer(double x, double a, double b);

// The confluent hypergeometric function U(a, b, x): from x = 6 on the asymptotic sum 13.5.2, below
// that the connection with M, 13.1.3. At integers b (within 0.0001) the connection is replaced by
// the mean of its values at b - 0.0005 and b + 0.0005.
//
// At x = 6 the asymptotic sum needs |a| and |1 + a - b| of a few units at most; where its terms
// grow from the first on, the value has no correct digits.
double Tricomi(double x, double a, double b);

} // namespace qx

#endif

#ifndef QX_SPECIAL_CONFLUENT_H
#define QX_SPECIAL_CONFLUENT_H

namespace qx {

// The value of one method for M(a, b, x) and its own estimate of the relative error; 1e38 where the
// method has no value.
struct KummerEstimate {
    double value;
    double error;
    double truncation; // the last term of a series against its sum
};

// The expansion in Bessel functions 13.3.7, at most 300 terms, to 2.2e-14: for a and x of opposite
// signs and (b - 2 a) x > 0. The argument of the Bessel functions is sqrt(2 (b - 2 a) x).
KummerEstimate KummerBessel(double a, double b, double x);

// The power series, to 8.9e-16; formed in two doubles where terms cancel.
KummerEstimate KummerSeries(double a, double b, double x);

// The asymptotic form for large |x|, 13.5.1, both of its sums cut at their smallest terms.
KummerEstimate KummerAsymptotic(double a, double b, double x);

// The confluent hypergeometric function M(a, b, x): the first of the three above whose error is
// estimated below 1.8e-11; else the series where its error is no larger than the asymptotic form's
// or below 1.2e-4, else the asymptotic form below 1.2e-4, else NaN. From |x| = 25 on the asymptotic
// form comes before all where its estimate is below 2.2e-14.
//
// At b = 0, -1, -2, ..., where M has poles, only a sum that ends before has a value.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, chapter 13.
double Kummer(double x, double a, double b);

// The confluent hypergeometric function U(a, b, x): from x = 6 on the asymptotic sum 13.5.2, below
// it the connection with M, 13.1.3, which at integers b (within 0.0001) is replaced by the mean of
// its values at b - 0.0005 and b + 0.0005.
//
// At x = 6 the asymptotic sum needs |a| and |1 + a - b| of a few units at most; where its terms
// grow from the first, nothing of the value is left.
double Tricomi(double x, double a, double b);

} // namespace qx

#endif

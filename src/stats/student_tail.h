#ifndef QX_STATS_STUDENT_TAIL_H
#define QX_STATS_STUDENT_TAIL_H

namespace qx {

// Student's distribution for degrees n from 1 to 1e6 and t from 1e-100 to 1e5, and tails above
// 1e-280; otherwise `isKnown` is false. Each value is within 4 eps.
//
// t <= 0.9: P(0 < T < t) by a series of positive terms in t^2 / (n + t^2). t > 0.9: P(T > t) by the
// continued fraction of Gauss for F(1, 1/2; n / 2 + 1; -n / t^2), whose coefficients are positive,
// evaluated backwards from as many levels as needed; 390 / t^2 + 8 levels suffice for any n, as for
// the normal distribution.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, 26.5.4, 26.7.1; the
// fraction is in W. B. Jones and W. J. Thron, Continued fractions, 1980, chapter 6.
struct StudentTail {
    double part; // P(0 < T < t) if isCentral, otherwise P(T > t)
    double density;
    bool isCentral, isKnown;

    double upper() const { return isCentral ? 0.5 - part : part; }
};
StudentTail StudentTailAt(double t, double n);

// t > 0 with P(T > t) = p, 1e-250 <= p < 1/2, n from 1 to 1e6; NaN if Newton's method, started with
// the value of G. W. Hill (Algorithm 396: Student's t-quantiles, 1970), leaves the range of
// StudentTailAt.
double StudentUpperPoint(double p, double n, double normalPoint);

} // namespace qx

#endif

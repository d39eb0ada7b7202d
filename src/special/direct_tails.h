#ifndef QX_SPECIAL_DIRECT_TAILS_H
#define QX_SPECIAL_DIRECT_TAILS_H

namespace qx {

// Two parts whose sum is 1, like Tails, as plain numbers.
struct DirectTails {
    double smaller; // or one that is hardly above a half
    bool isLower;
    double slope; // derivative of the lower part in ln x (gamma) or ln(x / y) (beta)
    bool isKnown;

    double part(bool lower) const { return lower == isLower ? smaller : 1.0 - smaller; }
};

// The regularised incomplete gamma functions and the beta function, whose point is x / y = (a / b) f,
// for parameters from 1/2 to 200 and to 25: the smaller part within 4 eps. Unknown for other parameters and
// where a factor is out of range.
//
// All sums are of positive terms, in double precision. The part below x of the gamma function is
// its power series (8.11.4 of the DLMF). The other parts are sums of at most as many terms as the
// parameter has units (8.8.12, 8.17.20), and continued fractions with positive coefficients for the
// parameter that is left, at most 1 (8.9.2, 15.7.5); a fraction has as many levels as its share
// of the sum needs. The factor in front is the power at the mean, from the corrections to Stirling's
// formula, times powers of quotients near 1.
DirectTails DirectGammaTails(double a, double x);
DirectTails DirectBetaTails(double f, double a, double b, bool takesLower);

// F(1, b; c; -z), 0 < b < 1, c >= 3/2, z > 0: the number of levels of its continued fraction for a
// relative error of exp(-digits), and its value.
double FractionLevels(double c, double z, double digits);
double BetaFraction(double b, double c, double z, double levels);

} // namespace qx

#endif

#include "stats/tail_distributions.h"

#include "frame/constants.h"
#include "special/digamma.h"
#include "special/gamma.h"
#include "special/logarithms.h"
#include "special/tables/normal.h"
#include "special/tail_integrals.h"
#include "stats/student_tail.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kMostDegrees = 1e25;
constexpr double kLeastTail = 1e-250;
constexpr double kFarStudent = 1e140;   // from here on the tail is a power of t to the last digit
constexpr double kNearStudent = 1e-150; // up to here the tail is a half to the last digit

Extended Whole(double x) { return {x, 0.0}; }

constexpr double kLeastDegrees = 1e-300;
constexpr double kLeastHalf = 5e-321; // for chi-square: a quotient by it is not 0
constexpr double kLeastStudentDegrees = 1e-25;
constexpr double kFewDegrees = 1e-25;  // for Fisher's: below it a part is proportional to them
constexpr double kFlatDegrees = 1e-20; // for Fisher's, if the other degrees are few

double Limited(double degrees) { return std::clamp(degrees, kLeastDegrees, kMostDegrees); }

bool IsLowerPart(DistributionValue what) {
    return what == DistributionValue::Probability || what == DistributionValue::LogProbability;
}

bool IsLogarithm(DistributionValue what) {
    return what == DistributionValue::LogProbability || what == DistributionValue::LogSurvival;
}

double ValueOf(const Tails &tails, DistributionValue what) {
    const bool isLower = IsLowerPart(what);
    return IsLogarithm(what) ? tails.logarithm(isLower) : tails.part(isLower);
}

// The value if all of the distribution is below the argument, or above it.
double ValueAtEnd(bool isBelow, DistributionValue what) {
    if (what == DistributionValue::Density)
        return 0.0;
    const bool isCertain = IsLowerPart(what) == isBelow;
    if (IsLogarithm(what))
        return isCertain ? 0.0 : -kInfinity;
    return isCertain ? 1.0 : 0.0;
}

// The density at 0 of a distribution that starts there as x^(degrees / 2 - 1).
double DensityAtZero(double degrees, double ofTwo) {
    return degrees < 2.0 ? kInfinity : degrees > 2.0 ? 0.0 : ofTwo;
}

// The exponent of exp(-x^2 / 2), with the square in twice the precision.
Extended ExponentOfNormal(double x) {
    const double half = 0.5 * x; // x / 2 and x are exact; their product is stored in full
    return std::fabs(x) < 1e150 ? -ExactProduct(half, x) : Whole(-half * x);
}

// P(X > x), x >= 0.
Scaled UpperNormal(double x) {
    const double factor = x < 2.0    ? table::millsNear(x)
                          : x < 10.0 ? table::millsMid(x)
                                     : table::millsFar(1.0 / x / x) / x;
    return {factor, ExponentOfNormal(x)};
}

// x with P(0 < X < x) = p, p <= 0.25 or so: Newton's method on a series that keeps small values
// accurate.
double CentralNormalPoint(double p) {
    double x = p * kRootTwoPi;
    for (int turn = 0; turn < 6; ++turn) {
        const double value = x * table::centralNormal(x * x);
        const double density = kInverseRootTwoPi * std::exp(-0.5 * x * x);
        const double step = (p - value) / density;
        x += step;
        if (std::fabs(step) < 1e-9 * x)
            break;
    }
    return x;
}

// x with P(X > x) = p, p at most 1/2. The start value is formula 26.2.23 of M. Abramowitz and I. A.
// Stegun, Handbook of mathematical functions, 1964.
double UpperNormalPoint(double p) {
    if (p > 0.25)
        return CentralNormalPoint(0.5 - p);
    const double logP = std::log(p);
    const double u = std::sqrt(-2.0 * logP);
    double x = u - ((0.010328 * u + 0.802853) * u + 2.515517) /
                       (((0.001308 * u + 0.189269) * u + 1.432788) * u + 1.0);
    for (int turn = 0; turn < 5; ++turn) {
        const Scaled upper = UpperNormal(x);
        const double got = upper.value();
        const double excess = got > 1e-290 ? std::log(got / p) : upper.logarithm() - logP;
        // Newton's step for the logarithm of the tail, whose derivative is -phi / P.
        const double step = excess * upper.factor * kRootTwoPi;
        x += step;
        if (std::fabs(step) < 1e-8)
            break;
    }
    return x;
}

Tails ChiSquareTails(double x, double dof) {
    return GammaTails(0.5 * dof, std::max(0.5 * x, kLeastHalf));
}

// n f and d as fractions of their sum; both are scaled if f is far from 1.
UnitPoint FisherShare(double f, double n, double d) {
    const double scale = f > 1e150 ? 0x1p-300 : f < 1e-150 ? 0x1p300 : 1.0;
    return UnitPoint::Share(ExactProduct(f * scale, n), Whole(d * scale));
}

// If n is tiny compared with d, the part above f is n times an integral over t^-1 that does not
// depend on n except for its end. If d is tiny, the part below f is the same with 1 / f.
Tails FewFisherTails(double f, double n, double d) {
    const bool isFirst = n < d;
    const double few = isFirst ? n : d, many = isFirst ? d : n;
    const double logarithm =
        std::log(few) + (isFirst ? std::log(f) : -std::log(f)) - std::log(many);
    if (logarithm < -650.0) { // the incomplete beta integral from 0 to its first term
        const double integral = -logarithm - Digamma(0.5 * many) - kEuler;
        return {{few * (0.5 * integral), Whole(0.0)}, !isFirst, {0.5 * few, Whole(0.0)}};
    }
    Tails tails = BetaTails(0.5 * (isFirst ? kFewDegrees : n), 0.5 * (isFirst ? d : kFewDegrees),
                            FisherShare(f, n, d));
    tails.smaller = tails.smaller * (few / kFewDegrees);
    tails.slope = tails.slope * (few / kFewDegrees);
    return tails;
}

// If both degrees are tiny, the parts do not depend on f.
Tails FlatFisherTails(double n, double d) {
    const double below = d / (n + d), above = n / (n + d);
    return {{std::min(below, above), Whole(0.0)}, below <= above, {0.5 * n * below, Whole(0.0)}};
}

Tails FisherTails(double f, double n, double d) {
    if (std::min(n, d) < kFewDegrees && std::max(n, d) < kFlatDegrees)
        return FlatFisherTails(n, d);
    if (std::min(n, d) < kFewDegrees)
        return FewFisherTails(f, n, d);
    return BetaTails(0.5 * n, 0.5 * d, FisherShare(f, n, d));
}

// The tails of t^2, which has Fisher's distribution with 1 and dof degrees.
Tails SquareTails(double t, double dof) {
    const UnitPoint point = UnitPoint::Share(ExactProduct(t, t), Whole(dof));
    return BetaTails(0.5, 0.5 * dof, point);
}

// P(T > t), t > 0, at most 1/2. For degrees below kLeastStudentDegrees it is 1/2 for all t, to the
// last bit.
Scaled UpperStudent(double t, double dof) {
    dof = std::max(dof, kLeastStudentDegrees);
    if (t < kNearStudent)
        return {0.5, Whole(0.0)};
    const StudentTail quick = StudentTailAt(t, dof);
    if (quick.isKnown)
        return {quick.upper(), Whole(0.0)};
    if (t <= kFarStudent) {
        const Tails tails = SquareTails(t, dof);
        return tails.isLower ? Scaled{0.5 - 0.5 * tails.smaller.value(), Whole(0.0)}
                             : tails.smaller * 0.5;
    }
    const Scaled far = UpperStudent(kFarStudent, dof);
    const Extended logarithm = LogOf(Whole(t)) - LogOf(Whole(kFarStudent));
    return {far.factor, far.exponent - Whole(dof) * logarithm};
}

double StudentDensity(double t, double dof) {
    // The density is constant to the last bit below this.
    const double least = 1e-20 * std::sqrt(dof);
    const double u = std::max(std::fabs(t), least);
    if (u > kFarStudent)
        return std::isinf(u) ? 0.0 : (UpperStudent(u, dof) * (dof / u)).value();
    return (SquareTails(u, dof).slope * (1.0 / u)).value();
}

// ln(p / part), from the numbers themselves where they are above `least` or can be scaled up,
// because the rounding of a large logarithm would matter more.
double LogOfShare(double p, const Tails &tails, bool lower) {
    constexpr double least = 1e-290;
    constexpr double raise = 0x1p200;
    const double part = tails.part(lower);
    if (part > least && p > least)
        return std::log(p / part);
    const double raised = lower == tails.isLower ? (tails.smaller * raise).value() : kInfinity;
    if (raised > least && raised < kInfinity)
        return std::log(p * raise / raised);
    return std::log(p) - tails.logarithm(lower);
}

// Newton's method for the logarithm of a part as a function of u = ln x; the function is concave.
template <class TailsAt>
double Solve(double start, double p, bool isUpper, TailsAt tailsAt) {
    const double direction = isUpper ? -1.0 : 1.0;
    double x = start;
    double low = 0.0, high = kInfinity;
    for (int turn = 0; turn < 300; ++turn) {
        const Tails tails = tailsAt(x);
        const double got = tails.part(!isUpper);
        const double missing = LogOfShare(p, tails, !isUpper);
        (direction * missing < 0.0 ? high : low) = x;
        const double ratio = tails.isLower != isUpper ? tails.smaller.factor / tails.slope.factor
                                                      : got / tails.slope.value();
        const double step = direction * missing * ratio;
        if (std::fabs(missing) < 1e-8 && std::fabs(step) < 1.0)
            return std::fabs(step) < 0.5 ? x + x * std::expm1(step) : x * std::exp(step);
        const double next = x * std::exp(step);
        const bool isInside = next > low && next < high && std::fabs(step) < 300;
        if (!isInside && high > std::numeric_limits<double>::max()) {
            if (x > 1e300)
                return kInfinity;
            x *= 1e3;
        } else if (!isInside && low == 0.0) {
            if (x < 1e-300)
                return 0.0;
            x *= next > 0.0 && next < x ? std::max(next / x, 1e-30) : 1e-3;
        } else if (!isInside) {
            const double middle = std::sqrt(low) * std::sqrt(high);
            if (!(middle > low && middle < high))
                return x;
            x = middle;
        } else {
            x = next;
        }
    }
    return x;
}

// Solves for the part that is at most 1/2; 1 - p is then exact.
void TakeSmaller(double &p, bool &isUpper) {
    if (p <= 0.5)
        return;
    p = 1.0 - p;
    isUpper = !isUpper;
}

// For p = 0 and p = 1 the points are the ends of the range.
bool IsAtEnd(double p, bool isUpper, double lowerEnd, double *point) {
    if (p != 0.0 && p != 1.0)
        return false;
    *point = (p == 0.0) != isUpper ? lowerEnd : kInfinity;
    return true;
}

} // namespace

double NormalValue(double x, DistributionValue what) {
    if (what == DistributionValue::Density)
        return Scaled{kInverseRootTwoPi, ExponentOfNormal(x)}.value();
    if (std::isinf(x))
        return ValueAtEnd(x > 0.0, what);
    const Tails tails = {UpperNormal(std::fabs(x)), x < 0.0, {}};
    return ValueOf(tails, what);
}

double StudentValue(double t, double dof, DistributionValue what) {
    dof = Limited(dof);
    if (std::isinf(t))
        return ValueAtEnd(t > 0.0, what);
    if (what == DistributionValue::Density)
        return StudentDensity(t, dof);
    return ValueOf({UpperStudent(std::fabs(t), dof), t < 0.0, {}}, what);
}

double FisherValue(double f, double n, double d, DistributionValue what) {
    n = std::min(n, kMostDegrees);
    d = std::min(d, kMostDegrees);
    if (f == 0.0 && what == DistributionValue::Density)
        return DensityAtZero(n, 1.0);
    if (f <= 0.0 || std::isinf(f))
        return ValueAtEnd(f > 0.0, what);
    const Tails tails = FisherTails(f, n, d);
    return what == DistributionValue::Density ? (tails.slope * (1.0 / f)).value()
                                              : ValueOf(tails, what);
}

double ChiSquareValue(double x, double dof, DistributionValue what) {
    dof = Limited(dof);
    if (x == 0.0 && what == DistributionValue::Density)
        return DensityAtZero(dof, 0.5);
    if (x <= 0.0 || std::isinf(x))
        return ValueAtEnd(x > 0.0, what);
    const Tails tails = ChiSquareTails(x, dof);
    return what == DistributionValue::Density ? (tails.slope * (1.0 / x)).value()
                                              : ValueOf(tails, what);
}

double NormalPoint(double p, bool isUpper) {
    double end;
    if (IsAtEnd(p, isUpper, -kInfinity, &end))
        return end;
    TakeSmaller(p, isUpper);
    const double x = p == 0.5 ? 0.0 : UpperNormalPoint(p);
    return isUpper || x == 0.0 ? x : -x;
}

double StudentPoint(double p, bool isUpper, double dof) {
    double end;
    if (IsAtEnd(p, isUpper, -kInfinity, &end))
        return end;
    dof = std::max(Limited(dof), kLeastStudentDegrees);
    TakeSmaller(p, isUpper);
    if (p == 0.5)
        return 0.0;
    double t = kNaN;
    if (dof >= 1.0 && p > kLeastTail)
        t = StudentUpperPoint(p, dof, UpperNormalPoint(p));
    if (!std::isnan(t))
        return isUpper ? t : -t;
    const Scaled far = UpperStudent(kFarStudent, dof);
    if (far.value() > p) {
        const Extended log = far.exponent + LogOf(Whole(far.factor)) - LogOf(Whole(p));
        const bool isBeyond = log.high > 1000.0 * dof;
        t = isBeyond ? kInfinity : kFarStudent * ExpOf(log / Whole(dof));
    } else {
        // For t^2: the upper part is 2 p, the lower part is 1 - 2 p, which is exact from 1/4 on.
        const bool takesLower = p > 0.25;
        const double z = UpperNormalPoint(p);
        t = Solve(z, takesLower ? 1.0 - 2.0 * p : 2.0 * p, !takesLower, [=](double at) {
            Tails tails = SquareTails(at, dof);
            tails.slope = tails.slope * 2.0; // with respect to ln t
            return tails;
        });
    }
    return isUpper ? t : -t;
}

double FisherPoint(double p, bool isUpper, double n, double d) {
    double end;
    if (IsAtEnd(p, isUpper, 0.0, &end))
        return end;
    n = std::min(n, kMostDegrees);
    d = std::min(d, kMostDegrees);
    TakeSmaller(p, isUpper);
    const double z = UpperNormalPoint(p);
    const double spread = std::min(std::sqrt(2.0 / n + 2.0 / d), 50.0);
    return Solve(std::exp((isUpper ? z : -z) * spread), p, isUpper,
                 [=](double f) { return FisherTails(f, n, d); });
}

double ChiSquarePoint(double p, bool isUpper, double dof) {
    double end;
    if (IsAtEnd(p, isUpper, 0.0, &end))
        return end;
    dof = Limited(dof);
    TakeSmaller(p, isUpper);
    // E. B. Wilson and M. M. Hilferty: the cube root is nearly normal.
    const double z = UpperNormalPoint(p);
    const double c = 2.0 / (9.0 * dof);
    const double root = 1.0 - c + (isUpper ? z : -z) * std::sqrt(c);
    double start = root > 0.1 ? dof * root * root * root : 1e-3 * dof;
    if (!isUpper && !(root > 0.5)) { // the first term of the series
        const double log = (std::log(p) + LnGammaFunction(0.5 * dof + 1.0)) * 2.0 / dof;
        start = 2.0 * std::exp(std::max(log, -690.0));
    }
    return Solve(start, p, isUpper, [=](double x) { return ChiSquareTails(x, dof); });
}

} // namespace qx

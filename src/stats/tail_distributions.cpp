#include "stats/tail_distributions.h"

#include "frame/constants.h"
#include "special/digamma.h"
#include "special/direct_tails.h"
#include "special/gamma.h"
#include "special/logarithms.h"
#include "special/normal_tail.h"
#include "special/tail_integrals.h"
#include "stats/student_tail.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kMostDegrees = 1e25;
constexpr double kLeastTail = 1e-250;
constexpr double kNormalDoubles = 37.0; // up to here the normal tail is not subnormal
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

// Below this the error of a part is not increased by its logarithm or that of the other part.
constexpr double kQuickLogarithm = 0.1;

// Whether the plain numbers suffice for the value.
bool Suffices(const DirectTails &tails, DistributionValue what) {
    return tails.isKnown && tails.smaller > kLeastTail &&
           (!IsLogarithm(what) || tails.smaller < kQuickLogarithm);
}

double ValueOf(const DirectTails &tails, DistributionValue what) {
    const bool isLower = IsLowerPart(what);
    if (!IsLogarithm(what))
        return tails.part(isLower);
    return isLower == tails.isLower ? std::log(tails.smaller) : std::log1p(-tails.smaller);
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
Scaled UpperNormal(double x) { return {ScaledNormalTail(x), ExponentOfNormal(x)}; }

// x with P(X < x) = p, or -x for the upper part, 0 < p < 1: rational functions, on the intervals of
// M. J. Wichura (The percentage points of the normal distribution, 1988).
double NormalPointOf(double p) {
    constexpr double central = 0.425, far = 5.0;
    const double q = p - 0.5; // exact from 1/4 on
    if (std::fabs(q) <= central)
        return q * table::pointCentral(q * q);
    const double r = std::sqrt(-std::log(q < 0.0 ? p : 1.0 - p));
    const double x = r < far ? table::pointNear(r) : table::pointFar(r);
    return q < 0.0 ? -x : x;
}

// x with P(X > x) = p, 0 < p <= 1/2.
double UpperNormalPoint(double p) { return p == 0.5 ? 0.0 : -NormalPointOf(p); }

Tails ChiSquareTails(double x, double dof) {
    return GammaTails(0.5 * dof, std::max(0.5 * x, kLeastHalf));
}

// n f and d as fractions of their sum; both are scaled if f is far from 1.
UnitPoint FisherShare(double f, double n, double d) {
    const double scale = f > 1e150 ? 0x1p-300 : f < 1e-150 ? 0x1p300 : 1.0;
    return UnitPoint::Share(ExactProduct(f * scale, n), Whole(d * scale));
}

// The lower part up to the median, which is close to the quotient of the medians of two gamma
// distributions.
DirectTails DirectFisherTails(double f, double n, double d) {
    constexpr double farthest = 1e100; // n f does not overflow
    if (!(f > 1.0 / farthest && f < farthest))
        return {0.0, false, 0.0, false};
    const bool isLower = f * (n * (3.0 * d - 2.0)) < (3.0 * n - 2.0) * d;
    return DirectBetaTails(f, 0.5 * n, 0.5 * d, isLower);
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

// A point with one more step, by tails with a smaller error: if a part changes less than its argument,
// the error of the part is amplified.
template <class TailsAt>
double Refined(double x, double p, bool isUpper, TailsAt tailsAt) {
    const Tails tails = tailsAt(x);
    const double missing = LogOfShare(p, tails, !isUpper);
    const double step = missing * (tails.part(!isUpper) / tails.slope.value());
    return x + x * (isUpper ? -step : step);
}

// The point by Halley's method for the logarithm of a part as a function of ln x. `bend` returns the
// derivative of the logarithm of the slope; `scale` is about the inverse of the distribution's width
// in ln x. A NaN if the tails are unknown or the steps do not settle.
template <class TailsAt, class Bend, class AccurateAt>
double SolveQuickly(double start, double p, bool isUpper, double scale, TailsAt tailsAt, Bend bend,
                    AccurateAt accurateAt) {
    constexpr double longest = 2.0;
    constexpr double close = 4e-6; // after a step of this length, in widths, the next is below eps
    const double direction = isUpper ? -1.0 : 1.0;
    double x = start;
    for (int turn = 0; turn < 12; ++turn) {
        const DirectTails tails = tailsAt(x);
        const double part = tails.part(!isUpper);
        if (!tails.isKnown || !(part > kLeastTail))
            return kNaN;
        const double rate = direction * tails.slope / part;
        const double newton = std::log(p / part) / rate;
        const double turned = 1.0 + 0.5 * newton * (bend(x) - rate);
        const double step = std::clamp(turned > 0.5 ? newton / turned : newton, -longest, longest);
        x += x * std::expm1(step);
        if (std::fabs(step) * scale < close)
            return std::fabs(rate) < 1.2 ? Refined(x, p, isUpper, accurateAt) : x;
    }
    return kNaN;
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

// Start values are those of M. Abramowitz and I. A. Stegun, Handbook of mathematical functions,
// 1964: 26.5.22 for Fisher's distribution, Student's for one degree.
double QuickFisherPoint(double p, bool isUpper, double n, double d, double z) {
    if (!(n >= 1.0 && d >= 1.0 && p > kLeastTail))
        return kNaN;
    double start;
    if (n < 2.0 || d < 2.0) {
        const bool isFirst = n < 2.0;
        const double many = isFirst ? d : n;
        const bool takesUpper = isUpper == isFirst; // of t^2, or of 1 / t^2
        const double half = takesUpper ? 0.5 * p : 0.5 - 0.5 * p;
        const double t = StudentUpperPoint(half, many, UpperNormalPoint(half));
        start = isFirst ? t * t : 1.0 / (t * t);
    } else {
        const double first = 1.0 / (n - 1.0), second = 1.0 / (d - 1.0);
        const double h = 2.0 / (first + second);
        const double lambda = (z * z - 3.0) / 6.0;
        const double w = z * std::sqrt(std::max(h + lambda, 0.1)) / h -
                         (first - second) * (lambda + 5.0 / 6.0 - 2.0 / (3.0 * h));
        start = std::exp(std::clamp(2.0 * w, -200.0, 200.0));
    }
    if (!(start > 0.0 && start < kInfinity))
        return kNaN;
    const double scale = 1.0 + std::sqrt(0.5 * n * d / (n + d));
    return SolveQuickly(
        start, p, isUpper, scale, [=](double f) { return DirectFisherTails(f, n, d); },
        [=](double f) { return 0.5 * n * d * (1.0 - f) / (n * f + d); },
        [=](double f) { return FisherTails(f, n, d); });
}

double QuickChiSquarePoint(double p, bool isUpper, double dof, double start) {
    if (!(dof >= 1.0 && p > kLeastTail && start > 0.0))
        return kNaN;
    if (dof == 2.0)
        return isUpper ? -2.0 * std::log(p) : -2.0 * std::log1p(-p);
    return SolveQuickly(
        start, p, isUpper, 1.0 + std::sqrt(0.5 * dof),
        [=](double x) { return DirectGammaTails(0.5 * dof, 0.5 * x); },
        [=](double x) { return 0.5 * (dof - x); },
        [=](double x) { return ChiSquareTails(x, dof); });
}

} // namespace

double NormalValue(double x, DistributionValue what) {
    if (what == DistributionValue::Density)
        return Scaled{kInverseRootTwoPi, ExponentOfNormal(x)}.value();
    if (std::isinf(x))
        return ValueAtEnd(x > 0.0, what);
    const double size = std::fabs(x);
    if (size < kNormalDoubles && !IsLogarithm(what)) {
        const double smaller = ScaledNormalTail(size) * ExpOf(ExponentOfNormal(size));
        return IsLowerPart(what) == (x < 0.0) ? smaller : 1.0 - smaller;
    }
    return ValueOf({UpperNormal(size), x < 0.0, {}}, what);
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
    const DirectTails quick = DirectFisherTails(f, n, d);
    if (Suffices(quick, what))
        return what == DistributionValue::Density ? quick.slope / f : ValueOf(quick, what);
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
    const DirectTails quick = DirectGammaTails(0.5 * dof, 0.5 * x);
    if (Suffices(quick, what))
        return what == DistributionValue::Density ? quick.slope / x : ValueOf(quick, what);
    const Tails tails = ChiSquareTails(x, dof);
    return what == DistributionValue::Density ? (tails.slope * (1.0 / x)).value()
                                              : ValueOf(tails, what);
}

double NormalPoint(double p, bool isUpper) {
    double end;
    if (IsAtEnd(p, isUpper, -kInfinity, &end))
        return end;
    const double x = NormalPointOf(p);
    return isUpper ? 0.0 - x : x;
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
    const double quick = QuickFisherPoint(p, isUpper, n, d, isUpper ? z : -z);
    if (!std::isnan(quick))
        return quick;
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
    const double quick = QuickChiSquarePoint(p, isUpper, dof, start);
    if (!std::isnan(quick))
        return quick;
    return Solve(start, p, isUpper, [=](double x) { return ChiSquareTails(x, dof); });
}

} // namespace qx

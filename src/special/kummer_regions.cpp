#include "special/kummer_regions.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/gamma.h"
#include "special/logarithms.h"
#include "special/reciprocal_gamma.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kAsymptoticFrom = 30;
constexpr double kGood = 40 * kEpsilon;
constexpr int kMostTerms = 1000;
constexpr double kHopeless = 1e30; // bound of the terms of an asymptotic sum

Extended Whole(double x) { return {x, 0}; }

// gamma(b) / gamma(a), 0 at the poles of gamma(a).
Estimated GammaRatio(Extended b, Extended a) {
    return GammaQuotientOf({b, Whole(1)}, {a, Whole(1)});
}

// One part of the asymptotic form: gamma(b) / gamma(a) exp(scale) |x|^power times a sum.
Estimated Part(Extended b, Extended a, double scale, double x, Extended power,
               const AsymptoticResult &sum) {
    const Estimated quotient = GammaRatio(b, a);
    if (quotient.value.isZero())
        return {quotient.value, 0};
    const Wide value =
        quotient.value * WideExp(Whole(scale) + power * LogOf(Whole(x))) * WideOf(Whole(sum.sum));
    return {value, sum.error + quotient.error};
}

// The asymptotic form in double precision for moderate arguments; d = b - a.
Estimated PlainAsymptotic(double a, double b, double d, double x, const AsymptoticResult &rising,
                          const AsymptoticResult &falling) {
    constexpr double most = 20, farthest = 300, rounding = 12 * kEpsilon;
    if (!(std::fabs(a) <= most && b > 0.1 && b <= most && std::fabs(d) <= most &&
          std::fabs(x) <= farthest))
        return {{Whole(kNaN), 0}, kInfinity};
    const bool isTurned = x < 0;
    const double y = std::fabs(x), p = isTurned ? d : a, q = isTurned ? a : d;
    const double first =
        ReciprocalGamma(p) * (isTurned ? 1 : std::exp(x)) * std::pow(y, -q) * rising.sum;
    const double second = ReciprocalGamma(q) * (isTurned ? std::exp(x) : 1) * std::pow(y, -p) *
                          CosPi(p) * falling.sum;
    const double sum = first + second;
    const double error =
        rounding + (rising.error * std::fabs(first) + falling.error * std::fabs(second) +
                    rounding * std::fabs(second)) /
                       std::fabs(sum);
    return {WideOf(Whole(GammaFunction(b) * sum)), std::isnan(error) ? kInfinity : error};
}

Estimated Asymptotic(double a, double b, double x) {
    const double y = std::fabs(x);
    const Extended d = ExactSum(b, -a);
    const double e = 1 - d.high; // 1 + a - b
    // for x < 0 by exp(x) M(b - a, b, -x), which exchanges the two parts
    const bool isTurned = x < 0;
    const AsymptoticResult rising =
        isTurned ? AsymptoticSum(a, e, 1 / y) : AsymptoticSum(d.high, 1 - a, 1 / y);
    const AsymptoticResult falling =
        isTurned ? AsymptoticSum(d.high, 1 - a, -1 / y) : AsymptoticSum(a, e, -1 / y);
    if (rising.error > kGood)
        return {{Whole(kNaN), 0}, kInfinity};
    const Estimated plain = PlainAsymptotic(a, b, d.high, x, rising, falling);
    if (plain.error <= kGood)
        return plain;
    const Extended p = isTurned ? d : Whole(a);
    const Extended q = isTurned ? Whole(a) : d;
    const Estimated first = Part(Whole(b), p, isTurned ? 0 : x, y, -q, rising);
    Estimated second = Part(Whole(b), q, isTurned ? x : 0, y, -p, falling);
    second.value = second.value * WideOf(Whole(CosPi(p.high)));
    return SumOfParts(first, second);
}

double AtInfinity(double x, double a, double b) {
    if (a == 0)
        return 1;
    const Extended d = ExactSum(b, -a);
    if (x > 0) {
        const bool ends = a < 0 && IsInteger(a);
        const Estimated quotient = ends ? GammaRatio(Whole(b), d) : GammaRatio(Whole(b), Whole(a));
        const double sign = ends && IsOdd(a) ? -1 : 1;
        return std::copysign(kInfinity, sign * quotient.value.value.high);
    }
    const Estimated quotient = GammaRatio(Whole(b), d);
    if (a > 0 || quotient.value.isZero())
        return 0;
    return std::copysign(kInfinity, quotient.value.value.high);
}

} // namespace

AsymptoticResult AsymptoticSum(double p, double q, double y) {
    double term = 1, sum = 1, roundings = 1;
    for (double n = 0; n < kMostTerms; ++n) {
        const double ratio = (p + n) * (q + n) / (n + 1) * y;
        const double size = std::fabs(term);
        if (ratio == 0 || size <= 0.25 * kEpsilon * std::fabs(sum))
            return {sum, kEpsilon * roundings / std::fabs(sum)};
        if (!(std::fabs(ratio) < 1) && n > -p && n > -q)
            return {sum, (size + kEpsilon * roundings) / std::fabs(sum)};
        term *= ratio;
        sum += term;
        roundings += 2 * std::fabs(term);
        if (!(roundings < kHopeless))
            break;
    }
    return {sum, kInfinity};
}

double KummerByRegion(double x, double a, double b) {
    if (std::isnan(x) || !std::isfinite(a) || !std::isfinite(b))
        return kNaN;
    const bool isPole = b <= 0 && IsInteger(b);
    if (isPole && !(a <= 0 && IsInteger(a) && a > b))
        return kNaN;
    if (a == 0 || x == 0)
        return 1;
    if (a == b)
        return std::exp(x);
    if (std::isinf(x))
        return AtInfinity(x, a, b);
    if (std::fabs(x) >= kAsymptoticFrom && !isPole) {
        const Estimated value = Asymptotic(a, b, x);
        if (value.error <= kGood)
            return value.value.rounded();
    }
    const Extended none = Whole(0);
    const HyperForm straight = {{Whole(a), Whole(1), Whole(b), Whole(x), false}, none, none};
    const HyperForm turned = {
        {ExactSum(b, -a), Whole(1), Whole(b), Whole(-x), false}, none, Whole(x)};
    const bool isStraight = x > 0 || (a < 0 && b > a);
    const Estimated first = StraightForm(isStraight || isPole ? straight : turned);
    if (first.error <= kGood)
        return first.value.rounded();
    const HyperForm forms[] = {isStraight ? straight : turned, isStraight ? turned : straight};
    const Estimated value = isPole ? BestForm(&straight, 1) : BestForm(forms, 2);
    return value.error <= kHyperAccepted ? value.value.rounded() : kNaN;
}

} // namespace qx

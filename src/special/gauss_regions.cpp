#include "special/gauss_regions.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/gamma.h"
#include "special/hypergeometric_terms.h"
#include "special/kummer_regions.h"
#include "special/reciprocal_gamma.h"

#include <cmath>
#include <initializer_list>

namespace qx {

namespace {

constexpr double kConnectionFrom = 0.9;
constexpr double kFarthest = -1e280; // below it 1 / (1 - x) does not have the digits of two doubles
constexpr double kGoodConnection = 1e-13;
constexpr double kGoodParts = 1e-27;
constexpr double kPlainFrom = 0.75, kPlainGood = 40 * kEpsilon, kPlainError = 10 * kEpsilon;
constexpr double kPlain = 20, kPlainDistance = 0.05;
constexpr double kPlainMostC = 6, kPlainMostS = 2.5; // beyond, the parts exceed the value
constexpr double kPlainLoss = 4;                     // largest part relative to the value
constexpr double kAside = 0x1p-32;
constexpr Wide kOne = {{0.5, 0}, 1};

Extended Whole(double x) { return {x, 0}; }

bool Ends(Extended a) { return a.high <= 0 && a.low == 0 && IsInteger(a.high); }

struct GaussArguments {
    Extended a, b, c;
};

// A point in (0, 1) and its distance from 1.
struct Point {
    Extended x, rest;
};

// Both parts of the connection of F(a, b; c; x) with 1 - x, 15.8.4 of the DLMF; s = c - a - b.
Estimated Connection(const GaussArguments &p, Extended s, const Point &point) {
    const Extended one = Whole(1);
    const Extended d = p.c - p.a, e = p.c - p.b;
    const Estimated firstFactor = GammaQuotientOf({p.c, s}, {d, e});
    const Estimated secondFactor = GammaQuotientOf({p.c, -s}, {p.a, p.b});
    if (std::isinf(firstFactor.error + secondFactor.error))
        return {kOne, kInfinity};
    const Estimated first = CarefulSum({p.a, p.b, one - s, point.rest, true}, kGoodParts);
    const Estimated second = CarefulSum({d, e, one + s, point.rest, true}, kGoodParts);
    const Estimated power = PowerOf(point.rest, s);
    return SumOfParts({firstFactor.value * first.value, first.error + firstFactor.error},
                      {secondFactor.value * power.value * second.value,
                       second.error + secondFactor.error + power.error});
}

// The same if c - a - b may be near an integer.
Estimated NearOne(const GaussArguments &p, const Point &point) {
    const Extended s = p.c - p.a - p.b;
    const double whole = std::rint(s.high);
    const Extended off = s - Whole(whole);
    if (std::fabs(off.high) >= kAside)
        return Connection(p, s, point);
    // b is moved, because F has no poles in b
    const auto beside = [&](double aside) {
        const Extended moved = Whole(whole) + Whole(aside);
        return Connection({p.a, p.c - p.a - moved, p.c}, moved, point);
    };
    return Between(beside(-kAside), beside(kAside), off.high / kAside);
}

// The relative error of 1 / gamma(x) of a rounded x.
double RoundingBesidePole(double x) {
    return x > 0.5 ? 0 : kEpsilon * (1 + std::fabs(x)) / std::fabs(x - std::rint(x));
}

// The connection in double precision for moderate parameters and c - a - b away from integers.
Estimated PlainConnection(const GaussArguments &p, Extended s, const Point &point) {
    const Extended one = Whole(1);
    const Extended d = p.c - p.a, e = p.c - p.b;
    const double c = p.c.high;
    const double off = std::fabs(s.high - std::rint(s.high));
    for (const double parameter : {p.a.high, p.b.high, c, d.high, e.high, s.high})
        if (!(std::fabs(parameter) <= kPlain))
            return {kOne, kInfinity};
    if (off < kPlainDistance || c < kPlainDistance || c > kPlainMostC ||
        std::fabs(s.high) > kPlainMostS)
        return {kOne, kInfinity};
    const PlainValue m = PlainForm({{p.a, p.b, one - s, point.rest, true}, one, Whole(0)});
    const PlainValue n = PlainForm({{d, e, one + s, point.rest, true}, one, Whole(0)});
    if (std::isinf(m.error + n.error))
        return {kOne, kInfinity};
    const double first =
        GammaFunction(s.high) * ReciprocalGamma(d.high) * ReciprocalGamma(e.high) * m.value;
    const double second = GammaFunction(-s.high) * ReciprocalGamma(p.a.high) *
                          ReciprocalGamma(p.b.high) * std::pow(point.rest.high, s.high) * n.value;
    const double sum = first + second;
    const double rounding = kPlainError + kEpsilon * (1 + std::fabs(s.high)) / off;
    const double ofFirst = rounding + RoundingBesidePole(d.high) + RoundingBesidePole(e.high);
    const double error =
        (std::fabs(first) * (m.error + ofFirst) + std::fabs(second) * (n.error + rounding)) /
        std::fabs(sum);
    if (!(std::fabs(first) + std::fabs(second) <= kPlainLoss * std::fabs(sum)))
        return {kOne, kInfinity};
    return {WideOf(Whole(GammaFunction(c) * sum)), error};
}

// Euler's form, whose series ends because c - a or c - b is 0, -1, -2, ...
Estimated Euler(const GaussArguments &p, const Point &point) {
    const Extended d = p.c - p.a, e = p.c - p.b;
    const HyperForm form = {{d, e, p.c, point.x, true}, point.rest, d - p.b};
    return BestForm(&form, 1);
}

Estimated BySeries(const GaussArguments &p, const Point &point) {
    const Extended d = p.c - p.a, e = p.c - p.b;
    const double x = point.x.high;
    const bool isTurned = x < -0.5;
    HyperForm forms[4];
    int count = 0;
    const auto add = [&](Extended a, Extended b, Extended at, Extended power) {
        forms[count++] = {{a, b, p.c, at, true}, point.rest, power};
    };
    const auto addTurned = [&] {
        const Extended turned = -point.x / point.rest;
        add(p.a, e, turned, -p.a);
        add(p.b, d, turned, -p.b);
    };
    if (isTurned)
        addTurned();
    if (x > -0.95) {
        add(p.a, p.b, point.x, Whole(0));
        add(d, e, point.x, d - p.b);
    }
    if (x >= -0.5 && x < 0.4)
        addTurned();
    return BestForm(forms, count);
}

// The first form of BySeries in double precision, for x to kPlainFrom.
PlainValue PlainSeries(double x, double a, double b, double c) {
    const Extended none = Whole(0), rest = ExactSum(1, -x);
    if (x >= -0.5)
        return PlainForm({{Whole(a), Whole(b), Whole(c), Whole(x), true}, none, none});
    return PlainForm(
        {{Whole(a), ExactSum(c, -b), Whole(c), Whole(-x) / rest, true}, rest, Whole(-a)});
}

Estimated ByRegion(const GaussArguments &p, double x) {
    const Point point = {Whole(x), ExactSum(1, -x)};
    if (Ends(p.a) || Ends(p.b)) {
        const HyperForm form = {{p.a, p.b, p.c, point.x, true}, Whole(0), Whole(0)};
        return BestForm(&form, 1);
    }
    const Extended d = p.c - p.a, e = p.c - p.b;
    if (x == 1)
        return GammaQuotientOf({p.c, d - p.b}, {d, e});
    if (Ends(d) || Ends(e))
        return Euler(p, point);
    Estimated near = {kOne, kInfinity};
    if (x > kPlainFrom) {
        near = PlainConnection(p, d - p.b, point);
        if (near.error <= kPlainGood)
            return near;
    }
    if (x > kConnectionFrom)
        near = NearOne(p, point);
    if (-x / point.rest.high > kConnectionFrom) { // F(a, c - b; c; x / (x - 1)) (1 - x)^(-a)
        const Extended rest = Whole(1) / point.rest;
        near = NearOne({p.a, e, p.c}, {-point.x / point.rest, rest});
        const Estimated power = PowerOf(rest, p.a);
        near = {near.value * power.value, near.error + power.error};
    }
    if (near.error <= kGoodConnection)
        return near;
    const Estimated value = BySeries(p, point);
    return value.error < near.error ? value : near;
}

} // namespace

double GaussByRegion(double x, double a, double b, double c) {
    if (!std::isfinite(x) || !std::isfinite(a) || !std::isfinite(b) || !std::isfinite(c) || x > 1)
        return kNaN;
    const auto endsBefore = [&](double p) { return Ends(Whole(p)) && p > c; };
    if (Ends(Whole(c)) && !endsBefore(a) && !endsBefore(b))
        return kInfinity;
    const bool ends = Ends(Whole(a)) || Ends(Whole(b));
    if (a == 0 || b == 0 || x == 0)
        return 1;
    if (x == 1 && !ends && !((ExactSum(c, -a) - Whole(b)).high > 0))
        return kNaN;
    if (x < kFarthest && !ends)
        return kNaN;
    if (x > -2 && x <= kPlainFrom && !ends) {
        const PlainValue plain = PlainSeries(x, a, b, c);
        if (plain.error <= kPlainGood)
            return plain.value;
    }
    const Estimated value = ByRegion({Whole(a), Whole(b), Whole(c)}, x);
    return value.error <= kHyperAccepted ? value.value.rounded() : kNaN;
}

} // namespace qx

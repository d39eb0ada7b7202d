#include "special/gauss_regions.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/hypergeometric_terms.h"
#include "special/kummer_regions.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kConnectionFrom = 0.9;
constexpr double kFarthest = -1e280; // below it 1 / (1 - x) does not have the digits of two doubles
constexpr double kGoodConnection = 1e-13;
constexpr double kGoodParts = 1e-27;
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

// Euler's form, whose series ends because c - a or c - b is 0, -1, -2, ...
Estimated Euler(const GaussArguments &p, const Point &point) {
    const Extended d = p.c - p.a, e = p.c - p.b;
    const HyperForm form = {{d, e, p.c, point.x, true}, point.rest, d - p.b};
    return BestForm(&form, 1);
}

Estimated BySeries(const GaussArguments &p, const Point &point) {
    const Extended d = p.c - p.a, e = p.c - p.b;
    const double x = point.x.high;
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
    if (x < -0.5)
        addTurned();
    if (x > -0.95) {
        add(p.a, p.b, point.x, Whole(0));
        add(d, e, point.x, d - p.b);
    }
    if (x >= -0.5 && x < 0.4)
        addTurned();
    return BestForm(forms, count);
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
    const Estimated value = ByRegion({Whole(a), Whole(b), Whole(c)}, x);
    return value.error <= kHyperAccepted ? value.value.rounded() : kNaN;
}

} // namespace qx

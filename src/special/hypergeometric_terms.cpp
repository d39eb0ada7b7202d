#include "special/hypergeometric_terms.h"

#include "frame/constants.h"
#include "special/extended.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr int kMostTerms = 10000;
constexpr int kMostCarefulTerms = 4000;
constexpr double kGoodDouble = 40 * kEpsilon;
constexpr double kGoodPair = 4 * kEpsilon;
constexpr double kPairEpsilon = 0x1p-100;
constexpr double kBig = 0x1p300;
constexpr int kBigExponent = 300;
constexpr double kVanishing = 1e-250;
constexpr int kSpareBits = 24;
constexpr double kLeastFactor = 1e-250; // of a form in double precision

// The result of a scan of a series, in units of 2^exponent.
struct Scan {
    Extended sum;
    double roundings; // contribution of the terms to the sum's error, in units of the precision
    int exponent;
    double peak; // the largest term
    bool isComplete;

    double error(double epsilon) const {
        const double size = std::fabs(sum.high);
        return isComplete && size > 0 ? epsilon * roundings / size : kInfinity;
    }
    double logOfRoundings() const { return exponent + std::log2(roundings); }
    double largest() const { return exponent + std::log2(peak); }
};

double At(double parameter, double k) { return parameter + k; }
Extended At(Extended parameter, double k) {
    const Extended sum = ExactSum(parameter.high, k);
    return QuickSum(sum.high, sum.low + parameter.low);
}
Extended ToPair(double x) { return {x, 0}; }
Extended ToPair(Extended x) { return x; }
double Down(double x) { return x * (1 / kBig); }
Extended Down(Extended x) { return {x.high * (1 / kBig), x.low * (1 / kBig)}; }
double Up(double x) { return x * kBig; }
Extended Up(Extended x) { return {x.high * kBig, x.low * kBig}; }

// Whether no parameter plus k is negative, where the ratio of the terms may rise again.
bool IsPast(const HyperTerms &t, double k) {
    return t.a.high + k > 0 && (!t.hasB || t.b.high + k > 0) && t.c.high + k > 0;
}

template <class Number>
Scan SumOf(const HyperTerms &terms, int most, double tolerance) {
    const Number a = Of<Number>(terms.a), b = Of<Number>(terms.b), c = Of<Number>(terms.c);
    const Number x = Of<Number>(terms.x);
    const double end = terms.hasB ? std::fabs(terms.x.high) : 0; // limit of the ratios
    Number term = Of<Number>({1, 0});
    Number sum = term;
    double roundings = 1, peak = 1;
    int exponent = 0;
    int below = 0; // how much lower the exponent of the term is
    for (int i = 0; i < most; ++i) {
        const double k = i;
        Number top = At(a, k) * x;
        if (terms.hasB)
            top = top * At(b, k);
        const Number quotient = top / (At(c, k) * Of<Number>({k + 1, 0}));
        term = term * quotient;
        const double size = std::fabs(Leading(term));
        const double ratio = std::max(std::fabs(Leading(quotient)), end); // bound for later terms
        if (size == 0)
            return {ToPair(sum), roundings, exponent, peak, Leading(top) == 0};
        if (size < kVanishing) { // may rise again beyond the poles
            if (IsPast(terms, k) && ratio < 1)
                return {ToPair(sum), roundings, exponent, peak, true};
            term = Up(term);
            below += kBigExponent;
        }
        if (below > 0) {
            if (size >= 1) {
                term = Down(term);
                below -= kBigExponent;
            }
            continue;
        }
        sum = sum + term;
        roundings += size * (2 + 0.2 * k); // an estimate for a product of about 4 k rounded factors
        peak = std::max(peak, size);
        if (!(size < kBig)) {
            if (!(size < kInfinity))
                break;
            term = Down(term);
            sum = Down(sum);
            roundings /= kBig;
            peak /= kBig;
            exponent += kBigExponent;
        }
        // Never for a ratio of 1 and above, where the bound is not above 0.
        if (size * ratio <= tolerance * std::fabs(Leading(sum)) * (1 - ratio) && IsPast(terms, k))
            return {ToPair(sum), roundings, exponent, peak, true};
    }
    return {ToPair(sum), roundings, exponent, peak, false};
}

// The same in double precision without the tests for overflow and underflow; incomplete if one is
// near.
template <bool HasB>
Scan PlainSum(const HyperTerms &terms) {
    constexpr double near = 0x1p-50, tolerance = 0x1p-60;
    const double a = terms.a.high, b = terms.b.high, c = terms.c.high, x = terms.x.high;
    const double end = HasB ? std::fabs(x) : 0;
    double term = 1, sum = 1, roundings = 1, weight = 2;
    for (double k = 0; k < kMostTerms; ++k) {
        const double top = HasB ? (a + k) * (b + k) * x : (a + k) * x;
        const double quotient = top / ((c + k) * (k + 1));
        term *= quotient;
        sum += term;
        const double size = std::fabs(term);
        roundings += size * weight;
        weight += 0.2;
        if (size > near * std::fabs(sum))
            continue;
        if (size == 0)
            return {{sum, 0}, roundings, 0, 1, top == 0};
        const double ratio = std::max(std::fabs(quotient), end);
        if (size * ratio <= tolerance * std::fabs(sum) * (1 - ratio) && IsPast(terms, k))
            return {{sum, 0}, roundings, 0, 1, true};
    }
    return {{sum, 0}, roundings, 0, 1, false};
}

Estimated None() { return {{{kNaN, 0}, 0}, kInfinity}; }

Estimated Result(const Scan &scan, double error) {
    return {WideOf(scan.sum, scan.exponent), error};
}

// Whether the double precision of the parameters suffices: no small a + k loses digits of the low
// part.
bool IsDouble(const HyperTerms &t) {
    const auto isDouble = [](Extended a) { return a.low == 0 || a.high > 0; };
    return isDouble(t.a) && (!t.hasB || isDouble(t.b)) && isDouble(t.c);
}

bool HasFactor(const HyperForm &form) { return form.power.high != 0; }

Estimated FactorOf(const HyperForm &form) {
    return form.base.high == 0 ? Estimated{WideExp(form.power), 0} : PowerOf(form.base, form.power);
}

// The same in double precision, corrected for the low parts; an infinite error outside a moderate
// range.
Estimated QuickFactorOf(const HyperForm &form) {
    const double p = form.power.high;
    const bool isExp = form.base.high == 0;
    const double power = isExp ? std::exp(p) : std::pow(form.base.high, p);
    if (!(power > 1e-250 && power < 1e250))
        return {{{kNaN, 0}, 0}, kInfinity};
    const double rest =
        isExp ? form.power.low
              : p * (form.base.low / form.base.high) + form.power.low * std::log(form.base.high);
    return {WideOf({power * (1 + rest), 0}), 2 * kEpsilon};
}

Estimated Times(const Estimated &a, const Estimated &b) {
    return {a.value * b.value, a.error + b.error};
}

// The sum in two doubles or, if these do not suffice, in integers; `largest` is from a scan of the
// series.
Estimated Careful(const HyperTerms &terms, double largest, double tolerance) {
    const Scan pair = SumOf<Extended>(terms, kMostCarefulTerms, 0x1p-106);
    const double error = pair.error(kPairEpsilon);
    if (error <= tolerance)
        return Result(pair, error);
    const bool isKnown = error < 0.1;
    const double lost = isKnown ? std::log2(pair.roundings / std::fabs(pair.sum.high)) : 110;
    Estimated best = isKnown ? Result(pair, error) : None();
    for (int bits = static_cast<int>(lost - std::log2(tolerance)) + kSpareBits; bits < 2000;
         bits *= 2) {
        const Estimated exact = IntegerSum(terms, std::max(largest, pair.largest()), bits);
        if (exact.error < best.error)
            best = exact;
        if (best.error <= tolerance || std::isnan(exact.error))
            break;
    }
    return best;
}

Estimated TimesFactor(const Estimated &sum, const HyperForm &form) {
    if (!HasFactor(form))
        return sum;
    const Estimated factor = QuickFactorOf(form);
    return Times(sum, std::isinf(factor.error) ? FactorOf(form) : factor);
}

} // namespace

namespace {

Scan PlainScan(const HyperForm &form) {
    return form.terms.hasB ? PlainSum<true>(form.terms) : PlainSum<false>(form.terms);
}

PlainValue PlainResult(const HyperForm &form, const Scan &scan) {
    const PlainValue none = {kNaN, kInfinity};
    const double error = scan.error(kEpsilon), sum = scan.sum.high;
    if (!(error <= kGoodDouble))
        return none;
    if (!HasFactor(form))
        return {sum, error};
    const double p = form.power.high;
    const bool isExp = form.base.high == 0;
    const double power = isExp ? std::exp(p) : std::pow(form.base.high, p);
    const double value = sum * power;
    if (!(power > kLeastFactor && power < 1 / kLeastFactor && std::fabs(value) > kLeastFactor &&
          std::fabs(value) < 1 / kLeastFactor))
        return none;
    double rest = isExp ? form.power.low : p * (form.base.low / form.base.high);
    if (!isExp && form.power.low != 0)
        rest += form.power.low * std::log(form.base.high);
    return {value + value * rest, error + 2 * kEpsilon};
}

} // namespace

PlainValue PlainForm(const HyperForm &form) {
    if (!IsDouble(form.terms))
        return {kNaN, kInfinity};
    return PlainResult(form, PlainScan(form));
}

Estimated StraightForm(const HyperForm &form) {
    constexpr double mostLost = 1e-6; // relative error in double precision
    if (!IsDouble(form.terms))
        return None();
    const Scan scan = PlainScan(form);
    const PlainValue plain = PlainResult(form, scan);
    if (plain.error <= kGoodDouble)
        return {WideOf({plain.value, 0}), plain.error};
    if (!(scan.error(kEpsilon) <= mostLost))
        return None();
    const Scan pair = SumOf<Extended>(form.terms, kMostCarefulTerms, 0x1p-106);
    const double error = pair.error(kPairEpsilon);
    return error <= kGoodPair ? TimesFactor(Result(pair, error), form) : None();
}

Estimated SumOfParts(const Estimated &a, const Estimated &b) {
    const Wide sum = a.value + b.value;
    const double size = sum.logarithm();
    const auto share = [&](const Estimated &part) {
        if (part.value.isZero() || std::isinf(part.error))
            return part.error;
        return part.error * std::exp2(part.value.logarithm() - size);
    };
    return {sum, share(a) + share(b)};
}

Estimated Between(const Estimated &low, const Estimated &high, double at) {
    const Wide first = low.value * WideOf({0.5 * (1 - at), 0});
    const Wide second = high.value * WideOf({0.5 * (1 + at), 0});
    return SumOfParts({first, low.error}, {second, high.error});
}

Estimated CarefulSum(const HyperTerms &terms, double tolerance) {
    return Careful(terms, 0, tolerance);
}

Estimated BestForm(const HyperForm *forms, int count) {
    const HyperForm *best = nullptr;
    double least = kInfinity, largest = 0;
    for (const HyperForm *form = forms; form < forms + count; ++form) {
        const Scan scan = SumOf<double>(form->terms, kMostTerms, 0x1p-60);
        const double error = scan.error(kEpsilon);
        if (error <= kGoodDouble && IsDouble(form->terms))
            return TimesFactor(Result(scan, error), *form);
        if (!scan.isComplete)
            continue;
        const double factor = HasFactor(*form) ? FactorOf(*form).value.logarithm() : 0;
        const double size = scan.logOfRoundings() + factor;
        if (size < least) {
            best = form;
            least = size;
            largest = scan.largest();
        }
    }
    if (best == nullptr)
        return None();
    const Estimated sum = Careful(best->terms, largest, kGoodPair);
    return HasFactor(*best) ? Times(sum, FactorOf(*best)) : sum;
}

} // namespace qx

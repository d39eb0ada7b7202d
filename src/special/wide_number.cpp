#include "special/wide_number.h"

#include "frame/constants.h"
#include "special/logarithms.h"

#include <cmath>
#include <iterator>

namespace qx {

namespace {

constexpr Extended kLogOfTwo = {0x1.62e42fefa39efp-1, 0x1.abc9e3b39803fp-56};
constexpr Extended kLogOfRootTwoPi = {0x1.d67f1c864beb5p-1, -0x1.65b5a1b7ff5dfp-55};
constexpr int kFarExponent = 1 << 30;
constexpr double kStirlingFrom = 30;
constexpr double kLowest = -2000;
constexpr double kLogError = 0x1p-90;

Extended Whole(double x) { return {x, 0.0}; }

// exp(r), |r| <= ln(2) / 2: the series of r / 16, squared four times.
Extended ExpOfRest(Extended r) {
    const Extended t = {r.high / 16, r.low / 16};
    Extended term = t, sum = t; // exp(t) - 1
    for (double k = 2; k < 20; ++k) {
        term = term * t / Whole(k);
        sum = sum + term;
        if (std::fabs(term.high) < 0x1p-112)
            break;
    }
    for (int i = 0; i < 4; ++i) // (1 + e)^2 - 1
        sum = sum * (sum + Whole(2));
    return sum + Whole(1);
}

// ln gamma(x) - ((x - 1/2) ln x - x + ln sqrt(2 pi)), x >= 30: the terms B_2k / (2k (2k - 1) x^(2k-1)).
Extended StirlingSum(Extended x) {
    constexpr double bernoulli[][2] = {{1, 6},
                                       {-1, 30},
                                       {1, 42},
                                       {-1, 30},
                                       {5, 66},
                                       {-691, 2730},
                                       {7, 6},
                                       {-3617, 510},
                                       {43867, 798},
                                       {-174611, 330},
                                       {854513, 138},
                                       {-236364091, 2730},
                                       {8553103, 6},
                                       {-23749461029.0, 870},
                                       {8615841276005.0, 14322}};
    const Extended inverse = Whole(1) / x;
    const Extended square = inverse * inverse;
    Extended power = inverse;
    Extended sum = Whole(0);
    double k = 2;
    for (const auto &b : bernoulli) {
        const Extended term = Whole(b[0]) / Whole(b[1] * k * (k - 1)) * power;
        sum = sum + term;
        if (std::fabs(term.high) < 0x1p-112)
            break;
        power = power * square;
        k += 2;
    }
    return sum;
}

} // namespace

double Wide::rounded() const {
    if (isZero() || !std::isfinite(value.high))
        return value.high;
    const int e = exponent > 3000 ? 3000 : exponent < -3000 ? -3000 : exponent;
    const double sum = value.high + value.low;
    return std::ldexp(sum, e);
}

double Wide::logarithm() const {
    return isZero() ? -kInfinity : exponent + std::log2(std::fabs(value.high));
}

Wide WideOf(Extended value, int exponent) {
    if (value.high == 0 || !std::isfinite(value.high))
        return {value, 0};
    int e = 0;
    const double high = std::frexp(value.high, &e);
    return {{high, std::ldexp(value.low, -e)}, exponent + e};
}

Wide operator*(const Wide &a, const Wide &b) {
    return WideOf(a.value * b.value, a.exponent + b.exponent);
}

Wide operator/(const Wide &a, const Wide &b) {
    return WideOf(a.value / b.value, a.exponent - b.exponent);
}

Wide operator+(const Wide &a, const Wide &b) {
    if (a.isZero() || b.isZero())
        return a.isZero() ? b : a;
    const bool aIsLarger = a.exponent >= b.exponent;
    const Wide &large = aIsLarger ? a : b;
    const Wide &small = aIsLarger ? b : a;
    const int shift = large.exponent - small.exponent;
    if (shift > 220)
        return large;
    const double scale = std::ldexp(1.0, -shift);
    return WideOf(large.value + Extended{small.value.high * scale, small.value.low * scale},
                  large.exponent);
}

Wide WideExp(Extended x) {
    const double turns = std::rint(x.high / kLogOfTwo.high);
    if (!(std::fabs(turns) < kFarExponent / 4))
        return {Whole(turns < 0 ? 0.0 : std::isnan(turns) ? kNaN : kInfinity), 0};
    const Extended rest = x - Whole(turns) * kLogOfTwo;
    return WideOf(ExpOfRest(rest), static_cast<int>(turns));
}

Estimated PowerOf(Extended base, Extended power) {
    if (power.high == 0)
        return {{Whole(0.5), 1}, 0};
    const Extended exponent = power * LogOf(base);
    return {WideExp(exponent), kLogError * (1 + std::fabs(exponent.high))};
}

WideGamma GammaOf(Extended x) {
    const Estimated none = {{Whole(kNaN), 0}, kInfinity};
    if (!(x.high > kLowest && x.high < 1e15))
        return {none, false};
    Wide product = {Whole(0.5), 1};
    for (; x.high < kStirlingFrom; x = x + Whole(1)) {
        if (x.high == 0)
            return {none, true};
        const Extended next = product.value * x;
        const bool isFar = std::fabs(next.high) > 1e100 || std::fabs(next.high) < 1e-100;
        product = isFar ? WideOf(next, product.exponent) : Wide{next, product.exponent};
    }
    const Extended exponent = (x - Whole(0.5)) * LogOf(x) - x + kLogOfRootTwoPi + StirlingSum(x);
    return {{WideExp(exponent) / product, kLogError * (1 + exponent.high)}, false};
}

Estimated GammaQuotientOf(const Extended (&numerators)[2], const Extended (&denominators)[2]) {
    Wide product = {Whole(0.5), 1};
    double error = 0;
    const auto isOne = [](const Extended &x) { return x.high == 1 && x.low == 0; };
    for (const Extended &x : numerators) {
        if (isOne(x))
            continue;
        const WideGamma factor = GammaOf(x);
        error += factor.gamma.error; // infinite at a pole
        product = product * factor.gamma.value;
    }
    for (const Extended &x : denominators) {
        if (isOne(x))
            continue;
        const WideGamma factor = GammaOf(x);
        if (factor.isPole)
            return {{Whole(0), 0}, error};
        error += factor.gamma.error;
        product = product / factor.gamma.value;
    }
    return {product, error};
}

} // namespace qx

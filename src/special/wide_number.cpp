#include "special/wide_number.h"

#include "frame/constants.h"
#include "special/logarithms.h"
#include "special/tables/gamma_pairs.h"

#include <cmath>
#include <cstddef>
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

// 1 / k! from k = 1 on, in twice the precision.
constexpr Extended kInverseFactorials[] = {{0x1.0000000000000p+0, 0},
                                           {0x1.0000000000000p-1, 0},
                                           {0x1.5555555555555p-3, 0x1.5555555555555p-57},
                                           {0x1.5555555555555p-5, 0x1.5555555555555p-59},
                                           {0x1.1111111111111p-7, 0x1.1111111111111p-63},
                                           {0x1.6c16c16c16c17p-10, -0x1.f49f49f49f49fp-65},
                                           {0x1.a01a01a01a01ap-13, 0x1.a01a01a01a01ap-73},
                                           {0x1.a01a01a01a01ap-16, 0x1.a01a01a01a01ap-76},
                                           {0x1.71de3a556c734p-19, -0x1.c154f8ddc6c00p-73},
                                           {0x1.27e4fb7789f5cp-22, 0x1.cbbc05b4fa99ap-76},
                                           {0x1.ae64567f544e4p-26, -0x1.c062e06d1f209p-80},
                                           {0x1.1eed8eff8d898p-29, -0x1.2aec959e14c06p-83},
                                           {0x1.6124613a86d09p-33, 0x1.f28e0cc748ebep-87},
                                           {0x1.93974a8c07c9dp-37, 0x1.05d6f8a2efd1fp-92},
                                           {0x1.ae7f3e733b81fp-41, 0x1.1d8656b0ee8cbp-97}};

// B_2k / (2k (2k - 1)), as many terms as x = 30 needs.
constexpr Extended kStirling[] = {{0x1.5555555555555p-4, 0x1.5555555555555p-58},
                                  {-0x1.6c16c16c16c17p-9, 0x1.f49f49f49f49fp-64},
                                  {0x1.a01a01a01a01ap-11, 0x1.a01a01a01a01ap-71},
                                  {-0x1.3813813813814p-11, 0x1.fb1fb1fb1fb20p-65},
                                  {0x1.b951e2b18ff23p-11, 0x1.5c3a9ce01b952p-65},
                                  {-0x1.f6ab0d9993c7dp-10, 0x1.f82553c999b0ep-64},
                                  {0x1.a41a41a41a41ap-8, 0x1.0690690690690p-62},
                                  {-0x1.e4286cb0f5398p-6, 0x1.1efcdab896745p-61},
                                  {0x1.6fe96381e0680p-3, -0x1.79e2405a71f88p-61},
                                  {-0x1.6476701181f3ap+0, 0x1.24246319da678p-56},
                                  {0x1.ace44322ce006p+3, -0x1.62c2b1bbcdd32p-51},
                                  {-0x1.39b2525cccc1bp+7, 0x1.52604768a30fcp-47},
                                  {0x1.12234e81b4e82p+11, -0x1.2c5f92c5f92c6p-43},
                                  {-0x1.1a198ae1c4ab8p+15, 0x1.4c012227b696ep-41},
                                  {0x1.51a2089a6e11ap+19, 0x1.c219ee4fdc447p-36}};

// c[0] + c[1] x + ..., where the terms from `pairs` on, which matter only below the last bit of
// c[0], are summed in double precision.
template <std::size_t N>
Extended Sum(const Extended (&c)[N], Extended x, std::size_t pairs) {
    double tail = 0;
    for (std::size_t k = N; k-- > pairs;)
        tail = c[k].high + x.high * tail;
    Extended sum = Whole(tail);
    for (std::size_t k = pairs; k-- > 0;)
        sum = c[k] + x * sum;
    return sum;
}

// exp(r), |r| <= ln(2) / 2: the series of r / 16, squared four times.
Extended ExpOfRest(Extended r) {
    const Extended t = {r.high / 16, r.low / 16};
    Extended sum = t * Sum(kInverseFactorials, t, 8); // exp(t) - 1
    for (int i = 0; i < 4; ++i)                       // (1 + e)^2 - 1
        sum = sum * (sum + Whole(2));
    return sum + Whole(1);
}

// ln gamma(x) - ((x - 1/2) ln x - x + ln sqrt(2 pi)), x >= 30.
Extended StirlingSum(Extended x) {
    const Extended inverse = Whole(1) / x;
    return inverse * Sum(kStirling, inverse * inverse, 6);
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

namespace {

// 1 / gamma(x), 1 <= x <= 2.
Extended ReciprocalGammaOf(Extended x) {
    const Extended h = x - Whole(1.5);
    constexpr std::size_t pairs = std::size(table::inverseGamma);
    double tail = 0;
    for (std::size_t k = std::size(table::inverseGammaRest); k-- > 0;)
        tail = table::inverseGammaRest[k] + h.high * tail;
    Extended sum = Whole(tail);
    for (std::size_t k = pairs; k-- > 0;)
        sum = table::inverseGamma[k] + h * sum;
    return sum;
}

// first (first + 1) ... (first + count - 1).
Wide Rising(Extended first, int count) {
    Wide product = {Whole(0.5), 1};
    for (int k = 0; k < count; ++k, first = first + Whole(1)) {
        const Extended next = product.value * first;
        const bool isFar = std::fabs(next.high) > 1e100 || std::fabs(next.high) < 1e-100;
        product = isFar ? WideOf(next, product.exponent) : Wide{next, product.exponent};
    }
    return WideOf(product.value, product.exponent);
}

} // namespace

WideGamma GammaOf(Extended x) {
    if (!(x.high > kLowest && x.high < 1e15))
        return {{{Whole(kNaN), 0}, kInfinity}, false};
    if (x.high >= kStirlingFrom) {
        const Extended exponent =
            (x - Whole(0.5)) * LogOf(x) - x + kLogOfRootTwoPi + StirlingSum(x);
        return {{WideExp(exponent), kLogError * (1 + exponent.high)}, false};
    }
    if (x.high <= 0 && x.low == 0 && std::floor(x.high) == x.high)
        return {{{Whole(kNaN), 0}, kInfinity}, true};
    const int steps = static_cast<int>(std::floor(x.high)) - 1;
    const Extended base = x - Whole(steps); // in [1, 2]
    const Wide gamma = WideOf(Whole(1) / ReciprocalGammaOf(base));
    if (steps >= 0)
        return {{gamma * Rising(base, steps), kLogError}, false};
    return {{gamma / Rising(x, -steps), kLogError}, false};
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

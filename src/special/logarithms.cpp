#include "special/logarithms.h"

#include "frame/constants.h"
#include "special/rational.h"

#include <cmath>

namespace qx {

namespace {

// (atanh(z) / z - 1) / z^2 = 1/3 + z^2/5 + z^4/7 + ..., |z| <= 0.18. The leading terms are in twice
// the precision; the others, in double precision, have an error of 2^-53 of the first of them.
Extended AtanhSeries(Extended z) {
    static constexpr Extended inverses[] = {
        {0x1.5555555555555p-2, 0x1.5555555555555p-56},  // 1/3
        {0x1.999999999999ap-3, -0x1.999999999999ap-57}, // 1/5
        {0x1.2492492492492p-3, 0x1.2492492492492p-57},  // 1/7
        {0x1.c71c71c71c71cp-4, 0x1.c71c71c71c71cp-58},  // 1/9
        {0x1.745d1745d1746p-4, -0x1.745d1745d1746p-59}, // 1/11
        {0x1.3b13b13b13b14p-4, -0x1.3b13b13b13b14p-58}, // 1/13
        {0x1.1111111111111p-4, 0x1.1111111111111p-60},  // 1/15
        {0x1.e1e1e1e1e1e1ep-5, 0x1.e1e1e1e1e1e1ep-61},  // 1/17
    };
    constexpr int pairs = 8;
    constexpr int terms = 22;
    const Extended square = z * z;
    double tail = 0.0;
    for (int k = terms; k > pairs; --k)
        tail = 1.0 / (2 * k + 1) + square.high * tail;
    Extended sum = {tail, 0.0};
    for (int k = pairs; k >= 1; --k)
        sum = inverses[k - 1] + square * sum;
    return sum;
}

constexpr Extended kLnTwo = {0x1.62e42fefa39efp-1, 0x1.abc9e3b39803fp-56};

} // namespace

Extended LogOf(Extended x) {
    int exponent;
    const double mantissa = std::frexp(x.high, &exponent);
    if (mantissa < kRootHalf)
        --exponent;
    const Extended m = {std::ldexp(x.high, -exponent), std::ldexp(x.low, -exponent)};
    const Extended one = {1.0, 0.0};
    const Extended z = (m - one) / (m + one);
    const Extended twice = {2 * z.high, 2 * z.low};
    const Extended log = twice + twice * (z * z) * AtanhSeries(z);
    const Extended turns = {static_cast<double>(exponent), 0.0};
    return turns * kLnTwo + log;
}

// With z = e / (2 + e) the logarithm is 2 atanh(z), and e - 2 z = e z.
Extended ExcessOfLog(Extended e, Extended onePlusE) {
    if (!(e.high > kRootHalf - 1 && e.high < kRootTwo - 1))
        return e - LogOf(onePlusE);
    const Extended z = e / (Extended{2.0, 0.0} + e);
    const Extended cube = z * (z * z);
    return e * z - Extended{2 * cube.high, 2 * cube.low} * AtanhSeries(z);
}

double ExpOf(Extended x) {
    const double power = std::exp(x.high);
    return std::isfinite(power) ? power + power * x.low : power;
}

double StirlingCorrection(double x) {
    constexpr double c[] = {1.0 / 12,   -1.0 / 360,      1.0 / 1260, -1.0 / 1680,
                            1.0 / 1188, -691.0 / 360360, 1.0 / 156,  -3617.0 / 122400};
    return Horner(c, 1 / (x * x)) / x;
}

} // namespace qx

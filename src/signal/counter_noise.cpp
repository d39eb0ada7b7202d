#include "signal/counter_noise.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr int32_t atOnce = 256;
constexpr double kHalfLnTwoPi = 0x1.d67f1c864beb5p-1;

// A number in (0, 1), exact, from the upper 52 bits.
double Uniform(uint64_t bits) { return (static_cast<double>(bits >> 12) + 0.5) * 0x1p-52; }

// Generates the blocks of attempt 0 for all values, in pieces; `draw` computes x[i] from the block
// and i.
template <class Draw>
void ForEachBlock(RealVector x, const NoisePlace &place, const Draw &draw) {
    uint64_t a[atOnce], b[atOnce];
    const int32_t n = static_cast<int32_t>(x.size());
    for (int32_t start = 0; start < n; start += std::min(atOnce, n - start)) {
        const int32_t count = std::min(atOnce, n - start);
        NoisePlace piece = place;
        piece.position += static_cast<uint64_t>(start);
        PhiloxBlocks(piece, 0, count, a, b);
        for (int32_t i = 0; i < count; ++i)
            x[start + i] = draw(NoiseBlock{a[i], b[i]}, static_cast<uint64_t>(start + i));
    }
}

// attempt(block, x) returns whether it has accepted.
template <class Attempt>
double UntilAccepted(NoiseBlock block, const NoisePlace &place, uint64_t i,
                     const Attempt &attempt) {
    double x = 0.0;
    for (uint32_t next = 1; !attempt(block, x); ++next)
        block = PhiloxBlock(place, i, next);
    return x;
}

// ln n! minus Stirling's formula (n + 1/2) ln n - n + ln(2 pi) / 2, for n >= 1.
double StirlingRest(double n) {
    constexpr double tabulated[16] = {0.0,
                                      0.08106146679532726,
                                      0.0413406959554093,
                                      0.02767792568499834,
                                      0.020790672103765093,
                                      0.016644691189821193,
                                      0.013876128823070748,
                                      0.01189670994589177,
                                      0.010411265261972096,
                                      0.009255462182712733,
                                      0.00833056343336287,
                                      0.007573675487951841,
                                      0.00694284010720953,
                                      0.006408994188004207,
                                      0.0059513701127588475,
                                      0.005554733551962801};
    if (n < 16.0)
        return tabulated[static_cast<int>(n)];
    const double square = 1.0 / (n * n);
    return (1.0 / 12 -
            (1.0 / 360 - (1.0 / 1260 - (1.0 / 1680 - 1.0 / 1188 * square) * square) * square) *
                square) /
           n;
}

// x ln(x / mean) + mean - x, without cancellation where x is near the mean.
double Deviance(double x, double mean) {
    const double gap = x - mean;
    if (std::fabs(gap) >= 0.1 * (x + mean))
        return x * std::log(x / mean) - gap;
    const double v = gap / (x + mean);
    double sum = gap * v, power = 2.0 * x * v;
    for (int j = 3;; j += 2) {
        power *= v * v;
        const double next = sum + power / j;
        if (next == sum)
            return sum;
        sum = next;
    }
}

// The logarithm of the probability of k events, k >= 0.
double LnPoisson(double k, double mean) {
    if (k == 0.0)
        return -mean;
    return -StirlingRest(k) - Deviance(k, mean) - kHalfLnTwoPi - 0.5 * std::log(k);
}

struct BinomialLaw {
    double trials, p, q; // q = 1 - p
    double ln(double k) const {
        if (k == 0.0)
            return trials * std::log1p(-p);
        if (k == trials)
            return trials * std::log(p);
        const double rest = trials - k;
        return StirlingRest(trials) - StirlingRest(k) - StirlingRest(rest) -
               Deviance(k, trials * p) - Deviance(rest, trials * q) - kHalfLnTwoPi +
               0.5 * std::log(trials / k / rest);
    }
};

// The first k from 0 on at which the sum of probabilities exceeds u, where probability(0) = first
// and following(k) = probability(k + 1) / probability(k).
template <class Following>
double BySum(double u, double first, double most, const Following &following) {
    double k = 0.0, probability = first;
    while (u >= probability && k < most && probability > 0.0) {
        u -= probability;
        probability *= following(k);
        k += 1.0;
    }
    return k;
}

// Hörmann's hat: k = floor((2 a / (1/2 - |u|) + b) u + c), with c in two parts, of which the whole
// part may be near 2^53.
struct Hat {
    double a, b, whole, part, quick;

    double at(double u, double middle) const {
        return whole + std::floor((2.0 * a / middle + b) * u + part);
    }
    bool acceptsAtOnce(double middle, double v) const { return middle >= 0.07 && v <= quick; }
    // The density of the hat at u, up to a factor.
    double slope(double middle) const { return a / (middle * middle) + b; }
};

} // namespace

void CounterPoisson(RealVector x, double mean, const NoisePlace &place) {
    constexpr double bySumBelow = 10.0;
    if (mean < bySumBelow) {
        const double first = std::exp(-mean);
        ForEachBlock(x, place, [&](const NoiseBlock &block, uint64_t) {
            return BySum(Uniform(block.a), first, kInfinity,
                         [&](double k) { return mean / (k + 1.0); });
        });
        return;
    }
    const double root = std::sqrt(mean), whole = std::floor(mean);
    const double b = 0.931 + 2.53 * root, a = -0.059 + 0.02483 * b;
    const Hat hat = {a, b, whole, mean - whole + 0.43, 0.9277 - 3.6224 / (b - 2.0)};
    const double scale = 1.1239 + 1.1328 / (b - 3.4);
    const auto attempt = [&](const NoiseBlock &block, double &k) {
        const double u = CentredUniform(block.a), v = Uniform(block.b);
        const double middle = 0.5 - std::fabs(u);
        k = hat.at(u, middle);
        if (hat.acceptsAtOnce(middle, v))
            return true;
        if (k < 0.0 || (middle < 0.013 && v > middle))
            return false;
        return std::log(v * scale / hat.slope(middle)) <= LnPoisson(k, mean);
    };
    ForEachBlock(x, place, [&](const NoiseBlock &block, uint64_t i) {
        return UntilAccepted(block, place, i, attempt);
    });
}

void CounterBinomial(RealVector x, double trials, double p, const NoisePlace &place) {
    constexpr double bySumBelow = 10.0;
    const bool isTurned = p > 0.5;
    const BinomialLaw law = {trials, isTurned ? 1.0 - p : p, isTurned ? p : 1.0 - p};
    const double mean = trials * law.p;
    const auto turned = [&](double k) { return isTurned ? trials - k : k; };
    if (mean < bySumBelow) {
        const double none = std::exp(trials * std::log1p(-law.p)), odds = law.p / law.q;
        ForEachBlock(x, place, [&](const NoiseBlock &block, uint64_t) {
            return turned(BySum(Uniform(block.a), none, trials,
                                [&](double k) { return (trials - k) / (k + 1.0) * odds; }));
        });
        return;
    }
    const double deviation = std::sqrt(mean * law.q), whole = std::floor(mean);
    const double b = 1.15 + 2.53 * deviation, a = -0.0873 + 0.0248 * b + 0.01 * law.p;
    const Hat hat = {a, b, whole, mean - whole + 0.5, 0.92 - 4.2 / b};
    const double scale = (2.83 + 5.1 / b) * deviation;
    const double lnMode = law.ln(std::floor(std::min((trials + 1.0) * law.p, trials)));
    const auto attempt = [&](const NoiseBlock &block, double &k) {
        const double u = CentredUniform(block.a), v = Uniform(block.b);
        const double middle = 0.5 - std::fabs(u);
        k = hat.at(u, middle);
        if (k < 0.0 || k > trials)
            return false;
        return hat.acceptsAtOnce(middle, v) ||
               std::log(v * scale / hat.slope(middle)) <= law.ln(k) - lnMode;
    };
    ForEachBlock(x, place, [&](const NoiseBlock &block, uint64_t i) {
        return turned(UntilAccepted(block, place, i, attempt));
    });
}

namespace {

// Marsaglia and Tsang: d v with v = (1 + c z)^3, z normal, d = shape - 1/3 and c = 1 / sqrt(9 d).
struct GammaAttempt {
    double d, c;
    explicit GammaAttempt(double shape) : d(shape - 1.0 / 3.0), c(1.0 / std::sqrt(9.0 * d)) {}

    bool operator()(double z, double u, double &x) const {
        const double base = 1.0 + c * z;
        if (!(base > 0.0))
            return false;
        const double v = base * base * base, square = z * z;
        x = d * v;
        return u < 1.0 - 0.0331 * (square * square) ||
               std::log(u) < 0.5 * square + d * (1.0 - v + std::log(v));
    }
};

} // namespace

void CounterGamma(RealVector x, double shape, const NoisePlace &place) {
    constexpr uint32_t powerAttempt = 0xffffffff; // of the uniform number for a shape below 1
    const bool isBelow1 = shape < 1.0;
    const GammaAttempt attempt(isBelow1 ? shape + 1.0 : shape);
    uint64_t a[atOnce], b[atOnce];
    double z[atOnce];
    const int32_t n = static_cast<int32_t>(x.size());
    for (int32_t start = 0; start < n; start += std::min(atOnce, n - start)) {
        const int32_t count = std::min(atOnce, n - start);
        const int32_t filled = (count + 3) / 4 * 4;
        NoisePlace piece = place;
        piece.position += static_cast<uint64_t>(start);
        PhiloxBlocks(piece, 0, filled, a, b);
        for (int32_t i = 0; i < filled; ++i)
            z[i] = CentredUniform(a[i]);
        NormalQuantiles(z, filled, z);
        for (int32_t i = 0; i < count; ++i) {
            const auto offset = static_cast<uint64_t>(i);
            double value = 0.0;
            bool isAccepted = attempt(z[i], Uniform(b[i]), value);
            for (uint32_t next = 1; !isAccepted; ++next) {
                const NoiseBlock block = PhiloxBlock(piece, offset, next);
                double again[4] = {CentredUniform(block.a)};
                NormalQuantiles(again, 4, again);
                isAccepted = attempt(again[0], Uniform(block.b), value);
            }
            x[start + i] = value;
        }
        if (isBelow1) {
            PhiloxBlocks(piece, powerAttempt, filled, a, b);
            for (int32_t i = 0; i < count; ++i)
                x[start + i] *= std::pow(Uniform(a[i]), 1.0 / shape);
        }
    }
}

uint32_t CounterIndex(uint64_t bits, uint32_t count, const NoisePlace &place, uint64_t offset) {
    for (uint32_t next = 1;; ++next) {
        const uint64_t lower = (bits & 0xffffffff) * count;
        const uint64_t upper = (bits >> 32) * count + (lower >> 32);
        const uint64_t rest = upper << 32 | (lower & 0xffffffff);
        // Below 2^64 mod count some numbers would occur once too often.
        if (rest >= count || rest >= (0 - uint64_t{count}) % count)
            return static_cast<uint32_t>(upper >> 32);
        bits = PhiloxBlock(place, offset, next).a;
    }
}

} // namespace qx

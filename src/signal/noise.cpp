#include "signal/noise.h"

#include "fft/plan.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "signal/random.h"
#include "special/gamma.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

template <ElementType E>
int32_t Count(VectorView<E> x) {
    return static_cast<int32_t>(x.size());
}

// A direction by a point in the unit disc: tan(angle) = b / a.
struct Direction {
    double a, b;
};
Direction DirectionInDisc(RandomStream &stream) {
    Direction direction;
    do {
        direction.a = 2.0 * stream.next() - 1.0;
        direction.b = 2.0 * stream.next() - 1.0;
    } while (direction.a * direction.a + direction.b * direction.b > 1.0);
    return direction;
}

} // namespace

void UniformNoise(RealVector x, double amplitude, RandomState &state) {
    const int32_t n = Count(x);
    constexpr int32_t inCache = 2048;
    for (int32_t start = 0; start < n; start += std::min(inCache, n - start)) {
        const int32_t count = std::min(inCache, n - start);
        RandomUniforms(state, &x[start], count);
        for (int32_t i = start; i < start + count; ++i)
            x[i] = (x[i] - 0.5) * (amplitude + amplitude);
    }
}

namespace {

// The coordinates of accepted points in the disc.
constexpr int32_t pairsAtOnce = 256;
struct PolarPoints {
    double a[pairsAtOnce], b[pairsAtOnce], r[pairsAtOnce];
    int32_t count;
};

// Takes pairs of numbers until `wanted` points have been accepted or the block ends. Each point is
// stored after the last accepted one and is overwritten by the next if it is not accepted, which
// avoids an unpredictable branch.
void TakePoints(RandomStream &stream, int32_t wanted, PolarPoints &points) {
    const int32_t pairs = stream.available(2) / 2;
    const double *u = stream.numbers();
    int32_t used = 0;
    int32_t accepted = 0;
    for (; used < pairs && accepted < wanted; ++used) {
        const double a = 2.0 * u[2 * used] - 1.0;
        const double b = 2.0 * u[2 * used + 1] - 1.0;
        const double r = b * b + a * a;
        points.a[accepted] = a;
        points.b[accepted] = b;
        points.r[accepted] = r;
        accepted += static_cast<int32_t>(r < 1.0) & static_cast<int32_t>(r != 0.0);
    }
    stream.use(2 * used);
    points.count = accepted;
}

// r becomes the factor sqrt(-2 ln(r) / r).
void FactorsOf(PolarPoints &points) {
    for (int32_t i = 0; i < points.count; ++i)
        points.r[i] = -2.0 * std::log(points.r[i]) / points.r[i];
    for (int32_t i = 0; i < points.count; ++i)
        points.r[i] = std::sqrt(points.r[i]);
}

} // namespace

void GaussianNoise(RealVector x, double sigma, RandomState &state, GaussSpare &spare) {
    const int32_t n = Count(x);
    int32_t i = 0;
    if (spare.hasSpare != 0) {
        x[i++] = spare.spare * sigma;
        spare.hasSpare = 0;
    }
    if (RandomIsStill(state)) { // no point would ever be in the disc
        Fill(&x[i], n - i, 0.0);
        return;
    }
    // A point is accepted with probability pi / 4.
    RandomStream stream(state, int64_t{n - i} * 4 / 3);
    PolarPoints points;
    while (i < n) {
        TakePoints(stream, std::min(pairsAtOnce, (n - i - 1) / 2 + 1), points);
        FactorsOf(points);
        const int32_t whole = std::min(points.count, (n - i) / 2);
        for (int32_t k = 0; k < whole; ++k, i += 2) {
            x[i] = points.b[k] * points.r[k] * sigma;
            x[i + 1] = points.a[k] * points.r[k] * sigma;
        }
        if (points.count > 0)
            spare.spare = points.a[points.count - 1] * points.r[points.count - 1];
        if (points.count > whole) {
            x[i++] = points.b[whole] * points.r[whole] * sigma;
            spare.hasSpare = 1;
        }
    }
}

ErrorCode PeriodicNoise(RealVector x, double amplitude, RandomState &state) {
    const int32_t n = Count(x);
    // In half-complex form, Re X[k] at k and Im X[k] at n - k.
    Scratch<ElementType::DBL> spectrum;
    if (const ErrorCode failed = spectrum.allocate(n))
        return failed;
    const PlanReference plan(n);
    if (!plan)
        return ErrOutOfMemory;
    Fill(spectrum.data(), n, 0.0);
    const double magnitude = n * amplitude * 0.5;
    for (int32_t k = 1; k <= (n - 1) / 2; ++k) {
        const double phase = RandomInt15(state); // kept: an integer as an angle in radians
        spectrum[k] = magnitude * std::cos(phase);
        spectrum[n - k] = magnitude * std::sin(phase);
    }
    return FFTRealInverse(plan.get(), spectrum.data(), x.data(), 1, 1, n);
}

namespace {

// -ln of a product of `order` uniform numbers: the sum of `order` exponentially distributed
// numbers.
double SumOfExponentials(RandomStream &stream, int32_t order) {
    double product = 1.0;
    for (int32_t j = 0; j < order; ++j)
        product *= stream.next();
    return -std::log(product);
}

// Rejection from a Lorentzian around the most probable value, `peak`.
double GammaByRejection(RandomStream &stream, double peak) {
    const double width = std::sqrt(1.0 + 2.0 * peak);
    while (true) {
        const Direction direction = DirectionInDisc(stream);
        const double y = direction.b / direction.a;
        const double v = y * width + peak;
        if (!(v > 0.0))
            continue;
        const double ratio = (1.0 + y * y) * std::exp(peak * std::log(v / peak) - width * y);
        if (!(ratio < stream.next()))
            return v;
    }
}

} // namespace

void GammaNoise(RealVector x, int32_t order, RandomState &state) {
    const int32_t n = Count(x);
    constexpr int32_t byRejectionFrom = 6;
    if (order < byRejectionFrom) {
        RandomStream stream(state, int64_t{n} * order);
        for (int32_t i = 0; i < n; ++i)
            x[i] = SumOfExponentials(stream, order);
        return;
    }
    if (RandomIsStill(state)) {
        Fill(x.data(), n, 0.0);
        return;
    }
    RandomStream stream(state, int64_t{n} * 6);
    for (int32_t i = 0; i < n; ++i)
        x[i] = GammaByRejection(stream, order - 1.0);
}

namespace {

double PoissonByCounting(RandomStream &stream, double limit) {
    double product = 1.0;
    double events = -1.0;
    do {
        events += 1.0;
        product *= stream.next();
    } while (product > limit);
    return events;
}

struct PoissonRejection {
    explicit PoissonRejection(double mean_)
        : mean(mean_), width(std::sqrt(2.0 * mean)), lnMean(std::log(mean)),
          lnPeak(mean * lnMean - LnGammaFunction(mean + 1.0)) {}

    double operator()(RandomStream &stream) const {
        while (true) {
            const double y = std::tan(kPi * stream.next());
            double v = width * y + mean;
            if (v < 0.0)
                continue;
            v = std::floor(v);
            const double ratio =
                0.9 * (1.0 + y * y) * std::exp(v * lnMean - LnGammaFunction(v + 1.0) - lnPeak);
            if (!(stream.next() > ratio))
                return v;
        }
    }

    double mean, width, lnMean, lnPeak;
};

} // namespace

void PoissonNoise(RealVector x, double mean, RandomState &state) {
    const int32_t n = Count(x);
    constexpr double byRejectionFrom = 12.0;
    if (mean < byRejectionFrom) {
        RandomStream stream(state, int64_t{n} * (static_cast<int32_t>(mean) + 1));
        const double limit = std::exp(-mean);
        for (int32_t i = 0; i < n; ++i)
            x[i] = PoissonByCounting(stream, limit);
        return;
    }
    const PoissonRejection draw(mean);
    RandomStream stream(state, int64_t{n} * 4);
    for (int32_t i = 0; i < n; ++i)
        x[i] = draw(stream);
}

namespace {

int32_t BinomialByTrials(RandomStream &stream, int32_t trials, double q) {
    int32_t successes = 0;
    for (int32_t trial = 0; trial < trials; ++trial)
        successes += static_cast<int32_t>(stream.next() < q);
    return successes;
}

int32_t BinomialByCounting(RandomStream &stream, int32_t trials, double limit) {
    double product = 1.0;
    int32_t successes = 0;
    for (; successes <= trials; ++successes) {
        product *= stream.next();
        if (product < limit)
            break;
    }
    return std::min(successes, trials);
}

// A cache that the caller has changed since the last call could lead to more successes than trials,
// or to a rejection that never accepts; values that are visibly wrong are recomputed.
void Refresh(BinomialCache &cache, int32_t trials, double q) {
    if (trials != cache.nOld || cache.enOld != trials) {
        cache.enOld = trials;
        cache.lnGammaEn1 = LnGammaFunction(trials + 1.0);
        cache.nOld = trials;
    }
    if (q != cache.pOld || cache.pc != 1.0 - q) {
        cache.pc = 1.0 - q;
        cache.logP = std::log(q);
        cache.logPc = std::log(cache.pc);
        cache.pOld = q;
    }
}

// The caller's cache influences how often numbers are drawn, but the result is always from 0 to
// trials.
double BinomialByRejection(RandomStream &stream, int32_t trials, double mean,
                           const BinomialCache &cache) {
    const double width = std::sqrt(2.0 * mean * cache.pc);
    while (true) {
        const double y = std::tan(kPi * stream.next());
        double v = width * y + mean;
        if (v < 0.0 || !(v < trials + 1.0))
            continue;
        v = std::floor(v);
        const double ratio = 1.2 * width * (1.0 + y * y) *
                             std::exp(cache.lnGammaEn1 - LnGammaFunction(v + 1.0) -
                                      LnGammaFunction(trials - v + 1.0) + v * cache.logP +
                                      (trials - v) * cache.logPc);
        if (!(stream.next() > ratio))
            return v;
    }
}

} // namespace

void BinomialNoise(VectorView<ElementType::U32> x, int32_t trials, double p, RandomState &state,
                   BinomialCache &cache) {
    const int32_t n = Count(x);
    constexpr int32_t carriedOutBelow = 25;
    const double q = p > 0.5 ? 1.0 - p : p;
    const double mean = trials * q;
    const bool byTrials = trials < carriedOutBelow;
    const bool byCounting = !byTrials && mean < 1.0;
    const double limit = std::exp(-mean);
    if (!byTrials && !byCounting)
        Refresh(cache, trials, q);
    RandomStream stream(state, int64_t{n} * (byTrials ? trials : 4));
    for (int32_t i = 0; i < n; ++i) {
        double successes;
        if (byTrials)
            successes = BinomialByTrials(stream, trials, q);
        else if (byCounting)
            successes = BinomialByCounting(stream, trials, limit);
        else
            successes = BinomialByRejection(stream, trials, mean, cache);
        x[i] = static_cast<uint32_t>(q != p ? trials - successes : successes);
    }
}

} // namespace qx

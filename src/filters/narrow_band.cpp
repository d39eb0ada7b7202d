#include "filters/narrow_band.h"

#include "filters/remez.h"
#include "spectra/convolution.h"
#include "spectra/sliding_sums.h"

#include <cmath>

namespace qx {

namespace {

// The normalised problem: a lowpass with pass band up to f1 and stop band from f2, or a bandpass
// with these distances from its centre.
struct LowpassProblem {
    double fs, f1, f2;
    double dp, ds; // ripples of the pass and stop bands
    int32_t kind;
    bool isBand() const { return kind == NarrowBandpass || kind == NarrowBandstop; }
    bool isComplement() const { return kind >= NarrowBandstop; }
    // Each of two cascaded filters may have half the ripple.
    double target() const { return dp / 2.0; }
    double stopWeight() const { return target() / ds; }
};

LowpassProblem Normalised(const NarrowFIRGoal &goal) {
    const double ds = std::pow(10.0, -goal.stopAttenuation / 20.0), dp = goal.passRipple;
    const double fs = goal.fs, half = fs / 2.0;
    switch (goal.type) {
    case NarrowLowpass:
        if (goal.fPass > fs / 4.0)
            return {fs, half - goal.fStop, half - goal.fPass, ds, dp, WideLowpass};
        return {fs, goal.fPass, goal.fStop, dp, ds, NarrowLowpass};
    case NarrowHighpass: {
        const double pass = half - goal.fPass, stop = half - goal.fStop;
        if (pass > fs / 4.0)
            return {fs, half - stop, half - pass, ds, dp, WideHighpass};
        return {fs, pass, stop, dp, ds, NarrowHighpass};
    }
    case NarrowBandpass:
        return {fs, goal.fPass / 2.0, goal.fStop / 2.0, dp, ds, NarrowBandpass};
    default:
        return {fs, goal.fStop / 2.0, goal.fPass / 2.0, ds, dp, NarrowBandstop};
    }
}

bool IsPossible(const NarrowFIRGoal &goal, const LowpassProblem &problem) {
    const bool isOrdered =
        problem.f1 > 0.0 && problem.f2 > problem.f1 && problem.fs / 2.0 > problem.f2;
    return isOrdered && goal.type >= NarrowLowpass && goal.type <= NarrowBandstop &&
           problem.ds > 0.0 && problem.dp > 0.0;
}

// Truncates a length. Lengths beyond any design are limited to one that no design accepts; NaN
// becomes -1.
int32_t Truncated(double length) {
    constexpr double beyond = 1 << 29;
    if (std::isnan(length))
        return -1;
    return static_cast<int32_t>(length > beyond ? beyond : length < -beyond ? -beyond : length);
}

// How a problem is split into two filters.
struct Stages {
    int32_t M = 1, modelCount = 0, interpolatorCount = 0;
    // For bands: the frequency of the centre's image, the index of the centre among the M images,
    // counted in half turns of the frequency axis, and the gap between the images.
    double image = 0.0, position = 1.0, width = 0.0;
    int64_t sum() const { return int64_t{modelCount} + interpolatorCount; }
};

// The length of an equiripple filter times its transition width, in cycles per sample, times 14.6.
double LengthFactor(double a, double b) { return -20.0 * std::log10(std::sqrt(a * b)) - 13.0; }

Stages EstimateLowpassStages(const LowpassProblem &problem) {
    const double fs = problem.fs, f1 = problem.f1, f2 = problem.f2;
    Stages stages;
    stages.M = Truncated(std::floor(fs / (std::sqrt((f2 - f1) * fs) + f1 + f2) + 0.5));
    while (stages.M > 1 && stages.M * f2 >= fs / 2.0)
        --stages.M;
    const double M = stages.M;
    const double K = LengthFactor(0.5 * problem.dp, problem.ds) / 14.6;
    stages.modelCount = Truncated(K / ((M * f2 - M * f1) / fs));
    stages.interpolatorCount = stages.M > 1 ? Truncated(K / ((fs / M - f2 - f1) / fs)) : 0;
    const double oneK = LengthFactor(problem.dp, problem.ds) / 14.6;
    const int32_t one = Truncated(oneK / ((f2 - f1) / fs));
    if (one <= stages.sum())
        stages = {1, one, 0};
    return stages;
}

// The image of the centre if the model is stretched by m. Returns false if the images of the band
// overlap.
bool FindImage(const LowpassProblem &problem, double center, int32_t m, Stages &stages) {
    const double fs = problem.fs, reach = m * problem.f2;
    const double whole = std::floor(m * center / fs);
    stages.M = m;
    stages.image = std::fmod(m * center, fs);
    stages.position = 2.0 * whole + 1.0;
    if (stages.image > fs / 2.0) {
        stages.image = fs - stages.image;
        stages.position += 1.0;
    }
    return stages.image - reach > 0.0 && stages.image + reach < fs / 2.0;
}

// The distance from the image to the next one, in the frequencies of the model.
double GapOfImages(double fs, const Stages &stages) {
    const double below = 2.0 * stages.image, above = fs - 2.0 * stages.image;
    if (stages.position == 1.0)
        return above;
    if (stages.position == stages.M)
        return stages.M % 2 == 0 ? above : below;
    return stages.image > fs / 4.0 ? above : below;
}

Stages EstimateBandStages(const LowpassProblem &problem, double center) {
    const double fs = problem.fs, f1 = problem.f1, f2 = problem.f2;
    const double K = LengthFactor(0.5 * problem.dp, problem.ds);
    const double oneK = LengthFactor(problem.dp, problem.ds);
    Stages best;
    best.modelCount = Truncated(oneK / (14.6 * (f2 - f1) / fs));
    best.image = center;
    best.width = f2 - f1;
    // If this is not positive, no length is positive. If it is, an interpolator has more than
    // K m / 14.6 taps, so the search ends when these alone are too many.
    if (oneK <= 0.0)
        return best;
    constexpr double tooMany = 8200.0; // for any two filters
    const int32_t last = Truncated(0.25 * fs / f2);
    for (int32_t m = 2; m <= last && K * m / 14.6 <= tooMany; ++m) {
        Stages stages;
        if (!FindImage(problem, center, m, stages))
            continue;
        stages.modelCount = Truncated(K / (m * 14.6 * (f2 - f1) / fs));
        stages.width = GapOfImages(fs, stages) / m - f2 - f1;
        stages.interpolatorCount = Truncated(K / (14.6 * stages.width / fs));
        if (stages.sum() < best.sum())
            best = stages;
    }
    return best;
}

struct BandTable {
    int32_t count;
    double gains[3], weights[3], edges[6];
    RemezBands of(double fs) const {
        return {{gains, count}, {weights, count}, {edges, 2 * count}, fs, RemezMultiband};
    }
};

BandTable ModelBands(const LowpassProblem &problem, const Stages &stages) {
    const double M = stages.M, f1 = problem.f1, f2 = problem.f2, a = stages.image;
    const double half = problem.fs / 2.0, r = problem.stopWeight();
    if (!problem.isBand())
        return {2, {1.0, 0.0}, {1.0, r}, {0.0, f1 * M, f2 * M, half}};
    return {3,
            {0.0, 1.0, 0.0},
            {r, 1.0, r},
            {0.0, a - f2 * M, a - f1 * M, a + f1 * M, a + f2 * M, half}};
}

// The bands of the filter that passes the wanted image and stops its neighbours.
BandTable InterpolatorBands(const LowpassProblem &problem, const Stages &stages, double center) {
    const double f1 = problem.f1, half = problem.fs / 2.0, r = problem.stopWeight();
    if (!problem.isBand())
        return {2, {1.0, 0.0}, {1.0, r}, {0.0, f1, problem.fs / stages.M - problem.f2, half}};
    const double low = center - f1, high = center + f1, w = stages.width;
    if (stages.position == 1.0)
        return {2, {1.0, 0.0}, {1.0, r}, {0.0, high, high + w, half}};
    if (stages.position == stages.M)
        return {2, {0.0, 1.0}, {r, 1.0}, {0.0, low - w, low, half}};
    return {3, {0.0, 1.0, 0.0}, {r, 1.0, r}, {0.0, low - w, low, high, high + w, half}};
}

// The first filter whose ripple is not above the target, for increasing lengths from the estimate
// on.
ErrorCode DesignStage(const LowpassProblem &problem, const BandTable &bands, int32_t &count,
                      Scratch<ElementType::DBL> &taps) {
    // Only a filter of odd length has its middle on a tap and can pass the Nyquist frequency.
    const auto shaped = [&](int32_t n) { return problem.kind == NarrowLowpass ? n : n | 1; };
    for (int32_t n = shaped(count);; n = shaped(Truncated(std::ceil(1.05 * n)))) {
        if (const ErrorCode failed = taps.allocate(n))
            return failed;
        double ripple = 0.0;
        if (const ErrorCode failed =
                RemezDesign(bands.of(problem.fs), {taps.data(), n}, &ripple, 0))
            return failed;
        count = n;
        if (!(ripple > problem.target()))
            return 0;
    }
}

// Shifts the response by half the sampling rate: every other tap changes sign, but not the middle
// one.
void FlipAlternate(DBL *taps, int32_t n) {
    const int32_t middle = (n - 1) / 2;
    const int32_t last = middle % 2 == 0 ? 2 * middle - 1 : 2 * middle;
    for (int32_t i = middle % 2 == 0 ? 1 : 0; i <= last; i += 2)
        taps[i] = -taps[i];
}

void Negate(DBL *taps, int32_t n) {
    for (int32_t i = 0; i < n; ++i)
        taps[i] = -taps[i];
}

void Flip(NarrowFIRBlock &block) {
    const bool isStaged = block.M > 1;
    DBL *const taps = isStaged ? block.interpolator.data() : block.model.data();
    const int32_t count = isStaged ? block.interpolatorCount : block.modelCount;
    if (block.kind == NarrowHighpass || block.kind == WideLowpass) {
        FlipAlternate(taps, count);
        if (isStaged && block.M % 2 != 0)
            FlipAlternate(block.model.data(), block.modelCount);
    }
    if (block.kind >= NarrowBandstop)
        Negate(taps, count);
}

// The estimates are too short for long filters.
int32_t WithMargin(int32_t length) { return length > 100 ? Truncated(1.1 * length) : length; }

} // namespace

ErrorCode DesignNarrowFIR(const NarrowFIRGoal &goal, NarrowFIRBlock &block) {
    const LowpassProblem problem = Normalised(goal);
    if (!IsPossible(goal, problem))
        return ErrBadDesignField;
    Stages stages = problem.isBand() ? EstimateBandStages(problem, goal.fCenter)
                                     : EstimateLowpassStages(problem);
    block.kind = problem.kind;
    block.M = stages.M;
    block.modelCount = WithMargin(stages.modelCount);
    block.interpolatorCount = WithMargin(stages.interpolatorCount);
    if (block.modelCount < 0 || block.interpolatorCount < 0)
        return ErrBadDesignField;
    if (const ErrorCode failed =
            DesignStage(problem, ModelBands(problem, stages), block.modelCount, block.model))
        return failed;
    if (block.M > 1)
        if (const ErrorCode failed =
                DesignStage(problem, InterpolatorBands(problem, stages, goal.fCenter),
                            block.interpolatorCount, block.interpolator))
            return failed;
    Flip(block);
    return 0;
}

bool NarrowFIRFilter::isComplete() const {
    return !model.isEmpty() && (M < 2 || !interpolator.isEmpty());
}

int64_t NarrowFIRFilter::outputCount(std::ptrdiff_t n) const {
    if (M < 2)
        return int64_t{model.size()} + n - 1;
    return (int64_t{model.size()} - 1) * M + interpolator.size() + n - 1;
}

namespace {

// The stretched model uses every M-th value of the interpolator's output.
ErrorCode FilterInStages(ConstRealVector x, const NarrowFIRFilter &filter, RealVector y) {
    const std::ptrdiff_t smoothCount = x.size() + filter.interpolator.size() - 1;
    RealVector smooth;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(smooth, smoothCount)))
        return failed;
    if (const ErrorCode failed = ConvolveReal(x, filter.interpolator, ConvolveDirectly, smooth))
        return failed;
    const int32_t M = filter.M;
    const auto taps = static_cast<int32_t>(filter.model.size());
    const auto ofPhase = [M](int64_t values, int32_t phase) {
        return values > phase ? (values - phase + M - 1) / M : 0;
    };
    for (int32_t phase = 0; phase < M && phase < y.size(); ++phase)
        SlidingSums({.taps = {filter.model.data() + (taps - 1), -1},
                     .tapCount = taps,
                     .signal = {smooth.data() + phase, M},
                     .length = ofPhase(smoothCount, phase),
                     .first = 1 - int64_t{taps},
                     .out = {y.data() + phase, M},
                     .count = static_cast<int32_t>(ofPhase(y.size(), phase))});
    return 0;
}

ErrorCode FilterReal(ConstRealVector x, const NarrowFIRFilter &filter, RealVector y) {
    if (const ErrorCode failed = filter.M > 1 ? FilterInStages(x, filter, y)
                                              : ConvolveReal(x, filter.model, ConvolveDirectly, y))
        return failed;
    if (filter.kind < NarrowBandstop || filter.kind > WideHighpass)
        return 0;
    const std::ptrdiff_t delay = (y.size() - x.size()) / 2;
    for (std::ptrdiff_t i = 0; i < x.size(); ++i)
        y[delay + i] += x[i];
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode FilterNarrowFIR(ConstVectorView<E> x, const NarrowFIRFilter &filter, VectorView<E> y) {
    QX_EXPECTS(!x.isEmpty() && filter.isComplete() && y.size() == filter.outputCount(x.size()));
    if constexpr (E == ElementType::DBL) {
        return FilterReal(x, filter, y);
    } else { // one part after the other
        RealVector part, filtered;
        ScratchParts memory;
        if (const ErrorCode failed = memory.take(Sized(part, x.size()), Sized(filtered, y.size())))
            return failed;
        for (DBL CDB::*which : {&CDB::re, &CDB::im}) {
            for (std::ptrdiff_t i = 0; i < x.size(); ++i)
                part[i] = x[i].*which;
            if (const ErrorCode failed = FilterReal(part, filter, filtered))
                return failed;
            for (std::ptrdiff_t i = 0; i < y.size(); ++i)
                y[i].*which = filtered[i];
        }
        return 0;
    }
}

template ErrorCode FilterNarrowFIR(ConstRealVector x, const NarrowFIRFilter &filter, RealVector y);
template ErrorCode FilterNarrowFIR(ConstComplexVector x, const NarrowFIRFilter &filter,
                                   ComplexVector y);

} // namespace qx

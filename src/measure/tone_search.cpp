#include "measure/tone_search.h"

#include "frame/constants.h"
#include "stats/order.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstddef>
#include <limits>
#include <utility>

namespace qx {
namespace {

// Lines below this part of the largest tone are rounding.
constexpr double smallestPart = 1e-12;

// How far fits settle: while tones are still sought, what is off must not be seen as a line; in the
// end it must be far below what noise does.
constexpr double settledForSearch = 1e-6;
constexpr double settledForGood = 1e-15;

// A von Hann window without zeros at its ends.
double Window(int32_t t, int32_t n) { return 0.5 - 0.5 * std::cos(kTwoPi * (t + 0.5) / n); }

// The vertex of the parabola through three neighbours, of which the second is the largest, from
// that.
double Vertex(double before, double at, double behind) {
    const double curvature = before - 2 * at + behind;
    return curvature < 0 ? 0.5 * (before - behind) / curvature : 0;
}

} // namespace

ErrorCode ToneSearch::begin(const DBL *y, int32_t n) {
    n_ = n;
    double largest = 0;
    for (int32_t t = 0; t < n; ++t)
        largest = std::max(largest, std::fabs(y[t]));
    if (largest == 0)
        return ErrMeasureNotFound;
    int exponent;
    std::frexp(largest, &exponent);
    unit_ = std::ldexp(1.0, std::max(exponent, -1022));
    if (const ErrorCode failed = samples_.allocate(n))
        return failed;

    // From the first sample, so that a constant leaves nothing but zeros.
    const double first = y[0] / unit_;
    double sum = 0;
    for (int32_t t = 0; t < n; ++t)
        sum += y[t] / unit_ - first;
    level_ = first + sum / n;
    double farthest = 0;
    for (int32_t t = 0; t < n; ++t) {
        samples_[t] = y[t] / unit_ - level_;
        farthest = std::max(farthest, std::fabs(samples_[t]));
    }
    if (farthest <= 2 * kEpsilon * (largest / unit_))
        return ErrMeasureNotFound;
    fit_.begin(samples_.data(), n);
    squares_ = 0;
    for (int32_t t = 0; t < n; ++t)
        squares_ += samples_[t] * samples_[t];
    return 0;
}

ErrorCode ToneSearch::reserve(int32_t count, int32_t groups) {
    if (const ErrorCode failed = fit_.reserve(count, groups))
        return failed;
    if (count <= capacity_)
        return 0;
    const int32_t capacity = std::max(count, 2 * capacity_);
    ScratchBytes grown;
    if (const ErrorCode failed = grown.allocate(3 * int64_t{capacity} * int64_t{sizeof(Line)}))
        return failed;
    if (count_ > 0)
        std::copy(lines(), lines() + count_, static_cast<Line *>(grown.bytes()));
    lineMemory_ = std::move(grown);
    capacity_ = capacity;
    return 0;
}

// The spectrum of the windowed residual, at half a bin or less.
ErrorCode ToneSearch::largestLine(const Band &band, Peak &peak) {
    constexpr int64_t fewest = 64;
    const auto length = static_cast<int64_t>(
        std::bit_ceil(static_cast<uint64_t>(std::max(fewest, 2 * int64_t{n_}))));
    if (length > std::numeric_limits<int32_t>::max() / int64_t{sizeof(DBL)})
        return ErrOutOfMemory;
    const auto m = static_cast<int32_t>(length);
    Scratch<ElementType::DBL> work, spectrum;
    for (Scratch<ElementType::DBL> *memory : {&work, &spectrum})
        if (const ErrorCode failed = memory->allocate(m))
            return failed;
    fit_.residualOf(lines(), count_, constant_, work.data());
    double gain = 0;
    for (int32_t t = 0; t < n_; ++t) {
        const double weight = Window(t, n_);
        gain += weight;
        work[t] *= weight;
    }
    Fill(work.data() + n_, m - n_, 0.0);
    if (!plan_)
        plan_.emplace(m);
    if (!*plan_)
        return ErrOutOfMemory;
    if (const ErrorCode failed =
            FFTRealForward(plan_->get(), work.data(), spectrum.data(), 1, 1, m))
        return failed;

    DBL *const power = work.data();
    const int32_t half = m / 2;
    power[0] = spectrum[0] * spectrum[0];
    power[half] = spectrum[half] * spectrum[half];
    for (int32_t k = 1; k < half; ++k)
        power[k] = spectrum[k] * spectrum[k] + spectrum[m - k] * spectrum[m - k];
    peak = {0, 0, 0};
    const auto from = static_cast<int32_t>(std::clamp(std::ceil(band.low * m), 1.0, half + 0.0));
    const auto to = static_cast<int32_t>(std::clamp(std::floor(band.high * m), 0.0, half - 1.0));
    int32_t highest = -1;
    for (int32_t k = from; k <= to; ++k)
        if (power[k] > 0 && (highest < 0 || power[k] > power[highest]))
            highest = k;
    if (highest < 0)
        return 0;
    const double height = power[highest];
    const double shift =
        Vertex(std::sqrt(power[highest - 1]), std::sqrt(height), std::sqrt(power[highest + 1]));
    const double inside = 0.5 / n_;
    peak.frequency = std::clamp((highest + shift) / m, inside, 0.5 - inside);
    peak.amplitude = 2 * std::sqrt(height) / gain;
    // The powers of noise have an exponential distribution, whose median is ln 2 of its mean.
    constexpr double medianOfMean = 0.6931471805599453;
    SelectKth(power + 1, half - 1, half / 2);
    const double noise = power[1 + half / 2] / medianOfMean;
    peak.overNoise = noise > 0 ? height / noise : kInfinity;
    return 0;
}

// One start of the fit: a new line at `frequency` without amplitude, and where `split` is one of
// the others, that moved to the other side. The best result so far is kept in best().
void ToneSearch::fitFrom(double frequency, int32_t split, double offset, State &least) {
    std::copy(former(), former() + count_, lines());
    lines()[count_] = {frequency, 0, 0, 1, count_};
    if (split >= 0) {
        if (frequency <= std::fabs(offset) || frequency >= 0.5 - std::fabs(offset))
            return;
        lines()[count_].frequency = frequency + offset;
        lines()[split].frequency = frequency - offset;
    }
    double constant = constant_;
    const double squares = fit_.refine(lines(), count_ + 1, count_ + 1, settledForSearch, constant);
    if (!(squares < least.squares))
        return;
    least = {constant, squares};
    std::copy(lines(), lines() + count_ + 1, best());
}

// By its height above the median of the spectrum; and, where the record is too short for that or
// the spectrum does not resolve the line, by how much the fit gains of what is left (the likelihood
// ratio), against the largest that noise alone makes of so many frequencies.
bool ToneSearch::isAboveNoise(const Peak &peak, double squaresBefore) const {
    constexpr double margin = 9.0;
    const double threshold = std::log(static_cast<double>(n_)) + margin;
    if (n_ >= 64 && peak.overNoise > threshold)
        return true;
    const double freedom = n_ - 3.0 * count_ - 1;
    return freedom > 0 &&
           (squares_ <= 0 || 0.5 * freedom * std::log(squaresBefore / squares_) > threshold);
}

ErrorCode ToneSearch::add(const Band &band, bool evenInNoise, Step &step) {
    step = Step::Exhausted;
    if (count_ > 0 && 3 * (int64_t{count_} + 1) + 1 > n_)
        return 0;
    if (const ErrorCode failed = reserve(count_ + 1, count_ + 1))
        return failed;
    Peak peak;
    if (const ErrorCode failed = largestLine(band, peak))
        return failed;
    double largest = 0;
    for (int32_t l = 0; l < count_; ++l)
        largest = std::max(largest, Amplitude(lines()[l]));
    if (!(peak.amplitude > smallestPart * largest))
        return 0;
    std::copy(lines(), lines() + count_, former());
    State least = {constant_, squares_};
    const State before = least;
    fitFrom(peak.frequency, -1, 0, least);
    // A line near it may stand for two that the spectrum does not resolve.
    constexpr double resolved = 4; // bins
    for (int32_t l = 0; l < count_; ++l) {
        const double frequency = former()[l].frequency;
        if (std::fabs(frequency - peak.frequency) * n_ < resolved)
            for (const double bins : {0.3, -0.3, 0.8, -0.8})
                fitFrom(frequency, l, bins / n_, least);
    }

    if (!(least.squares < before.squares)) {
        std::copy(former(), former() + count_, lines());
        return 0;
    }
    const bool isFirst = count_ == 0;
    std::copy(best(), best() + count_ + 1, lines());
    ++count_;
    constant_ = least.constant;
    squares_ = least.squares;
    step = Step::Added;
    if (!isFirst && !evenInNoise && !isAboveNoise(peak, before.squares)) {
        --count_;
        std::copy(former(), former() + count_, lines());
        constant_ = before.constant;
        squares_ = before.squares;
        step = Step::OnlyNoise;
    }
    return 0;
}

void ToneSearch::settle() {
    squares_ = fit_.refine(lines(), count_, count_, settledForGood, constant_);
}

ErrorCode ToneSearch::replace(const Line *from, int32_t count, int32_t groups) {
    count_ = 0;
    if (const ErrorCode failed = reserve(count, groups))
        return failed;
    std::copy(from, from + count, lines());
    count_ = count;
    squares_ = fit_.refine(lines(), count, groups, settledForGood, constant_);
    return 0;
}

double ToneSearch::residualRms(DBL *residual) {
    return std::sqrt(fit_.residualOf(lines(), count_, constant_, residual) / n_);
}
double ToneSearch::residualRmsOf(int32_t count) {
    return std::sqrt(fit_.residualOf(lines(), count, constant_, nullptr) / n_);
}
double ToneSearch::residualRmsOf(const Line &tone) {
    return std::sqrt(fit_.residualOf(&tone, 1, constant_, nullptr) / n_);
}

} // namespace qx

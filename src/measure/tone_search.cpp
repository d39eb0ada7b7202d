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

// Lines below this fraction of the largest tone are rounding errors.
constexpr double smallestPart = 1e-12;

// The effort of fits. While tones are still being searched for, the error must not look like a
// line; in the end it must be far below that of the noise. The limits on steps are for records that
// are not made of tones.
constexpr FitEffort nearby = {1e-6, 20, SinusoidFit::farthestReach};
constexpr FitEffort searching = {1e-6, 3, 12};
constexpr FitEffort forGood = {1e-20, 100, SinusoidFit::farthestReach};

// The vertex of the parabola through three neighbours, relative to the middle one, which is the
// largest.
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

    // Relative to the first sample, so that a constant leaves nothing but zeros.
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

ErrorCode ToneSearch::reserve(int32_t count) {
    if (count <= capacity_)
        return 0;
    const int32_t capacity = std::max(count, 2 * capacity_);
    if (const ErrorCode failed = fit_.reserve(std::max(capacity, mostNearby + 1)))
        return failed;
    ScratchBytes grown;
    if (const ErrorCode failed = grown.allocate(2 * int64_t{capacity} * int64_t{sizeof(Line)}))
        return failed;
    if (count_ > 0)
        std::copy(lines(), lines() + count_, static_cast<Line *>(grown.bytes()));
    lineMemory_ = std::move(grown);
    capacity_ = capacity;
    return 0;
}

// The spectrum has a spacing of half a bin or less.
ErrorCode ToneSearch::reserveSpectrum() {
    if (spectrumLength_ > 0)
        return 0;
    constexpr int64_t fewest = 64;
    const auto length = static_cast<int64_t>(
        std::bit_ceil(static_cast<uint64_t>(std::max(fewest, 2 * int64_t{n_}))));
    if (length > std::numeric_limits<int32_t>::max() / int64_t{sizeof(DBL)})
        return ErrOutOfMemory;
    if (const ErrorCode failed = memory_.take(Sized(residual_, n_), Sized(window_, n_),
                                              Sized(work_, length), Sized(spectrum_, length)))
        return failed;
    plan_.emplace(static_cast<int32_t>(length));
    if (!*plan_)
        return ErrOutOfMemory;

    // Von Hann's window without zeros at its ends, computed as zeros minus its negative.
    const Line wave = {1.0 / n_, -0.5, 0, 0};
    Fill(window_.data(), n_, 0.0);
    SinusoidFit window;
    if (const ErrorCode failed = window.reserve(1))
        return failed;
    window.begin(window_.data(), n_);
    window.residualOf(&wave, 1, -0.5, window_.data());
    spectrumLength_ = static_cast<int32_t>(length);
    return 0;
}

// The mean power of the noise: its powers have an exponential distribution, whose median is ln 2
// times its mean. If there are many powers, only every k-th one is used. Overwrites the spectrum.
double ToneSearch::noiseOf(const DBL *power, int32_t count) {
    constexpr double medianOfMean = 0.6931471805599453;
    constexpr int32_t enough = 1 << 15;
    const int32_t every = std::max(1, count / enough);
    const int32_t taken = count / every;
    for (int32_t k = 0; k < taken; ++k)
        spectrum_[k] = power[std::ptrdiff_t{k} * every];
    SelectKth({spectrum_.data(), taken}, taken / 2);
    return spectrum_[taken / 2] / medianOfMean;
}

// Finds the largest line in the spectrum of the windowed residual; the residual itself stays in
// residual_.
ErrorCode ToneSearch::largestLine(const Band &band, Peak &peak) {
    if (const ErrorCode failed = reserveSpectrum())
        return failed;
    const int32_t m = spectrumLength_;
    fit_.residualOf(lines(), count_, constant_, residual_.data());
    double gain = 0;
    for (int32_t t = 0; t < n_; ++t) {
        gain += window_[t];
        work_[t] = window_[t] * residual_[t];
    }
    Fill(work_.data() + n_, m - n_, 0.0);
    if (const ErrorCode failed =
            FFTRealForward(plan_->get(), work_.data(), spectrum_.data(), 1, 1, m))
        return failed;

    DBL *const power = work_.data();
    const int32_t half = m / 2;
    power[0] = spectrum_[0] * spectrum_[0];
    power[half] = spectrum_[half] * spectrum_[half];
    for (int32_t k = 1; k < half; ++k)
        power[k] = spectrum_[k] * spectrum_[k] + spectrum_[m - k] * spectrum_[m - k];
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
    const double noise = noiseOf(power + 1, half - 1);
    peak.overNoise = noise > 0 ? height / noise : kInfinity;
    return 0;
}

// Leakage of the rectangular window from lines farther away is left to the fit of all lines.
ToneSearch::Neighbourhood ToneSearch::linesAround(double frequency) const {
    constexpr double farthest = 16; // bins
    Neighbourhood around;
    around.count = 0;
    const auto distance = [&](int32_t l) { return std::fabs(lines()[l].frequency - frequency); };
    for (int32_t l = 0; l < count_; ++l) {
        if (distance(l) * n_ > farthest)
            continue;
        int32_t at = std::min(around.count, mostNearby);
        for (; at > 0 && distance(l) < distance(around.places[at - 1]); --at)
            if (at < mostNearby)
                around.places[at] = around.places[at - 1];
        if (at < mostNearby)
            around.places[at] = l;
        around.count = std::min(around.count + 1, mostNearby);
    }
    for (int32_t i = 0; i < around.count; ++i)
        around.lines[i] = lines()[around.places[i]];
    around.constant = 0;
    around.squares = squares_;
    return around;
}

// One start of the fit: a new line at `frequency` without amplitude. If `split` is the index of
// another line, the two are moved to opposite sides of `frequency`. The best result so far is in
// `least`.
void ToneSearch::fitFrom(const Neighbourhood &around, double frequency, int32_t split,
                         double offset, Neighbourhood &least) {
    Neighbourhood trial = around;
    trial.lines[around.count] = {frequency, 0, 0, 1};
    if (split >= 0) {
        if (frequency <= std::fabs(offset) || frequency >= 0.5 - std::fabs(offset))
            return;
        trial.lines[around.count].frequency = frequency + offset;
        trial.lines[split].frequency = frequency - offset;
    }
    ++trial.count;
    trial.squares = fit_.refine(trial.lines, trial.count, Frequencies::Own, nearby, trial.constant);
    if (trial.squares < least.squares)
        least = trial;
}

// Fits a new line to the residual of all lines that are not in `around`.
ToneSearch::Neighbourhood ToneSearch::fitNearby(const Neighbourhood &around, double frequency) {
    Line negatives[mostNearby];
    for (int32_t i = 0; i < around.count; ++i) {
        negatives[i] = around.lines[i];
        negatives[i].cosine *= -1;
        negatives[i].sine *= -1;
    }
    fit_.begin(residual_.data(), n_);
    fit_.residualOf(negatives, around.count, 0, residual_.data());
    Neighbourhood least = around;
    fitFrom(around, frequency, -1, 0, least);
    // A line near it may represent two that the spectrum does not resolve.
    constexpr double resolved = 4; // bins
    constexpr int32_t mostSplit = 2;
    for (int32_t i = 0; i < std::min(around.count, mostSplit); ++i) {
        const double other = around.lines[i].frequency;
        if (std::fabs(other - frequency) * n_ < resolved)
            for (const double bins : {0.3, -0.3, 0.8, -0.8})
                fitFrom(around, other, i, bins / n_, least);
    }
    fit_.begin(samples_.data(), n_);
    return least;
}

// Judged by the height above the median of the spectrum and, if the record is too short for that or
// the spectrum does not resolve the line, by how much the fit reduces the residual (the likelihood
// ratio), compared with the largest value that noise alone produces for so many frequencies.
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
    if (const ErrorCode failed = reserve(count_ + 1))
        return failed;
    Peak peak;
    if (const ErrorCode failed = largestLine(band, peak))
        return failed;
    double largest = 0;
    for (int32_t l = 0; l < count_; ++l)
        largest = std::max(largest, Amplitude(lines()[l]));
    if (!(peak.amplitude > smallestPart * largest))
        return 0;
    const Neighbourhood around = linesAround(peak.frequency);
    const Neighbourhood least = fitNearby(around, peak.frequency);
    if (least.count == around.count)
        return 0;

    const double constantBefore = constant_, squaresBefore = squares_;
    std::copy(lines(), lines() + count_, former());
    for (int32_t i = 0; i < around.count; ++i)
        lines()[around.places[i]] = least.lines[i];
    lines()[count_] = least.lines[around.count];
    constant_ += least.constant;
    squares_ = least.squares;
    ++count_;
    if (least.count < count_)
        squares_ = fit_.refine(lines(), count_, Frequencies::Own, searching, constant_);
    step = Step::Added;
    if (count_ > 1 && !evenInNoise && !isAboveNoise(peak, squaresBefore)) {
        --count_;
        std::copy(former(), former() + count_, lines());
        constant_ = constantBefore;
        squares_ = squaresBefore;
        step = Step::OnlyNoise;
    }
    return 0;
}

void ToneSearch::settle() {
    squares_ = fit_.refine(lines(), count_, Frequencies::Own, forGood, constant_);
}

ErrorCode ToneSearch::replace(const Line *from, int32_t count) {
    count_ = 0;
    if (const ErrorCode failed = reserve(count))
        return failed;
    std::copy(from, from + count, lines());
    count_ = count;
    squares_ = fit_.refine(lines(), count, Frequencies::Common, forGood, constant_);
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

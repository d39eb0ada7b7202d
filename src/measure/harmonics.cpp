#include "measure/harmonics.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace qx {
namespace {

// The aliased frequencies of the harmonics: distinct lines, and the line of each harmonic.
class SeenHarmonics {
public:
    ErrorCode reserve(int32_t highest) {
        return memory_.take(Sized(lines_, highest), Sized(lineOf_, highest));
    }
    void lay(const Line &fundamental, int32_t n, int32_t highest);

    int32_t count() const { return count_; }
    Line *lines() const { return lines_; }
    // The line of harmonic h + 1, or -1 if it cannot be distinguished.
    int32_t lineOf(int32_t h) const { return lineOf_[h]; }

private:
    Line *lines_ = nullptr;
    VectorView<ElementType::I32> lineOf_;
    ScratchParts memory_;
    int32_t count_ = 0;
};

void SeenHarmonics::lay(const Line &fundamental, int32_t n, int32_t highest) {
    const double halfBin = 0.5 / n;
    lines()[0] = fundamental;
    lines()[0].slope = 1;
    lineOf_[0] = 0;
    count_ = 1;
    for (int32_t h = 1; h < highest; ++h) {
        const double turns = PartOfTurn(fundamental.frequency, h + 1.0);
        Line seen = {std::fabs(turns), 0, 0, turns < 0 ? -(h + 1.0) : h + 1.0};
        lineOf_[h] = -1;
        if (seen.frequency < halfBin)
            continue;
        const bool isTold = seen.frequency <= 0.5 - halfBin;
        if (!isTold) { // one wave represents all harmonics that alias there
            seen.frequency = 0.5;
            seen.slope = 0;
        }
        int32_t same = 0;
        while (same < count_ && std::fabs(lines()[same].frequency - seen.frequency) >= halfBin)
            ++same;
        if (same == count_) {
            lines()[count_] = seen;
            lineOf_[h] = isTold ? count_ : -1;
            ++count_;
        } else if (same > 0) {
            for (int32_t other = 1; other < h; ++other)
                if (lineOf_[other] == same)
                    lineOf_[other] = -1;
        }
    }
}

double Decibels(double ratio) { return 20 * std::log10(ratio); }

// The mean square of a line. At half the sampling rate the line alternates between one value and
// its negative.
double SquaredRms(const Line &line) {
    const double square = line.cosine * line.cosine + line.sine * line.sine;
    return line.frequency < 0.5 ? 0.5 * square : square;
}

// The amplitude of the largest line in the residual; 0 if there is none.
ErrorCode LargestSpur(const DBL *residual, int32_t n, double &amplitude) {
    amplitude = 0;
    ToneSearch search;
    const ErrorCode status = search.begin(residual, n);
    if (status != 0)
        return status == ErrMeasureNotFound ? 0 : status;
    ToneSearch::Step step;
    if (const ErrorCode failed = search.add(wholeBand, true, step))
        return failed;
    search.settle();
    if (step == ToneSearch::Step::Added)
        amplitude = Amplitude(search[0]) * search.unit();
    return 0;
}

} // namespace

ErrorCode FindToneInBand(ToneSearch &search, const Band &band) {
    constexpr int32_t mostOutside = 32;
    const bool isWhole = band.low <= 0 && band.high >= 0.5;
    for (int32_t k = 0; k <= mostOutside; ++k) {
        ToneSearch::Step step;
        const bool isLast = k == mostOutside;
        if (const ErrorCode failed = search.add(isLast ? band : wholeBand, false, step))
            return failed;
        if (step != ToneSearch::Step::Added)
            return ErrMeasureNotFound;
        const int32_t newest = search.count() - 1;
        if (isWhole || isLast || band.contains(search[newest].frequency))
            return 0;
    }
    return ErrMeasureNotFound;
}

ErrorCode MeasureHarmonics(ToneSearch &search, const Line &fundamental, int32_t n, int32_t highest,
                           Line *harmonics, HarmonicSums &sums) {
    SeenHarmonics seen;
    if (const ErrorCode failed = seen.reserve(highest))
        return failed;
    seen.lay(fundamental, n, highest);
    if (const ErrorCode failed = search.replace(seen.lines(), seen.count()))
        return failed;

    for (int32_t h = 0; h < highest; ++h) {
        const int32_t line = seen.lineOf(h);
        harmonics[h] = line < 0 ? Line{kNaN, kNaN, kNaN, 0} : search[line];
    }
    Scratch<ElementType::DBL> residual;
    if (const ErrorCode failed = residual.allocate(n))
        return failed;
    const double noise = search.residualRms(residual.data());
    double spur;
    if (const ErrorCode failed = LargestSpur(residual.data(), n, spur))
        return failed;
    double squares = 0;
    for (int32_t l = 1; l < search.count(); ++l) {
        squares += SquaredRms(search[l]);
        spur = std::max(spur, Amplitude(search[l]));
    }
    const double rms = std::sqrt(SquaredRms(search[0]));
    sums.amplitude = Amplitude(search[0]);
    sums.thd = std::sqrt(squares) / rms;
    sums.sinad = Decibels(rms / search.residualRmsOf(1));
    sums.snr = Decibels(rms / noise);
    sums.sfdr = Decibels(sums.amplitude / spur);
    sums.noiseFloor = -sums.snr - 10 * std::log10(0.5 * n);
    return 0;
}

} // namespace qx

#ifndef QX_MEASURE_TONE_SEARCH_H
#define QX_MEASURE_TONE_SEARCH_H

#include "fft/plan.h"
#include "frame/scratch.h"
#include "measure/sinusoids.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>
#include <optional>

namespace qx {

// A band of frequencies in cycles per sample.
struct Band {
    double low, high;
    bool contains(double frequency) const { return frequency >= low && frequency <= high; }
};
constexpr Band wholeBand = {0.0, 0.5};

// The tones of a record. They are found one after the other, each as the largest line in the
// spectrum of the residual of the previous ones, and are fitted together.
class ToneSearch {
public:
    // At least 4 finite samples. ErrMeasureNotFound (only a constant), ErrOutOfMemory.
    ErrorCode begin(const DBL *y, int32_t n);

    enum class Step {
        Added,
        OnlyNoise, // the largest line of the band is not above the noise, and was not added
        Exhausted // nothing above rounding is left, or there are as many tones as the samples can determine
    };
    // Adds the largest line of the band. The very first line, and any line if `evenInNoise`, is
    // added even if noise alone could have produced it. ErrOutOfMemory.
    ErrorCode add(const Band &band, bool evenInNoise, Step &step);

    int32_t count() const { return count_; }
    const Line &operator[](int32_t i) const { return lines()[i]; }
    double constant() const { return constant_; }

    // Fits the tones to the last digits, once all have been found.
    void settle();
    // Replaces the tones by lines with a common frequency, and fits them.
    ErrorCode replace(const Line *lines, int32_t count);
    // The root mean square of the residual of the constant and the tones; the residual itself is
    // stored in `residual` unless that is null.
    double residualRms(DBL *residual);
    // The same with only the first `count` tones, or with only this tone.
    double residualRmsOf(int32_t count);
    double residualRmsOf(const Line &tone);

    // The samples are scaled by this unit, a power of 2, after subtraction of the level.
    double unit() const { return unit_; }
    double level() const { return level_; }

private:
    struct Peak {
        double frequency, amplitude;
        double overNoise; // the ratio of its power to the noise
    };
    // The lines that are fitted together with a new one, which comes last; the others are fixed.
    static constexpr int32_t mostNearby = 8;
    struct Neighbourhood {
        I32 places[mostNearby]; // in the list of tones, nearest first
        Line lines[mostNearby + 1];
        int32_t count;
        double constant, squares;
    };

    Line *lines() const { return static_cast<Line *>(lineMemory_.bytes()); }
    Line *former() const { return lines() + capacity_; }
    ErrorCode reserve(int32_t count);
    ErrorCode reserveSpectrum();
    ErrorCode largestLine(const Band &band, Peak &peak);
    double noiseOf(const DBL *power, int32_t count);
    Neighbourhood linesAround(double frequency) const;
    void fitFrom(const Neighbourhood &around, double frequency, int32_t split, double offset,
                 Neighbourhood &least);
    Neighbourhood fitNearby(const Neighbourhood &around, double frequency);
    bool isAboveNoise(const Peak &peak, double squaresBefore) const;

    int32_t n_ = 0;
    double unit_ = 1, level_ = 0;
    Scratch<ElementType::DBL> samples_;
    RealVector residual_, window_;
    int32_t spectrumLength_ = 0;
    RealVector work_, spectrum_;
    ScratchParts memory_;
    SinusoidFit fit_;
    std::optional<PlanReference> plan_;
    ScratchBytes lineMemory_;
    int32_t count_ = 0, capacity_ = 0;
    double constant_ = 0, squares_ = 0;
};

} // namespace qx

#endif

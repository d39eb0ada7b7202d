#ifndef QX_MEASURE_SINUSOIDS_H
#define QX_MEASURE_SINUSOIDS_H

#include "frame/scratch.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// A line of a record of n samples: cosine cos(2 pi frequency s) + sine sin(2 pi frequency s), with
// s the sample number counted from the middle of the record, (n - 1) / 2, and the frequency in
// cycles per sample.
//
// The lines of a group move together: where the group's frequency changes by d, that of a line
// changes by slope d. Tones have a group each and slope 1, harmonics are one group.
struct Line {
    DBL frequency;
    DBL cosine, sine;
    DBL slope;
    I32 group;
};

double Amplitude(const Line &line);
// The phase of the line as a cosine at the first of n samples, above -pi and at most pi.
double PhaseAtStart(const Line &line, int32_t n);

// value count - its nearest integer; count is a multiple of 1/2.
double PartOfTurn(double value, double count);

// A constant and lines, fitted to samples by least squares: the sine fit of IEEE 1057 extended to
// several lines. Damped Gauss-Newton steps (D. W. Marquardt, 1963) in all parameters at once; the
// products of the derivatives with each other have closed forms, so that a step takes time in
// proportion to samples times lines.
class SinusoidFit {
public:
    // Samples of magnitude about 1 that stay where they are.
    void begin(const DBL *samples, int32_t n);

    // Memory for so many lines in so many groups, of which the rest of the calls may have fewer.
    // ErrOutOfMemory.
    ErrorCode reserve(int32_t lines, int32_t groups);

    // Moves the lines and the constant from where they are to the least squares nearby, until a
    // step takes less than the part `settled` of the sum of squares. What is left of that.
    double refine(Line *lines, int32_t count, int32_t groups, double settled, double &constant);

    // What is left of the samples, and the sum of its squares; residual may be null.
    double residualOf(const Line *lines, int32_t count, double constant, DBL *residual);

private:
    double middle() const { return 0.5 * (n_ - 1); }
    double smallestFrequency() const { return 0.25 / n_; }
    double sumOfSquares(const Line *lines, int32_t count, double constant, DBL *moments,
                        DBL *residual);
    void buildNormal(const Line *lines, int32_t count, int32_t groups);
    void buildGradient(const Line *lines, int32_t count, int32_t groups, const DBL *moments);
    bool solve(int32_t size, double damping);
    bool takeStep(const Line *from, int32_t count, int32_t groups, Line *to);

    const DBL *samples_ = nullptr;
    int32_t n_ = 0;
    Scratch<ElementType::DBL> memory_;
    ScratchBytes trialMemory_;
    // Of the block at hand, by line: cosines and sines; and those of a wave from
    // phase 0.
    DBL *waves_ = nullptr, *table_ = nullptr;
    DBL *normal_ = nullptr, *factor_ = nullptr; // size by size, the lower triangles
    DBL *gradient_ = nullptr, *step_ = nullptr, *scale_ = nullptr;
    DBL *moments_ = nullptr, *trialMoments_ = nullptr;
    Line *trial_ = nullptr;
};

} // namespace qx

#endif

#ifndef QX_MEASURE_SINUSOIDS_H
#define QX_MEASURE_SINUSOIDS_H

#include "frame/scratch.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// A line of a record of n samples: cosine cos(2 pi frequency s) + sine sin(2 pi frequency s), with
// s the sample number counted from the middle of the record, (n - 1) / 2, and the frequency in
// cycles per sample. If lines share a common frequency, a change of it by d changes the frequency
// of this line by slope d.
struct Line {
    DBL frequency;
    DBL cosine, sine;
    DBL slope;
};

struct Phasor {
    DBL cosine, sine;
};
// Sums over the record of cos(theta s), s sin(theta s) and s^2 cos(theta s): the Dirichlet kernel
// and its derivatives.
struct Kernel {
    double cosines, sines, squares;
};

// The frequencies of the lines of a fit: independent ones, as for tones, or a common one, as for
// harmonics.
enum class Frequencies { Own, Common };

double Amplitude(const Line &line);
// The phase of the line as a cosine at the first of n samples, in (-pi, pi].
double PhaseAtStart(const Line &line, int32_t n);

// value count minus its nearest integer; count is a multiple of 1/2.
double PartOfTurn(double value, double count);

// The effort of a fit. It ends before a step that would reduce the sum of squares by less than the
// fraction `settled`, or after mostSteps. The matrix of a step neglects the products of lines that
// are more than `reach` places apart in the order of their frequencies, which makes the steps less
// good, but not the fit.
struct FitEffort {
    double settled;
    int32_t mostSteps;
    int32_t reach; // at most SinusoidFit::farthestReach
};

// A constant and lines, fitted to samples by least squares: the sine fit of IEEE 1057 extended to
// several lines. Uses damped Gauss-Newton steps (D. W. Marquardt, 1963) in all parameters together.
// The products of the derivatives have closed forms, so that the time of a step is proportional to
// samples times lines.
class SinusoidFit {
public:
    static constexpr int32_t farthestReach = 32;

    // Samples of magnitude about 1, which must remain in place.
    void begin(const DBL *samples, int32_t n);

    // Allocates memory for `lines` lines; later calls may use fewer. ErrOutOfMemory.
    ErrorCode reserve(int32_t lines);

    // Moves the lines and the constant from their start values to the nearby least-squares
    // solution. Returns the remaining sum of squares.
    double refine(Line *lines, int32_t count, Frequencies frequencies, const FitEffort &effort,
                  double &constant);

    // Computes the residual and returns the sum of its squares; residual may be null, or the
    // samples.
    double residualOf(const Line *lines, int32_t count, double constant, DBL *residual);

private:
    // The parameters are the constant, then the cosine, the sine and, unless it is common, the
    // frequency of each line in the order of the frequencies, and last the common frequency.
    // Frequencies are in units of 1 / (pi n). Of the symmetric matrix of their products, each row
    // of the lower triangle is stored from the first line within reach on; the row of the common
    // frequency is stored in full.
    struct Layout {
        int32_t count;
        Frequencies frequencies;
        int32_t reach;

        std::ptrdiff_t perLine() const { return frequencies == Frequencies::Own ? 3 : 2; }
        std::ptrdiff_t common() const { return 1 + perLine() * count; }
        std::ptrdiff_t size() const { return common() + (frequencies == Frequencies::Common); }
        std::ptrdiff_t ofPlace(std::ptrdiff_t place) const { return 1 + perLine() * place; }
        std::ptrdiff_t frequencyOf(std::ptrdiff_t place) const {
            return frequencies == Frequencies::Own ? ofPlace(place) + 2 : common();
        }
        std::ptrdiff_t firstInRow(std::ptrdiff_t row) const {
            const std::ptrdiff_t place = (row - 1) / perLine();
            return row == 0 || row == common() || place < reach ? 0 : ofPlace(place - reach);
        }
        std::ptrdiff_t width() const { return 1 + perLine() * (std::ptrdiff_t{reach} + 1); }
        // Where the row begins; element (row, col) is at offset col.
        DBL *row(DBL *matrix, std::ptrdiff_t row) const {
            return matrix + row * width() - firstInRow(row);
        }
        // The weight of the products of lines that are `apart` places apart: 1, or a weight that
        // falls to 0 beyond the reach, which keeps the matrix positive (I. Schur, 1911).
        double weight(std::ptrdiff_t apart) const {
            return count <= reach ? 1.0 : 1.0 - static_cast<double>(apart) / (reach + 1.0);
        }
    };

    double middle() const { return 0.5 * (n_ - 1); }
    double smallestFrequency() const { return 0.25 / n_; }
    double sumOfSquares(const Line *lines, int32_t count, double constant, DBL *moments,
                        DBL *residual);
    void layTable(const Line &line, DBL *table);
    void addMoments(const DBL *left, int32_t count, double s0, double sum, DBL *moments);
    void sortByFrequency(const Line *lines);
    void buildNormal(const Line *lines);
    void kernelsOf(const Line *lines, int32_t p, int32_t q, Kernel &less, Kernel &more) const;
    void addProducts(const Line *lines, int32_t placeOfP, int32_t placeOfQ);
    void buildGradient(const Line *lines);
    bool factor(double damping);
    double solve();
    bool takeStep(const Line *from, Line *to);

    const DBL *samples_ = nullptr;
    int32_t n_ = 0;
    Layout layout_ = {};
    ScratchParts memory_;
    VectorView<ElementType::I32> order_; // the lines by ascending frequency
    // For each line: the phasor at the first sample of the current block, the phasor of a block,
    // and two of half the angle, of one sample and of all.
    Phasor *atBlock_ = nullptr, *ofBlock_ = nullptr, *halfAngles_ = nullptr;
    // For each line: cosines and sines of the current block, and those of a wave with phase 0.
    DBL *waves_ = nullptr, *table_ = nullptr;
    DBL *normal_ = nullptr, *factor_ = nullptr;
    DBL *gradient_ = nullptr, *step_ = nullptr, *scale_ = nullptr;
    DBL *moments_ = nullptr, *trialMoments_ = nullptr;
    Line *trial_ = nullptr;
};

} // namespace qx

#endif

#ifndef QX_FIT_PEAK_SEARCH_H
#define QX_FIT_PEAK_SEARCH_H

#include "fit/bounded_lm.h"

namespace qx {

// A start for a fit of a exp(-((x - m) / s)^2 / 2) + c, with the residual sum of squares of the
// binned samples.
struct PeakStart {
    double a, m, s, c;
    double rest;
};

// Finds starts at every scale. The samples are sorted into bins, and those into bins of twice the width until
// 64 are left. At each width, peaks that are a few bins wide are placed on every bin and beyond the ends; at
// the last width wider peaks are tried, too. a and c are the best within their bounds, in closed form, since
// the model is linear in them (G. H. Golub, V. Pereyra, "The differentiation of pseudo-inverses and nonlinear
// least squares problems whose variables separate", 1973). The best peak and the best dip of each scale are
// starts, and so are the highest and the lowest sample with the width observed there. The starts are sorted,
// best first. The work is proportional to the number of samples.
class PeakSearch {
public:
    // Takes four lower and four upper bounds, in the order a, m, s, c; the lower bound of s must
    // not be below 0.
    PeakSearch(const FitSamples &samples, const FitBounds &bounds)
        : samples_(samples), bounds_(bounds) {}
    // ErrOutOfMemory.
    ErrorCode run();

    int32_t count() const { return count_; }
    double squares() const { return squares_; } // about the mean
    const PeakStart &operator[](int32_t i) const { return starts_[i]; }

private:
    static constexpr int32_t mostStarts = 96, fewestBins = 64;
    // The number of bins from the middle of the widest peak to the farthest bin.
    static constexpr int32_t widest = 25 * fewestBins;
    struct Level {
        RealVector weights, products; // sums of w and of w (y - mean) in each bin
        double width;
    };
    // Sums over the shape g of a peak: of w g, w g^2 and w g (y - mean).
    struct ShapeSums {
        double g, gg, gy;
    };

    ErrorCode fillBins();
    static Level halved(const Level &level, RealVector weights, RealVector products);
    void searchLevel(const Level &level, double widthsPerScale);
    ShapeSums sumsAt(const Level &level, double m, double s) const;
    ShapeSums sumsOnBin(const Level &level, int32_t bin) const;
    PeakStart bestHeight(const ShapeSums &sums, double m, double s) const;
    void keep(const PeakStart &start);
    void addExtreme(bool isPeak);
    double restOf(double a, double c, const ShapeSums &sums) const;

    const FitSamples samples_;
    const FitBounds bounds_;
    double first_ = 0.0, last_ = 0.0; // x
    double mean_ = 0.0, weight_ = 0.0, squares_ = 0.0;
    int32_t reach_ = 0; // number of bins of the shape on either side
    double shape_[widest + 1];
    PeakStart starts_[mostStarts];
    int32_t count_ = 0;
    Level finest_ = {};
    ScratchParts memory_;
};

} // namespace qx

#endif

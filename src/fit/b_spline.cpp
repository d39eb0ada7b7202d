#include "fit/b_spline.h"

#include "fit/b_spline_spans.h"
#include "fit/weights.h"
#include "frame/constants.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// The upper triangle of a banded matrix with `band` diagonals and the target of each row.
class BandedTriangle {
public:
    explicit BandedTriangle(const RealMatrix &elements)
        : elements_(elements), order_(elements.rows()), band_(elements.cols() - 1) {
        for (DBL &element : elements.elements())
            element = 0.0;
    }
    // Element (i, i + j), j < band; at j = band the target.
    DBL *row(int32_t i) const { return elements_.row(i); }
    // Whether no diagonal element is negligible compared with its column.
    bool hasFullRank() const;
    void solve(RealVector x) const;

private:
    RealMatrix elements_;
    int32_t order_, band_;
};

bool BandedTriangle::hasFullRank() const {
    for (int32_t j = 0; j < order_; ++j) {
        double largest = 0.0;
        for (int32_t k = 0; k < band_ && k <= j; ++k)
            largest = std::max(largest, std::fabs(row(j - k)[k]));
        if (!(std::fabs(row(j)[0]) > 16 * kEpsilon * largest))
            return false;
    }
    return true;
}

void BandedTriangle::solve(RealVector x) const {
    for (int32_t i = order_ - 1; i >= 0; --i) {
        const DBL *const r = row(i);
        double rest = r[band_];
        for (int32_t j = 1; j < band_ && j < order_ - i; ++j)
            rest -= r[j] * x[i + j];
        x[i] = rest / r[0];
    }
}

// Splits the samples, which ascend, into runs within one span; the last x belongs to the last span
// that has a length.
class Spans {
public:
    Spans(const FitSamples &all, ConstRealVector knots, int32_t degree)
        : all_(all), knots_(knots), span_(degree),
          last_(static_cast<int32_t>(knots.size()) - degree - 2) {
        while (last_ > degree && !(knots[last_] < knots[last_ + 1]))
            --last_;
    }
    // Sets *run to the next run of at most kSplineRows samples; returns false after the last one.
    bool next(SpanSamples *run) {
        first_ += count_;
        if (first_ >= all_.n())
            return false;
        while (span_ < last_ && !(all_.x[first_] < knots_[span_ + 1]))
            ++span_;
        const int32_t most = std::min(kSplineRows, all_.n() - first_);
        const DBL *const x = all_.x.data() + first_;
        count_ = span_ == last_ ? most : 1;
        while (count_ < most && x[count_] < knots_[span_ + 1])
            ++count_;
        const DBL *const w = all_.weights();
        *run = {x, all_.y.data() + first_, w == nullptr ? nullptr : w + first_, count_};
        return true;
    }
    int32_t first() const { return first_; }
    int32_t span() const { return span_; }

private:
    const FitSamples &all_;
    const ConstRealVector knots_;
    int32_t span_, last_, first_ = 0, count_ = 0;
};

// A power of two near 1 / sqrt(largest |w|), with which no square of a row overflows or underflows.
double ScaleOfWeights(const FitSamples &samples) {
    const DBL *const w = samples.weights();
    const double largest = w == nullptr ? 1.0 : LargestWeight(w, samples.n());
    int exponent;
    std::frexp(largest == 0.0 ? 1.0 : std::sqrt(largest), &exponent);
    return std::ldexp(1.0, -exponent);
}

} // namespace

void MakeKnots(ConstRealVector x, int32_t degree, ConstRealVector given, RealVector knots) {
    const std::ptrdiff_t n = x.size(), ends = degree + 1, interior = knots.size() - 2 * ends;
    QX_EXPECTS(given.isEmpty() || given.size() == interior);
    for (std::ptrdiff_t i = 0; i < ends; ++i) {
        knots[i] = x[0];
        knots[ends + interior + i] = x[n - 1];
    }
    const RealVector inner = knots.part(ends, interior);
    for (std::ptrdiff_t i = 0; i < interior; ++i) {
        if (!given.isEmpty()) {
            inner[i] = given[i];
            continue;
        }
        const auto at = static_cast<double>(i), last = static_cast<double>(n - 1);
        const double position = (at + 1.0) * last / (static_cast<double>(interior) + 1.0);
        const auto below = std::min(static_cast<std::ptrdiff_t>(position), n - 2);
        const double share = position - static_cast<double>(below);
        const double low = x[below], high = x[below + 1];
        inner[i] = std::min(low + share * (high - low), high);
    }
}

ErrorCode FitBSpline(const FitSamples &samples, int32_t degree, ConstRealVector knots,
                     RealVector coefficients, const FitOutput &out) {
    const int32_t n = samples.n(), stride = degree + 2;
    if (!(samples.x[0] < samples.x[n - 1]))
        return ErrPolynomialOrderTooHigh;
    RealMatrix elements;
    DBL *rows;
    ScratchParts memory;
    const auto count = static_cast<int32_t>(coefficients.size());
    if (const ErrorCode failed =
            memory.take(Sized(elements, count, stride), Sized(rows, kSplineRows * stride)))
        return failed;
    const BandedTriangle triangle(elements);
    const double scale = ScaleOfWeights(samples);
    SpanSamples run;
    for (Spans spans(samples, knots, degree); spans.next(&run);)
        ReduceSpan(&run, knots.data() + spans.span(), degree, scale,
                   triangle.row(spans.span() - degree), rows);
    if (!triangle.hasFullRank())
        return ErrPolynomialOrderTooHigh;
    triangle.solve(coefficients);

    double squares[4] = {};
    for (Spans spans(samples, knots, degree); spans.next(&run);)
        EvaluateSpan(&run, knots.data() + spans.span(), degree,
                     coefficients.data() + spans.span() - degree, out.values.data() + spans.first(),
                     squares);
    *out.mse = ((squares[0] + squares[1]) + (squares[2] + squares[3])) / n;
    return 0;
}

} // namespace qx

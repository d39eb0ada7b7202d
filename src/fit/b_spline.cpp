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
    BandedTriangle(DBL *elements, int32_t order, int32_t band)
        : elements_(elements), order_(order), band_(band) {
        Fill(row(0), std::ptrdiff_t{order} * (band + 1), 0.0);
    }
    // Element (i, i + j), j < band; at j = band the target.
    DBL *row(int32_t i) const { return elements_ + std::ptrdiff_t{i} * (band_ + 1); }
    // No diagonal element is negligible beside its column.
    bool hasFullRank() const;
    void solve(DBL *x) const;

private:
    DBL *elements_;
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

void BandedTriangle::solve(DBL *x) const {
    for (int32_t i = order_ - 1; i >= 0; --i) {
        const DBL *const r = row(i);
        double rest = r[band_];
        for (int32_t j = 1; j < band_ && j < order_ - i; ++j)
            rest -= r[j] * x[i + j];
        x[i] = rest / r[0];
    }
}

// The samples, which ascend, in runs within one span; the last x belongs to the last span that has
// a length.
class Spans {
public:
    Spans(const SpanSamples &all, const DBL *knots, int32_t degree, int32_t count)
        : all_(all), knots_(knots), span_(degree), last_(count - 1) {
        while (last_ > degree && !(knots[last_] < knots[last_ + 1]))
            --last_;
    }
    // The next run, of at most kSplineRows samples; false behind the last one.
    bool next(SpanSamples *run) {
        first_ += count_;
        if (first_ >= all_.count)
            return false;
        while (span_ < last_ && !(all_.x[first_] < knots_[span_ + 1]))
            ++span_;
        const int32_t most = std::min(kSplineRows, all_.count - first_);
        const DBL *const x = all_.x + first_;
        count_ = span_ == last_ ? most : 1;
        while (count_ < most && x[count_] < knots_[span_ + 1])
            ++count_;
        *run = {x, all_.y + first_, all_.w == nullptr ? nullptr : all_.w + first_, count_};
        return true;
    }
    int32_t first() const { return first_; }
    int32_t span() const { return span_; }

private:
    const SpanSamples all_;
    const DBL *knots_;
    int32_t span_, last_, first_ = 0, count_ = 0;
};

// A power of two near 1 / sqrt(largest |w|), with which no square of a row leaves the range.
double ScaleOfWeights(const DBL *w, int32_t n) {
    const double largest = w == nullptr ? 1.0 : LargestWeight(w, n);
    int exponent;
    std::frexp(largest == 0.0 ? 1.0 : std::sqrt(largest), &exponent);
    return std::ldexp(1.0, -exponent);
}

} // namespace

void MakeKnots(const DBL *x, int32_t n, int32_t degree, int32_t interior, const DBL *given,
               DBL *knots) {
    Fill(knots, degree + 1, x[0]);
    DBL *const inner = knots + degree + 1;
    for (int32_t i = 0; i < interior; ++i) {
        if (given != nullptr) {
            inner[i] = given[i];
            continue;
        }
        const double position = (i + 1.0) * (n - 1.0) / (interior + 1.0);
        const auto below = std::min(static_cast<int32_t>(position), n - 2);
        const double share = position - below, low = x[below], high = x[below + 1];
        inner[i] = std::min(low + share * (high - low), high);
    }
    Fill(inner + interior, degree + 1, x[n - 1]);
}

ErrorCode FitBSpline(const DBL *x, const DBL *y, const DBL *w, int32_t n, int32_t degree,
                     const DBL *knots, int32_t count, DBL *coefficients, DBL *values, DBL *mse) {
    if (!(x[0] < x[n - 1]))
        return ErrPolynomialOrderTooHigh;
    const int32_t stride = degree + 2;
    DBL *elements, *rows;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(elements, int64_t{count} * stride),
                                             Sized(rows, kSplineRows * stride)))
        return failed;
    const BandedTriangle triangle(elements, count, degree + 1);
    const SpanSamples all = {x, y, w, n};
    const double scale = ScaleOfWeights(w, n);
    SpanSamples run;
    for (Spans spans(all, knots, degree, count); spans.next(&run);)
        ReduceSpan(&run, knots + spans.span(), degree, scale, triangle.row(spans.span() - degree),
                   rows);
    if (!triangle.hasFullRank())
        return ErrPolynomialOrderTooHigh;
    triangle.solve(coefficients);

    double squares[4] = {};
    for (Spans spans(all, knots, degree, count); spans.next(&run);)
        EvaluateSpan(&run, knots + spans.span(), degree, coefficients + spans.span() - degree,
                     values + spans.first(), squares);
    *mse = ((squares[0] + squares[1]) + (squares[2] + squares[3])) / n;
    return 0;
}

} // namespace qx

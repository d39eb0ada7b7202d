#include "fit/b_spline.h"

#include "fit/banded_triangle.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// The degree + 1 splines that are not 0 in the span knots[span] to knots[span + 1], by the
// recurrence of M. G. Cox and C. de Boor (1972).
void BasisAt(double x, const DBL *knots, int32_t span, int32_t degree, DBL *basis) {
    double left[BandedTriangle::widest], right[BandedTriangle::widest];
    basis[0] = 1.0;
    for (int32_t j = 1; j <= degree; ++j) {
        left[j] = x - knots[span + 1 - j];
        right[j] = knots[span + j] - x;
        double carried = 0.0;
        for (int32_t r = 0; r < j; ++r) {
            const double share = basis[r] / (right[r + 1] + left[j - r]);
            basis[r] = carried + right[r + 1] * share;
            carried = left[j - r] * share;
        }
        basis[j] = carried;
    }
}

// The span of each x in turn, which ascend; the last x belongs to the last span that has a length.
class Spans {
public:
    Spans(const DBL *knots, int32_t degree, int32_t count)
        : knots_(knots), span_(degree), last_(count - 1) {
        while (last_ > degree && !(knots[last_] < knots[last_ + 1]))
            --last_;
    }
    int32_t of(double x) {
        while (span_ < last_ && !(x < knots_[span_ + 1]))
            ++span_;
        return span_;
    }

private:
    const DBL *knots_;
    int32_t span_, last_;
};

} // namespace

void MakeKnots(const DBL *x, int32_t n, int32_t degree, int32_t interior, const DBL *given,
               DBL *knots) {
    std::fill(knots, knots + degree + 1, x[0]);
    DBL *const inner = knots + degree + 1;
    for (int32_t i = 0; i < interior; ++i) {
        if (given != nullptr) {
            inner[i] = given[i];
            continue;
        }
        const double position = (i + 1.0) * (n - 1.0) / (interior + 1.0);
        const auto below = std::min(static_cast<int32_t>(position), n - 2);
        const double share = position - below;
        inner[i] = x[below] * (1.0 - share) + x[below + 1] * share;
    }
    std::fill(inner + interior, inner + interior + degree + 1, x[n - 1]);
}

ErrorCode FitBSpline(const DBL *x, const DBL *y, const DBL *w, int32_t n, int32_t degree,
                     const DBL *knots, int32_t count, DBL *coefficients, DBL *values, DBL *mse) {
    if (!(x[0] < x[n - 1]))
        return ErrPolynomialOrderTooHigh;
    BandedTriangle triangle;
    if (const ErrorCode failed = triangle.make(count, degree + 1))
        return failed;
    triangle.clear();
    double basis[BandedTriangle::widest];
    Spans rows(knots, degree, count);
    for (int32_t i = 0; i < n; ++i) {
        const int32_t span = rows.of(x[i]);
        BasisAt(x[i], knots, span, degree, basis);
        const double root = w == nullptr ? 1.0 : std::sqrt(std::fabs(w[i]));
        for (int32_t j = 0; j <= degree; ++j)
            basis[j] *= root;
        triangle.add(span - degree, basis, y[i] * root);
    }
    if (!triangle.hasFullRank())
        return ErrPolynomialOrderTooHigh;
    triangle.solve(coefficients);

    double squares = 0.0;
    Spans spans(knots, degree, count);
    for (int32_t i = 0; i < n; ++i) {
        const int32_t span = spans.of(x[i]);
        BasisAt(x[i], knots, span, degree, basis);
        double value = 0.0;
        for (int32_t j = 0; j <= degree; ++j)
            value += basis[j] * coefficients[span - degree + j];
        const double rest = y[i] - value;
        squares += (w == nullptr ? 1.0 : std::fabs(w[i])) * (rest * rest);
        values[i] = value;
    }
    *mse = squares / n;
    return 0;
}

} // namespace qx

#include "fit/smoothing_spline.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {

ErrorCode SmoothingSpline::make(const DBL *x, const DBL *y, const DBL *d, int32_t n) {
    x_ = x;
    y_ = y;
    d_ = d;
    n_ = n;
    unitOfX_ = (x[n - 1] - x[0]) / (n - 1);
    unitOfD_ = d == nullptr ? 1.0 : *std::max_element(d, d + n);
    if (const ErrorCode failed = v_.allocate(n - 2))
        return failed;
    return triangle_.make(n - 2, 3);
}

// Row i of D Q: its elements in the columns i - 2, i - 1 and i, 0 where there is no column.
void SmoothingSpline::differences(int32_t i, DBL *q) const {
    const double d = deviation(i);
    q[0] = i > 1 ? d / spacing(i - 1) : 0.0;
    q[1] = i > 0 && i < n_ - 1 ? -d * (1.0 / spacing(i - 1) + 1.0 / spacing(i)) : 0.0;
    q[2] = i < n_ - 2 ? d / spacing(i) : 0.0;
}

// The triangle of [alpha D Q; beta L'] with (beta / alpha)^2 = 1 / lambda and the larger one 1; an
// alpha of 0 is the interpolating spline.
void SmoothingSpline::factor(double lambda) {
    const int32_t m = n_ - 2;
    const double root = std::sqrt(lambda);
    const double beta = root > 1.0 ? 1.0 / root : 1.0;
    alpha_ = root > 1.0 ? 1.0 : root;
    triangle_.clear();
    double carried = 0.0; // the element of L below the last diagonal one
    for (int32_t i = 0; i < n_; ++i) {
        double q[3], moved[3] = {};
        differences(i, q);
        const int32_t first = std::max(0, i - 2), skipped = first - (i - 2);
        for (int32_t j = skipped; j < 3; ++j)
            moved[j - skipped] = alpha_ * q[j];
        if (alpha_ != 0.0)
            triangle_.add(first, moved, alpha_ * y_[i] / deviation(i));
        if (i < 2)
            continue;
        const int32_t j = i - 2;
        const double diagonal = std::sqrt((spacing(j) + spacing(j + 1)) / 3.0 - carried * carried);
        carried = j + 1 < m ? spacing(j + 1) / 6.0 / diagonal : 0.0;
        const double row[3] = {beta * diagonal, beta * carried, 0.0};
        triangle_.add(j, row, 0.0);
    }
}

// values = y - D^2 Q v; returns the sum of ((y - values) / d)^2 in units of d.
double SmoothingSpline::residuals(DBL *values) {
    double squares = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        double q[3], u = 0.0;
        differences(i, q);
        for (int32_t j = 0; j < 3; ++j)
            u += q[j] == 0.0 ? 0.0 : q[j] * v_[i - 2 + j];
        squares += u * u;
        values[i] = y_[i] - deviation(i) * u;
    }
    return squares;
}

double SmoothingSpline::solve(double lambda, DBL *values) {
    factor(lambda);
    triangle_.solve(v_.data());
    return residuals(values);
}

// The trace of I - A = alpha^2 D Q S Q' D with S the inverse of the triangle's square. S is walked
// from its end; s00 is its element (j, j), s12 (j + 1, j + 2), and so on. Sample j + 2 is complete
// with column j.
double SmoothingSpline::traceOfRest() const {
    double trace = 0.0;
    double s11 = 0.0, s12 = 0.0, s22 = 0.0;
    for (int32_t j = n_ - 3; j >= -2; --j) {
        double s00 = 0.0, s01 = 0.0, s02 = 0.0;
        if (j >= 0) {
            const DBL *const r = triangle_.row(j);
            const double a = r[1] / r[0], b = r[2] / r[0];
            s02 = -(a * s12 + b * s22);
            s01 = -(a * s11 + b * s12);
            s00 = 1.0 / (r[0] * r[0]) - (a * s01 + b * s02);
        }
        double q[3];
        differences(j + 2, q);
        const double form = q[0] * (q[0] * s00 + 2.0 * (q[1] * s01 + q[2] * s02)) +
                            q[1] * (q[1] * s11 + 2.0 * q[2] * s12) + q[2] * q[2] * s22;
        trace += form;
        s22 = s11;
        s12 = s01;
        s11 = s00;
    }
    return alpha_ * alpha_ * trace;
}

// The score of generalised cross validation (P. Craven, G. Wahba, Smoothing noisy data with spline
// functions, 1979), less a factor of n.
double SmoothingSpline::score(double logLambda, DBL *values) {
    const double squares = solve(std::exp(logLambda), values);
    const double rest = traceOfRest();
    return squares / (rest * rest);
}

// The weighted line, with x and y about their weighted means.
void SmoothingSpline::line(DBL *values, double *squares) const {
    double sum = 0.0, meanX = 0.0, meanY = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        const double weight = 1.0 / (deviation(i) * deviation(i));
        sum += weight;
        meanX += ((x_[i] - x_[0]) / unitOfX_ - meanX) * (weight / sum);
        meanY += (y_[i] - meanY) * (weight / sum);
    }
    double xx = 0.0, xy = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        const double weight = 1.0 / (deviation(i) * deviation(i));
        const double x = (x_[i] - x_[0]) / unitOfX_ - meanX;
        xx += weight * x * x;
        xy += weight * x * (y_[i] - meanY);
    }
    const double slope = xy / xx;
    *squares = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        values[i] = meanY + slope * ((x_[i] - x_[0]) / unitOfX_ - meanX);
        const double u = (y_[i] - values[i]) / deviation(i);
        *squares += u * u;
    }
}

// The spline through the samples: L L' s'' = Q' y, with L' in the triangle.
void SmoothingSpline::interpolate(DBL *second) {
    const int32_t m = n_ - 2;
    factor(0.0);
    double before = 0.0;
    for (int32_t j = 0; j < m; ++j) {
        const double right =
            (y_[j + 2] - y_[j + 1]) / spacing(j + 1) - (y_[j + 1] - y_[j]) / spacing(j);
        DBL *const r = triangle_.row(j);
        before = r[3] = (right - (j > 0 ? triangle_.row(j - 1)[1] * before : 0.0)) / r[0];
    }
    triangle_.solve(second);
}

// A walk by factors of 10 from where the spline follows each sample to where it is nearly the line,
// then the golden section about the lowest score; infinite where no score is below the line's.
double SmoothingSpline::crossValidated(DBL *values) {
    constexpr double golden = 0x1.3c6ef372fe95p-1, decade = 0x1.26bb1bbb55516p+1;
    const auto decades = static_cast<int32_t>(4.0 * std::log10(n_)) + 2;
    double lineSquares;
    line(values, &lineSquares);
    double best = kInfinity, bestAt = 0.0;
    for (int32_t i = -6; i <= decades; ++i) {
        const double found = score(i * decade, values);
        if (found < best) {
            best = found;
            bestAt = i * decade;
        }
    }
    double low = bestAt - decade, high = bestAt + decade;
    double left = high - golden * (high - low), right = low + golden * (high - low);
    double atLeft = score(left, values), atRight = score(right, values);
    while (high - low > 1e-5) {
        if (atLeft <= atRight) {
            high = right;
            right = left;
            atRight = atLeft;
            left = high - golden * (high - low);
            atLeft = score(left, values);
        } else {
            low = left;
            left = right;
            atLeft = atRight;
            right = low + golden * (high - low);
            atRight = score(right, values);
        }
    }
    const double freedom = n_ - 2.0;
    const bool isLine = !(std::min(atLeft, atRight) < lineSquares / (freedom * freedom));
    return isLine ? kInfinity : std::exp((low + high) / 2);
}

// The lambda at which the squares are `wanted`, by bisection of its logarithm between values that
// enclose it; 0 where that is beyond the numbers.
double SmoothingSpline::within(double wanted, DBL *values) {
    double lineSquares;
    line(values, &lineSquares);
    if (wanted >= lineSquares)
        return kInfinity;
    constexpr double step = 7.0, furthest = 600.0;
    double low = 0.0, high = 0.0;
    while (low > -furthest && solve(std::exp(low), values) > wanted) {
        high = low;
        low -= step;
    }
    while (high < furthest && (high <= low || solve(std::exp(high), values) <= wanted)) {
        low = high > low ? high : low;
        high = std::max(high, low) + step;
    }
    if (wanted == 0.0 || low <= -furthest)
        return 0.0;
    while (high - low > 1e-13 * (1.0 + std::fabs(low))) {
        const double middle = 0.5 * (low + high);
        (solve(std::exp(middle), values) <= wanted ? low : high) = middle;
    }
    return std::exp(low);
}

void SmoothingSpline::fit(Smoothing method, double parameter, DBL *values, DBL *second, DBL *lambda,
                          DBL *effective) {
    const double unit = unitOfD_ * unitOfD_ / (unitOfX_ * unitOfX_ * unitOfX_);
    double inside = parameter * unit;
    if (method == Smoothing::CrossValidated)
        inside = crossValidated(values);
    else if (method == Smoothing::WithinSquares)
        inside = parameter == 0.0 ? 0.0 : within(parameter * unitOfD_ * unitOfD_, values);
    *lambda = method == Smoothing::Given ? parameter : inside / unit;
    std::fill(second, second + n_, 0.0);
    if (inside == kInfinity) {
        double squares;
        line(values, &squares);
        *lambda = kInfinity;
        *effective = 2.0;
        return;
    }
    if (inside < 1e-280) {
        interpolate(second + 1);
        std::copy(y_, y_ + n_, values);
        *effective = n_;
    } else {
        solve(inside, values);
        *effective = n_ - traceOfRest();
        for (int32_t j = 0; j < n_ - 2; ++j)
            second[j + 1] = v_[j] / inside;
    }
    for (int32_t j = 1; j < n_ - 1; ++j)
        second[j] = second[j] / unitOfX_ / unitOfX_;
}

} // namespace qx

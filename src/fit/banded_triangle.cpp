#include "fit/banded_triangle.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {

void BandedTriangle::clear() const {
    std::fill(row(0), row(0) + std::ptrdiff_t{order_} * (band_ + 1), 0.0);
}

void BandedTriangle::add(int32_t first, const DBL *values, double target) const {
    // The row's elements from the column in work on; each rotation fills one more at its end.
    double rest[widest];
    std::copy(values, values + band_, rest);
    for (int32_t column = first; column < order_; ++column) {
        DBL *const r = row(column);
        const double b = rest[0];
        if (b != 0.0) {
            const double length = std::sqrt(r[0] * r[0] + b * b), inverse = 1.0 / length;
            const double c = r[0] * inverse, s = b * inverse;
            const bool isNew = r[0] == 0.0;
            r[0] = length;
            for (int32_t j = 1; j < band_; ++j) {
                const double above = r[j];
                r[j] = c * above + s * rest[j];
                rest[j] = c * rest[j] - s * above;
            }
            const double above = r[band_];
            r[band_] = c * above + s * target;
            target = c * target - s * above;
            if (isNew)
                return; // the row has become that of the triangle
        }
        std::copy(rest + 1, rest + band_, rest);
        rest[band_ - 1] = 0.0;
        if (std::all_of(rest, rest + band_, [](double v) { return v == 0.0; }))
            return;
    }
}

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

} // namespace qx

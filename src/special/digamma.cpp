#include "special/digamma.h"

#include "frame/constants.h"
#include "special/gamma.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kSeriesFrom = 10;
constexpr double kLogarithmFrom = 1e9; // above it the series is negligible

// Bernoulli numbers B_14 ... B_2, each divided by its index.
constexpr double kSeries[] = {1.0 / 12,  -691.0 / 32760, 1.0 / 132, -1.0 / 240,
                              1.0 / 252, -1.0 / 120,     1.0 / 12};

// pi / tan(pi x); the fraction of x is exact, and the tangent has period 1.
double PiCotangent(double x) { return kPi / std::tan(kPi * (x - std::round(x))); }

double OfPositive(double x) {
    if (x <= kSeriesFrom && std::floor(x) == x) {
        double sum = 0;
        for (int k = 1; k < static_cast<int>(x); ++k)
            sum += 1.0 / k;
        return sum - kEuler;
    }
    double w = 0;
    while (x < kSeriesFrom) {
        w += 1 / x;
        x += 1;
    }
    double y = 0;
    if (x < kLogarithmFrom) {
        const double z = 1 / (x * x);
        y = z * PolyEval(z, kSeries, 6);
    }
    return std::log(x) - 0.5 / x - y - w;
}

} // namespace

double Digamma(double x) {
    if (std::isnan(x) || x == -kInfinity)
        return kNaN;
    if (x == kInfinity)
        return kInfinity;
    if (x > 0)
        return OfPositive(x);
    if (std::floor(x) == x)
        return kInfinity;
    return OfPositive(1 - x) - PiCotangent(x);
}

} // namespace qx

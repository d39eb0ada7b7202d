#include "special/struve.h"

#include "frame/constants.h"
#include "special/bessel_real.h"
#include "special/extended.h"
#include "special/reciprocal_gamma.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kStop = 1.8046660579423136e-14;
constexpr double kMostTerms = 200;
constexpr double kLargestTerm = 1e35;
constexpr double kUnusable = 1e38;
constexpr double kPairEps = 1e-31; // eps of sums in two doubles

struct Estimate {
    double sum;
    double error;
};

// Estimates the error of a sum from its last and its largest term.
Estimate Judge(double sum, double last, double largest, double eps) {
    const double size = std::fabs(sum);
    return {sum, std::fmax(std::fabs(last) / size, largest * eps / size)};
}

Estimate Struve1F2(double x, double v) {
    const Extended square = ExactProduct(x, x);
    const Extended q = {-0.25 * square.high, -0.25 * square.low};
    Extended term = {1, 0};
    Extended sum = term;
    double largest = 1;
    double last = 1;
    for (double k = 0; k < kMostTerms && largest < kLargestTerm; k += 1) {
        const Extended divisor = Extended{k + 1.5, 0} * (ExactSum(v, k) + Extended{1.5, 0});
        term = term * q / divisor;
        sum = sum + term;
        last = std::fabs(term.high);
        largest = std::fmax(largest, last);
        // kStop itself would leave out the last digits, so terms are added down to a hundredth of
        // it
        if (last <= 0.01 * kStop * std::fabs(sum.high) &&
            std::fabs(q.high) < std::fabs(divisor.high))
            return {sum.high, Judge(sum.high, 0.0, largest, kPairEps).error};
    }
    return Judge(sum.high, last, largest, kPairEps);
}

Estimate Struve3F0(double x, double v) {
    double term = 1;
    double sum = 1;
    double largest = 1;
    double last = 1;
    bool hasFallen = false;
    for (double k = 0; k < kMostTerms && largest < kLargestTerm; k += 1) {
        const double next = term * ((k + 0.5) * (0.5 - v + k)) * (-4 / x / x);
        const double size = std::fabs(next);
        if (hasFallen && size > last) // divergent from here on
            break;
        hasFallen = hasFallen || size < last;
        term = next;
        sum += term;
        last = size;
        largest = std::fmax(largest, last);
        if (last <= 0.01 * kStop * std::fabs(sum))
            break;
    }
    return Judge(sum, last, largest, kEpsilon);
}

// (x/2)^v / gamma(v + 1/2 + shift), shift 0 or 1, without overflow for large v.
double Factor(double x, double v, double shift) {
    const double half = 0.5 * x;
    if (v < 1)
        return std::pow(half, v) * ReciprocalGamma(v + 0.5 + shift);
    return PowerOverGamma(half, v - 0.5 + shift) *
           (shift == 0 ? std::sqrt(half) : 1 / std::sqrt(half));
}

// The ascending series, given its sum.
double Ascending(double sum, double x, double v) {
    const double value = sum * (0.5 * x / kHalfRootPi) * Factor(x, v, 1);
    if (!std::isinf(value) || v >= 1)
        return value;
    const double root = std::pow(0.5 * x, 0.5 * (v + 1)); // the power alone may overflow
    return (sum / kHalfRootPi * root) * (root * ReciprocalGamma(v + 1.5));
}

} // namespace

double Struve(double x, double v) {
    if (!std::isfinite(x) || !std::isfinite(v) || (x < 0 && !IsInteger(v)))
        return kNaN;
    if (x == 0)
        return v < 0 ? kNaN : 0;
    if (x < 0)
        return IsOdd(v) ? Struve(-x, v) : -Struve(-x, v);
    if (v < 0 && v - std::floor(v) == 0.5) {
        const double value = BesselJ(-v, x);
        return IsOdd(-v - 0.5) ? -value : value;
    }

    const bool ascends = x <= 30 || x <= 1.5 * std::fabs(v);
    const Estimate first = ascends ? Struve1F2(x, v) : Estimate{0, kUnusable};
    const bool certain = first.error < 0.25 * kEpsilon; // the other candidate cannot be better
    const Estimate second = x >= 18 && !certain ? Struve3F0(x, v) : Estimate{0, kUnusable};
    if (ascends && !(first.error > second.error))
        return Ascending(first.sum, x, v);
    return second.sum * (Factor(x, v, 0) / (0.5 * x)) / kRootPi + BesselY(v, x);
}

} // namespace qx

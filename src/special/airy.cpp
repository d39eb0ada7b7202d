#include "special/airy.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/tables/airy.h"

#include <cmath>
#include <limits>

namespace qx {

namespace {

constexpr double kOverflow = 103.892;
constexpr double kSeriesLimit = 2.09;
constexpr double kGrowthFrom = 8.3203353;
constexpr double kFar = 0.02; // bound of 1 / zeta^2

// 2/3 x sqrt(x) in two doubles.
Extended Zeta(double x) {
    constexpr Extended twoThirds = {0.6666666666666666, 3.700743415417188e-17};
    return twoThirds * (Extended{x, 0} * SquareRoot({x, 0}));
}

// exp of a pair.
double Exp(Extended x) {
    const double e = std::exp(x.high);
    return e + e * x.low;
}

AiryValues Oscillating(double x) {
    const double a = -x;
    const Extended zeta = Zeta(a);
    if (!std::isfinite(zeta.high) || std::isnan(zeta.low)) // the phase has no digits left
        return {0, 0, 0, 0};
    const double z = 1 / (zeta.high * zeta.high);
    const bool far = z < kFar;
    const double f = far ? table::airyWaveFFar(z) : table::airyWaveFMid(z);
    const double g = (far ? table::airyWaveGFar(z) : table::airyWaveGMid(z)) / zeta.high;
    const double fp = far ? table::airypWaveFFar(z) : table::airypWaveFMid(z);
    const double gp = (far ? table::airypWaveGFar(z) : table::airypWaveGMid(z)) / zeta.high;
    // sine and cosine of zeta + pi / 4 without forming the sum: s and c are sqrt(2) times too large
    const double s0 = std::sin(zeta.high);
    const double c0 = std::cos(zeta.high);
    const double sine = s0 + c0 * zeta.low;
    const double cosine = c0 - s0 * zeta.low;
    const double s = sine + cosine;
    const double c = cosine - sine;
    const double root = std::sqrt(std::sqrt(a));
    return {
        kInverseRootTwoPi / root * (s * f - c * g), -kInverseRootTwoPi * root * (c * fp + s * gp),
        kInverseRootTwoPi / root * (c * f + s * g), kInverseRootTwoPi * root * (s * fp - c * gp)};
}

// The two Maclaurin series and their derivatives; Ai = c1 f - c2 g, Bi = sqrt(3) (c1 f + c2 g).
AiryValues Series(double x) {
    constexpr double c1 = 0.3550280538878172;
    constexpr double c2 = 0.2588194037928068;
    constexpr double eps = 1.1102230246251565e-16;
    const double cube = x * x * x;
    double f = 1;
    double g = x;
    double fp = 0;
    double gp = 1;
    double termF = 1;
    double termG = x;
    for (int k = 1; k < 100; ++k) { // 40 terms suffice for the largest argument
        const double n = 3 * k;
        const double slopeF = termF * (x * x) / (n - 1);
        const double slopeG = termG * (x * x) / n;
        termF *= cube / (n * (n - 1));
        termG *= cube / (n * (n + 1));
        f += termF;
        g += termG;
        fp += slopeF;
        gp += slopeG;
        if (std::fabs(slopeF) <= eps * std::fabs(fp) && std::fabs(slopeG) <= eps * std::fabs(gp) &&
            std::fabs(termF) <= eps * std::fabs(f) && std::fabs(termG) <= eps * std::fabs(g))
            break;
    }
    return {c1 * f - c2 * g, c1 * fp - c2 * gp, kRootThree * (c1 * f + c2 * g),
            kRootThree * (c1 * fp + c2 * gp)};
}

// Ai and Ai' by the series in two doubles: their two parts cancel as x grows.
void CarefulDecay(double x, AiryValues *values) {
    constexpr Extended c1 = {0.3550280538878172, 2.05233632436212e-17};
    constexpr Extended c2 = {0.2588194037928068, -2.522243111610832e-17};
    const Extended square = ExactProduct(x, x);
    const Extended cube = square * Extended{x, 0};
    Extended f = {1, 0};
    Extended g = {x, 0};
    Extended fp = {0, 0};
    Extended gp = {1, 0};
    Extended termF = f;
    Extended termG = g;
    for (int k = 1; k < 100; ++k) {
        const double n = 3 * k;
        fp = fp + termF * square / Extended{n - 1, 0};
        gp = gp + termG * square / Extended{n, 0};
        termF = termF * cube / Extended{n * (n - 1), 0};
        termG = termG * cube / Extended{n * (n + 1), 0};
        f = f + termF;
        g = g + termG;
        if (termF.high <= 1e-20 * f.high)
            break;
    }
    const Extended ai = c1 * f;
    const Extended aip = c1 * fp;
    const Extended lessAi = c2 * g;
    const Extended lessAip = c2 * gp;
    values->ai = (ai + Extended{-lessAi.high, -lessAi.low}).high;
    values->aip = (aip + Extended{-lessAip.high, -lessAip.low}).high;
}

} // namespace

AiryValues Airy(double x) {
    constexpr double largest = std::numeric_limits<double>::max();
    if (std::isnan(x))
        return {kNaN, kNaN, kNaN, kNaN};
    if (x > kOverflow)
        return {0, 0, largest, largest};
    if (x < -kSeriesLimit)
        return Oscillating(x);
    if (x <= kSeriesLimit) {
        AiryValues values = Series(x);
        if (x > 0.5)
            CarefulDecay(x, &values);
        return values;
    }

    const Extended zeta = Zeta(x);
    const double root = std::sqrt(std::sqrt(x));
    const double u = 1 / zeta.high;
    const double decay = Exp({-zeta.high, -zeta.low});
    AiryValues values = {};
    values.ai = kInverseRootPi * decay / (2 * root) * table::aiDecay(u);
    values.aip = -0.28209479177387814 * root * decay * table::aipDecay(u);
    if (x > kGrowthFrom) {
        const double growth = kInverseRootPi / decay;
        values.bi = growth / root * table::biGrowth(u);
        values.bip = growth * root * table::bipGrowth(u);
    } else {
        const AiryValues series = Series(x);
        values.bi = series.bi;
        values.bip = series.bip;
    }
    return values;
}

} // namespace qx

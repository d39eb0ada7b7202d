#include "stats/student_tail.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "special/direct_tails.h"
#include "special/tables/student.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kMostDegrees = 1e6;
constexpr double kNearest = 1e-100, kFarthest = 1e5;
constexpr double kCentralTo = 0.9;
constexpr double kLeastTail = 1e-278;

double DensityAtZero(double n) {
    constexpr double low = -0x1.cbc0d30ebfd15p-56; // of 1 / sqrt(2 pi), the part below its double
    const double lacking = n < 3.0    ? table::studentFirst(n)
                           : n < 10.0 ? table::studentSecond(n)
                           : n < 40.0 ? table::studentThird(n)
                                      : table::studentMany(1.0 / n) / n;
    return kInverseRootTwoPi + (low - kInverseRootTwoPi * lacking);
}

// (1 + t^2 / n)^(-power), with the base in twice the precision.
double PowerOfBase(const Extended &base, double power) {
    return std::pow(base.high, -power) * (1.0 - power * (base.low / base.high));
}

// 1 + (n + 1) / 3 y (1 + (n + 3) / 5 y (...)), up to the term that is below half a unit.
double CentralSeries(double n, double y) {
    double term = 1.0, rest = 0.0;
    for (double k = 1; term > 0.1 * kEpsilon; ++k) {
        term *= (n + 2.0 * k - 1.0) / (2.0 * k + 1.0) * y;
        rest += term;
    }
    return 1.0 + rest;
}

// F(1, 1/2; n / 2 + 1; -z).
double Fraction(double n, double z) {
    constexpr double digits = 37.0;
    const double c = 0.5 * n + 1.0;
    return BetaFraction(0.5, c, z, FractionLevels(c, z, digits));
}

} // namespace

StudentTail StudentTailAt(double t, double n) {
    StudentTail tail = {0.0, 0.0, t <= kCentralTo, false};
    if (!(n >= 1.0 && n <= kMostDegrees && t >= kNearest && t <= kFarthest))
        return tail;
    const double front = DensityAtZero(n);
    const Extended quotient = ExactProduct(t, t) / Extended{n, 0.0};
    const Extended base = ExactSum(1.0, quotient.high);
    const Extended whole = {base.high, base.low + quotient.low};
    if (tail.isCentral) {
        tail.isKnown = true;
        tail.density = front * PowerOfBase(whole, 0.5 * (n + 1.0));
        tail.part = t * tail.density * CentralSeries(n, quotient.high / whole.high);
        return tail;
    }
    const double power = front * PowerOfBase(whole, 0.5 * (n - 1.0));
    tail.density = power / whole.high;
    tail.isKnown = tail.density > kLeastTail;
    if (tail.isKnown)
        tail.part = power / t * Fraction(n, 1.0 / quotient.high);
    return tail;
}

namespace {

// Hill's start value, for the probability of both tails.
double HillsPoint(double both, double n, double normalPoint) {
    const double a = 1.0 / (n - 0.5);
    const double b = 48.0 / (a * a);
    double c = ((20700.0 * a / b - 98.0) * a - 16.0) * a + 96.36;
    const double d = ((94.5 / (b + c) - 3.0) / b + 1.0) * std::sqrt(a * kHalfPi) * n;
    double y = std::pow(d * both, 2.0 / n);
    if (y > 0.05 + a) {
        const double x = normalPoint;
        y = x * x;
        if (n < 5.0)
            c += 0.3 * (n - 4.5) * (x + 0.6);
        c += (((0.05 * d * x - 5.0) * x - 7.0) * x - 2.0) * x + b;
        y = (((((0.4 * y + 6.3) * y + 36.0) * y + 94.5) / c - y - 3.0) / b + 1.0) * x;
        y = std::expm1(a * y * y);
    } else {
        y = ((1.0 / (((n + 6.0) / (n * y) - 0.089 * d - 0.822) * (n + 2.0) * 3.0) +
              0.5 / (n + 4.0)) *
                 y -
             1.0) *
                (n + 1.0) / (n + 2.0) +
            1.0 / y;
    }
    return std::sqrt(n * y);
}

} // namespace

double StudentUpperPoint(double p, double n, double normalPoint) {
    double t = n < 1.5 ? 1.0 / std::tan(kPi * p) : HillsPoint(2.0 * p, n, normalPoint);
    const double central = 0.5 - p; // exact for p from 1/4 on
    for (int turn = 0; turn < 12; ++turn) {
        const StudentTail tail = StudentTailAt(t, n);
        if (!tail.isKnown)
            return kNaN;
        const double curvature = (n + 1.0) * t / (n + t * t); // -density' / density
        double step; // Newton's step, made third-order by the curvature
        if (tail.isCentral) {
            const double newton = (central - tail.part) / tail.density;
            step = newton / (1.0 - 0.5 * curvature * newton);
        } else { // for the logarithm of the tail
            const double hazard = tail.density / tail.part;
            const double newton = std::log(tail.part / p) / hazard;
            step = newton / (1.0 + 0.5 * (hazard - curvature) * newton);
        }
        const double next = t + step;
        if (!(next > 0.0))
            return kNaN;
        const bool isClose = std::fabs(step) < 1e-6 * t;
        t = next;
        if (isClose)
            return t;
    }
    return kNaN;
}

} // namespace qx

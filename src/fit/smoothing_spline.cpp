#include "fit/smoothing_spline.h"

#include "fit/weights.h"
#include "frame/constants.h"

#include <algorithm>
#include <cmath>

namespace qx {

// What the forward pass leaves of the interval from sample i to i + 1 for the backward pass: with
// the value g and the slope s at i + 1,
//     u1 = t1 - a1 g - a2 s + noise of variance v1,
//     u2 = t2 - q u1 - b1 g - b2 s + noise of variance v2,
// and the value at i is g - h s + h/2 u1 + h/sqrt(12) u2, the slope there s - u1.
// The mean of s'' is u1 / h, and half of its growth is sqrt(3) u2 / h.
struct SmoothingSpline::Step {
    DBL t1, a1, a2, v1;
    DBL t2, q, b1, b2, v2;
};

// (r11 r12; r21 r22) (g, s) = (z1, z2), where r21 differs from 0 only between a step and its
// sample.
struct SmoothingSpline::Triangle {
    double r11, r12, r21, r22, z1, z2;

    void takeStep(double h, double gamma, Step *step);
    void takeSample(double weight, double y);
};

// The variances of g and s and their covariance.
struct SmoothingSpline::Covariance {
    double gg, gs, ss;

    explicit Covariance(const Triangle &r);
    void stepBack(double h, const Step &step);
};

namespace {

constexpr double rootOf3 = 0x1.bb67ae8584caap+0, rootOf12 = 0x1.bb67ae8584caap+1;

// Rotates b into a: (a, b) becomes (length, 0).
struct Turn {
    double c = 1.0, s = 0.0;
    Turn(double *a, double b) {
        if (b == 0.0)
            return;
        const double length = std::sqrt(*a * *a + b * b), inverse = 1.0 / length;
        c = *a * inverse;
        s = b * inverse;
        *a = length;
    }
    void apply(double *a, double *b) const {
        const double before = *a;
        *a = c * before + s * *b;
        *b = c * *b - s * before;
    }
};

// The zero of an increasing f that is above 0 at high and not at low: the last x found with f not
// above 0, to 1e-13 relative to x or 1 (T. R. Chandrupatla, A new hybrid quadratic/bisection
// algorithm for finding the zero of a nonlinear function without using derivatives, 1997).
template <class Function>
double LastNotAbove(const Function &f, double low, double atLow, double high, double atHigh) {
    double newest = low, atNewest = atLow, other = high, atOther = atHigh, share = 0.5;
    for (;;) {
        const double x = newest + share * (other - newest), at = f(x);
        double third = newest, atThird = atNewest;
        if ((at > 0.0) != (atNewest > 0.0)) {
            third = other;
            atThird = atOther;
            other = newest;
            atOther = atNewest;
        }
        newest = x;
        atNewest = at;
        const double width = std::fabs(other - newest), tolerance = 1e-13 * (1.0 + std::fabs(x));
        if (!(width > tolerance))
            return atNewest > 0.0 ? other : newest;
        const double xi = (newest - other) / (third - other);
        const double phi = (atNewest - atOther) / (atThird - atOther);
        share = 0.5;
        if (phi * phi < xi && (1.0 - phi) * (1.0 - phi) < 1.0 - xi)
            share = atNewest / (atOther - atNewest) * (atThird / (atOther - atThird)) +
                    (third - newest) / (other - newest) * (atNewest / (atThird - atNewest)) *
                        (atOther / (atThird - atOther));
        const double least = 0.5 * tolerance / width;
        share = std::min(std::max(share, least), 1.0 - least);
    }
}

} // namespace

ErrorCode SmoothingSpline::make(ConstRealVector x, ConstRealVector y, ConstRealVector d) {
    const auto n = static_cast<int32_t>(x.size());
    x_ = x;
    y_ = y;
    d_ = d;
    n_ = n;
    unitOfX_ = (x[n - 1] - x[0]) / (n - 1);
    unitOfD_ = d.isEmpty() ? 1.0 : LargestWeight(d.data(), n);
    if (const ErrorCode failed = memory_.take(Sized(rest_, n), Sized(steps_, int64_t{n} - 1)))
        return failed;
    takeOffLine();
    return 0;
}

// Fits the weighted line, with x and y relative to their weighted means, and subtracts it.
void SmoothingSpline::takeOffLine() {
    double sum = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        const double weight = 1.0 / (deviation(i) * deviation(i));
        sum += weight;
        meanX_ += ((x_[i] - x_[0]) / unitOfX_ - meanX_) * (weight / sum);
        meanY_ += (y_[i] - meanY_) * (weight / sum);
    }
    double xx = 0.0, xy = 0.0;
    for (int32_t i = 0; i < n_; ++i) {
        const double weight = 1.0 / (deviation(i) * deviation(i));
        const double x = (x_[i] - x_[0]) / unitOfX_ - meanX_;
        xx += weight * x * x;
        xy += weight * x * (y_[i] - meanY_);
    }
    slope_ = xy / xx;
    for (int32_t i = 0; i < n_; ++i) {
        rest_[i] = y_[i] - onLine(i);
        const double u = rest_[i] / deviation(i);
        lineSquares_ += u * u;
    }
}

// A row u / gamma = 0 is added to the triangle for each u, and its state is expressed by the u and
// the next state: rows (u1, u2 | g, s | z) of (e1, e2 | r11, r12 | z1) and (e3, 0 | 0, r22 | z2).
// Columns of u are in units of gamma.
void SmoothingSpline::Triangle::takeStep(double h, double gamma, Step *step) {
    double e1 = gamma * (0.5 * h * r11 - r12), e3 = -gamma * r22;
    const double e2 = gamma * (h / rootOf12) * r11;
    r12 -= h * r11;

    double length = 1.0;
    const Turn second(&length, e2);
    const double share = second.s / length;
    step->t2 = gamma * share * z1;
    step->q = share * e1;
    step->b1 = gamma * share * r11;
    step->b2 = gamma * share * r12;
    step->v2 = (gamma / length) * (gamma / length);
    for (double *const element : {&e1, &r11, &r12, &z1})
        *element *= second.c;

    double a1 = 0.0, a2 = 0.0, t1 = 0.0;
    length = 1.0;
    const Turn first(&length, e1);
    first.apply(&a1, &r11);
    first.apply(&a2, &r12);
    first.apply(&t1, &z1);
    const Turn third(&length, e3);
    third.apply(&a1, &r21);
    third.apply(&a2, &r22);
    third.apply(&t1, &z2);
    const double scale = gamma / length;
    step->t1 = scale * t1;
    step->a1 = scale * a1;
    step->a2 = scale * a2;
    step->v1 = scale * scale;
}

// The row weight g = weight y is added and reduced, so that the matrix is triangular again.
void SmoothingSpline::Triangle::takeSample(double weight, double y) {
    double fill = 0.0, rest = weight * y;
    const Turn sample(&r11, weight);
    sample.apply(&r12, &fill);
    sample.apply(&z1, &rest);
    const Turn below(&r11, r21);
    below.apply(&r12, &r22);
    below.apply(&z1, &z2);
    const Turn corner(&r22, fill);
    corner.apply(&z2, &rest);
    r21 = 0.0;
}

// Returns the triangle of the last sample.
SmoothingSpline::Triangle SmoothingSpline::forwards(double lambda) {
    const double rootOfLambda = std::sqrt(lambda);
    Triangle triangle = {1.0 / deviation(0), 0.0, 0.0, 0.0, rest_[0] / deviation(0), 0.0};
    for (int32_t i = 0; i < n_ - 1; ++i) {
        const double h = spacing(i);
        triangle.takeStep(h, std::sqrt(h) / rootOfLambda, &steps_[i]);
        triangle.takeSample(1.0 / deviation(i + 1), rest_[i + 1]);
    }
    return triangle;
}

SmoothingSpline::Covariance::Covariance(const Triangle &r) {
    ss = 1.0 / (r.r22 * r.r22);
    gs = -r.r12 / r.r11 * ss;
    gg = 1.0 / (r.r11 * r.r11) - r.r12 / r.r11 * gs;
}

// The previous state is F (g, s) plus noise, by the formulas of Step.
void SmoothingSpline::Covariance::stepBack(double h, const Step &step) {
    const double k = h / rootOf12, m = 0.5 * h - k * step.q;
    const double f11 = 1.0 - k * step.b1 - m * step.a1, f12 = -(h + k * step.b2 + m * step.a2);
    const double f21 = step.a1, f22 = 1.0 + step.a2;
    const double g0 = f11 * gg + f12 * gs, g1 = f11 * gs + f12 * ss;
    const double s0 = f21 * gg + f22 * gs, s1 = f21 * gs + f22 * ss;
    gg = (f11 * g0 + f12 * g1) + (m * m * step.v1 + k * k * step.v2);
    gs = (f11 * s0 + f12 * s1) - m * step.v1;
    ss = (f21 * s0 + f22 * s1) + step.v1;
}

// second: in units of the mean spacing, 0 at both ends.
SmoothingSpline::Quality SmoothingSpline::backwards(const Triangle &last, RealVector values,
                                                    RealVector second) const {
    double s = last.z2 / last.r22, g = (last.z1 - last.r12 * s) / last.r11;
    Covariance variance(last);
    Quality quality = {0.0, 0.0};
    for (int32_t i = n_ - 1;; --i) {
        const double weight = 1.0 / deviation(i), u = weight * (rest_[i] - g);
        quality.squares += u * u;
        // The variance is at most that of the sample alone, but rounding errors raise it if weights
        // or steps differ by more than the available digits.
        quality.effective += std::min(1.0, weight * weight * variance.gg);
        values[i] = g;
        if (i == 0)
            break;
        const Step &step = steps_[i - 1];
        const double h = spacing(i - 1);
        const double u1 = step.t1 - step.a1 * g - step.a2 * s;
        const double u2 = step.t2 - step.q * u1 - step.b1 * g - step.b2 * s;
        second[i - 1] = (u1 - rootOf3 * u2) / h;
        g = g - h * s + (0.5 * h * u1 + h / rootOf12 * u2);
        s = s - u1;
        variance.stepBack(h, step);
    }
    second[0] = second[n_ - 1] = 0.0;
    return quality;
}

SmoothingSpline::Quality SmoothingSpline::solve(double lambda, RealVector values,
                                                RealVector second) {
    return backwards(forwards(lambda), values, second);
}

// The score of generalised cross validation (P. Craven, G. Wahba, Smoothing noisy data with spline
// functions, 1979), without its factor n.
double SmoothingSpline::score(double logLambda, RealVector values, RealVector second) {
    const Quality found = solve(std::exp(logLambda), values, second);
    const double rest = n_ - found.effective;
    return found.squares / (rest * rest);
}

// The spline through the samples: R s'' = Q' y, tridiagonal, by elimination.
void SmoothingSpline::interpolate(RealVector second) {
    const RealVector above = rest_;
    double before = 0.0, slope = (y_[1] - y_[0]) / spacing(0);
    above[0] = second[0] = 0.0;
    for (int32_t i = 1; i < n_ - 1; ++i) {
        const double h = spacing(i - 1), next = spacing(i);
        const double slopeBefore = slope;
        slope = (y_[i + 1] - y_[i]) / next;
        const double diagonal = 2.0 * (h + next) - h * above[i - 1];
        above[i] = next / diagonal;
        before = second[i] = (6.0 * (slope - slopeBefore) - h * before) / diagonal;
    }
    second[n_ - 1] = 0.0;
    for (int32_t i = n_ - 2; i > 0; --i)
        second[i] -= above[i] * second[i + 1];
}

// Moves *at, whose score is `least`, to the lowest score between low and high, to 1e-5, and returns
// that score: by parabolas, and by the golden section where these do not converge (R. P. Brent,
// Algorithms for Minimization Without Derivatives, 1973).
double SmoothingSpline::leastScore(double low, double high, RealVector values, RealVector second,
                                   double *at, double least) {
    constexpr double golden = 0x1.8722191a02d61p-2, tolerance = 2.5e-6;
    double best = *at, next = best, old = best; // the lowest three scores so far
    double atBest = least, atNext = least, atOld = least;
    double step = 0.0, stepBefore = 0.0;
    while (std::fabs(best - 0.5 * (low + high)) + 0.5 * (high - low) > 2.0 * tolerance) {
        const double centre = 0.5 * (low + high);
        const double r = (best - next) * (atBest - atOld), t = (best - old) * (atBest - atNext);
        const double above = (best - old) * t - (best - next) * r, below = 2.0 * (t - r);
        const double parabola = -above / below, twoBefore = stepBefore;
        stepBefore = step;
        if (std::fabs(parabola) < 0.5 * std::fabs(twoBefore) && best + parabola > low &&
            best + parabola < high) {
            step = parabola;
            if (best + step - low < 2.0 * tolerance || high - best - step < 2.0 * tolerance)
                step = std::copysign(tolerance, centre - best);
        } else {
            stepBefore = best < centre ? high - best : low - best;
            step = golden * stepBefore;
        }
        const double to =
            best + (std::fabs(step) < tolerance ? std::copysign(tolerance, step) : step);
        const double atTo = score(to, values, second);
        if (atTo <= atBest) {
            (to < best ? high : low) = best;
            old = next, atOld = atNext;
            next = best, atNext = atBest;
            best = to, atBest = atTo;
            continue;
        }
        (to < best ? low : high) = to;
        if (atTo <= atNext || next == best) {
            old = next, atOld = atNext;
            next = to, atNext = atTo;
        } else if (atTo <= atOld || old == best || old == next) {
            old = to, atOld = atTo;
        }
    }
    *at = best;
    return atBest;
}

// Steps by factors of 10 from where the spline follows each sample to where it is nearly the line,
// then finds the minimum near the lowest score; infinite if no score is below that of the line.
double SmoothingSpline::crossValidated(RealVector values, RealVector second) {
    constexpr double decade = 0x1.26bb1bbb55516p+1;
    const auto decades = static_cast<int32_t>(4.0 * std::log10(n_)) + 2;
    double least = kInfinity, at = 0.0;
    for (int32_t i = -6; i <= decades; ++i) {
        const double found = score(i * decade, values, second);
        if (found < least) {
            least = found;
            at = i * decade;
        }
    }
    least = leastScore(at - decade, at + decade, values, second, &at, least);
    constexpr double clearly = 1.0 - 1e-7; // the margin exceeds the rounding errors of the scores
    const double freedom = n_ - 2.0;
    return least < clearly * (lineSquares_ / (freedom * freedom)) ? std::exp(at) : kInfinity;
}

// The largest lambda at which the squares are at most `wanted`, to 1e-13 relative to its logarithm
// or 1; 0 if it is too small to be represented.
double SmoothingSpline::within(double wanted, RealVector values, RealVector second) {
    if (wanted >= lineSquares_)
        return kInfinity;
    const auto excess = [&](double logLambda) {
        return std::log(solve(std::exp(logLambda), values, second).squares / wanted);
    };
    constexpr double furthest = 600.0;
    double step = 7.0, low = 0.0, atLow = excess(low), high = low, atHigh = atLow;
    while (atLow > 0.0 && low > -furthest) {
        high = low;
        atHigh = atLow;
        low = std::max(low - step, -furthest);
        atLow = excess(low);
        step *= 2.0;
    }
    if (atLow > 0.0)
        return 0.0;
    while (!(atHigh > 0.0) && high < furthest) {
        low = high;
        atLow = atHigh;
        high = std::min(high + step, furthest);
        atHigh = excess(high);
        step *= 2.0;
    }
    if (!(atHigh > 0.0))
        return kInfinity;
    return std::exp(LastNotAbove(excess, low, atLow, high, atHigh));
}

void SmoothingSpline::fit(Smoothing method, double parameter, RealVector values, RealVector second,
                          DBL *lambda, DBL *effective) {
    const double unit = unitOfD_ * unitOfD_ / (unitOfX_ * unitOfX_ * unitOfX_);
    double inside = parameter * unit;
    if (method == Smoothing::CrossValidated)
        inside = crossValidated(values, second);
    else if (method == Smoothing::WithinSquares)
        inside = parameter == 0.0 ? 0.0 : within(parameter * unitOfD_ * unitOfD_, values, second);
    *lambda = method == Smoothing::Given ? parameter : inside / unit;
    if (inside == kInfinity) {
        for (int32_t i = 0; i < n_; ++i) {
            second[i] = 0.0;
            values[i] = onLine(i);
        }
        *lambda = kInfinity;
        *effective = 2.0;
        return;
    }
    if (inside < 1e-280) {
        interpolate(second);
        for (int32_t i = 0; i < n_; ++i)
            values[i] = y_[i];
        *effective = n_;
    } else {
        *effective = solve(inside, values, second).effective;
        for (int32_t i = 0; i < n_; ++i)
            values[i] += onLine(i);
    }
    for (int32_t i = 1; i < n_ - 1; ++i)
        second[i] = second[i] / unitOfX_ / unitOfX_;
}

} // namespace qx

#include "fit/gaussian.h"

#include "fit/residuals.h"
#include "fit/weights.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <cmath>

namespace qx {

namespace {

struct Samples {
    const DBL *x, *y, *w;
    int32_t n;
};

double Bell(const GaussianPeak &peak, double x) {
    const double z = (x - peak.centre) / peak.deviation;
    return std::exp(-0.5 * (z * z));
}

// The first of the elements with the largest modulus.
int32_t HighestPeak(const Samples &data) {
    int32_t best = 0;
    for (int32_t i = 1; i < data.n; ++i)
        if (std::fabs(data.y[i]) > std::fabs(data.y[best]))
            best = i;
    return best;
}

// The sample nearest to the peak on one side, of the sign of the peak; -1 where there is none.
int32_t Neighbour(const Samples &data, int32_t peak, double side) {
    int32_t best = -1;
    double nearest = 0.0;
    for (int32_t i = 0; i < data.n; ++i) {
        const double distance = side * (data.x[i] - data.x[peak]);
        if (!(distance > 0.0) || !(data.y[peak] * data.y[i] > 0.0))
            continue;
        if (best < 0 || distance < nearest) {
            best = i;
            nearest = distance;
        }
    }
    return best;
}

// The peak through three points, whose logarithms lie on a parabola.
ErrorCode ThroughThreePoints(const Samples &data, int32_t peak, GaussianPeak *found) {
    const int32_t below = Neighbour(data, peak, -1.0), above = Neighbour(data, peak, 1.0);
    if (below < 0 || above < 0)
        return ErrFitStartValues;
    const double x0 = data.x[peak], height = data.y[peak];
    const double slopeBelow = std::log(data.y[below] / height) / (data.x[below] - x0);
    const double slopeAbove = std::log(data.y[above] / height) / (data.x[above] - x0);
    // slope = -(x + x0 - 2 c) / (2 s^2) on either side
    const double twoVariances = (data.x[above] - data.x[below]) / (slopeBelow - slopeAbove);
    found->deviation = std::sqrt(0.5 * twoVariances);
    found->centre = 0.5 * (data.x[below] + x0 + slopeBelow * twoVariances);
    found->amplitude = height / Bell(*found, x0);
    return 0;
}

// Where all that is above a tenth of the peak is as high as the peak.
GaussianPeak OverPlateau(const Samples &data, int32_t peak) {
    double left = data.x[peak], right = left;
    for (int32_t i = 0; i < data.n; ++i) {
        if (data.y[i] != data.y[peak])
            continue;
        left = data.x[i] < left ? data.x[i] : left;
        right = data.x[i] > right ? data.x[i] : right;
    }
    // kept: the deviation is the root of the width itself
    return {1.2 * data.y[peak], (left + right) / 2.0, std::sqrt(right - left)};
}

// *isExact where the peak is found without iteration.
ErrorCode Estimate(const Samples &data, GaussianPeak *found, bool *isExact) {
    const int32_t peak = HighestPeak(data);
    const double height = data.y[peak], x0 = data.x[peak];
    double logarithms = 0.0, squares = 0.0;
    int32_t count = 0;
    for (int32_t i = 0; i < data.n; ++i) {
        const double y = data.y[i];
        if (y == 0.0 || !(std::fabs(y) > 0.1 * std::fabs(height)))
            continue;
        const double ratio = height / y;
        logarithms += std::log(ratio * ratio);
        squares += (data.x[i] - x0) * (data.x[i] - x0);
        ++count;
    }
    *isExact = count == 1;
    if (count == 1)
        return ThroughThreePoints(data, peak, found);
    *found = logarithms == 0.0 ? OverPlateau(data, peak)
                               : GaussianPeak{height, x0, std::sqrt(squares / logarithms)};
    return 0;
}

class Descent {
public:
    Descent(const Samples &data, DBL *bells) : data_(data), bells_(bells) {}

    double mseAt(const GaussianPeak &peak) {
        SquaredResiduals squares(data_.w);
        for (int32_t i = 0; i < data_.n; ++i) {
            bells_[i] = Bell(peak, data_.x[i]);
            squares.add(i, data_.y[i], peak.amplitude * bells_[i]);
        }
        return squares.mean(data_.n);
    }

    // Half the negative gradient of the sum of squares, for the peak that mseAt was asked for last.
    GaussianPeak direction(const GaussianPeak &at) const {
        GaussianPeak sum = {};
        for (int32_t i = 0; i < data_.n; ++i) {
            const double value = at.amplitude * bells_[i];
            const double rest = data_.y[i] - value;
            const double r = data_.w == nullptr ? rest : std::fabs(data_.w[i]) * rest;
            const double away = data_.x[i] - at.centre;
            const double slope = away * value / (at.deviation * at.deviation);
            sum.amplitude += r * bells_[i];
            sum.centre += slope * r;
            sum.deviation += away / at.deviation * slope * r;
        }
        return sum;
    }

    // *peak becomes the result.
    void run(const FitLimits &limits, GaussianPeak *peak, int32_t *steps) {
        const GaussianPeak start = *peak;
        const double first = mseAt(start);
        double m = first, accepted = first, earlier = first + 1.0, step = 1.0;
        GaussianPeak along = {};
        bool isFresh = true;
        *steps = 0;
        while (limits.iterations >= 0 && std::fabs(earlier - m) > earlier * limits.tolerance &&
               m > limits.floor) {
            if (isFresh) {
                earlier = m;
                along = direction(*peak);
            }
            const GaussianPeak trial = {peak->amplitude + step * along.amplitude,
                                        peak->centre + step * along.centre,
                                        peak->deviation + step * along.deviation};
            m = mseAt(trial);
            isFresh = m <= earlier;
            if (isFresh) {
                *peak = trial;
                accepted = m;
            } else {
                step /= 2.0;
            }
            if (++*steps > limits.iterations)
                break;
        }
        if (first <= m && first <= accepted)
            *peak = start;
    }

private:
    const Samples &data_;
    DBL *bells_;
};

ErrorCode FindPeak(const Samples &data, const DBL *guess, const FitLimits &limits,
                   GaussianPeak *peak, int32_t *steps) {
    bool isExact = false;
    if (guess != nullptr && CheckFinite(guess, 3) == 0)
        *peak = {guess[0], guess[1], guess[2]};
    else if (const ErrorCode failed = Estimate(data, peak, &isExact))
        return failed;
    *steps = 0;
    if (isExact)
        return 0;
    if (peak->deviation == 0.0)
        return ErrFitStartValues;
    Scratch<ElementType::DBL> bells;
    if (const ErrorCode failed = bells.allocate(data.n))
        return failed;
    Descent(data, bells.data()).run(limits.settled(), peak, steps);
    return 0;
}

} // namespace

ErrorCode FitGaussian(const DBL *x, const DBL *y, const DBL *w, int32_t n, DBL *fit, DBL *a, DBL *c,
                      DBL *s, DBL *mse, const DBL *guess, const FitLimits &limits, int32_t *steps) {
    if (const ErrorCode failed = SettleWeights(n, 3, &w))
        return failed;
    if (CheckFinite(x, n) != 0)
        return ErrNonFiniteInput;
    const Samples data = {x, y, w, n};
    GaussianPeak peak = {};
    if (const ErrorCode failed = FindPeak(data, guess, limits, &peak, steps))
        return failed;
    *a = peak.amplitude;
    *c = peak.centre;
    *s = std::fabs(peak.deviation);
    if (fit == nullptr && mse == nullptr)
        return 0;
    SquaredResiduals squares(w);
    for (int32_t i = 0; i < n; ++i) {
        const double f = peak.amplitude * Bell(peak, x[i]);
        squares.add(i, y[i], f);
        if (fit != nullptr)
            fit[i] = f;
    }
    if (mse != nullptr)
        *mse = squares.mean(n);
    return 0;
}

} // namespace qx

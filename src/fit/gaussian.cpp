#include "fit/gaussian.h"

#include "fit/residuals.h"
#include "fit/weights.h"
#include "frame/scratch.h"
#include "linalg/matrix.h"

#include <cmath>

namespace qx {

namespace {

struct GaussianPeak {
    double amplitude, centre, deviation;
};

double Bell(const GaussianPeak &peak, double x) {
    const double z = (x - peak.centre) / peak.deviation;
    return std::exp(-0.5 * (z * z));
}

// The index of the first element with the largest modulus.
int32_t HighestPeak(const FitSamples &data) {
    int32_t best = 0;
    for (int32_t i = 1; i < data.n(); ++i)
        if (std::fabs(data.y[i]) > std::fabs(data.y[best]))
            best = i;
    return best;
}

// The index of the sample nearest to the peak on one side that has the sign of the peak; -1 if
// there is none.
int32_t Neighbour(const FitSamples &data, int32_t peak, double side) {
    int32_t best = -1;
    double nearest = 0.0;
    for (int32_t i = 0; i < data.n(); ++i) {
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
ErrorCode ThroughThreePoints(const FitSamples &data, int32_t peak, GaussianPeak *found) {
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

// The start if all samples above a tenth of the peak are as high as the peak.
GaussianPeak OverPlateau(const FitSamples &data, int32_t peak) {
    double left = data.x[peak], right = left;
    for (int32_t i = 0; i < data.n(); ++i) {
        if (data.y[i] != data.y[peak])
            continue;
        left = data.x[i] < left ? data.x[i] : left;
        right = data.x[i] > right ? data.x[i] : right;
    }
    // kept: the deviation is the square root of the width
    return {1.2 * data.y[peak], (left + right) / 2.0, std::sqrt(right - left)};
}

// Sets *isExact if the peak is found without iteration.
ErrorCode Estimate(const FitSamples &data, GaussianPeak *found, bool *isExact) {
    const int32_t peak = HighestPeak(data);
    const double height = data.y[peak], x0 = data.x[peak];
    double logarithms = 0.0, squares = 0.0;
    int32_t count = 0;
    for (int32_t i = 0; i < data.n(); ++i) {
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
    Descent(const FitSamples &data, RealVector bells) : data_(data), bells_(bells) {}

    double mseAt(const GaussianPeak &peak) {
        SquaredResiduals squares(data_);
        for (int32_t i = 0; i < data_.n(); ++i) {
            bells_[i] = Bell(peak, data_.x[i]);
            squares.add(i, peak.amplitude * bells_[i]);
        }
        return squares.mean();
    }

    // Half the negative gradient of the sum of squares, for the peak of the last call of mseAt.
    GaussianPeak direction(const GaussianPeak &at) const {
        GaussianPeak sum = {};
        for (int32_t i = 0; i < data_.n(); ++i) {
            const double value = at.amplitude * bells_[i];
            const double rest = data_.y[i] - value;
            const double r = data_.w.isEmpty() ? rest : std::fabs(data_.w[i]) * rest;
            const double away = data_.x[i] - at.centre;
            const double slope = away * value / (at.deviation * at.deviation);
            sum.amplitude += r * bells_[i];
            sum.centre += slope * r;
            sum.deviation += away / at.deviation * slope * r;
        }
        return sum;
    }

    // *peak is the start on entry and the result on return.
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
    const FitSamples &data_;
    const RealVector bells_;
};

ErrorCode FindPeak(const FitSamples &data, const ModelFit &request, GaussianPeak *peak) {
    const DBL *const guess = request.guess;
    bool isExact = false;
    if (guess != nullptr && CheckFinite(guess, 3) == 0)
        *peak = {guess[0], guess[1], guess[2]};
    else if (const ErrorCode failed = Estimate(data, peak, &isExact))
        return failed;
    *request.steps = 0;
    if (isExact)
        return 0;
    if (peak->deviation == 0.0)
        return ErrFitStartValues;
    Scratch<ElementType::DBL> bells;
    if (const ErrorCode failed = bells.allocate(data.n()))
        return failed;
    Descent(data, {bells.data(), data.n()}).run(request.limits.settled(), peak, request.steps);
    return 0;
}

} // namespace

ErrorCode FitGaussian(const ModelFit &request) {
    FitSamples data = request.samples;
    if (const ErrorCode failed = SettleWeights(&data, 3))
        return failed;
    if (CheckFinite(data.x.data(), data.n()) != 0)
        return ErrNonFiniteInput;
    GaussianPeak peak = {};
    if (const ErrorCode failed = FindPeak(data, request, &peak))
        return failed;
    EvaluateFit(data, request.out,
                [&](int32_t i) { return peak.amplitude * Bell(peak, data.x[i]); });
    request.p[0] = peak.amplitude;
    request.p[1] = peak.centre;
    request.p[2] = std::fabs(peak.deviation);
    return 0;
}

} // namespace qx

#include "filters/remez.h"

#include "frame/constants.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr int32_t gridDensity = 16; // points per extremum
constexpr int32_t mostExtrema = 2048;
constexpr int32_t usualRounds = 100;

ErrorCode CheckNumber(double value, bool mayBeZero) {
    if (!std::isfinite(value))
        return ErrBadDesignField;
    return value < 0.0 || (value == 0.0 && !mayBeZero) ? ErrBadCutoff : 0;
}

ErrorCode CheckNumbers(const RemezBands &bands) {
    if (const ErrorCode failed = CheckNumber(bands.fs, false))
        return failed;
    for (const double edge : bands.edges)
        if (const ErrorCode failed = CheckNumber(edge, true))
            return failed;
    for (std::ptrdiff_t b = 0; b < bands.count(); ++b) {
        if (const ErrorCode failed = CheckNumber(bands.weight[b], false))
            return failed;
        if (const ErrorCode failed = CheckNumber(bands.desired[b], true))
            return failed;
    }
    return 0;
}

// Checks the ends of the bands against the zeros that the symmetry of the taps forces on the
// response.
ErrorCode CheckEnds(const RemezBands &bands, bool isOdd) {
    const double gap = std::fabs(bands.lastEdge() - 0.5 * bands.fs);
    if (bands.type == RemezHilbert ? bands.firstEdge() == 0.0 : bands.firstEdge() != 0.0)
        return ErrBadDesignField;
    if (bands.type == RemezMultiband) {
        if (gap > 0.001)
            return ErrBadDesignField;
        return !isOdd && bands.desired[bands.count() - 1] != 0.0 ? ErrBadTapCount : 0;
    }
    if (bands.type != RemezDifferentiator && bands.type != RemezHilbert)
        return ErrBadDesignField;
    const double leastGapOfOdd = bands.type == RemezDifferentiator ? 0.01 : 0.001;
    return (isOdd ? gap < leastGapOfOdd : gap > 0.001) ? ErrBadDesignField : 0;
}

ErrorCode CheckBands(const RemezBands &bands, int32_t n) {
    if (bands.count() < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = CheckNumbers(bands))
        return failed;
    if (bands.lastEdge() / bands.fs > 0.5)
        return ErrAboveNyquist;
    for (std::ptrdiff_t i = 1; i < bands.edges.size(); ++i)
        if (bands.edges[i] <= bands.edges[i - 1])
            return ErrBadCutoff;
    return CheckEnds(bands, n % 2 != 0);
}

// Points of the frequency axis, with the desired value and the weight at each.
struct Grid {
    RealVector frequency, desired, weight;
    int32_t size = 0;

    ErrorCode allocate(int64_t capacity) {
        return memory.take(Sized(frequency, capacity), Sized(desired, capacity),
                           Sized(weight, capacity));
    }
    void add(const RemezBands &bands, std::ptrdiff_t band, double f) {
        const double gain = bands.desired[band], w = bands.weight[band];
        const bool isSlope = bands.type == RemezDifferentiator;
        frequency[size] = f;
        desired[size] = isSlope ? gain * f : gain;
        weight[size] = isSlope && gain >= 0.0001 ? w / f : w;
        ++size;
    }

private:
    ScratchParts memory;
};

// Each band from its lower edge in steps; its last point is replaced by its upper edge.
ErrorCode LayGrid(const RemezBands &bands, int32_t nfcns, Grid &grid) {
    const double step = 0.5 / (gridDensity * nfcns);
    // All bands together are at most one half wide; rounding and the edges add two points per band.
    if (const ErrorCode failed =
            grid.allocate(int64_t{gridDensity} * nfcns + 2 * int64_t{bands.count()} + 1))
        return failed;
    for (std::ptrdiff_t b = 0; b < bands.count(); ++b) {
        double f = bands.lower(b);
        if (b == 0 && bands.type != RemezMultiband && step > f)
            f = step;
        const double last = bands.upper(b);
        for (double next = f + step; next <= last; next = f + step) {
            grid.add(bands, b, f);
            f = next;
        }
        grid.add(bands, b, last);
    }
    return 0;
}

// A response of n taps is a cosine polynomial times a factor. The desired values are divided by
// this factor and the weights are multiplied by it.
double SymmetryFactor(const RemezBands &bands, bool isOdd, double f) {
    if (bands.type == RemezMultiband)
        return isOdd ? 1.0 : std::cos(kPi * f);
    return isOdd ? std::sin(kTwoPi * f) : std::sin(kPi * f);
}

// ErrBadDesignField if a weight vanishes, because the deviation that it allows would not be finite.
ErrorCode DivideByFactor(const RemezBands &bands, bool isOdd, int32_t nfcns, Grid &grid) {
    const bool isZeroAtNyquist = (bands.type == RemezMultiband) != isOdd;
    const double step = 0.5 / (gridDensity * nfcns);
    if (isZeroAtNyquist && grid.frequency[grid.size - 1] > 0.5 - step)
        --grid.size;
    if (bands.type == RemezMultiband && isOdd)
        return 0;
    for (int32_t k = 0; k < grid.size; ++k) {
        const double factor = SymmetryFactor(bands, isOdd, grid.frequency[k]);
        grid.desired[k] = grid.desired[k] / factor;
        grid.weight[k] = grid.weight[k] * factor;
        if (grid.weight[k] == 0.0)
            return ErrBadDesignField;
    }
    return 0;
}

// The exchange: a polynomial through r alternating deviations at the extrema ext, whose error on
// the grid determines the next extrema.
class Exchange {
public:
    Exchange(Grid &grid, int32_t nfcns) : grid_(grid), r_(nfcns + 1) {}

    // If the iteration limit is reached, *unsettled is set to the last deviation.
    ErrorCode run(int32_t maxIterations, double *unsettled);
    double deviation() const { return deviation_; }
    // The polynomial at x = cos(2 pi f).
    double at(double x) const;
    // The same, but y[j] within `reach` of x[j].
    double near(double x, double reach) const;

private:
    ErrorCode prepare();
    ErrorCode interpolate();
    ErrorCode formWeights();
    void formDeviation();
    double error(int32_t l);
    void evaluateGroup(int32_t group);
    bool beats(int32_t l, double sign, double level) { return sign * error(l) > level; }
    int32_t climb(int32_t l, int32_t direction, int32_t end, double sign, double &level);
    double moveExtremum(int32_t j, int32_t above, double sign, int32_t &below);
    void exchange();
    void shiftAtEnds(int32_t first, int32_t last, double levelOfFirst, double levelOfLast);

    Interpolation polynomial() const { return {x_.data(), y_.data(), ad_.data(), r_}; }
    double signOf(int32_t j) const { return j % 2 == 0 ? nut_ : -nut_; }

    Grid &grid_;
    int32_t r_;
    ScratchParts memory_;
    I32 *ext_, *exponent_, *knownSince_;
    RealVector x_, y_, ad_, cosine_, error_;
    double deviation_ = -1.0, nut_ = 1.0;
    int32_t changes_ = 0, round_ = 0;
};

ErrorCode Exchange::prepare() {
    const int32_t groups = (grid_.size + interpolationGroup - 1) / interpolationGroup;
    const int64_t evaluated = int64_t{groups} * interpolationGroup;
    if (const ErrorCode failed = memory_.take(
            Sized(ext_, r_), Sized(exponent_, r_), Sized(knownSince_, groups), Sized(x_, r_),
            Sized(y_, r_), Sized(ad_, r_), Sized(cosine_, evaluated), Sized(error_, evaluated)))
        return failed;
    for (int32_t k = 0; k < groups * interpolationGroup; ++k)
        cosine_[k] = std::cos(kTwoPi * grid_.frequency[std::min(k, grid_.size - 1)]);
    for (int32_t group = 0; group < groups; ++group)
        knownSince_[group] = -1;
    const double last = grid_.size - 1;
    for (int32_t j = 0; j < r_; ++j)
        ext_[j] = static_cast<int32_t>(j * last / (r_ - 1));
    ext_[r_ - 1] = grid_.size - 1;
    return 0;
}

// All weights are scaled by a common power of 2, which cancels where they are used.
ErrorCode Exchange::formWeights() {
    MultiplyDistances({x_.data(), r_, ad_.data(), exponent_});
    int32_t least = 0;
    for (int32_t j = 0; j < r_; ++j) {
        if (ad_[j] == 0.0)
            return ErrBadDesignField;
        least = exponent_[j] < least ? exponent_[j] : least;
    }
    for (int32_t j = 0; j < r_; ++j)
        ad_[j] = std::ldexp(1.0 / ad_[j], least - exponent_[j]);
    return 0;
}

void Exchange::formDeviation() {
    double above = 0.0, below = 0.0;
    for (int32_t j = 0; j < r_; ++j) {
        above += ad_[j] * grid_.desired[ext_[j]];
        const double part = ad_[j] / grid_.weight[ext_[j]];
        below += j % 2 == 0 ? part : -part;
    }
    deviation_ = above / below;
    for (int32_t j = 0; j < r_; ++j) {
        const double allowed = deviation_ / grid_.weight[ext_[j]];
        y_[j] = j % 2 == 0 ? grid_.desired[ext_[j]] - allowed : grid_.desired[ext_[j]] + allowed;
    }
    nut_ = deviation_ > 0.0 ? -1.0 : 1.0;
    deviation_ = std::fabs(deviation_);
}

ErrorCode Exchange::interpolate() {
    for (int32_t j = 0; j < r_; ++j)
        x_[j] = cosine_[ext_[j]];
    if (const ErrorCode failed = formWeights())
        return failed;
    formDeviation();
    return 0;
}

double Exchange::at(double x) const {
    for (int32_t j = 0; j < r_; ++j)
        if (x == x_[j])
            return y_[j];
    double places[interpolationGroup], values[interpolationGroup];
    for (double &place : places)
        place = x;
    Interpolate(polynomial(), places, values);
    return values[0];
}

double Exchange::near(double x, double reach) const {
    int32_t nearest = 0;
    for (int32_t j = 1; j < r_; ++j)
        if (std::fabs(x - x_[j]) < std::fabs(x - x_[nearest]))
            nearest = j;
    return std::fabs(x - x_[nearest]) < reach ? y_[nearest] : at(x);
}

// A group is evaluated when one of its points is first needed.
void Exchange::evaluateGroup(int32_t group) {
    const int32_t first = group * interpolationGroup;
    double values[interpolationGroup];
    Interpolate(polynomial(), cosine_.data() + first, values);
    for (int32_t i = 0; i < interpolationGroup && first + i < grid_.size; ++i) {
        const int32_t l = first + i;
        const double value = std::isnan(values[i]) ? at(cosine_[l]) : values[i];
        error_[l] = (value - grid_.desired[l]) * grid_.weight[l];
    }
    knownSince_[group] = round_;
}

double Exchange::error(int32_t l) {
    const int32_t group = l / interpolationGroup;
    if (knownSince_[group] != round_)
        evaluateGroup(group);
    return error_[l];
}

// Climbs from l, which exceeds the level, until the error stops increasing or the end is reached;
// the level is set to that of the summit.
int32_t Exchange::climb(int32_t l, int32_t direction, int32_t end, double sign, double &level) {
    level = sign * error(l);
    while (l + direction != end && beats(l + direction, sign, level)) {
        l += direction;
        level = sign * error(l);
    }
    ++changes_;
    return l;
}

// Moves extremum j between the next one, `above`, and the previous one, `below`, which is set to
// the bound of the search for the next extremum. Returns the error at the new place.
double Exchange::moveExtremum(int32_t j, int32_t above, double sign, int32_t &below) {
    const int32_t old = ext_[j];
    double level = deviation_;
    if (old + 1 < above && beats(old + 1, sign, level)) {
        below = ext_[j] = climb(old + 1, 1, above, sign, level);
        return level;
    }
    const int32_t bound = below;
    below = old;
    for (int32_t l = old - 1; l > bound; --l) {
        if (beats(l, sign, level)) {
            ext_[j] = climb(l, -1, bound, sign, level);
            return level;
        }
        if (changes_ > 0)
            return level;
    }
    if (changes_ > 0)
        return level;
    for (int32_t l = old + 2; l < above; ++l)
        if (beats(l, sign, level)) {
            below = ext_[j] = climb(l, 1, above, sign, level);
            return level;
        }
    return level;
}

// Replaces an extremum at one end by one beyond the other end if that is larger.
void Exchange::shiftAtEnds(int32_t first, int32_t last, double levelOfFirst, double levelOfLast) {
    constexpr double clearly = 1.00001;
    const double signBelow = -signOf(0), signAbove = -signOf(r_ - 1);
    int32_t newFirst = -1, newLast = -1;
    double level = levelOfLast * clearly;
    for (int32_t l = 0; l < first && newFirst < 0; ++l)
        if (beats(l, signBelow, level))
            newFirst = climb(l, 1, first, signBelow, level);
    if (newFirst >= 0)
        levelOfFirst = std::max(levelOfFirst, level);
    level = levelOfFirst * clearly;
    for (int32_t l = grid_.size - 1; l > last && newLast < 0; --l)
        if (beats(l, signAbove, level))
            newLast = climb(l, -1, last, signAbove, level);

    if (newLast >= 0) {
        for (int32_t j = 0; j + 1 < r_; ++j)
            ext_[j] = ext_[j + 1];
        ext_[r_ - 1] = newLast;
    } else if (newFirst >= 0) {
        for (int32_t j = r_ - 1; j > 0; --j)
            ext_[j] = ext_[j - 1];
        ext_[0] = newFirst;
    }
}

void Exchange::exchange() {
    changes_ = 0;
    const int32_t first = ext_[0], last = ext_[r_ - 1];
    int32_t below = -1;
    double levelOfFirst = 0.0, level = 0.0;
    for (int32_t j = 0; j < r_; ++j) {
        const int32_t above = j + 1 < r_ ? ext_[j + 1] : grid_.size;
        level = moveExtremum(j, above, signOf(j), below);
        if (j == 0)
            levelOfFirst = level;
    }
    const int32_t newFirst = ext_[0], newLast = ext_[r_ - 1];
    shiftAtEnds(std::min(first, newFirst), std::max(last, newLast), levelOfFirst, level);
}

ErrorCode Exchange::run(int32_t maxIterations, double *unsettled) {
    if (const ErrorCode failed = prepare())
        return failed;
    double before = -1.0;
    for (int32_t left = maxIterations - 1; left > 0; --left, ++round_) {
        if (round_ > 0 && changes_ == 0 && std::fabs(deviation_ - before) < 1e-09)
            return 0;
        before = deviation_;
        if (const ErrorCode failed = interpolate())
            return failed;
        if (!(deviation_ >= before)) // the deviation must never decrease
            return ErrBadDesignField;
        exchange();
    }
    if (round_ > 0)
        *unsettled = deviation_;
    return ErrBadDesignField;
}

// After the exchange: the coefficients of the polynomial in cos(2 pi k f), and the taps computed
// from them.

// The points at which the polynomial is sampled, mapped onto the range of the grid: the cosine is
// (sample - bb) / aa.
struct Mapping {
    double aa = 1.0, bb = 0.0;
    Mapping() = default;
    explicit Mapping(const Grid &grid) {
        const double first = std::cos(kTwoPi * grid.frequency[0]);
        const double last = std::cos(kTwoPi * grid.frequency[grid.size - 1]);
        aa = 2.0 / (first - last);
        bb = -(first + last) / (first - last);
    }
};

// The sum of alpha[k] T_k(aa x + bb) as a sum of T_k(x), with T the Chebyshev polynomials, by
// Clenshaw's recurrence on whole polynomials. `work` has 2 n elements.
void MapBack(const Mapping &mapping, int32_t n, DBL *alpha, DBL *work) {
    DBL *p = work, *q = work + n; // the sums from k on, and from k + 1 on
    Fill(work, 2 * std::ptrdiff_t{n}, 0.0);
    for (int32_t k = n - 1; k >= 0; --k) {
        // (1 or 2) (aa x + bb) p - q + alpha[k]; x T_i is half of T_(i-1) + T_(i+1).
        const double twice = k == 0 ? 1.0 : 2.0;
        for (int32_t i = 0; i < n; ++i)
            q[i] = twice * mapping.bb * p[i] - q[i];
        const double half = 0.5 * twice * mapping.aa;
        for (int32_t i = 0; i + 1 < n; ++i) {
            q[i + 1] += (i == 0 ? 2.0 * half : half) * p[i];
            q[i] += half * p[i + 1];
        }
        q[0] += alpha[k];
        DBL *const latest = q;
        q = p;
        p = latest;
    }
    for (int32_t i = 0; i < n; ++i)
        alpha[i] = p[i];
}

ErrorCode FindCoefficients(const Exchange &exchange, const Mapping &mapping, bool isMapped,
                           int32_t nfcns, DBL *alpha) {
    const int32_t period = 2 * nfcns - 1;
    RealVector cosines, samples;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(cosines, period), Sized(samples, 2 * int64_t{nfcns})))
        return failed;
    for (int32_t j = 0; j < period; ++j)
        cosines[j] = std::cos(kTwoPi * j / period);
    for (int32_t j = 0; j < nfcns; ++j)
        samples[j] = exchange.near((cosines[j] - mapping.bb) / mapping.aa, 1e-06);
    for (int32_t k = 0; k < nfcns; ++k) {
        double sum = 0.0;
        for (int32_t j = 1, at = k; j < nfcns; ++j) {
            sum += samples[j] * cosines[at]; // at is j k modulo the period
            at += at + k < period ? k : k - period;
        }
        alpha[k] = (samples[0] + 2.0 * sum) * (k == 0 ? 1.0 : 2.0) / period;
    }
    if (isMapped)
        MapBack(mapping, nfcns, alpha, samples.data());
    return 0;
}

// The first half of the taps, for a sum of alpha[k] cos(2 pi k f) times the symmetry factor, which
// adds or subtracts neighbours. The other half is its mirror image.
void FormTaps(const DBL *alpha, int32_t nfcns, int32_t type, int32_t n, DBL *h) {
    const bool isOdd = n % 2 != 0, isSymmetric = type == RemezMultiband;
    const int32_t distance = isOdd ? 2 : 1; // between the neighbours
    const auto coefficient = [&](int32_t k) { return k < nfcns ? alpha[k] : 0.0; };
    const int32_t middle = nfcns - 1;
    if (isOdd && isSymmetric) {
        for (int32_t j = 0; j < middle; ++j)
            h[j] = 0.5 * alpha[middle - j];
        h[middle] = alpha[0];
    } else {
        for (int32_t j = 0; j < middle; ++j) {
            const double neighbour = coefficient(middle - j + distance);
            h[j] = 0.25 * (alpha[middle - j] + (isSymmetric ? neighbour : -neighbour));
        }
        const double neighbour = 0.25 * coefficient(distance);
        h[middle] = 0.5 * alpha[0] + (isSymmetric ? neighbour : -neighbour);
        if (isOdd)
            h[nfcns] = 0.0;
    }
    for (int32_t j = 0; j < n / 2; ++j)
        h[n - 1 - j] = isSymmetric ? h[j] : -h[j];
}

} // namespace

ErrorCode RemezDesign(const RemezBands &bands, RealVector h, double *ripple,
                      int32_t maxIterations) {
    QX_EXPECTS(bands.weight.size() == bands.count() && bands.edges.size() == 2 * bands.count());
    const auto n = static_cast<int32_t>(h.size());
    if (n < 3)
        return ErrBadDesignField;
    if (const ErrorCode failed = CheckBands(bands, n))
        return failed;
    const bool isOdd = n % 2 != 0;
    const int32_t nfcns = n / 2 + (isOdd && bands.type == RemezMultiband ? 1 : 0);
    if (nfcns + 2 >= mostExtrema)
        return ErrOutOfMemory;

    Grid grid;
    if (const ErrorCode failed = LayGrid(bands, nfcns, grid))
        return failed;
    if (const ErrorCode failed = DivideByFactor(bands, isOdd, nfcns, grid))
        return failed;
    if (grid.size < 1)
        return ErrBadDesignField;
    Exchange exchange(grid, nfcns);
    if (const ErrorCode failed =
            exchange.run(maxIterations > 0 ? maxIterations : usualRounds, ripple))
        return failed;

    const bool isMapped = bands.type == RemezHilbert;
    Scratch<ElementType::DBL> alpha;
    if (const ErrorCode failed = alpha.allocate(nfcns))
        return failed;
    if (const ErrorCode failed = FindCoefficients(exchange, isMapped ? Mapping(grid) : Mapping(),
                                                  isMapped, nfcns, alpha.data()))
        return failed;
    FormTaps(alpha.data(), nfcns, bands.type, n, h.data());
    *ripple = exchange.deviation();
    return 0;
}

} // namespace qx

#include "measure/sinusoids.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "measure/waves.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <utility>

namespace qx {
namespace {

// The moments of a residual r: its sum, and for each line the sums of r cos, r sin, s r cos and
// s r sin.
constexpr int32_t momentsOfLine = 4;

// The kernel at theta = 2 pi turns.
Kernel SumDirectly(double turns, int32_t n) {
    Kernel sum = {0, 0, 0};
    const double middle = 0.5 * (n - 1);
    for (int32_t t = 0; t < n; ++t) {
        const double s = t - middle;
        const double angle = kTwoPi * turns * s;
        const double cosine = std::cos(angle);
        sum.cosines += cosine;
        sum.sines += s * std::sin(angle);
        sum.squares += s * s * cosine;
    }
    return sum;
}

// Below this the derivatives of the quotient lose digits; two lines are hardly ever so close to
// each other.
constexpr double nearZero = 0.05;

// The kernel from N(x) / sin x with x = theta / 2 and N(x) = sin(n x), and its first and second
// derivatives with respect to x.
Kernel FromHalfAngle(Phasor x, Phasor nx, int32_t n) {
    const double count = n;
    const double slope = count * nx.cosine;
    const double quotient = nx.sine / x.sine;
    const double first = (slope - quotient * x.cosine) / x.sine;
    const double second =
        (-count * count * nx.sine - 2 * first * x.cosine + quotient * x.sine) / x.sine;
    return {quotient, -0.5 * first, -0.25 * second};
}

Phasor PhasorOf(double turns, double count) {
    const double angle = kTwoPi * PartOfTurn(turns, count);
    return {std::cos(angle), std::sin(angle)};
}
Phasor Sum(Phasor a, Phasor b) {
    return {a.cosine * b.cosine - a.sine * b.sine, a.sine * b.cosine + a.cosine * b.sine};
}
Phasor Difference(Phasor a, Phasor b) {
    return {a.cosine * b.cosine + a.sine * b.sine, a.sine * b.cosine - a.cosine * b.sine};
}

// turns is between -1/2 and 1.
Kernel KernelAt(double turns, int32_t n) {
    const double count = n;
    if (turns == 0)
        return {count, 0, count * (count * count - 1) / 12};
    if (turns > 0.5) {
        // The middle of an even number of samples lies between two samples.
        const Kernel k = KernelAt(turns - 1, n);
        const double sign = n % 2 == 0 ? -1 : 1;
        return {sign * k.cosines, sign * k.sines, sign * k.squares};
    }
    if (std::fabs(turns) * count < nearZero)
        return SumDirectly(turns, n);
    return FromHalfAngle({std::cos(kPi * turns), std::sin(kPi * turns)},
                         PhasorOf(turns, 0.5 * count), n);
}

double Wrapped(double angle) {
    if (angle > kPi)
        angle -= kTwoPi;
    return angle <= -kPi ? angle + kTwoPi : angle;
}

} // namespace

double Amplitude(const Line &line) {
    return std::sqrt(line.cosine * line.cosine + line.sine * line.sine);
}

double PartOfTurn(double value, double count) {
    const Extended product = ExactProduct(value, count);
    return product.high - std::rint(product.high) + product.low;
}

double PhaseAtStart(const Line &line, int32_t n) {
    const double toMiddle = kTwoPi * PartOfTurn(line.frequency, 0.5 * (n - 1));
    return Wrapped(-toMiddle - std::atan2(line.sine, line.cosine));
}

void SinusoidFit::begin(const DBL *samples, int32_t n) {
    samples_ = samples;
    n_ = n;
}

ErrorCode SinusoidFit::reserve(int32_t lines) {
    const int64_t count = lines;
    const int64_t size = 2 + 3 * count;
    const int64_t widest = 1 + 3 * (std::min<int64_t>(count, farthestReach) + 1);
    const int64_t matrix = size * widest + size;
    const int64_t moments = 1 + momentsOfLine * count;
    const int64_t waves = 2 * waveBlock * count;
    if (const ErrorCode failed = memory_.take(
            Sized(waves_, waves), Sized(table_, waves), Sized(normal_, matrix),
            Sized(factor_, matrix), Sized(gradient_, size), Sized(step_, size), Sized(scale_, size),
            Sized(moments_, moments), Sized(trialMoments_, moments), Sized(trial_, count),
            Sized(atBlock_, 4 * count), Sized(order_, count)))
        return failed;
    ofBlock_ = atBlock_ + lines;
    halfAngles_ = ofBlock_ + lines;
    return 0;
}

// The waves of a block with phase 0, as products of two out of 14 phasors.
void SinusoidFit::layTable(const Line &line, DBL *table) {
    constexpr int32_t step = 8;
    Phasor near[step], far[waveBlock / step];
    for (int32_t j = 0; j < step; ++j)
        near[j] = PhasorOf(line.frequency, j);
    for (int32_t j = 0; j < waveBlock / step; ++j)
        far[j] = PhasorOf(line.frequency, step * j);
    for (int32_t j = 0; j < waveBlock; ++j) {
        const Phasor at = Sum(far[j / step], near[j % step]);
        table[j] = at.cosine;
        table[waveBlock + j] = at.sine;
    }
}

// The phases in a block are that of its first sample, rotated by the table's phases for 0, 1, ....
// Every 16th block starts with a phase that is exact to the last bits, however long the record is;
// the phases of the other blocks follow by rotation from block to block.
double SinusoidFit::sumOfSquares(const Line *lines, int32_t count, double constant, DBL *moments,
                                 DBL *residual) {
    constexpr std::ptrdiff_t wave = 2 * waveBlock;
    constexpr std::ptrdiff_t turned = 16 * waveBlock;
    for (int32_t l = 0; l < count; ++l) {
        layTable(lines[l], table_ + wave * l);
        ofBlock_[l] = PhasorOf(lines[l].frequency, waveBlock);
    }
    if (moments != nullptr)
        Fill(moments, 1 + momentsOfLine * std::ptrdiff_t{count}, 0.0);
    double squares = 0;
    DBL left[waveBlock];
    for (int64_t begin = 0; begin < n_; begin += waveBlock) {
        const auto first = static_cast<std::ptrdiff_t>(begin);
        const auto length = static_cast<int32_t>(std::min<int64_t>(waveBlock, n_ - begin));
        const double s0 = static_cast<double>(first) - middle();
        for (int32_t j = 0; j < length; ++j)
            left[j] = samples_[first + j] - constant;
        for (int32_t l = 0; l < count; ++l) {
            atBlock_[l] = first % turned == 0 ? PhasorOf(lines[l].frequency, s0)
                                              : Sum(atBlock_[l], ofBlock_[l]);
            SubtractWave({atBlock_[l].cosine, atBlock_[l].sine, lines[l].cosine, lines[l].sine},
                         table_ + wave * l, waves_ + wave * l, left);
        }
        Fill(left + length, waveBlock - length, 0.0);
        double ofBlock[2];
        SumOfBlock(left, ofBlock);
        squares += ofBlock[1];
        if (residual != nullptr)
            for (int32_t j = 0; j < length; ++j)
                residual[first + j] = left[j];
        if (moments != nullptr)
            addMoments(left, count, s0, ofBlock[0], moments);
    }
    return squares;
}

// Adds the moments of a block whose waves have been computed.
void SinusoidFit::addMoments(const DBL *left, int32_t count, double s0, double sum, DBL *moments) {
    moments[0] += sum;
    for (std::ptrdiff_t l = 0; l < count; ++l) {
        double sums[4];
        SumByWave(waves_ + 2 * waveBlock * l, left, sums);
        DBL *const m = moments + 1 + momentsOfLine * l;
        m[0] += sums[0];
        m[1] += sums[1];
        m[2] += s0 * sums[0] + sums[2];
        m[3] += s0 * sums[1] + sums[3];
    }
}

// The order of the previous step is nearly right.
void SinusoidFit::sortByFrequency(const Line *lines) {
    for (int32_t i = 1; i < layout_.count; ++i) {
        const int32_t moved = order_[i];
        int32_t at = i;
        for (; at > 0 && lines[moved].frequency < lines[order_[at - 1]].frequency; --at)
            order_[at] = order_[at - 1];
        order_[at] = moved;
    }
}

void SinusoidFit::buildNormal(const Line *lines) {
    const std::ptrdiff_t size = layout_.size();
    for (std::ptrdiff_t row = 0; row < size; ++row) {
        const std::ptrdiff_t first = layout_.firstInRow(row);
        Fill(layout_.row(normal_, row) + first, row - first + 1, 0.0);
    }
    layout_.row(normal_, 0)[0] = n_;
    for (int32_t l = 0; l < layout_.count; ++l) {
        halfAngles_[2 * std::ptrdiff_t{l}] = PhasorOf(lines[l].frequency, 0.5);
        halfAngles_[2 * std::ptrdiff_t{l} + 1] = PhasorOf(lines[l].frequency, 0.5 * n_);
    }
    const double unit = 2.0 / n_;
    for (int32_t place = 0; place < layout_.count; ++place) {
        const Line &p = lines[order_[place]];
        if (place < layout_.reach) {
            const Kernel alone = KernelAt(p.frequency, n_);
            const double weight = layout_.weight(place + 1);
            layout_.row(normal_, layout_.ofPlace(place))[0] = weight * alone.cosines;
            layout_.row(normal_, layout_.frequencyOf(place))[0] -=
                weight * p.slope * unit * p.cosine * alone.sines;
        }
        for (int32_t other = std::max(0, place - layout_.reach); other <= place; ++other)
            addProducts(lines, place, other);
    }
}

// The kernels of the difference and of the sum of the frequencies of two lines; p has the higher
// frequency.
void SinusoidFit::kernelsOf(const Line *lines, int32_t p, int32_t q, Kernel &less,
                            Kernel &more) const {
    const Phasor *const ofP = halfAngles_ + 2 * std::ptrdiff_t{p};
    const Phasor *const ofQ = halfAngles_ + 2 * std::ptrdiff_t{q};
    const double difference = lines[p].frequency - lines[q].frequency;
    const double sum = lines[p].frequency + lines[q].frequency;
    less = difference * n_ < nearZero
               ? KernelAt(difference, n_)
               : FromHalfAngle(Difference(ofP[0], ofQ[0]), Difference(ofP[1], ofQ[1]), n_);
    more = (1 - sum) * n_ < nearZero ? KernelAt(sum, n_)
                                     : FromHalfAngle(Sum(ofP[0], ofQ[0]), Sum(ofP[1], ofQ[1]), n_);
}

// Adds the products of the derivatives with respect to the parameters of two lines, in the order of
// their frequencies.
void SinusoidFit::addProducts(const Line *lines, int32_t placeOfP, int32_t placeOfQ) {
    const Line &p = lines[order_[placeOfP]], &q = lines[order_[placeOfQ]];
    const std::ptrdiff_t ofP = layout_.ofPlace(placeOfP), ofQ = layout_.ofPlace(placeOfQ);
    const std::ptrdiff_t frequencyOfP = layout_.frequencyOf(placeOfP);
    const std::ptrdiff_t frequencyOfQ = layout_.frequencyOf(placeOfQ);
    const auto add = [this](std::ptrdiff_t a, std::ptrdiff_t b, double product) {
        layout_.row(normal_, std::max(a, b))[std::min(a, b)] += product;
    };
    const double weight = layout_.weight(placeOfP - placeOfQ);
    Kernel less, more;
    kernelsOf(lines, order_[placeOfP], order_[placeOfQ], less, more);
    const double half = 0.5 * weight;
    add(ofP, ofQ, half * (less.cosines + more.cosines));
    add(ofP + 1, ofQ + 1, half * (less.cosines - more.cosines));
    // s sin(p) cos(q) and s cos(p) sin(q); the kernel's sines are odd.
    const double ofSine = half * (more.sines + less.sines);
    const double ofCosine = half * (more.sines - less.sines);
    const double toP = p.slope * (2.0 / n_);
    const double toQ = q.slope * (2.0 / n_);
    add(frequencyOfP, ofQ, -toP * p.cosine * ofSine);
    add(frequencyOfP, ofQ + 1, toP * p.sine * ofCosine);
    const double both = toP * toQ * half *
                        (p.cosine * q.cosine * (less.squares - more.squares) +
                         p.sine * q.sine * (less.squares + more.squares));
    add(frequencyOfP, frequencyOfQ, both);
    if (placeOfP == placeOfQ)
        return;
    add(frequencyOfQ, ofP, -toQ * q.cosine * ofCosine);
    add(frequencyOfQ, ofP + 1, toQ * q.sine * ofSine);
    if (frequencyOfP == frequencyOfQ)
        add(frequencyOfP, frequencyOfQ, both);
}

void SinusoidFit::buildGradient(const Line *lines) {
    Fill(gradient_, layout_.size(), 0.0);
    gradient_[0] = moments_[0];
    for (std::ptrdiff_t place = 0; place < layout_.count; ++place) {
        const int32_t l = order_[place];
        const DBL *const m = moments_ + 1 + momentsOfLine * std::ptrdiff_t{l};
        gradient_[layout_.ofPlace(place)] = m[0];
        gradient_[layout_.ofPlace(place) + 1] = m[1];
        gradient_[layout_.frequencyOf(place)] +=
            lines[l].slope * (2.0 / n_) * (lines[l].sine * m[2] - lines[l].cosine * m[3]);
    }
}

// Cholesky factorisation of the matrix scaled to a diagonal of 1 + damping. A parameter that has no
// influence, such as the frequency of a line without amplitude, stays as it is.
bool SinusoidFit::factor(double damping) {
    constexpr double nothing = 1e-40; // relative to the number of samples
    for (std::ptrdiff_t i = 0; i < layout_.size(); ++i) {
        const DBL *const normal = layout_.row(normal_, i);
        DBL *const row = layout_.row(factor_, i);
        scale_[i] = normal[i] > nothing * n_ ? 1 / std::sqrt(normal[i]) : 0.0;
        const std::ptrdiff_t first = layout_.firstInRow(i);
        for (std::ptrdiff_t j = first; j <= i; ++j) {
            const DBL *const other = layout_.row(factor_, j);
            const std::ptrdiff_t from = std::max(first, layout_.firstInRow(j));
            double sum = scale_[i] * normal[j] * scale_[j];
            if (i == j)
                sum = scale_[i] > 0 ? 1 + damping : 1;
            sum -= SumOfProducts(row + from, other + from, static_cast<int32_t>(j - from));
            if (i != j)
                row[j] = sum / other[j];
            else if (sum > 1e-15)
                row[j] = std::sqrt(sum);
            else
                return false;
        }
    }
    return true;
}

// Solves for the step with the factored matrix; returns by how much a linear model would lower the
// sum of squares.
double SinusoidFit::solve() {
    const std::ptrdiff_t n = layout_.size();
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        const DBL *const row = layout_.row(factor_, i);
        const std::ptrdiff_t first = layout_.firstInRow(i);
        const double known =
            SumOfProducts(row + first, step_ + first, static_cast<int32_t>(i - first));
        step_[i] = (scale_[i] * gradient_[i] - known) / row[i];
    }
    for (std::ptrdiff_t i = n - 1; i >= 0; --i) {
        const DBL *const row = layout_.row(factor_, i);
        step_[i] /= row[i];
        for (std::ptrdiff_t k = layout_.firstInRow(i); k < i; ++k)
            step_[k] -= row[k] * step_[i];
    }
    double promised = 0;
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        step_[i] *= scale_[i];
        promised += step_[i] * gradient_[i];
    }
    return promised;
}

// Returns false if a frequency is too close to 0 or to half the sampling rate for a record of this
// length.
bool SinusoidFit::takeStep(const Line *from, Line *to) {
    double widest = 0;
    for (std::ptrdiff_t place = 0; place < layout_.count; ++place)
        widest = std::max(widest, std::fabs(step_[layout_.frequencyOf(place)]));
    if (widest > kPi) // at most a bin
        for (std::ptrdiff_t i = 0; i < layout_.size(); ++i)
            step_[i] *= kPi / widest;
    for (std::ptrdiff_t place = 0; place < layout_.count; ++place) {
        const int32_t l = order_[place];
        to[l] = from[l];
        to[l].cosine += step_[layout_.ofPlace(place)];
        to[l].sine += step_[layout_.ofPlace(place) + 1];
        if (from[l].slope == 0)
            continue;
        to[l].frequency += from[l].slope * step_[layout_.frequencyOf(place)] / (kPi * n_);
        if (!(to[l].frequency >= smallestFrequency() &&
              to[l].frequency <= 0.5 - smallestFrequency()))
            return false;
    }
    return true;
}

double SinusoidFit::refine(Line *lines, int32_t count, Frequencies frequencies,
                           const FitEffort &effort, double &constant) {
    constexpr double mostDamping = 1e6;
    constexpr double firstDamping = 1e-3;
    constexpr double rounding = 1e-27; // of the samples' sum of squares

    layout_ = {count, frequencies, std::min(effort.reach, count)};
    for (int32_t l = 0; l < count; ++l)
        order_[l] = l;
    double squares = sumOfSquares(lines, count, constant, moments_, nullptr);
    double damping = 0;
    for (int32_t k = 0; k < effort.mostSteps && squares > 0; ++k) {
        sortByFrequency(lines);
        buildNormal(lines);
        buildGradient(lines);
        for (;;) {
            double trialSquares = kInfinity;
            double promised = kInfinity;
            if (factor(damping)) {
                promised = solve();
                if (damping == 0 && promised <= effort.settled * squares)
                    return squares;
                if (takeStep(lines, trial_))
                    trialSquares =
                        sumOfSquares(trial_, count, constant + step_[0], trialMoments_, nullptr);
            }
            if (trialSquares < squares) {
                squares = trialSquares;
                break;
            }
            damping = damping > 0 ? 10 * damping : firstDamping;
            if (damping > mostDamping || promised <= rounding * n_)
                return squares;
        }
        std::copy(trial_, trial_ + count, lines);
        constant += step_[0];
        std::swap(moments_, trialMoments_);
        damping = damping > firstDamping ? damping / 10 : 0;
    }
    return squares;
}

double SinusoidFit::residualOf(const Line *lines, int32_t count, double constant, DBL *residual) {
    return sumOfSquares(lines, count, constant, nullptr, residual);
}

} // namespace qx

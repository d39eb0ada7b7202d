#include "measure/sinusoids.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "measure/waves.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace qx {
namespace {

// The moments of a residual r: its sum, and for each line the sums of r cos, r sin, s r cos and
// s r sin.
constexpr int32_t momentsOfLine = 4;

// Sums over the record of cos(theta s), s sin(theta s) and s^2 cos(theta s), for theta of
// 2 pi turns: the Dirichlet kernel and its derivatives.
struct Kernel {
    double cosines, sines, squares;
};

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

// turns is from -1/2 to 1.
Kernel KernelAt(double turns, int32_t n) {
    const double count = n;
    if (turns == 0)
        return {count, 0, count * (count * count - 1) / 12};
    if (turns > 0.5) {
        // The middle of an even number of samples lies between two of them.
        const Kernel k = KernelAt(turns - 1, n);
        const double sign = n % 2 == 0 ? -1 : 1;
        return {sign * k.cosines, sign * k.sines, sign * k.squares};
    }
    // Nearer to 0 the derivatives of the quotient lose their digits, and so near to each other are
    // hardly ever two lines.
    constexpr double nearZero = 0.05;
    if (std::fabs(turns) * count < nearZero)
        return SumDirectly(turns, n);
    const double half = 0.5 * count;
    const double over = kTwoPi * PartOfTurn(turns, half);
    const double sine = std::sin(kPi * turns);
    const double cosine = std::cos(kPi * turns);
    // Of N(x) / sin x with x = theta / 2 and N(x) = sin(n x): first and second derivative by x.
    const double top = std::sin(over);
    const double slope = count * std::cos(over);
    const double quotient = top / sine;
    const double first = (slope - quotient * cosine) / sine;
    const double second = (-count * count * top - 2 * first * cosine + quotient * sine) / sine;
    return {quotient, -0.5 * first, -0.25 * second};
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
    return product.high - std::nearbyint(product.high) + product.low;
}

double PhaseAtStart(const Line &line, int32_t n) {
    const double toMiddle = kTwoPi * PartOfTurn(line.frequency, 0.5 * (n - 1));
    return Wrapped(-toMiddle - std::atan2(line.sine, line.cosine));
}

void SinusoidFit::begin(const DBL *samples, int32_t n) {
    samples_ = samples;
    n_ = n;
}

ErrorCode SinusoidFit::reserve(int32_t lines, int32_t groups) {
    const int64_t count = lines;
    const int64_t size = 1 + 2 * count + groups;
    constexpr int64_t most = 1 << 14; // parameters; more have no memory in any case
    if (size > most)
        return ErrOutOfMemory;
    const int64_t moments = 1 + momentsOfLine * count;
    const int64_t waves = 2 * waveBlock * count;
    if (const ErrorCode failed =
            memory_.allocate(2 * waves + 2 * size * size + 3 * size + 2 * moments))
        return failed;
    if (const ErrorCode failed = trialMemory_.allocate(count * int64_t{sizeof(Line)}))
        return failed;
    DBL *next = memory_.data();
    const auto part = [&next](int64_t length) {
        DBL *const begin = next;
        next += static_cast<std::ptrdiff_t>(length);
        return begin;
    };
    waves_ = part(waves);
    table_ = part(waves);
    normal_ = part(size * size);
    factor_ = part(size * size);
    gradient_ = part(size);
    step_ = part(size);
    scale_ = part(size);
    moments_ = part(moments);
    trialMoments_ = part(moments);
    trial_ = static_cast<Line *>(trialMemory_.bytes());
    return 0;
}

// The phases of a block are those of its first sample, exact to the last bits however long the
// record is, turned by those of 0, 1, ... from the table.
double SinusoidFit::sumOfSquares(const Line *lines, int32_t count, double constant, DBL *moments,
                                 DBL *residual) {
    constexpr std::ptrdiff_t wave = 2 * waveBlock;
    for (int32_t l = 0; l < count; ++l)
        for (int32_t j = 0; j < waveBlock; ++j) {
            const double angle = kTwoPi * PartOfTurn(lines[l].frequency, j);
            table_[wave * l + j] = std::cos(angle);
            table_[wave * l + waveBlock + j] = std::sin(angle);
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
            const double angle = kTwoPi * PartOfTurn(lines[l].frequency, s0);
            SubtractWave({std::cos(angle), std::sin(angle), lines[l].cosine, lines[l].sine},
                         table_ + wave * l, waves_ + wave * l, left);
        }
        Fill(left + length, waveBlock - length, 0.0);
        double ofBlock[2];
        SumOfBlock(left, ofBlock);
        squares += ofBlock[1];
        if (residual != nullptr)
            for (int32_t j = 0; j < length; ++j)
                residual[first + j] = left[j];
        if (moments == nullptr)
            continue;
        moments[0] += ofBlock[0];
        for (int32_t l = 0; l < count; ++l) {
            double sums[4];
            SumByWave(waves_ + wave * l, left, sums);
            DBL *const m = moments + 1 + momentsOfLine * std::ptrdiff_t{l};
            m[0] += sums[0];
            m[1] += sums[1];
            m[2] += s0 * sums[0] + sums[2];
            m[3] += s0 * sums[1] + sums[3];
        }
    }
    return squares;
}

// The parameters: the constant, two of each line, one frequency of each group in units of
// 1 / (pi n).
void SinusoidFit::buildNormal(const Line *lines, int32_t count, int32_t groups) {
    const std::ptrdiff_t size = 1 + 2 * std::ptrdiff_t{count} + groups;
    Fill(normal_, size * size, 0.0);
    const double unit = 2.0 / n_;
    const auto at = [size](std::ptrdiff_t row, std::ptrdiff_t col) {
        return std::max(row, col) * size + std::min(row, col);
    };
    normal_[at(0, 0)] = n_;
    const std::ptrdiff_t firstGroup = 1 + 2 * std::ptrdiff_t{count};
    for (int32_t l = 0; l < count; ++l) {
        const Line &p = lines[l];
        const Kernel alone = KernelAt(p.frequency, n_);
        normal_[at(0, 1 + 2 * l)] = alone.cosines;
        normal_[at(0, firstGroup + p.group)] -= p.slope * unit * p.cosine * alone.sines;
        for (int32_t m = 0; m <= l; ++m) {
            const Line &q = lines[m];
            const Kernel less = KernelAt(std::fabs(p.frequency - q.frequency), n_);
            const Kernel more = KernelAt(p.frequency + q.frequency, n_);
            normal_[at(1 + 2 * l, 1 + 2 * m)] = 0.5 * (less.cosines + more.cosines);
            normal_[at(2 + 2 * l, 2 + 2 * m)] = 0.5 * (less.cosines - more.cosines);
            // s sin(p) cos(q) and s cos(p) sin(q); the kernel's sines are odd.
            const double difference = p.frequency < q.frequency ? -less.sines : less.sines;
            const double ofSine = 0.5 * (more.sines + difference);
            const double ofCosine = 0.5 * (more.sines - difference);
            const double toP = p.slope * unit;
            const double toQ = q.slope * unit;
            normal_[at(firstGroup + q.group, 1 + 2 * l)] -= toQ * q.cosine * ofCosine;
            normal_[at(firstGroup + q.group, 2 + 2 * l)] += toQ * q.sine * ofSine;
            const double both = toP * toQ * 0.5 *
                                (p.cosine * q.cosine * (less.squares - more.squares) +
                                 p.sine * q.sine * (less.squares + more.squares));
            normal_[at(firstGroup + p.group, firstGroup + q.group)] += both;
            if (m == l)
                continue;
            normal_[at(firstGroup + p.group, 1 + 2 * m)] -= toP * p.cosine * ofSine;
            normal_[at(firstGroup + p.group, 2 + 2 * m)] += toP * p.sine * ofCosine;
            if (p.group == q.group)
                normal_[at(firstGroup + p.group, firstGroup + q.group)] += both;
        }
    }
}

void SinusoidFit::buildGradient(const Line *lines, int32_t count, int32_t groups,
                                const DBL *moments) {
    const std::ptrdiff_t firstGroup = 1 + 2 * std::ptrdiff_t{count};
    Fill(gradient_, firstGroup + groups, 0.0);
    gradient_[0] = moments[0];
    for (std::ptrdiff_t l = 0; l < count; ++l) {
        const DBL *const m = moments + 1 + momentsOfLine * l;
        gradient_[1 + 2 * l] = m[0];
        gradient_[2 + 2 * l] = m[1];
        gradient_[firstGroup + lines[l].group] +=
            lines[l].slope * (2.0 / n_) * (lines[l].sine * m[2] - lines[l].cosine * m[3]);
    }
}

// Cholesky's method on the matrix scaled to a diagonal of 1 + damping. A parameter on which nothing
// depends, such as the frequency of a line without amplitude, stays.
bool SinusoidFit::solve(int32_t size, double damping) {
    constexpr double nothing = 1e-40; // of the number of samples
    const std::ptrdiff_t n = size;
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        const double diagonal = normal_[i * n + i];
        scale_[i] = diagonal > nothing * n_ ? 1 / std::sqrt(diagonal) : 0.0;
    }
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        DBL *const row = factor_ + i * n;
        for (std::ptrdiff_t j = 0; j <= i; ++j) {
            const DBL *const other = factor_ + j * n;
            double sum = scale_[i] * normal_[i * n + j] * scale_[j];
            if (i == j)
                sum = scale_[i] > 0 ? 1 + damping : 1;
            for (std::ptrdiff_t k = 0; k < j; ++k)
                sum -= row[k] * other[k];
            if (i != j)
                row[j] = sum / other[j];
            else if (sum > 1e-15)
                row[j] = std::sqrt(sum);
            else
                return false;
        }
        double sum = scale_[i] * gradient_[i];
        for (std::ptrdiff_t k = 0; k < i; ++k)
            sum -= row[k] * step_[k];
        step_[i] = sum / row[i];
    }
    for (std::ptrdiff_t i = n - 1; i >= 0; --i) {
        double sum = step_[i];
        for (std::ptrdiff_t k = i + 1; k < n; ++k)
            sum -= factor_[k * n + i] * step_[k];
        step_[i] = sum / factor_[i * n + i];
    }
    for (std::ptrdiff_t i = 0; i < n; ++i)
        step_[i] *= scale_[i];
    return true;
}

// False where a frequency leaves what a record of this length tells from 0 and from half the
// sampling rate.
bool SinusoidFit::takeStep(const Line *from, int32_t count, int32_t groups, Line *to) {
    const DBL *const ofGroups = step_ + 1 + 2 * std::ptrdiff_t{count};
    double widest = 0;
    for (int32_t g = 0; g < groups; ++g)
        widest = std::max(widest, std::fabs(ofGroups[g]));
    if (widest > kPi) // a bin at most
        for (std::ptrdiff_t i = 0; i < 1 + 2 * std::ptrdiff_t{count} + groups; ++i)
            step_[i] *= kPi / widest;
    for (std::ptrdiff_t l = 0; l < count; ++l) {
        to[l] = from[l];
        to[l].cosine += step_[1 + 2 * l];
        to[l].sine += step_[2 + 2 * l];
        if (from[l].slope == 0)
            continue;
        to[l].frequency += from[l].slope * ofGroups[from[l].group] / (kPi * n_);
        if (!(to[l].frequency >= smallestFrequency() &&
              to[l].frequency <= 0.5 - smallestFrequency()))
            return false;
    }
    return true;
}

double SinusoidFit::refine(Line *lines, int32_t count, int32_t groups, double settled,
                           double &constant) {
    constexpr int32_t mostSteps = 100;
    constexpr double mostDamping = 1e6;
    constexpr double firstDamping = 1e-3;
    constexpr double rounding = 1e-27; // of the samples' own squares

    const int32_t size = 1 + 2 * count + groups;
    double squares = sumOfSquares(lines, count, constant, moments_, nullptr);
    double damping = 0;
    for (int32_t k = 0; k < mostSteps && squares > 0; ++k) {
        buildNormal(lines, count, groups);
        buildGradient(lines, count, groups, moments_);
        double promised = 0;
        for (;;) {
            double trialSquares = kInfinity;
            promised = kInfinity;
            if (solve(size, damping)) {
                promised = 0;
                for (int32_t i = 0; i < size; ++i)
                    promised += step_[i] * gradient_[i];
                if (takeStep(lines, count, groups, trial_))
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
        DBL *const accepted = trialMoments_;
        trialMoments_ = moments_;
        moments_ = accepted;
        damping = damping > firstDamping ? damping / 10 : 0;
        if (promised <= settled * squares && damping == 0)
            break;
    }
    return squares;
}

double SinusoidFit::residualOf(const Line *lines, int32_t count, double constant, DBL *residual) {
    return sumOfSquares(lines, count, constant, nullptr, residual);
}

} // namespace qx

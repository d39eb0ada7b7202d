#include "windows/tapers.h"

#include "frame/constants.h"
#include "windows/cosine_sum.h"

#include <cmath>
#include <type_traits>

namespace qx {

namespace {

// A point that moves round the unit circle in equal steps.
struct Rotation {
    explicit Rotation(double theta) : cosTheta(std::cos(theta)), sinTheta(std::sin(theta)) {}
    void advance() {
        const double c = cosine * cosTheta - sine * sinTheta;
        sine = sine * cosTheta + cosine * sinTheta;
        cosine = c;
    }
    double cosTheta, sinTheta;
    double cosine = 1.0, sine = 0.0;
};

// A window that is 0 at sample 0 and mirrored about n/2, from its value at 1, 2, ...; `value` is
// asked for these in order, and for the middle sample of an even n.
template <class Signal, class Value>
void ScaleMirrored(Signal x, int32_t n, Value value) {
    x.scale(0, 0.0);
    const int32_t half = n / 2 + n % 2;
    for (int32_t i = 1; i < half; ++i) {
        const double w = value(i);
        x.scale(i, w);
        x.scale(n - i, w);
    }
    if (n % 2 == 0)
        x.scale(half, value(half));
}

// The modified Bessel function of order 0, as far as a window needs it.
// kept: the test is absolute and the sum ends after 25 terms, so a large argument is cut short
double KaiserBesselI0(double z) {
    constexpr int rounds = 25;
    constexpr double smallest = 1e-08;
    const double q = z * z;
    double sum = 1.0;
    double term = 1.0;
    double e = 0.0;
    for (int round = 0; round < rounds; ++round) {
        e += 2.0;
        term *= q / (e * e);
        sum += term;
        if (!(term > smallest))
            break;
    }
    return sum;
}

// The integer part of a count of samples, kept within 0 and n; a NaN counts as 0.
int32_t SampleCount(double samples, int32_t n) {
    if (!(samples > 0.0))
        return 0;
    return samples >= n ? n : static_cast<int32_t>(samples);
}

} // namespace

template <class Signal>
ErrorCode ApplyTriangleWindow(Signal x, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    x.clear(0); // kept: also for a single sample, unlike every other window
    const double delta = 2.0 / n;
    // The middle sample of an even n is its own mirror and is scaled by 1 twice.
    for (int32_t i = 1; i <= n / 2; ++i) {
        const double w = i * delta;
        x.scale(i, w);
        x.scale(n - i, w);
    }
    return 0;
}

template <class Signal>
ErrorCode ApplyWelchWindow(Signal x, int32_t n) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double middle = 0.5 * n;
    const double scale = (1.0 / middle) / middle;
    ScaleMirrored(x, n, [=](int32_t i) {
        const double t = i - middle;
        return 1.0 - t * t * scale;
    });
    return 0;
}

template <class Signal>
ErrorCode ApplyBartHannWindow(Signal x, int32_t n) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    if (n == 2) {
        x.scale(0, 0.0);
        return 0;
    }
    Rotation rotation(2.0 * kPi / n);
    ScaleMirrored(x, n, [=](int32_t i) mutable {
        rotation.advance();
        return 0.62 - 0.48 * std::fabs(static_cast<double>(i) / n - 0.5) - 0.38 * rotation.cosine;
    });
    return 0;
}

template <class Signal>
ErrorCode ApplyParzenWindow(Signal x, int32_t n) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double middle = 0.5 * n;
    const double c1 = (6.0 / middle) / middle;
    const double c2 = c1 / middle;
    ScaleMirrored(x, n, [=](int32_t i) {
        const double t = std::fabs(i - middle);
        if (t > 0.5 * middle) {
            const double u = 1.0 - t / middle;
            return u * 2.0 * u * u;
        }
        return (1.0 - t * c1 * t) + t * c2 * t * t;
    });
    return 0;
}

template <class Signal>
ErrorCode ApplyBohmanWindow(Signal x, int32_t n) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    if (n == 2) {
        x.scale(0, 0.0);
        return 0;
    }
    Rotation rotation(2.0 * kPi / n);
    ScaleMirrored(x, n, [=](int32_t i) mutable {
        rotation.advance();
        return rotation.sine * kInversePi - 2.0 * i / n * rotation.cosine;
    });
    return 0;
}

template <class Signal>
ErrorCode ApplyKaiserWindow(Signal x, int32_t n, double beta) {
    if (n < 1)
        return ErrEmptyInput;
    const double peak = KaiserBesselI0(beta);
    x.scale(0, KaiserBesselI0(0.0) / peak);
    const double step = 2.0 / n;
    // The middle sample of an even n has the factor 1 and is left as it is.
    const int32_t last = n % 2 == 0 ? n / 2 - 1 : n / 2;
    for (int32_t i = 1; i <= last; ++i) {
        const double u = 1.0 - i * step;
        const double v = std::sqrt(1.0 - u * u);
        const double w = KaiserBesselI0(v * beta) / peak;
        x.scale(i, w);
        x.scale(n - i, w);
    }
    return 0;
}

template <class Signal>
ErrorCode ApplyGaussWindow(Signal x, int32_t n, double sigma, int32_t symmetric) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double width = sigma <= 0.0 ? 0.2 : sigma;
    // kept: the periodic form counts in units of n + 1 samples
    const double length = symmetric != 0 ? n : n + 1.0;
    const double c = -0.5 / (width * width * (length * length));
    if (symmetric != 0) {
        const double middle = 0.5 * (n - 1.0);
        for (int32_t i = 0; i <= (n - 1) / 2; ++i) {
            const double t = i - middle;
            const double w = std::exp(c * t * t);
            x.scale(i, w);
            if (i != n - 1 - i)
                x.scale(n - 1 - i, w);
        }
        return 0;
    }
    x.scale(0, std::exp(c * n * n * 0.25));
    const auto weight = [=](int32_t i) {
        const double t = i - 0.5 * n;
        return std::exp(t * (c * t));
    };
    for (int32_t i = 1; i <= (n - 1) / 2; ++i) {
        const double w = weight(i);
        x.scale(i, w);
        x.scale(n - i, w);
    }
    if (n % 2 == 0)
        x.scale(n / 2, weight(n / 2));
    return 0;
}

template <class Signal>
ErrorCode ApplyForceWindow(Signal x, int32_t n, double percent) {
    if (n < 2)
        return ErrFewerThanTwo;
    for (int32_t i = SampleCount(percent * 0.01 * n, n); i < n; ++i)
        x.clear(i);
    return 0;
}

template <class Signal>
ErrorCode ApplyExpWindow(Signal x, int32_t n, double finalValue) {
    if (n < 2)
        return ErrFewerThanTwo;
    if (finalValue <= 0.0)
        return ErrFinalValueNotPositive;
    const double step = std::log(finalValue) / (n - 1.0);
    double phase = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        x.scale(i, std::exp(phase));
        phase += step;
    }
    return 0;
}

template <class Signal>
ErrorCode ApplyCosTaperedWindow(Signal x, int32_t n, double taperRatio) {
    if (n < 1)
        return ErrEmptyInput;
    if (taperRatio <= 0.0 || n == 1)
        return 0;
    if (taperRatio >= 1.0) // kept: periodic, while every shorter taper is symmetric
        return ApplyCosineWindowBySelector(x, n, 1, 0);
    const int32_t taper = SampleCount(taperRatio * 0.5 * n, n);
    if (taper <= 0)
        return 0;
    x.clear(0);
    x.clear(n - 1);
    const double delta = kPi / (2.0 * taper);
    double phase = delta;
    for (int32_t i = 1; i < taper; ++i) {
        // kept: the complex form takes the phase afresh, the real form accumulates it
        if constexpr (std::is_same_v<Signal, ComplexSignal>)
            phase = i * kPi / (2.0 * taper);
        const double sine = std::sin(phase);
        x.scale(i, sine * sine);
        x.scale(n - 1 - i, sine * sine);
        phase += delta;
    }
    return 0;
}

#define QX_INSTANTIATE(Signal)                                                                     \
    template ErrorCode ApplyTriangleWindow(Signal, int32_t);                                       \
    template ErrorCode ApplyWelchWindow(Signal, int32_t);                                          \
    template ErrorCode ApplyBartHannWindow(Signal, int32_t);                                       \
    template ErrorCode ApplyParzenWindow(Signal, int32_t);                                         \
    template ErrorCode ApplyBohmanWindow(Signal, int32_t);                                         \
    template ErrorCode ApplyKaiserWindow(Signal, int32_t, double);                                 \
    template ErrorCode ApplyGaussWindow(Signal, int32_t, double, int32_t);                         \
    template ErrorCode ApplyForceWindow(Signal, int32_t, double);                                  \
    template ErrorCode ApplyExpWindow(Signal, int32_t, double);                                    \
    template ErrorCode ApplyCosTaperedWindow(Signal, int32_t, double);

QX_INSTANTIATE(RealSignal)
QX_INSTANTIATE(ComplexSignal)

} // namespace qx

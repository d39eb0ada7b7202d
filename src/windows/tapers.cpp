#include "windows/tapers.h"

#include "frame/constants.h"
#include "windows/cosine_sum.h"

#include <cmath>

namespace qx {

namespace {

// A point that moves around the unit circle in equal steps.
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

// A window that is 0 at sample 0 and mirrored about n/2, from its values at 1, 2, ...; `value` is
// called for these in order, and for the middle sample of an even n.
template <ElementType E, class Value>
void ScaleMirrored(VectorView<E> x, Value value) {
    const int32_t n = Count(x);
    Scale(x[0], 0.0);
    const int32_t half = n / 2 + n % 2;
    for (int32_t i = 1; i < half; ++i) {
        const double w = value(i);
        Scale(x[i], w);
        Scale(x[n - i], w);
    }
    if (n % 2 == 0)
        Scale(x[half], value(half));
}

// The modified Bessel function of order 0, as far as the window needs it.
// kept: the test is absolute and the sum ends after 25 terms, so that it is truncated for large
// arguments
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

// The integer part of a number of samples, clamped to 0 to n; NaN counts as 0.
int32_t SampleCount(double samples, int32_t n) {
    if (!(samples > 0.0))
        return 0;
    return samples >= n ? n : static_cast<int32_t>(samples);
}

} // namespace

template <ElementType E>
ErrorCode ApplyTriangleWindow(VectorView<E> x) {
    const int32_t n = Count(x);
    if (n < 1)
        return ErrEmptyInput;
    Clear(x[0]); // kept: even for a single sample, unlike all other windows
    const double delta = 2.0 / n;
    // The middle sample of an even n is its own mirror and is scaled by 1 twice.
    for (int32_t i = 1; i <= n / 2; ++i) {
        const double w = i * delta;
        Scale(x[i], w);
        Scale(x[n - i], w);
    }
    return 0;
}

template <ElementType E>
ErrorCode ApplyWelchWindow(VectorView<E> x) {
    const int32_t n = Count(x);
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double middle = 0.5 * n;
    const double scale = (1.0 / middle) / middle;
    ScaleMirrored(x, [=](int32_t i) {
        const double t = i - middle;
        return 1.0 - t * t * scale;
    });
    return 0;
}

template <ElementType E>
ErrorCode ApplyBartHannWindow(VectorView<E> x) {
    const int32_t n = Count(x);
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    if (n == 2) {
        Scale(x[0], 0.0);
        return 0;
    }
    Rotation rotation(2.0 * kPi / n);
    ScaleMirrored(x, [=](int32_t i) mutable {
        rotation.advance();
        return 0.62 - 0.48 * std::fabs(static_cast<double>(i) / n - 0.5) - 0.38 * rotation.cosine;
    });
    return 0;
}

template <ElementType E>
ErrorCode ApplyParzenWindow(VectorView<E> x) {
    const int32_t n = Count(x);
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double middle = 0.5 * n;
    const double c1 = (6.0 / middle) / middle;
    const double c2 = c1 / middle;
    ScaleMirrored(x, [=](int32_t i) {
        const double t = std::fabs(i - middle);
        if (t > 0.5 * middle) {
            const double u = 1.0 - t / middle;
            return u * 2.0 * u * u;
        }
        return (1.0 - t * c1 * t) + t * c2 * t * t;
    });
    return 0;
}

template <ElementType E>
ErrorCode ApplyBohmanWindow(VectorView<E> x) {
    const int32_t n = Count(x);
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    if (n == 2) {
        Scale(x[0], 0.0);
        return 0;
    }
    Rotation rotation(2.0 * kPi / n);
    ScaleMirrored(x, [=](int32_t i) mutable {
        rotation.advance();
        return rotation.sine * kInversePi - 2.0 * i / n * rotation.cosine;
    });
    return 0;
}

template <ElementType E>
ErrorCode ApplyKaiserWindow(VectorView<E> x, double beta) {
    const int32_t n = Count(x);
    if (n < 1)
        return ErrEmptyInput;
    const double peak = KaiserBesselI0(beta);
    Scale(x[0], KaiserBesselI0(0.0) / peak);
    const double step = 2.0 / n;
    // The middle sample of an even n has the factor 1 and is left as it is.
    const int32_t last = n % 2 == 0 ? n / 2 - 1 : n / 2;
    for (int32_t i = 1; i <= last; ++i) {
        const double u = 1.0 - i * step;
        const double v = std::sqrt(1.0 - u * u);
        const double w = KaiserBesselI0(v * beta) / peak;
        Scale(x[i], w);
        Scale(x[n - i], w);
    }
    return 0;
}

template <ElementType E>
ErrorCode ApplyGaussWindow(VectorView<E> x, double sigma, bool symmetric) {
    const int32_t n = Count(x);
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const double width = sigma <= 0.0 ? 0.2 : sigma;
    // kept: the periodic form counts in units of n + 1 samples
    const double length = symmetric ? n : n + 1.0;
    const double c = -0.5 / (width * width * (length * length));
    if (symmetric) {
        const double middle = 0.5 * (n - 1.0);
        for (int32_t i = 0; i <= (n - 1) / 2; ++i) {
            const double t = i - middle;
            const double w = std::exp(c * t * t);
            Scale(x[i], w);
            if (i != n - 1 - i)
                Scale(x[n - 1 - i], w);
        }
        return 0;
    }
    Scale(x[0], std::exp(c * n * n * 0.25));
    const auto weight = [=](int32_t i) {
        const double t = i - 0.5 * n;
        return std::exp(t * (c * t));
    };
    for (int32_t i = 1; i <= (n - 1) / 2; ++i) {
        const double w = weight(i);
        Scale(x[i], w);
        Scale(x[n - i], w);
    }
    if (n % 2 == 0)
        Scale(x[n / 2], weight(n / 2));
    return 0;
}

template <ElementType E>
ErrorCode ApplyForceWindow(VectorView<E> x, double percent) {
    const int32_t n = Count(x);
    if (n < 2)
        return ErrFewerThanTwo;
    for (int32_t i = SampleCount(percent * 0.01 * n, n); i < n; ++i)
        Clear(x[i]);
    return 0;
}

template <ElementType E>
ErrorCode ApplyExpWindow(VectorView<E> x, double finalValue) {
    const int32_t n = Count(x);
    if (n < 2)
        return ErrFewerThanTwo;
    if (finalValue <= 0.0)
        return ErrFinalValueNotPositive;
    const double step = std::log(finalValue) / (n - 1.0);
    double phase = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        Scale(x[i], std::exp(phase));
        phase += step;
    }
    return 0;
}

template <ElementType E>
ErrorCode ApplyCosTaperedWindow(VectorView<E> x, double taperRatio) {
    const int32_t n = Count(x);
    if (n < 1)
        return ErrEmptyInput;
    if (taperRatio <= 0.0 || n == 1)
        return 0;
    if (taperRatio >= 1.0) // kept: periodic, while every shorter taper is symmetric
        return ApplyCosineWindowBySelector(x, 1, false);
    const int32_t taper = SampleCount(taperRatio * 0.5 * n, n);
    if (taper <= 0)
        return 0;
    Clear(x[0]);
    Clear(x[n - 1]);
    const double delta = kPi / (2.0 * taper);
    double phase = delta;
    for (int32_t i = 1; i < taper; ++i) {
        // kept: the complex form computes the phase anew, the real form accumulates it
        if constexpr (E == ElementType::CDB)
            phase = i * kPi / (2.0 * taper);
        const double sine = std::sin(phase);
        Scale(x[i], sine * sine);
        Scale(x[n - 1 - i], sine * sine);
        phase += delta;
    }
    return 0;
}

#define QX_INSTANTIATE(View)                                                                       \
    template ErrorCode ApplyTriangleWindow(View);                                                  \
    template ErrorCode ApplyWelchWindow(View);                                                     \
    template ErrorCode ApplyBartHannWindow(View);                                                  \
    template ErrorCode ApplyParzenWindow(View);                                                    \
    template ErrorCode ApplyBohmanWindow(View);                                                    \
    template ErrorCode ApplyKaiserWindow(View, double);                                            \
    template ErrorCode ApplyGaussWindow(View, double, bool);                                       \
    template ErrorCode ApplyForceWindow(View, double);                                             \
    template ErrorCode ApplyExpWindow(View, double);                                               \
    template ErrorCode ApplyCosTaperedWindow(View, double);

QX_INSTANTIATE(RealVector)
QX_INSTANTIATE(ComplexVector)

} // namespace qx

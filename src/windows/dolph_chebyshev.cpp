#include "windows/dolph_chebyshev.h"

#include "fft/plan.h"
#include "frame/scratch.h"
#include "transforms/dct.h"

#include <cmath>
#include <cstring>
#include <limits>
#include <numbers>

namespace qx {

namespace {

double InverseCosh(double y) { return std::log(std::sqrt(y * y - 1.0) + y); }

// W[k] = T[length-1](x0 cos(pi k / length)) for k below `count`; the cosines by recurrence.
void ChebyshevSpectrum(DBL *W, int32_t count, int32_t length, double ratio) {
    const double order = length - 1.0;
    const double x0 = std::cosh(InverseCosh(ratio) / order);
    const double first = std::cos(std::numbers::pi / length);
    W[0] = 1.0;
    if (count > 1)
        W[1] = first;
    for (int32_t k = 2; k < count; ++k)
        W[k] = 2.0 * first * W[k - 1] - W[k - 2];

    W[0] = ratio;
    for (int32_t k = 1; k < count; ++k) {
        const double y = x0 * W[k];
        W[k] = std::fabs(y) <= 1.0 ? std::cos(order * std::acos(y))
                                   : std::cosh(order * InverseCosh(y));
    }
}

// The right half of the window, from the middle outward, in w[0 .. half-1].
ErrorCode RightHalf(DBL *w, int32_t half, int32_t length, double ratio) {
    const bool isEven = length % 2 == 0;
    Scratch<ElementType::DBL> spectrum;
    if (const ErrorCode status = spectrum.allocate(isEven ? half : length))
        return status;
    ChebyshevSpectrum(spectrum.data(), half, length, ratio);

    if (!isEven) {
        Fill(spectrum.data() + half, length - half, 0.0);
        const PlanReference plan(length);
        if (!plan)
            return ErrOutOfMemory;
        return FFTRealInverse(plan.get(), spectrum.data(), w, 1, 1, length);
    }
    spectrum[0] *= std::sqrt(0.5);
    Scratch<ElementType::DBL> work;
    if (const ErrorCode status = work.allocate(DCTInverseWork(half)))
        return status;
    const PlanReference plan(static_cast<int32_t>(DCTPlanLength(half)));
    if (!plan)
        return ErrOutOfMemory;
    return DCTInverse(spectrum.data(), w, 1, 1, half, work.data(), plan.get());
}

} // namespace

ErrorCode GenerateDolChebyWindow(DBL *w, double *peak, int32_t length, double ratio) {
    const int32_t half = length / 2 + length % 2;
    const ErrorCode status = RightHalf(w, half, length, ratio);
    if (status >= 0) {
        const int32_t middle = length % 2; // of an odd window, on both sides the same value
        std::memcpy(w + half, w + middle, static_cast<std::size_t>(half - middle) * sizeof(DBL));
        Reverse(w, half);
    }
    // kept: handed back also after a failure
    *peak = -std::numeric_limits<double>::infinity();
    for (int32_t i = 0; i < half; ++i)
        if (w[i] > *peak)
            *peak = w[i];
    return status;
}

template <class Signal>
ErrorCode ApplyDolChebyWindow(Signal x, int32_t n, double ratio, int32_t symmetric) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    const int64_t length = int64_t{n} + (symmetric != 0 ? 0 : 1);
    Scratch<ElementType::DBL> window;
    if (const ErrorCode status = window.allocate(length))
        return status;
    double peak;
    const ErrorCode status =
        GenerateDolChebyWindow(window.data(), &peak, static_cast<int32_t>(length), ratio);
    if (status == 0) {
        const double gain = 1.0 / peak;
        for (int32_t i = 0; i < n; ++i)
            x.scale(i, window[i] * gain);
    }
    return Merge(status, window.release());
}

template ErrorCode ApplyDolChebyWindow(RealSignal, int32_t, double, int32_t);
template ErrorCode ApplyDolChebyWindow(ComplexSignal, int32_t, double, int32_t);

} // namespace qx

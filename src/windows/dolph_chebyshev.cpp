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

// W[k] = T[length-1](x0 cos(pi k / length)); the cosines by recurrence.
void ChebyshevSpectrum(RealVector W, int32_t length, double ratio) {
    const double order = length - 1.0;
    const double x0 = std::cosh(InverseCosh(ratio) / order);
    const double first = std::cos(std::numbers::pi / length);
    W[0] = 1.0;
    if (W.size() > 1)
        W[1] = first;
    for (std::ptrdiff_t k = 2; k < W.size(); ++k)
        W[k] = 2.0 * first * W[k - 1] - W[k - 2];

    W[0] = ratio;
    for (std::ptrdiff_t k = 1; k < W.size(); ++k) {
        const double y = x0 * W[k];
        W[k] = std::fabs(y) <= 1.0 ? std::cos(order * std::acos(y))
                                   : std::cosh(order * InverseCosh(y));
    }
}

// The right half of the window of the given length, from the middle outwards, in the first `half`
// values of w.
ErrorCode RightHalf(DBL *w, int32_t half, int32_t length, double ratio) {
    const bool isEven = length % 2 == 0;
    RealVector spectrum, work;
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(spectrum, isEven ? half : length),
                                             Sized(work, isEven ? DCTInverseWork(half) : 0)))
        return status;
    ChebyshevSpectrum(spectrum.part(0, half), length, ratio);
    const PlanReference plan(isEven ? static_cast<int32_t>(DCTPlanLength(half)) : length);
    if (!plan)
        return ErrOutOfMemory;
    if (!isEven) {
        Fill(spectrum.data() + half, length - half, 0.0);
        return FFTRealInverse(plan.get(), spectrum.data(), w, 1, 1, length);
    }
    spectrum[0] *= std::sqrt(0.5);
    return DCTInverse(plan.get(), spectrum.part(0, half), {w, half}, work.data());
}

// Fills w, which has two or more values, with the window, without normalising it: the inverse
// transform of T[length-1](x0 cos(pi k / length)), whose side lobes all lie `ratio` below the main
// lobe. *peak is its largest value.
ErrorCode GenerateDolChebyWindow(RealVector w, double ratio, double *peak) {
    const int32_t length = Count(w), half = length / 2 + length % 2;
    if (const ErrorCode status = RightHalf(w.data(), half, length, ratio))
        return status;
    const int32_t middle = length % 2; // 1 if both halves share the middle value
    std::memcpy(&w[half], &w[middle], static_cast<std::size_t>(half - middle) * sizeof(DBL));
    Reverse(w.data(), half);
    *peak = -std::numeric_limits<double>::infinity();
    for (const double value : w.part(0, half))
        if (value > *peak)
            *peak = value;
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode ApplyDolChebyWindow(VectorView<E> x, double ratio, bool symmetric) {
    if (x.size() <= 1)
        return x.isEmpty() ? ErrEmptyInput : 0;
    RealVector window;
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(window, x.size() + (symmetric ? 0 : 1))))
        return status;
    double peak;
    if (const ErrorCode status = GenerateDolChebyWindow(window, ratio, &peak))
        return Merge(status, memory.release());
    const double gain = 1.0 / peak;
    for (std::ptrdiff_t i = 0; i < x.size(); ++i)
        Scale(x[i], window[i] * gain);
    return memory.release();
}

template ErrorCode ApplyDolChebyWindow(RealVector, double, bool);
template ErrorCode ApplyDolChebyWindow(ComplexVector, double, bool);

} // namespace qx

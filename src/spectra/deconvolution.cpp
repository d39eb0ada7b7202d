#include "spectra/deconvolution.h"

#include "fft/plan.h"
#include "frame/scratch.h"
#include "spectra/recursion.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

void CopyPadded(ConstRealVector from, RealVector to) {
    std::memcpy(to.data(), from.data(), sizeof(DBL) * static_cast<std::size_t>(from.size()));
    Fill(to.data() + from.size(), to.size() - from.size(), 0.0);
}

// Whether a value of the half-complex spectrum h is too small to divide by; false for NaN.
// kept: element k is paired with element L/2 + k, which is not its own imaginary part.
bool IsSingular(const DBL *h, std::ptrdiff_t L) {
    const double tolerance = std::min(static_cast<double>(L) * 2.220446049250313e-16, 1e-9);
    const std::ptrdiff_t half = L / 2;
    for (std::ptrdiff_t k = 0; k <= half; ++k) {
        const double a = h[k];
        const double b = k == 0 || k == half ? 0.0 : h[half + k];
        if (std::fabs(a) < tolerance && std::fabs(b) < tolerance)
            return true;
    }
    return false;
}

// g = g / h, both in half-complex form, L a power of two.
void DivideHalfComplex(DBL *g, const DBL *h, std::ptrdiff_t L) {
    g[0] = g[0] / h[0];
    for (std::ptrdiff_t k = 1; k < L / 2; ++k) {
        const double a = g[k];
        const double b = g[L - k];
        const double c = h[k];
        const double d = h[L - k];
        const double t = 1.0 / (d * d + c * c);
        g[k] = (a * c + d * b) * t;
        g[L - k] = (b * c - a * d) * t;
    }
    if (L > 1)
        g[L / 2] = g[L / 2] / h[L / 2];
}

// The first values of the response of the taps x to a unit impulse: x itself followed by zeros,
// except that each sum also includes all the other taps times zero.
void ImpulseResponse(ConstRealVector x, RealVector response) {
    std::ptrdiff_t broken = 0;
    for (const double value : x)
        broken += !std::isfinite(value);
    for (std::ptrdiff_t t = 0; t < response.size(); ++t) {
        const double own = t < x.size() ? x[t] : 0.0;
        const std::ptrdiff_t others = broken - !std::isfinite(own);
        response[t] = others == 0 ? 0.0 + own : std::numeric_limits<double>::quiet_NaN();
    }
}

// Division by the series: with i leading zeros in y, the quotient begins at index i of the response
// of the filter with the numerator x and the denominator y from index i on. If y is all zeros, only
// the numerator remains, and the quotient begins at index ny.
ErrorCode DivideSeries(ConstRealVector x, ConstRealVector y, RealVector quotient) {
    std::ptrdiff_t zeros = 0;
    while (zeros < y.size() && y[zeros] == 0.0)
        ++zeros;
    const ConstRealVector divisor = y.part(zeros, y.size() - zeros);
    RealVector response, history;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(response, int64_t{quotient.size()} + zeros),
                        Sized(history, std::max<std::ptrdiff_t>(0, divisor.size() - 1))))
        return failed;
    ImpulseResponse(x, response);
    if (!divisor.isEmpty()) {
        Fill(history.data(), history.size(), 0.0);
        RunRecursion(divisor, history, response);
    }
    std::memcpy(quotient.data(), response.data() + zeros,
                sizeof(DBL) * static_cast<std::size_t>(quotient.size()));
    return memory.release();
}

} // namespace

ErrorCode DeconvolveReal(ConstRealVector x, ConstRealVector y, RealVector quotient) {
    QX_EXPECTS(!y.isEmpty() && quotient.size() == x.size() - y.size() + 1);
    int64_t L = 1;
    while (L < x.size())
        L *= 2;
    RealVector g, padded, h;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(g, L), Sized(padded, L), Sized(h, L)))
        return failed;
    const auto length = static_cast<int32_t>(L);
    const PlanReference plan(length);
    if (!plan)
        return ErrOutOfMemory;
    CopyPadded(y, g);
    if (const ErrorCode failed = FFTRealForward(plan.get(), g.data(), h.data(), 1, 1, length))
        return failed;
    if (IsSingular(h.data(), length))
        return DivideSeries(x, y, quotient);
    CopyPadded(x, padded);
    if (const ErrorCode failed = FFTRealForward(plan.get(), padded.data(), g.data(), 1, 1, length))
        return failed;
    DivideHalfComplex(g.data(), h.data(), length);
    if (const ErrorCode failed = FFTRealInverse(plan.get(), g.data(), padded.data(), 1, 1, length))
        return failed;
    std::memcpy(quotient.data(), padded.data(),
                sizeof(DBL) * static_cast<std::size_t>(quotient.size()));
    return memory.release();
}

} // namespace qx

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

typedef Scratch<ElementType::DBL> Work;

void CopyPadded(const DBL *from, std::ptrdiff_t count, DBL *to, std::ptrdiff_t length) {
    std::memcpy(to, from, sizeof(DBL) * static_cast<std::size_t>(count));
    Fill(to + count, length - count, 0.0);
}

// Whether a value of the half-complex spectrum h is too small to divide by. NaN is not.
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

// What the taps x give for a unit impulse, the `count` first values: x itself and zeros after it,
// but each sum also meets all the other taps times zero.
void ImpulseResponse(const DBL *x, std::ptrdiff_t nx, DBL *response, std::ptrdiff_t count) {
    std::ptrdiff_t broken = 0;
    for (std::ptrdiff_t i = 0; i < nx; ++i)
        broken += !std::isfinite(x[i]);
    for (std::ptrdiff_t t = 0; t < count; ++t) {
        const double own = t < nx ? x[t] : 0.0;
        const std::ptrdiff_t others = broken - !std::isfinite(own);
        response[t] = others == 0 ? 0.0 + own : std::numeric_limits<double>::quiet_NaN();
    }
}

// By the series: with i leading zeros in y, the quotient begins at place i of the response of the
// filter with the numerator x and the denominator y from i on. An all-zero y leaves the numerator
// alone, and the quotient begins at place ny.
ErrorCode DivideSeries(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out) {
    int32_t i = 0;
    while (i < ny && y[i] == 0.0)
        ++i;
    const int32_t na = ny - i;
    const int32_t outCount = nx - ny + 1;
    const int32_t count = outCount + i;
    Work work;
    if (const ErrorCode failed = work.allocate(int64_t{count} + na))
        return failed;
    DBL *const response = work.data();
    ImpulseResponse(x, nx, response, count);
    if (na > 0) {
        DBL *const history = response + count;
        Fill(history, na - 1, 0.0);
        RunRecursion(y + i, na, history, response, count);
    }
    std::memcpy(out, response + i, sizeof(DBL) * static_cast<std::size_t>(outCount));
    return work.release();
}

} // namespace

ErrorCode DeconvolveReal(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out) {
    if (nx < 1 || ny < 1)
        return ErrEmptyInput;
    if (nx < ny)
        return ErrSizesDisagree;
    int64_t L = 1;
    while (L < nx)
        L *= 2;
    Work memory;
    if (const ErrorCode failed = memory.allocate(3 * L))
        return failed;
    const auto length = static_cast<int32_t>(L);
    const PlanReference plan(length);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const g = memory.data();
    DBL *const padded = g + length;
    DBL *const h = padded + length;
    CopyPadded(y, ny, g, length);
    if (const ErrorCode failed = FFTRealForward(plan.get(), g, h, 1, 1, length))
        return failed;
    if (IsSingular(h, length))
        return DivideSeries(x, nx, y, ny, out);
    CopyPadded(x, nx, padded, length);
    if (const ErrorCode failed = FFTRealForward(plan.get(), padded, g, 1, 1, length))
        return failed;
    DivideHalfComplex(g, h, length);
    if (const ErrorCode failed = FFTRealInverse(plan.get(), g, padded, 1, 1, length))
        return failed;
    std::memcpy(out, padded, sizeof(DBL) * static_cast<std::size_t>(nx - ny + 1));
    return memory.release();
}

} // namespace qx

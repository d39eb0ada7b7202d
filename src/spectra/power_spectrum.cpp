#include "spectra/power_spectrum.h"

#include "fft/plan.h"
#include "frame/scratch.h"
#include "spectra/powers.h"

#include <cstddef>

namespace qx {
namespace {

double SpectrumScale(int32_t n) { return 1.0 / (static_cast<double>(n) * static_cast<double>(n)); }

} // namespace

ErrorCode PowerSpectrumReal(DBL *x, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1) {
        x[0] = x[0] * x[0];
        return 0;
    }
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(n))
        return failed;
    const PlanReference plan(n);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const h = work.data();
    if (const ErrorCode failed = FFTRealForward(plan.get(), x, h, 1, 1, n))
        return failed;
    PowerOfHalfComplex(h, n, SpectrumScale(n), x);
    return work.release();
}

ErrorCode PowerSpectrumComplex(const DBL *z, DBL *out, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1) {
        out[0] = z[0] * z[0] + z[1] * z[1];
        return 0;
    }
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(2 * int64_t{n}))
        return failed;
    const PlanReference plan(n);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const f = work.data();
    if (const ErrorCode failed = FFTComplexForward(plan.get(), z, z + 1, f, f + 1, 2, 2, n))
        return failed;
    PowerOfComplex(f, n, SpectrumScale(n), out);
    return work.release();
}

ErrorCode CrossSpectrumReal(const DBL *x, const DBL *y, int32_t inStride, int32_t n, DBL *outRe,
                            DBL *outIm, int32_t outStride) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1) {
        outRe[0] = x[0] * y[0];
        outIm[0] = 0.0;
        return 0;
    }
    const PlanReference plan(n);
    if (!plan)
        return ErrOutOfMemory;
    // The half-complex spectrum of x in the real slots, that of y in the imaginary slots.
    if (const ErrorCode failed = FFTRealForward(plan.get(), x, outRe, inStride, outStride, n))
        return failed;
    if (const ErrorCode failed = FFTRealForward(plan.get(), y, outIm, inStride, outStride, n))
        return failed;
    const double s = SpectrumScale(n);
    const std::ptrdiff_t stride = outStride;
    outRe[0] = (outRe[0] * outIm[0]) * s;
    outIm[0] = 0.0;
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const std::ptrdiff_t low = k * stride;
        const std::ptrdiff_t high = (n - k) * stride;
        const double a = outRe[low];
        const double b = outRe[high];
        const double c = outIm[low];
        const double d = outIm[high];
        const double re = (a * c + d * b) * s;
        const double im = (a * d - c * b) * s;
        outRe[low] = re;
        outIm[low] = im;
        outRe[high] = re;
        outIm[high] = -im;
    }
    if (n % 2 == 0) {
        const std::ptrdiff_t middle = n / 2 * stride;
        outRe[middle] = s * (outRe[middle] * outIm[middle]);
        outIm[middle] = 0.0;
    }
    return 0;
}

ErrorCode CrossSpectrumComplex(const DBL *x, const DBL *y, int32_t n, DBL *out) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1) {
        const double re = x[0] * y[0] + x[1] * y[1];
        const double im = x[0] * y[1] - x[1] * y[0];
        out[0] = re;
        out[1] = im;
        return 0;
    }
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(4 * int64_t{n}))
        return failed;
    const PlanReference plan(n);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const first = work.data();
    DBL *const second = first + 2 * std::ptrdiff_t{n};
    if (const ErrorCode failed = FFTComplexForward(plan.get(), x, x + 1, first, first + 1, 2, 2, n))
        return failed;
    if (const ErrorCode failed =
            FFTComplexForward(plan.get(), y, y + 1, second, second + 1, 2, 2, n))
        return failed;
    CrossOfComplex(first, second, n, SpectrumScale(n), out);
    return work.release();
}

} // namespace qx

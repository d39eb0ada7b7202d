#include "transforms/hartley.h"

#include "fft/plan.h"
#include "frame/heap_block.h"

#include <cstddef>
#include <optional>

namespace qx {
namespace {

// The half-complex spectrum of n values in a block from the heap, with the plan that made it.
struct HalfSpectrum {
    HeapBlock<ElementType::DBL> h;
    std::optional<PlanReference> plan;

    ErrorCode take(const DBL *x, int32_t n) {
        if (const ErrorCode failed = h.allocate(n))
            return failed;
        plan.emplace(n);
        if (!*plan)
            return ErrOutOfMemory;
        return FFTRealForward(plan->get(), x, h.data(), 1, 1, n);
    }
};

} // namespace

ErrorCode FastHartley(DBL *x, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1)
        return 0;
    HalfSpectrum spectrum;
    if (const ErrorCode failed = spectrum.take(x, n))
        return failed;
    DBL *const h = spectrum.h.data();
    x[0] = h[0];
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const double re = h[k];
        const double im = h[n - k];
        x[k] = re - im;
        x[n - k] = re + im;
    }
    if (n % 2 == 0)
        x[n / 2] = h[n / 2];
    return 0;
}

ErrorCode FastHartleyInverse(DBL *x, int32_t n) {
    if (const ErrorCode failed = FastHartley(x, n))
        return failed;
    const double scale = 1.0 / n;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        x[j] *= scale;
    return 0;
}

ErrorCode FastHilbert(DBL *x, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    if (n == 1) {
        x[0] = 0;
        return 0;
    }
    HalfSpectrum spectrum;
    if (const ErrorCode failed = spectrum.take(x, n))
        return failed;
    DBL *const h = spectrum.h.data();
    h[0] = 0;
    if (n % 2 == 0)
        h[n / 2] = 0;
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const double re = h[k];
        h[k] = h[n - k];
        h[n - k] = -re;
    }
    return FFTRealInverse(spectrum.plan->get(), h, x, 1, 1, n);
}

ErrorCode FastHilbertInverse(DBL *x, int32_t n) {
    if (const ErrorCode failed = FastHilbert(x, n))
        return failed;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        x[j] = -x[j];
    return 0;
}

} // namespace qx

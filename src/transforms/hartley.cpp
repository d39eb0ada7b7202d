#include "transforms/hartley.h"

#include "frame/heap_block.h"

#include <cstddef>

namespace qx {
namespace {

typedef HeapBlock<ElementType::DBL> HalfSpectrum;

// The half-complex spectrum of x, in a heap block.
ErrorCode Transform(const FFTPlan *plan, ConstRealVector x, HalfSpectrum &h) {
    QX_EXPECTS(plan->length == x.size());
    if (const ErrorCode failed = h.allocate(plan->length))
        return failed;
    return FFTRealForward(plan, x.data(), h.data(), 1, 1, plan->length);
}

} // namespace

ErrorCode FastHartley(const FFTPlan *plan, RealVector x) {
    const std::ptrdiff_t n = x.size();
    if (n == 1)
        return 0;
    HalfSpectrum h;
    if (const ErrorCode failed = Transform(plan, x, h))
        return failed;
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

ErrorCode FastHartleyInverse(const FFTPlan *plan, RealVector x) {
    if (const ErrorCode failed = FastHartley(plan, x))
        return failed;
    const double scale = 1.0 / static_cast<double>(x.size());
    for (DBL &value : x)
        value *= scale;
    return 0;
}

ErrorCode FastHilbert(const FFTPlan *plan, RealVector x) {
    const std::ptrdiff_t n = x.size();
    if (n == 1) {
        x[0] = 0;
        return 0;
    }
    HalfSpectrum h;
    if (const ErrorCode failed = Transform(plan, x, h))
        return failed;
    h[0] = 0;
    if (n % 2 == 0)
        h[n / 2] = 0;
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const double re = h[k];
        h[k] = h[n - k];
        h[n - k] = -re;
    }
    return FFTRealInverse(plan, h.data(), x.data(), 1, 1, plan->length);
}

ErrorCode FastHilbertInverse(const FFTPlan *plan, RealVector x) {
    if (const ErrorCode failed = FastHilbert(plan, x))
        return failed;
    for (DBL &value : x)
        value = -value;
    return 0;
}

} // namespace qx

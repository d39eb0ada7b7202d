#include "frame/lanes.h"
#include "spectra/spectral_products.h"

namespace qx::QX_WIDTH {
namespace {

// The frequencies from k on, one per lane, and the indices of their imaginary parts.
template <class N>
struct Pairs {
    std::ptrdiff_t k, opposite;
    Pairs(std::ptrdiff_t first, std::ptrdiff_t n)
        : k(first), opposite(n - first - (N::count - 1)) {}

    N re(const DBL *x) const { return N::load(x + k); }
    N im(const DBL *x) const { return N::load(x + opposite).reversed(); }
    void store(N realPart, N imaginaryPart, DBL *out) const {
        realPart.store(out + k);
        imaginaryPart.reversed().store(out + opposite);
    }
};

template <class N>
inline void MultiplyPairs(const DBL *x, const DBL *y, std::ptrdiff_t k, std::ptrdiff_t n,
                          DBL *out) {
    const Pairs<N> at(k, n);
    const N a = at.re(x);
    const N b = at.im(x);
    const N c = at.re(y);
    const N d = at.im(y);
    at.store(a * c - b * d, b * c + d * a, out);
}

template <class N>
inline void SquarePairs(const DBL *x, std::ptrdiff_t k, std::ptrdiff_t n, DBL *out) {
    const Pairs<N> at(k, n);
    const N a = at.re(x);
    const N b = at.im(x);
    at.store(a * a + b * b, N(0.0), out);
}

} // namespace

void MultiplyHalfComplex(const DBL *x, const DBL *y, int32_t n, DBL *out) {
    out[0] = x[0] * y[0];
    const std::ptrdiff_t last = (n - 1) / 2;
    std::ptrdiff_t k = 1;
    for (; k + nativeLanes - 1 <= last; k += nativeLanes)
        MultiplyPairs<Lanes<nativeLanes>>(x, y, k, n, out);
    for (; k <= last; ++k)
        MultiplyPairs<Lanes<1>>(x, y, k, n, out);
    if (n % 2 == 0)
        out[n / 2] = x[n / 2] * y[n / 2];
}

void SquareHalfComplex(const DBL *x, int32_t n, DBL *out) {
    out[0] = x[0] * x[0];
    const std::ptrdiff_t last = (n - 1) / 2;
    std::ptrdiff_t k = 1;
    for (; k + nativeLanes - 1 <= last; k += nativeLanes)
        SquarePairs<Lanes<nativeLanes>>(x, k, n, out);
    for (; k <= last; ++k)
        SquarePairs<Lanes<1>>(x, k, n, out);
    if (n % 2 == 0)
        out[n / 2] = x[n / 2] * x[n / 2];
}

void MultiplyComplex(const CDB *x, const CDB *y, std::ptrdiff_t n, CDB *out) {
    for (std::ptrdiff_t k = 0; k < n; ++k) {
        const double a = x[k].re;
        const double b = x[k].im;
        const double c = y[k].re;
        const double d = y[k].im;
        out[k].re = a * c - b * d;
        out[k].im = c * b + d * a;
    }
}

} // namespace qx::QX_WIDTH

#ifndef QX_FFT_WHOLE_H
#define QX_FFT_WHOLE_H

#include "fft/kernels/kernel_set.h"

// Single transforms, side by side.

namespace qx::QX_WIDTH {

template <int P>
QX_INLINE void WholeComplexTransform(const DBL *in, DBL *out) {
    RunPacked<P, One>(SideBySideIn{in}, SideBySideOut{out});
}

template <int P>
QX_INLINE void WholeRealTransform(const DBL *in, DBL *out) {
    RunReal<P, Narrow>(RealColumnIn{in, 1}, RealColumnOut{out, 1});
}

struct ArrayOut {
    One *y;
    QX_INLINE void set(int k, One x) const { y[k] = x; }
};

// A real transform of P = 2 m values as a complex one of m: the values of even index are its real
// parts, those of odd index its imaginary ones. With Z its spectrum, those of the even and of the
// odd values are E = (Z[k] + conj Z[m-k]) / 2 and O = -i (Z[k] - conj Z[m-k]) / 2, and X[k] =
// E + w O, X[m-k] = conj (E - w O) with w = exp(-2 pi i k / P). `turns` are cosine and sine,
// halved, of the angles 2 pi k / P for k from 1 to (m - 1) / 2.
template <int P>
QX_INLINE void RealByHalf(const DBL *in, DBL *h, const double *turns) {
    constexpr int m = P / 2;
    typedef int64_t Bits __attribute__((vector_size(16)));
    const Bits imaginarySign = {0, INT64_MIN};
    const auto conjugate = [=](One x) { return One((One::Vector)((Bits)x.v ^ imaginarySign)); };

    One z[m];
    RunPacked<m, One>(SideBySideIn{in}, ArrayOut{z});
    h[0] = z[0][0] + z[0][1];
    h[m] = z[0][0] - z[0][1];
#pragma GCC unroll 16
    for (int k = 1; 2 * k < m; ++k) {
        const One low = z[k];
        const One high = conjugate(z[m - k]);
        const One even = (low + high) * One(0.5);
        const One odd = Turned(low - high, -turns[2 * k - 1], turns[2 * k - 2]);
        const One direct = even + odd;
        const One mirrored = conjugate(even - odd);
        h[k] = direct[0];
        h[P - k] = direct[1];
        h[m - k] = mirrored[0];
        h[m + k] = mirrored[1];
    }
    if constexpr (m % 2 == 0) {
        h[m / 2] = z[m / 2][0];
        h[m + m / 2] = -z[m / 2][1];
    }
}

} // namespace qx::QX_WIDTH

#endif

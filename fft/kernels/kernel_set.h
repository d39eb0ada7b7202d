#ifndef QX_FFT_KERNEL_SET_H
#define QX_FFT_KERNEL_SET_H

#include "fft/kernels/columns.h"
#include "fft/kernels/kernels.h"

#include <algorithm>

// The loops around the straight-line transforms of one radix.

namespace qx {

// ---- Large bodies stand alone ----
//
// From this radix on a transform is so long that one copy of it, between arrays, serves all loops.
inline constexpr int smallestArrayRadix = 17;

template <class V>
struct ComplexArrayIn {
    const Complex<V> *x;
    QX_INLINE Complex<V> at(int j) const { return x[j]; }
};
template <class V>
struct ComplexArrayOut {
    Complex<V> *y;
    QX_INLINE void set(int k, V re, V im) const { y[k] = {re, im}; }
};
template <class V>
struct RealArrayIn {
    const V *x;
    QX_INLINE V at(int j) const { return x[j]; }
};
template <class V>
struct RealArrayOut {
    V *h;
    QX_INLINE void set(int k, V a) const { h[k] = a; }
    QX_INLINE void setPair(int k, V a, V b) const {
        h[k] = a;
        h[k + 1] = b;
    }
};

template <int P, class V>
__attribute__((noinline)) void ComplexInArrays(const Complex<V> *x, Complex<V> *y) {
    ComplexTransform<P>::template run<V>(ComplexArrayIn<V>{x}, ComplexArrayOut<V>{y});
}
template <int P, class V>
__attribute__((noinline)) void RealInArrays(const V *x, V *h) {
    RealTransform<P>::template run<V>(RealArrayIn<V>{x}, RealArrayOut<V>{h});
}

inline constexpr bool standsAlone(int radix) { return radix >= smallestArrayRadix && radix % 2; }

template <int P, class V, class In, class Out>
QX_INLINE void RunComplex(const In &in, const Out &out) {
    if constexpr (standsAlone(P)) {
        Complex<V> x[P], y[P];
        for (int j = 0; j < P; ++j)
            x[j] = in.at(j);
        ComplexInArrays<P, V>(x, y);
        for (int k = 0; k < P; ++k)
            out.set(k, y[k].re, y[k].im);
    } else {
        ComplexTransform<P>::template run<V>(in, out);
    }
}

template <int P, class V, class In, class Out>
QX_INLINE void RunReal(const In &in, const Out &out) {
    if constexpr (standsAlone(P)) {
        V x[P], h[P];
        for (int j = 0; j < P; ++j)
            x[j] = in.at(j);
        RealInArrays<P, V>(x, h);
        for (int k = 0; k + 1 < P; k += 2)
            out.setPair(k, h[k], h[k + 1]);
        out.set(P - 1, h[P - 1]);
    } else {
        RealTransform<P>::template run<V>(in, out);
    }
}

// ---- Complex ----

// The columns of a leaf, nativeLanes at a time; lanes behind the last column repeat it.
template <class Block>
QX_INLINE void ForLeafBlocks(const LeafColumns &columns, const Block &block) {
    ptrdiff_t a = 0;
    ptrdiff_t b = 0;
    ptrdiff_t in[nativeLanes];
    ptrdiff_t out[nativeLanes];
    while (b < columns.count[1]) {
        for (int lane = 0; lane < nativeLanes; ++lane) {
            if (b < columns.count[1]) {
                in[lane] = a * columns.inStride[0] + b * columns.inStride[1];
                out[lane] = a * columns.outStride[0] + b * columns.outStride[1];
                if (++a == columns.count[0]) {
                    a = 0;
                    ++b;
                }
            } else {
                in[lane] = in[lane - 1];
                out[lane] = out[lane - 1];
            }
        }
        block(in, out);
    }
}

template <int P>
void ComplexLanesLeaf(const DBL *in, DBL *out, const LeafColumns &columns) {
    if (columns.count[0] * columns.count[1] == 1) {
        RunComplex<P, Narrow>(ComplexColumnIn{in, in + 1, columns.legStride},
                              ComplexColumnOut{out, out + 1, 2});
        return;
    }
    ForLeafBlocks(columns, [&](const ptrdiff_t *inAt, const ptrdiff_t *outAt) {
        ComplexGatherIn x;
        ComplexScatterOut y;
        for (int lane = 0; lane < nativeLanes; ++lane) {
            x.x[lane] = in + inAt[lane];
            y.y[lane] = out + outAt[lane];
        }
        x.leg = columns.legStride;
        y.leg = 2;
        RunComplex<P, Wide>(x, y);
    });
}

template <int P>
void ComplexLanesTwiddle(DBL *data, const DBL *lanes, ptrdiff_t m) {
    const ptrdiff_t leg = 2 * m;
    ptrdiff_t k = 0;
    for (; k + nativeLanes <= m; k += nativeLanes) {
        DBL *const columns = data + 2 * k;
        RunComplex<P, Wide>(TwiddledLanesIn<ComplexLanesIn>{{columns, leg}, lanes},
                            ComplexLanesOut{columns, leg});
        lanes += 2 * nativeLanes * (P - 1);
    }
    if (k == m)
        return;
    TwiddledLanesIn<ComplexGatherIn> in;
    ComplexScatterOut out;
    for (int lane = 0; lane < nativeLanes; ++lane)
        in.columns.x[lane] = out.y[lane] = data + 2 * std::min(k + lane, m - 1);
    in.columns.leg = out.leg = leg;
    in.lanes = lanes;
    RunComplex<P, Wide>(in, out);
}

template <int P>
void ComplexLeafKernel(const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm, ptrdiff_t inStride,
                       ptrdiff_t outStride, int32_t count) {
    const ptrdiff_t leg = count * inStride;
    if (inIm == inRe + 1 && outIm == outRe + 1 && outStride == 2) {
        ComplexLanesLeaf<P>(inRe, outRe, {{count, 1}, {inStride, 0}, {2 * P, 0}, leg});
        return;
    }
    for (ptrdiff_t i = 0; i < count; ++i)
        RunComplex<P, Narrow>(
            ComplexColumnIn{inRe + i * inStride, inIm + i * inStride, leg},
            ComplexColumnOut{outRe + i * P * outStride, outIm + i * P * outStride, outStride});
}

template <int P>
void ComplexTwiddleKernel(DBL *re, DBL *im, const DBL *twiddleCos, const DBL *twiddleSin,
                          ptrdiff_t stride, int32_t m) {
    const ptrdiff_t leg = m * stride;
    double one[P], zero[P]; // for column 0, which is treated as in lanes
    std::fill(one, one + P, 1.0);
    std::fill(zero, zero + P, 0.0);
    for (ptrdiff_t k = 0; k < m; ++k) {
        const ptrdiff_t entry = (k - 1) * (P - 1);
        DBL *const columnRe = re + k * stride;
        DBL *const columnIm = im + k * stride;
        RunComplex<P, Narrow>(TwiddledColumnIn{{columnRe, columnIm, leg},
                                               k == 0 ? one : twiddleCos + entry,
                                               k == 0 ? zero : twiddleSin + entry},
                              ComplexColumnOut{columnRe, columnIm, leg});
    }
}

// ---- Real ----

template <int P>
void RealLanesLeaf(const DBL *in, DBL *out, const LeafColumns &columns) {
    if (columns.count[0] * columns.count[1] == 1) {
        RunReal<P, Narrow>(RealColumnIn{in, columns.legStride}, RealColumnOut{out, 1});
        return;
    }
    ForLeafBlocks(columns, [&](const ptrdiff_t *inAt, const ptrdiff_t *outAt) {
        RealBlocksOut h;
        for (int lane = 0; lane < nativeLanes; ++lane)
            h.h[lane] = out + outAt[lane];
        RealGatherIn x;
        for (int lane = 0; lane < nativeLanes; ++lane)
            x.x[lane] = in + inAt[lane];
        x.leg = columns.legStride;
        RunReal<P, Wide>(x, h);
    });
}

template <int P>
void RealLeafKernel(const DBL *in, DBL *out, ptrdiff_t inStride, ptrdiff_t outStride,
                    int32_t count) {
    const ptrdiff_t leg = count * inStride;
    if (outStride == 1) {
        RealLanesLeaf<P>(in, out, {{count, 1}, {inStride, 0}, {P, 0}, leg});
        return;
    }
    for (ptrdiff_t i = 0; i < count; ++i)
        RunReal<P, Narrow>(RealColumnIn{in + i * inStride, leg},
                           RealColumnOut{out + i * P * outStride, outStride});
}

// Columns 0 and, for even m, m / 2: real values in every block.
template <int P>
void RealEdgeColumns(DBL *data, ptrdiff_t stride, ptrdiff_t m) {
    const ptrdiff_t leg = m * stride;
    RunReal<P, Narrow>(RealColumnIn{data, leg}, RealColumnOut{data, leg});
    if (m % 2 == 0) {
        DBL *const middle = data + m / 2 * stride;
        OddTransform<P>::template run<Narrow>(RealColumnIn{middle, leg},
                                              HalfComplexColumnOut<P>{middle, middle, leg});
    }
}

template <int P>
void RealLanesTwiddle(DBL *data, const DBL *lanes, ptrdiff_t stride, ptrdiff_t m) {
    RealEdgeColumns<P>(data, stride, m);
    const ptrdiff_t leg = m * stride;
    const ptrdiff_t last = (m - 1) / 2;
    ptrdiff_t k = 1;
    if (stride == 1) {
        for (; k + nativeLanes - 1 <= last; k += nativeLanes) {
            DBL *const up = data + k;
            DBL *const down = data + m - k - (nativeLanes - 1);
            RunComplex<P, Wide>(TwiddledLanesIn<PairLanesIn>{{up, down, leg}, lanes},
                                PairLanesOut<P>{up, down, leg});
            lanes += 2 * nativeLanes * (P - 1);
        }
    }
    for (; k <= last; k += nativeLanes) {
        TwiddledLanesIn<PairGatherIn> in;
        PairScatterOut<P> out;
        for (int lane = 0; lane < nativeLanes; ++lane) {
            const ptrdiff_t column = std::min(k + lane, last);
            in.columns.up[lane] = out.up[lane] = data + column * stride;
            in.columns.down[lane] = out.down[lane] = data + (m - column) * stride;
        }
        in.columns.leg = out.leg = leg;
        in.lanes = lanes;
        RunComplex<P, Wide>(in, out);
        lanes += 2 * nativeLanes * (P - 1);
    }
}

template <int P>
void RealTwiddleKernel(DBL *data, const DBL *twiddleCos, const DBL *twiddleSin, ptrdiff_t stride,
                       int32_t m) {
    RealEdgeColumns<P>(data, stride, m);
    const ptrdiff_t leg = m * stride;
    for (ptrdiff_t k = 1; k <= (m - 1) / 2; ++k) {
        const ptrdiff_t entry = (k - 1) * (P - 1);
        DBL *const up = data + k * stride;
        DBL *const down = data + (m - k) * stride;
        RunComplex<P, Narrow>(
            TwiddledColumnIn{{up, down, leg}, twiddleCos + entry, twiddleSin + entry},
            HalfComplexColumnOut<P>{up, down, leg});
    }
}

template <int P>
constexpr KernelSet MakeKernels() {
    return {RealLeafKernel<P>, RealTwiddleKernel<P>, ComplexLeafKernel<P>, ComplexTwiddleKernel<P>,
            RealLanesLeaf<P>,  RealLanesTwiddle<P>,  ComplexLanesLeaf<P>,  ComplexLanesTwiddle<P>};
}

} // namespace qx

#endif

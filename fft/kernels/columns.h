#ifndef QX_FFT_COLUMNS_H
#define QX_FFT_COLUMNS_H

#include "fft/kernels/transforms.h"

// How the straight-line transforms meet memory: each type here is an `in` or an `out` of theirs for
// one layout. Strides count in DBL units; `leg` leads from value j of a column to value j + 1.

namespace qx {

using std::ptrdiff_t;

template <class V>
QX_INLINE Complex<V> Twiddled(Complex<V> x, V c, V s) {
    return {x.re * c - x.im * s, x.re * s + x.im * c};
}

// ---- One column, any strides ----

struct ComplexColumnIn {
    const DBL *re, *im;
    ptrdiff_t leg;
    QX_INLINE Complex<Narrow> at(int j) const { return {Narrow(re[j * leg]), Narrow(im[j * leg])}; }
};

struct ComplexColumnOut {
    DBL *re, *im;
    ptrdiff_t leg;
    QX_INLINE void set(int k, Narrow a, Narrow b) const {
        re[k * leg] = a.v;
        im[k * leg] = b.v;
    }
};

// With the twiddles of the column, those of j = 1 first.
struct TwiddledColumnIn {
    ComplexColumnIn column;
    const DBL *twiddleCos, *twiddleSin;
    QX_INLINE Complex<Narrow> at(int j) const {
        if (j == 0)
            return column.at(0);
        return Twiddled(column.at(j), Narrow(twiddleCos[j - 1]), Narrow(twiddleSin[j - 1]));
    }
};

struct RealColumnIn {
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Narrow at(int j) const { return Narrow(x[j * leg]); }
};

struct RealColumnOut {
    DBL *h;
    ptrdiff_t leg;
    QX_INLINE void set(int k, Narrow a) const { h[k * leg] = a.v; }
    QX_INLINE void setPair(int k, Narrow a, Narrow b) const {
        set(k, a);
        set(k + 1, b);
    }
};

// Results of a half-complex column of p m values: real parts upward from `up`, imaginary parts
// downward from the last block; past the middle of the spectrum they change places.
template <int P>
struct HalfComplexColumnOut {
    DBL *up, *down;
    ptrdiff_t leg;
    QX_INLINE void set(int q, Narrow re, Narrow im) const {
        const bool direct = q < (P + 1) / 2;
        (direct ? up + q * leg : down + (P - 1 - q) * leg)[0] = re.v;
        (direct ? down + (P - 1 - q) * leg : up + q * leg)[0] = direct ? im.v : -im.v;
    }
    QX_INLINE void setReal(int q, Narrow re) const { up[q * leg] = re.v; }
};

// ---- Complex columns in lanes, interleaved; lanes in the order of laneColumn ----

struct ComplexLanesIn { // neighbouring columns
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Complex<Wide> at(int j) const {
        const DBL *const from = x + j * leg;
        const Wide a = Wide::load(from);
        const Wide b = Wide::load(from + nativeLanes);
        return {PairsLow(a, b), PairsHigh(a, b)};
    }
};

struct ComplexLanesOut {
    DBL *y;
    ptrdiff_t leg;
    QX_INLINE void set(int k, Wide re, Wide im) const {
        DBL *const to = y + k * leg;
        PairsLow(re, im).store(to);
        PairsHigh(re, im).store(to + nativeLanes);
    }
};

struct ComplexGatherIn { // columns anywhere
    const DBL *x[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE Complex<Wide> at(int j) const {
        const Wide a = LoadPairs(x, j * leg);
        const Wide b = LoadPairs(x + nativeLanes / 2, j * leg);
        return {PairsLow(a, b), PairsHigh(a, b)};
    }
};

struct ComplexScatterOut {
    DBL *y[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE void set(int k, Wide re, Wide im) const {
        StorePairs(PairsLow(re, im), y, k * leg);
        StorePairs(PairsHigh(re, im), y + nativeLanes / 2, k * leg);
    }
};

// Any of the complex inputs, with twiddles from a block of a lane table.
template <class Columns>
struct TwiddledLanesIn {
    Columns columns;
    const DBL *lanes;
    QX_INLINE Complex<Wide> at(int j) const {
        if (j == 0)
            return columns.at(0);
        const DBL *const twiddle = lanes + (j - 1) * 2 * nativeLanes;
        return Twiddled(columns.at(j), Wide::load(twiddle), Wide::load(twiddle + nativeLanes));
    }
};

// ---- Real columns in lanes ----

struct RealLanesIn { // neighbouring columns
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return Wide::load(x + j * leg); }
};

QX_INLINE Wide GatherLanes(const DBL *const *x, ptrdiff_t at) {
#ifdef __AVX__
    return Wide(Wide::Vector{x[0][at], x[1][at], x[2][at], x[3][at]});
#else
    return Wide(Wide::Vector{x[0][at], x[1][at]});
#endif
}
QX_INLINE void ScatterLanes(Wide values, DBL *const *y, ptrdiff_t at) {
    for (int lane = 0; lane < nativeLanes; ++lane)
        y[lane][at] = values[lane];
}

struct RealGatherIn { // columns anywhere
    const DBL *x[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return GatherLanes(x, j * leg); }
};

// Transform by transform, each one's results side by side.
struct RealBlocksOut {
    DBL *h[nativeLanes];
    QX_INLINE void set(int k, Wide a) const { ScatterLanes(a, h, k); }
    QX_INLINE void setPair(int k, Wide a, Wide b) const {
        const Wide low = PairsLow(a, b);
        const Wide high = PairsHigh(a, b);
#ifdef __AVX__
        DBL *const even[] = {h[0], h[2]};
        DBL *const odd[] = {h[1], h[3]};
#else
        DBL *const even[] = {h[0]};
        DBL *const odd[] = {h[1]};
#endif
        StorePairs(low, even, k);
        StorePairs(high, odd, k);
    }
};

// Columns k upward and, mirrored, m - k downward of the half-complex blocks, in place: the real
// parts of Y_j stand at up + j leg, its imaginary parts at down + j leg.
struct PairLanesIn { // `down` is the lowest of its columns
    const DBL *up, *down;
    ptrdiff_t leg;
    QX_INLINE Complex<Wide> at(int j) const {
        return {Wide::load(up + j * leg), Wide::load(down + j * leg).reversed()};
    }
};

template <int P>
struct PairLanesOut {
    DBL *up, *down;
    ptrdiff_t leg;
    QX_INLINE void set(int q, Wide re, Wide im) const {
        DBL *const upward = up + q * leg;
        DBL *const downward = down + (P - 1 - q) * leg;
        if (q < (P + 1) / 2) {
            re.store(upward);
            im.reversed().store(downward);
        } else {
            re.reversed().store(downward);
            (-im).store(upward);
        }
    }
};

struct PairGatherIn { // any stride, any columns
    const DBL *up[nativeLanes], *down[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE Complex<Wide> at(int j) const {
        return {GatherLanes(up, j * leg), GatherLanes(down, j * leg)};
    }
};

template <int P>
struct PairScatterOut {
    DBL *up[nativeLanes], *down[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE void set(int q, Wide re, Wide im) const {
        const bool direct = q < (P + 1) / 2;
        ScatterLanes(re, direct ? up : down, (direct ? q : P - 1 - q) * leg);
        ScatterLanes(direct ? im : -im, direct ? down : up, (direct ? P - 1 - q : q) * leg);
    }
};

} // namespace qx

#endif

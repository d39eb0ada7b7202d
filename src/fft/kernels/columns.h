#ifndef QX_FFT_COLUMNS_H
#define QX_FFT_COLUMNS_H

#include "fft/kernels/transforms.h"

// How the straight-line transforms meet memory: each type here is an `in` or an `out` of theirs for
// one layout. Strides count in DBL units; `leg` leads from value j of a column to value j + 1.

namespace qx::QX_WIDTH {

using std::ptrdiff_t;

// The number of columns of packed complex values in one Wide.
constexpr int packedColumns = nativeLanes / 2;

// Loops of eight lanes run where the columns fill the lanes; the loops of four do the rest.
constexpr bool isWide = nativeLanes == 8;

// ---- Columns copied to the stack ----
//
// Where the values of a column are a multiple of half a page apart, all of them map to the same few
// sets of the cache, and the lines that one column loads are evicted before its neighbour reads them.
// Therefore several neighbours are copied to the stack together, by whole cache lines.

constexpr bool legsCollide(ptrdiff_t leg, int p) {
    return p > 4 && leg * ptrdiff_t{sizeof(DBL)} % 2048 == 0;
}

// How many columns, or pairs of mirrored ones, a stage copies together. The host's arrays do not begin on
// cache lines: the more columns, the fewer lines are shared with the copies before and after.
constexpr int columnsCopied = 4 * nativeLanes;

// `rows` runs of `width` values each.
template <int Width>
QX_INLINE void CopyRows(const DBL *from, ptrdiff_t fromPitch, DBL *to, ptrdiff_t toPitch,
                        int rows) {
    for (int row = 0; row < rows; ++row)
        for (int i = 0; i < Width; i += nativeLanes)
            Wide::load(from + row * fromPitch + i).store(to + row * toPitch + i);
}

// ---- One column, any strides ----

struct ColumnIn {
    const DBL *re, *im;
    ptrdiff_t leg;
    QX_INLINE One at(int j) const { return One(One::Vector{re[j * leg], im[j * leg]}); }
};

struct ColumnOut {
    DBL *re, *im;
    ptrdiff_t leg;
    QX_INLINE void set(int k, One x) const {
        re[k * leg] = x[0];
        im[k * leg] = x[1];
    }
};

// Interleaved and contiguous.
struct SideBySideIn {
    const DBL *x;
    QX_INLINE One at(int j) const { return One::load(x + 2 * j); }
};

struct SideBySideOut {
    DBL *y;
    QX_INLINE void set(int k, One x) const { x.store(y + 2 * k); }
};

// With the twiddles of the column, those of j = 1 first.
struct TwiddledColumnIn {
    ColumnIn column;
    const DBL *twiddleCos, *twiddleSin;
    QX_INLINE One at(int j) const {
        if (j == 0)
            return column.at(0);
        return Twiddled(column.at(j), One(One::Vector{twiddleCos[j - 1], twiddleSin[j - 1]}));
    }
};

// Results of a half-complex column: real parts go upward from `up`, imaginary parts downward from the
// last block from `down` on; past the middle of the spectrum they change places.
template <int P>
struct HalfComplexColumnOut {
    DBL *up, *down;
    ptrdiff_t leg;
    QX_INLINE void set(int q, double re, double im) const {
        if (q < (P + 1) / 2) {
            up[q * leg] = re;
            down[(P - 1 - q) * leg] = im;
        } else {
            down[(P - 1 - q) * leg] = re;
            up[q * leg] = -im;
        }
    }
    QX_INLINE void set(int q, Narrow re, Narrow im) const { set(q, re.v, im.v); }
    QX_INLINE void set(int q, One x) const { set(q, x[0], x[1]); }
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

// The values of the middle column with alternating signs. For odd p its transform at the half-odd
// frequency q + 1/2 is that of these values at the whole frequency q + (p + 1) / 2.
struct AlternatingColumnIn {
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Narrow at(int j) const { return Narrow(j % 2 == 0 ? x[j * leg] : -x[j * leg]); }
};
template <int P>
struct MiddleColumnOut {
    DBL *middle;
    ptrdiff_t leg;
    // Result k of the half-complex spectrum is the real part of frequency k or the imaginary one of
    // p - k. Frequency k is the conjugate of q = (p - 1) / 2 - k.
    QX_INLINE void set(int k, Narrow a) const {
        if (2 * k < P)
            middle[((P - 1) / 2 - k) * leg] = a.v;
        else
            middle[((P - 1) / 2 + P - k) * leg] = -a.v;
    }
    QX_INLINE void setPair(int k, Narrow a, Narrow b) const {
        set(k, a);
        set(k + 1, b);
    }
};

// ---- Packed columns in lanes ----

struct PackedIn { // neighbouring columns
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return Wide::load(x + j * leg); }
};

struct PackedOut {
    DBL *y;
    ptrdiff_t leg;
    QX_INLINE void set(int k, Wide x) const { x.store(y + k * leg); }
};

struct PackedTwiddledIn { // with a block of the lane table
    PackedIn columns;
    const DBL *lanes;
    QX_INLINE Wide at(int j) const {
        if (j == 0)
            return columns.at(0);
        return Twiddled(columns.at(j), Wide::load(lanes + (j - 1) * nativeLanes));
    }
};

struct PackedGatherIn { // columns anywhere
    const DBL *x[packedColumns];
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return LoadPairs<nativeLanes>(x, j * leg); }
};

struct PackedBlocksOut { // transform by transform
    DBL *y[packedColumns];
    QX_INLINE void set(int k, Wide x) const { StorePairs(x, y, 2 * k); }
};

// ---- Real columns in lanes ----

struct RealLanesIn { // neighbouring columns
    const DBL *x;
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return Wide::load(x + j * leg); }
};

struct RealGatherIn { // columns anywhere
    const DBL *x[nativeLanes];
    ptrdiff_t leg;
    QX_INLINE Wide at(int j) const { return LoadEach<nativeLanes>(x, j * leg); }
};

struct RealBlocksOut { // transform by transform
    DBL *h[nativeLanes];
    QX_INLINE void set(int k, Wide a) const {
        for (int lane = 0; lane < nativeLanes; ++lane)
            h[lane][k] = a[lane];
    }
    QX_INLINE void setPair(int k, Wide a, Wide b) const {
        DBL *even[packedColumns], *odd[packedColumns];
        for (int pair = 0; pair < packedColumns; ++pair) {
            even[pair] = h[2 * pair];
            odd[pair] = h[2 * pair + 1];
        }
        StorePairs(PairsLow(a, b), even, k);
        StorePairs(PairsHigh(a, b), odd, k);
    }
};

// ---- Pairs of mirrored columns of half-complex blocks ----
//
// Columns k upward and m - k downward: the real parts of Y_j are at up + j leg, its imaginary parts at
// down + j leg. `down` is the lowest of the mirrored columns.

struct PairLanesIn {
    const DBL *up, *down;
    ptrdiff_t leg;
    const DBL *lanes; // a block of the lane table
    QX_INLINE Complex<Wide> at(int j) const {
        const Wide re = Wide::load(up + j * leg);
        const Wide im = Wide::load(down + j * leg).reversed();
        if (j == 0)
            return {re, im};
        const DBL *const twiddle = lanes + (j - 1) * 2 * nativeLanes;
        const Wide c = Wide::load(twiddle);
        const Wide s = Wide::load(twiddle + nativeLanes);
        return {re * c - im * s, im * c + re * s};
    }
};

template <int P, class Leg = ptrdiff_t>
struct PairLanesOut {
    DBL *up, *down;
    Leg leg;
    QX_INLINE void set(int q, Wide re, Wide im) const {
        DBL *const upward = up + q * ptrdiff_t{leg};
        DBL *const downward = down + (P - 1 - q) * ptrdiff_t{leg};
        if (q < (P + 1) / 2) {
            re.store(upward);
            im.reversed().store(downward);
        } else {
            re.reversed().store(downward);
            (-im).store(upward);
        }
    }
};

} // namespace qx::QX_WIDTH

#endif

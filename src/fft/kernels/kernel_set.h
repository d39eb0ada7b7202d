#ifndef QX_FFT_KERNEL_SET_H
#define QX_FFT_KERNEL_SET_H

#include "fft/kernels/columns.h"
#include "fft/kernels/kernels.h"

#include <type_traits>

// The loops around the straight-line transforms of one radix.

namespace qx::QX_WIDTH {

// ---- Large bodies that all loops share ----
//
// The transforms of the larger primes are so long that all loops share one copy of each, which works
// between arrays. Narrower data uses the first lanes, which takes no longer.

constexpr bool standsAlone(int radix) { return radix >= 17 && radix % 2; }

struct PackedArrayIn {
    const Wide *x;
    QX_INLINE Wide at(int j) const { return x[j]; }
};
struct PackedArrayOut {
    Wide *y;
    QX_INLINE void set(int k, Wide x) const { y[k] = x; }
};
struct RealArrayOut {
    Wide *h;
    QX_INLINE void set(int k, Wide a) const { h[k] = a; }
    QX_INLINE void setPair(int k, Wide a, Wide b) const {
        h[k] = a;
        h[k + 1] = b;
    }
};

template <int P>
__attribute__((noinline)) void PackedInArrays(const Wide *x, Wide *y) {
    PackedTransform<P>::template run<Wide>(PackedArrayIn{x}, PackedArrayOut{y});
}
template <int P>
__attribute__((noinline)) void RealInArrays(const Wide *x, Wide *h) {
    RealTransform<P>::template run<Wide>(PackedArrayIn{x}, RealArrayOut{h});
}

template <int N>
QX_INLINE Wide Widened(Lanes<N> x) {
    if constexpr (N == nativeLanes)
        return x;
    else if constexpr (N == 2)
        return InEveryPair<nativeLanes>(x);
    else
        return Wide(x.v);
}

template <class V>
QX_INLINE V FirstLanes(Wide x) {
    if constexpr (V::count == nativeLanes)
        return x;
    else if constexpr (V::count == 2)
        return FirstPair(x);
    else
        return V(x[0]);
}

template <int P, class V, class In, class Out>
QX_INLINE void RunPacked(const In &in, const Out &out) {
    if constexpr (standsAlone(P)) {
        Wide x[P], y[P];
        for (int j = 0; j < P; ++j)
            x[j] = Widened(in.at(j));
        PackedInArrays<P>(x, y);
        for (int k = 0; k < P; ++k)
            out.set(k, FirstLanes<V>(y[k]));
    } else {
        PackedTransform<P>::template run<V>(in, out);
    }
}

template <int P, class V, class In, class Out>
QX_INLINE void RunReal(const In &in, const Out &out) {
    if constexpr (standsAlone(P)) {
        Wide x[P], h[P];
        for (int j = 0; j < P; ++j)
            x[j] = Widened(in.at(j));
        RealInArrays<P>(x, h);
        for (int k = 0; k + 1 < P; k += 2)
            out.setPair(k, FirstLanes<V>(h[k]), FirstLanes<V>(h[k + 1]));
        out.set(P - 1, FirstLanes<V>(h[P - 1]));
    } else {
        RealTransform<P>::template run<V>(in, out);
    }
}

// ---- Leaves ----

// How many rows of a leaf are copied to the stack together, `bundle` neighbouring columns in all of
// `width` DBL units each; 0 if the columns are not neighbours.
inline ptrdiff_t RowsTogether(const LeafColumns &columns, ptrdiff_t bundle, ptrdiff_t width) {
    const ptrdiff_t count = columns.count[0];
    if (columns.inStride[0] != width || bundle % count != 0)
        return 0;
    const ptrdiff_t rows = bundle / count;
    const bool follow = rows == 1 || columns.inStride[1] == count * width;
    return follow && columns.count[1] % rows == 0 ? rows : 0;
}

template <int P>
__attribute__((noinline)) void ComplexLeafColumn(const ColumnIn &in, const ColumnOut &out) {
    RunPacked<P, One>(in, out);
}

template <int P>
__attribute__((noinline)) void ComplexLeafRows(const DBL *in, DBL *out,
                                               const LeafColumns &columns) {
    for (ptrdiff_t b = 0; b < columns.count[1]; ++b) {
        const DBL *column = in + b * columns.inStride[1];
        DBL *results = out + b * columns.outStride[1];
        ptrdiff_t left = columns.count[0];
        if (columns.inStride[0] == 2) {
            for (; left >= packedColumns; left -= packedColumns) {
                PackedBlocksOut y;
                for (int i = 0; i < packedColumns; ++i) {
                    y.y[i] = results;
                    results += columns.outStride[0];
                }
                RunPacked<P, Wide>(PackedIn{column, columns.legStride}, y);
                column += nativeLanes;
            }
        }
        for (; !isWide && left > 0; --left) {
            ComplexLeafColumn<P>({column, column + 1, columns.legStride},
                                 {results, results + 1, 2});
            column += columns.inStride[0];
            results += columns.outStride[0];
        }
    }
}

template <int P>
void ComplexLanesLeaf(const DBL *in, DBL *out, const LeafColumns &columns) {
    constexpr int width = 2 * complexBundle;
#ifdef QX_HAS_EIGHT_LANES
    if (isWide && (columns.inStride[0] != 2 || columns.count[0] % packedColumns != 0))
        return avx2::KernelsFor<P>()->lanes.complexLeaf(in, out, columns);
#endif
    const ptrdiff_t together =
        legsCollide(columns.legStride, P) ? RowsTogether(columns, complexBundle, 2) : 0;
    if (together == 0) {
        ComplexLeafRows<P>(in, out, columns);
        return;
    }
    double rows[P * width];
    const LeafColumns onStack = {{columns.count[0], together},
                                 {2, 2 * columns.count[0]},
                                 {columns.outStride[0], columns.outStride[1]},
                                 width};
    for (ptrdiff_t b = 0; b < columns.count[1]; b += together) {
        CopyRows<width>(in + b * columns.inStride[1], columns.legStride, rows, width, P);
        ComplexLeafRows<P>(rows, out + b * columns.outStride[1], onStack);
    }
}

template <int P>
__attribute__((noinline)) void RealLeafColumn(const RealColumnIn &in, const RealColumnOut &out) {
    RunReal<P, Narrow>(in, out);
}

// Walks over the columns of a leaf.
class ColumnWalk {
public:
    explicit ColumnWalk(const LeafColumns &columns) : columns_(columns) {}
    bool atEnd() const { return b_ == columns_.count[1]; }
    void take(ptrdiff_t *in, ptrdiff_t *out) {
        *in = a_ * columns_.inStride[0] + b_ * columns_.inStride[1];
        *out = a_ * columns_.outStride[0] + b_ * columns_.outStride[1];
        if (++a_ == columns_.count[0]) {
            a_ = 0;
            ++b_;
        }
    }

private:
    const LeafColumns &columns_;
    ptrdiff_t a_ = 0;
    ptrdiff_t b_ = 0;
};

// Columns in any place; lanes after the last column repeat it.
template <int P>
__attribute__((noinline)) void RealLeafWalk(const DBL *in, DBL *out, const LeafColumns &columns) {
    for (ColumnWalk walk(columns); !walk.atEnd();) {
        RealGatherIn x;
        RealBlocksOut h;
        ptrdiff_t inAt = 0;
        ptrdiff_t outAt = 0;
        for (int lane = 0; lane < nativeLanes; ++lane) {
            if (!walk.atEnd())
                walk.take(&inAt, &outAt);
            x.x[lane] = in + inAt;
            h.h[lane] = out + outAt;
        }
        x.leg = columns.legStride;
        RunReal<P, Wide>(x, h);
    }
}

// Rows of neighbouring columns.
template <int P>
__attribute__((noinline)) void RealLeafRows(const DBL *in, DBL *out, const LeafColumns &columns) {
    const ptrdiff_t whole = columns.count[0] - columns.count[0] % nativeLanes;
    for (ptrdiff_t b = 0; b < columns.count[1]; ++b) {
        const DBL *const row = in + b * columns.inStride[1];
        DBL *const results = out + b * columns.outStride[1];
        for (ptrdiff_t a = 0; a < whole; a += nativeLanes) {
            RealBlocksOut h;
            for (int lane = 0; lane < nativeLanes; ++lane)
                h.h[lane] = results + (a + lane) * columns.outStride[0];
            RunReal<P, Wide>(RealLanesIn{row + a, columns.legStride}, h);
        }
        if (whole < columns.count[0])
            RealLeafWalk<P>(row + whole, results + whole * columns.outStride[0],
                            {{columns.count[0] - whole, 1},
                             {1, 0},
                             {columns.outStride[0], 0},
                             columns.legStride});
    }
}

// Columns whose inputs follow one another across the rows of the rectangle (LieInOrder).
template <int P>
__attribute__((noinline)) void RealLeafInOrder(const DBL *in, DBL *out,
                                               const LeafColumns &columns) {
    ColumnWalk walk(columns);
    const ptrdiff_t count = columns.count[0] * columns.count[1];
    for (ptrdiff_t i = 0; i < count; i += nativeLanes) {
        RealBlocksOut h;
        ptrdiff_t inAt, outAt;
        for (int lane = 0; lane < nativeLanes; ++lane) {
            walk.take(&inAt, &outAt);
            h.h[lane] = out + outAt;
        }
        RunReal<P, Wide>(RealLanesIn{in + i, columns.legStride}, h);
    }
}

// Whether all columns are neighbours, and fill the lanes.
inline bool LieInOrder(const LeafColumns &columns) {
    return columns.inStride[0] == 1 && columns.inStride[1] == columns.count[0] &&
           columns.count[0] * columns.count[1] % nativeLanes == 0;
}

// Copies the columns to the stack, `Bundle` at a time, and transforms them there. Returns false, and
// does nothing, if the columns are not neighbours.
template <int P, int Bundle>
bool RealLeafOnStack(const DBL *in, DBL *out, const LeafColumns &columns) {
    const ptrdiff_t together = RowsTogether(columns, Bundle, 1);
    if (together == 0)
        return false;
    double rows[P * Bundle];
    const LeafColumns onStack = {{columns.count[0], together},
                                 {1, columns.count[0]},
                                 {columns.outStride[0], columns.outStride[1]},
                                 Bundle};
    for (ptrdiff_t b = 0; b < columns.count[1]; b += together) {
        CopyRows<Bundle>(in + b * columns.inStride[1], columns.legStride, rows, Bundle, P);
        DBL *const results = out + b * columns.outStride[1];
        if (columns.count[0] % nativeLanes == 0)
            RealLeafRows<P>(rows, results, onStack);
        else
            RealLeafInOrder<P>(rows, results, onStack);
    }
    return true;
}

template <int P>
void RealLanesLeaf(const DBL *in, DBL *out, const LeafColumns &columns) {
    if (legsCollide(columns.legStride, P) && (RealLeafOnStack<P, realBundle>(in, out, columns) ||
                                              RealLeafOnStack<P, realBundle / 2>(in, out, columns)))
        return;
    if (columns.count[0] % nativeLanes != 0 && LieInOrder(columns))
        RealLeafInOrder<P>(in, out, columns);
    else if (columns.inStride[0] != 1 || columns.count[0] < nativeLanes)
        RealLeafWalk<P>(in, out, columns);
    else
        RealLeafRows<P>(in, out, columns);
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
        ComplexLeafColumn<P>({inRe + i * inStride, inIm + i * inStride, leg},
                             {outRe + i * P * outStride, outIm + i * P * outStride, outStride});
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
        RealLeafColumn<P>({in + i * inStride, leg}, {out + i * P * outStride, outStride});
}

// ---- Twiddle stages ----

template <int P>
__attribute__((noinline)) void ComplexTwiddleColumn(const TwiddledColumnIn &in,
                                                    const ColumnOut &out) {
    RunPacked<P, One>(in, out);
}

template <int P>
void ComplexTwiddleKernel(DBL *re, DBL *im, const DBL *twiddleCos, const DBL *twiddleSin,
                          ptrdiff_t stride, int32_t m) {
    const ptrdiff_t leg = m * stride;
    double one[P], zero[P]; // for column 0, which is treated as in lanes
    for (int j = 0; j < P; ++j) {
        one[j] = 1.0;
        zero[j] = 0.0;
    }
    for (ptrdiff_t k = 0; k < m; ++k) {
        const ptrdiff_t entry = (k - 1) * (P - 1);
        DBL *const columnRe = re + k * stride;
        DBL *const columnIm = im + k * stride;
        ComplexTwiddleColumn<P>({{columnRe, columnIm, leg},
                                 k == 0 ? one : twiddleCos + entry,
                                 k == 0 ? zero : twiddleSin + entry},
                                {columnRe, columnIm, leg});
    }
}

// `count` neighbouring columns, a multiple of those that fill the lanes.
template <int P>
__attribute__((noinline)) void ComplexTwiddleColumns(const DBL *in, ptrdiff_t inLeg, DBL *out,
                                                     ptrdiff_t outLeg, ptrdiff_t count,
                                                     const DBL *lanes) {
    for (ptrdiff_t k = 0; k < count; k += packedColumns) {
        RunPacked<P, Wide>(PackedTwiddledIn{{in + 2 * k, inLeg}, lanes},
                           PackedOut{out + 2 * k, outLeg});
        lanes += nativeLanes * (P - 1);
    }
}

template <int P>
void ComplexLanesTwiddle(const DBL *in, ptrdiff_t inLeg, DBL *out, const FFTStage &stage,
                         ptrdiff_t m) {
    const ptrdiff_t leg = 2 * m;
    if (legsCollide(leg, P)) { // m is a multiple of the columns that are copied
        constexpr int width = 2 * columnsCopied;
        double rows[P * width];
        for (ptrdiff_t k = 0; k < m; k += columnsCopied) {
            const DBL *const lanes = stage.complexLanes + 2 * k * (P - 1);
            if (legsCollide(inLeg, P)) {
                CopyRows<width>(in + 2 * k, inLeg, rows, width, P);
                ComplexTwiddleColumns<P>(rows, width, rows, width, columnsCopied, lanes);
            } else {
                ComplexTwiddleColumns<P>(in + 2 * k, inLeg, rows, width, columnsCopied, lanes);
            }
            CopyRows<width>(rows, width, out + 2 * k, leg, P);
        }
        return;
    }
    const ptrdiff_t whole = m - m % packedColumns;
    ComplexTwiddleColumns<P>(in, inLeg, out, leg, whole, stage.complexLanes);
    if (!isWide && whole < m) {
        const ptrdiff_t entry = (whole - 1) * (P - 1);
        const DBL *const from = in + 2 * whole;
        DBL *const to = out + 2 * whole;
        ComplexTwiddleColumn<P>(
            {{from, from + 1, inLeg}, stage.twiddleCos + entry, stage.twiddleSin + entry},
            {to, to + 1, leg});
    }
}

// Where a stage of the real path reads its blocks and where it writes its results, each with its own
// leg.
struct RealBlocks {
    const DBL *in;
    ptrdiff_t inLeg;
    DBL *out;
    ptrdiff_t outLeg;
};

// Columns 0 and, for even m, m / 2: real values in every block.
template <int P>
void RealEdgeColumns(const RealBlocks &blocks, ptrdiff_t stride, ptrdiff_t m) {
    RealLeafColumn<P>({blocks.in, blocks.inLeg}, {blocks.out, blocks.outLeg});
    if (m % 2 != 0)
        return;
    const RealColumnIn in{blocks.in + m / 2 * stride, blocks.inLeg};
    DBL *const middle = blocks.out + m / 2 * stride;
    if constexpr (P % 2 == 0)
        OddTransform<P>::template run<Narrow>(
            in, HalfComplexColumnOut<P>{middle, middle, blocks.outLeg});
    else
        RunReal<P, Narrow>(AlternatingColumnIn{in.x, in.leg},
                           MiddleColumnOut<P>{middle, blocks.outLeg});
}

template <int P>
__attribute__((noinline)) void RealPairColumns(const TwiddledColumnIn &in,
                                               const HalfComplexColumnOut<P> &out) {
    RunPacked<P, One>(in, out);
}

// The pairs of columns from k to the last one.
template <int P>
void RealPairs(const RealBlocks &blocks, const DBL *twiddleCos, const DBL *twiddleSin,
               ptrdiff_t stride, ptrdiff_t m, ptrdiff_t k) {
    for (; k <= (m - 1) / 2; ++k) {
        const ptrdiff_t entry = (k - 1) * (P - 1);
        const ptrdiff_t up = k * stride;
        const ptrdiff_t down = (m - k) * stride;
        RealPairColumns<P>({{blocks.in + up, blocks.in + down, blocks.inLeg},
                            twiddleCos + entry,
                            twiddleSin + entry},
                           {blocks.out + up, blocks.out + down, blocks.outLeg});
    }
}

template <int P>
void RealTwiddleKernel(DBL *data, const DBL *twiddleCos, const DBL *twiddleSin, ptrdiff_t stride,
                       int32_t m) {
    const RealBlocks inPlace{data, m * stride, data, m * stride};
    RealEdgeColumns<P>(inPlace, stride, m);
    RealPairs<P>(inPlace, twiddleCos, twiddleSin, stride, m, 1);
}

// `count` neighbouring pairs of columns, a multiple of the lanes, in place; `down` is one past the
// highest of the mirrored columns.
template <int P>
__attribute__((noinline)) void RealPairLanes(DBL *up, DBL *down, ptrdiff_t leg, ptrdiff_t count,
                                             const DBL *lanes) {
    for (ptrdiff_t k = 0; k < count; k += nativeLanes) {
        down -= nativeLanes;
        SplitTransform<P>::template run<Wide>(PairLanesIn{up, down, leg, lanes},
                                              PairLanesOut<P>{up, down, leg});
        up += nativeLanes;
        lanes += 2 * nativeLanes * (P - 1);
    }
}

// The same for `Columns` pairs, with the results in `rows`, which has 2 Columns values in each row: those
// of the upward columns in the first half, those of the mirrored ones in the second. `up` and `down` may
// point into `rows` at these places.
template <int P, int Columns>
__attribute__((noinline)) void RealPairLanesToRows(const DBL *up, const DBL *down, ptrdiff_t leg,
                                                   DBL *rows, const DBL *lanes) {
    typedef std::integral_constant<int, 2 * Columns> Width;
    DBL *upward = rows;
    DBL *downward = rows + 2 * Columns;
    for (int k = 0; k < Columns; k += nativeLanes) {
        down -= nativeLanes;
        downward -= nativeLanes;
        SplitTransform<P>::template run<Wide>(PairLanesIn{up, down, leg, lanes},
                                              PairLanesOut<P, Width>{upward, downward, {}});
        up += nativeLanes;
        upward += nativeLanes;
        lanes += 2 * nativeLanes * (P - 1);
    }
}

// Passes the pairs from k to `last`, as many as fill blocks of `Copied`, through the stack. Returns the
// next k.
template <int P, int Copied>
ptrdiff_t RealPairsOnStack(const RealBlocks &blocks, const FFTStage &stage, ptrdiff_t m,
                           ptrdiff_t k, ptrdiff_t last) {
    constexpr int width = 2 * Copied;
    double rows[P * width];
    for (; k + Copied - 1 <= last; k += Copied) {
        const ptrdiff_t down = m - k - (Copied - 1);
        const DBL *const lanes = stage.realLanes + 2 * (k - 1) * (P - 1);
        if (legsCollide(blocks.inLeg, P)) {
            CopyRows<Copied>(blocks.in + k, blocks.inLeg, rows, width, P);
            CopyRows<Copied>(blocks.in + down, blocks.inLeg, rows + Copied, width, P);
            RealPairLanesToRows<P, Copied>(rows, rows + width, width, rows, lanes);
        } else {
            RealPairLanesToRows<P, Copied>(blocks.in + k, blocks.in + down + Copied, blocks.inLeg,
                                           rows, lanes);
        }
        CopyRows<Copied>(rows, width, blocks.out + k, blocks.outLeg, P);
        CopyRows<Copied>(rows + Copied, width, blocks.out + down, blocks.outLeg, P);
    }
    return k;
}

// Transforms the pairs up to `last`, as many as fill the lanes. Returns the next k.
template <int P>
ptrdiff_t RealPairsInLanes(const RealBlocks &blocks, const FFTStage &stage, ptrdiff_t m,
                           ptrdiff_t last) {
    ptrdiff_t k = 1;
    if (legsCollide(m, P))
        k = RealPairsOnStack<P, columnsCopied>(blocks, stage, m, k, last);
    if (blocks.in != blocks.out)
        return RealPairsOnStack<P, nativeLanes>(blocks, stage, m, k, last);
    const ptrdiff_t left = last - (k - 1);
    const ptrdiff_t whole = left - left % nativeLanes;
    RealPairLanes<P>(blocks.out + k, blocks.out + m - k + 1, m, whole,
                     stage.realLanes + 2 * (k - 1) * (P - 1));
    return k + whole;
}

template <int P>
void RealLanesTwiddle(const DBL *in, ptrdiff_t inLeg, DBL *out, const FFTStage &stage,
                      ptrdiff_t m) {
    const RealBlocks blocks{in, inLeg, out, m};
    RealEdgeColumns<P>(blocks, 1, m);
    ptrdiff_t k = 1;
    if constexpr (!standsAlone(P))
        k = RealPairsInLanes<P>(blocks, stage, m, (m - 1) / 2);
    RealPairs<P>(blocks, stage.twiddleCos, stage.twiddleSin, 1, m, k);
}

// In eight lanes, where the pairs together with the middle column fill them (fillsWideRealLanes). The
// middle column passes through as one more pair; its own results, computed with the edge columns, are
// saved before and restored after.
template <int P>
void RealWideTwiddle(const DBL *in, ptrdiff_t inLeg, DBL *out, const FFTStage &stage, ptrdiff_t m) {
    const RealBlocks blocks{in, inLeg, out, m};
    stage.passes.realEdges(in, inLeg, out, m);
    double middle[P];
    for (int q = 0; q < P; ++q)
        middle[q] = out[q * m + m / 2];
    RealPairsInLanes<P>(blocks, stage, m, m / 2);
    for (int q = 0; q < P; ++q)
        out[q * m + m / 2] = middle[q];
}
constexpr bool fillsWideRealLanes(ptrdiff_t m) { return m % 16 == 0; }

// The edge columns as a function of their own, for the stages in eight lanes.
template <int P>
void RealLanesEdges(const DBL *in, ptrdiff_t inLeg, DBL *out, ptrdiff_t m) {
    RealEdgeColumns<P>({in, inLeg, out, m}, 1, m);
}

// ---- Columns of a matrix abreast ----
//
// Neighbouring columns fill the lanes. So the rows of the matrix are read and written as they are, and all
// lanes have the same twiddles.

// The twiddles of one row of the blocks, j from 1 to P - 1, with each in all lanes: the cosine, then the
// sine as Twiddled needs it.
template <int P>
using RowTurns = double[2 * nativeLanes * (P > 1 ? P - 1 : 1)];

// A value times the twiddle of a row.
QX_INLINE Wide RowTwiddled(Wide x, const double *turn) {
    const Wide c = Wide::load(turn);
    const Wide s = Wide::load(turn + nativeLanes);
    if constexpr (isWide)
        return x * c + Swapped(x) * s;
    else
        return MinusPlus(x * c, Swapped(x) * s);
}

struct RowTwiddledIn {
    PackedIn columns;
    const double *turns;
    QX_INLINE Wide at(int j) const {
        const Wide x = columns.at(j);
        return j == 0 ? x : RowTwiddled(x, turns + (j - 1) * 2 * nativeLanes);
    }
};

template <int P>
void SpreadTurns(const FFTStage &stage, ptrdiff_t k, double *turns) {
    const ptrdiff_t entry = (k - 1) * (P - 1);
    for (int j = 0; j < P - 1; ++j) {
        const Wide c(k == 0 ? 1.0 : stage.twiddleCos[entry + j]);
        const Wide s(k == 0 ? 0.0 : stage.twiddleSin[entry + j]);
        c.store(turns + j * 2 * nativeLanes);
        (isWide ? NegatedInPairs(s, true) : s).store(turns + j * 2 * nativeLanes + nativeLanes);
    }
}

// The columns of one row of blocks that do not fill the lanes, and rows so far apart that they share sets
// of the cache, pass through the stack by whole rows.
template <int P>
bool passOnStack(ptrdiff_t leg, ptrdiff_t columns) {
    return columns % packedColumns != 0 || (P > 8 && legsCollide(leg, P));
}
constexpr int abreastWidth = 2 * mostAbreast;

// P rows of `columns` values, with zeros behind them up to whole lanes.
template <int P>
void RowsToStack(const DBL *in, ptrdiff_t leg, ptrdiff_t columns, double *rows) {
    const ptrdiff_t values = 2 * columns;
    const ptrdiff_t whole = values - values % nativeLanes;
    for (int j = 0; j < P; ++j) {
        const DBL *const from = in + j * leg;
        double *const to = rows + j * abreastWidth;
        for (ptrdiff_t i = 0; i < whole; i += nativeLanes)
            Wide::load(from + i).store(to + i);
        if (whole < values)
            Wide::loadFirst(from + whole, values - whole).store(to + whole);
    }
}
template <int P>
void RowsFromStack(const double *rows, ptrdiff_t columns, DBL *out, ptrdiff_t leg) {
    const ptrdiff_t values = 2 * columns;
    const ptrdiff_t whole = values - values % nativeLanes;
    for (int k = 0; k < P; ++k) {
        const double *const from = rows + k * abreastWidth;
        DBL *const to = out + k * leg;
        for (ptrdiff_t i = 0; i < whole; i += nativeLanes)
            Wide::load(from + i).store(to + i);
        if (whole < values)
            Wide::load(from + whole).storeFirst(to + whole, values - whole);
    }
}

template <int P>
__attribute__((noinline)) void AbreastLeafColumns(const DBL *in, ptrdiff_t inLeg, DBL *out,
                                                  ptrdiff_t outLeg, ptrdiff_t columns) {
    for (ptrdiff_t c = 0; c < columns; c += packedColumns)
        RunPacked<P, Wide>(PackedIn{in + 2 * c, inLeg}, PackedOut{out + 2 * c, outLeg});
}
template <int P>
void ComplexAbreastLeaf(const DBL *in, ptrdiff_t inLeg, DBL *out, ptrdiff_t outLeg,
                        ptrdiff_t columns) {
    const bool readsStack = passOnStack<P>(inLeg, columns);
    const bool writesStack = passOnStack<P>(outLeg, columns);
    if (!readsStack && !writesStack)
        return AbreastLeafColumns<P>(in, inLeg, out, outLeg, columns);
    alignas(64) double rows[P * abreastWidth];
    if (readsStack)
        RowsToStack<P>(in, inLeg, columns, rows);
    AbreastLeafColumns<P>(readsStack ? rows : in, readsStack ? abreastWidth : inLeg,
                          writesStack ? rows : out, writesStack ? abreastWidth : outLeg, columns);
    if (writesStack)
        RowsFromStack<P>(rows, columns, out, outLeg);
}

template <int P>
__attribute__((noinline)) void AbreastTwiddleColumns(const DBL *in, ptrdiff_t inLeg, DBL *out,
                                                     ptrdiff_t outLeg, const double *turns,
                                                     ptrdiff_t columns) {
    for (ptrdiff_t c = 0; c < columns; c += packedColumns)
        RunPacked<P, Wide>(RowTwiddledIn{{in + 2 * c, inLeg}, turns},
                           PackedOut{out + 2 * c, outLeg});
}
template <int P>
void ComplexAbreastTwiddle(const DBL *in, const BlockRows &inRows, DBL *out,
                           const BlockRows &outRows, const FFTStage &stage, ptrdiff_t m,
                           ptrdiff_t columns) {
    alignas(64) RowTurns<P> turns;
    alignas(64) double rows[P * abreastWidth];
    const bool writesStack = in != out && passOnStack<P>(outRows.leg, columns);
    for (ptrdiff_t k = 0; k < m; ++k) {
        SpreadTurns<P>(stage, k, turns);
        DBL *const to = out + k * outRows.pitch;
        AbreastTwiddleColumns<P>(in + k * inRows.pitch, inRows.leg, writesStack ? rows : to,
                                 writesStack ? abreastWidth : outRows.leg, turns, columns);
        if (writesStack)
            RowsFromStack<P>(rows, columns, to, outRows.leg);
    }
}

template <int P>
constexpr KernelSet MakeKernels() {
    return {RealLeafKernel<P>,
            RealTwiddleKernel<P>,
            ComplexLeafKernel<P>,
            ComplexTwiddleKernel<P>,
            {ComplexLanesLeaf<P>, RealLanesLeaf<P>, ComplexLanesTwiddle<P>, RealLanesTwiddle<P>,
             RealLanesEdges<P>, nativeLanes, nativeLanes, ComplexAbreastLeaf<P>,
             ComplexAbreastTwiddle<P>}};
}

} // namespace qx::QX_WIDTH

#endif

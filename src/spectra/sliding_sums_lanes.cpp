#include "frame/lanes.h"
#include "spectra/sliding_sums.h"

// Each lane computes its own stretch of outputs, `stretch` outputs away from that of its neighbour.
// The signal is rearranged accordingly beforehand, once per tile: vector i contains, for each lane,
// the value i places after the start of the lane's first window. Output p of all lanes then takes
// tap k from vector p + k: whole vectors at aligned addresses, several sums together in registers,
// and each vector that is loaded serves two taps.
namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
constexpr int lanes = nativeLanes;

// The outputs of one lane and the taps in one tile. In total, the signal of a tile takes 16 KiB
// with four lanes.
constexpr int tileOutputs = 240;
constexpr int tileTaps = 256;

struct RealSums {
    static constexpr auto code = ElementType::DBL;
    static constexpr int parts = 1;
    static constexpr int together = 12; // sums in registers; divides tileOutputs
};
struct ComplexSums {
    static constexpr auto code = ElementType::CDB;
    static constexpr int parts = 2; // real parts at even places, imaginary parts at odd ones
    static constexpr int together = 4;
};

template <class Sums>
struct Tile {
    static constexpr int outputs = tileOutputs / Sums::parts;
    static constexpr int taps = tileTaps / Sums::parts;

    alignas(32) double signal[(tileOutputs + tileTaps) * lanes];
    alignas(32) double sums[tileOutputs * lanes];
    double tap[tileTaps];
};

inline void Put(double *place, const DBL *value) { *place = *value; }
inline void Put(double *place, const CDB *value) {
    place[0] = value->re;
    place[lanes] = value->im;
}
inline void Take(const double *place, DBL *value) { *value = *place; }
inline void Take(const double *place, CDB *value) {
    value->re = place[0];
    value->im = place[lanes];
}

// The values i .. i + lanes - 1 of a sequence with step 1 or -1.
inline L LoadSome(const DBL *at, std::ptrdiff_t step, std::ptrdiff_t i) {
    return step == 1 ? L::load(at + i) : L::load(at - i - (lanes - 1)).reversed();
}
inline void StoreSome(L values, DBL *at, std::ptrdiff_t step, std::ptrdiff_t i) {
    if (step == 1)
        values.store(at + i);
    else
        values.reversed().store(at - i - (lanes - 1));
}

// A stretch of signal to be rearranged: lane l begins at index begin + l stretch.
template <ElementType Code>
struct Rows {
    const typename Element<Code>::type *signal;
    std::ptrdiff_t step;
    int64_t length, begin;
    int stretch;
};

// The range of vectors that can be rearranged in squares, where all lanes lie on the signal.
struct Range {
    int from, to;
};
inline Range SquaresOf(const Rows<ElementType::DBL> &rows, int count) {
    const int64_t low = rows.begin < 0 ? -rows.begin : 0;
    const int64_t high = rows.length - rows.begin - int64_t{rows.stretch} * (lanes - 1);
    const int64_t end = high < count ? high : count;
    if ((rows.step != 1 && rows.step != -1) || end - low < lanes)
        return {0, 0};
    const int from = static_cast<int>(low);
    return {from, from + static_cast<int>(end - low) / lanes * lanes};
}
inline Range SquaresOf(const Rows<ElementType::CDB> &, int) { return {0, 0}; }

inline void LayOutSquares(const Rows<ElementType::DBL> &rows, Range range, double *vectors) {
    for (int i = range.from; i < range.to; i += lanes) {
        L square[lanes];
        for (int lane = 0; lane < lanes; ++lane)
            square[lane] = LoadSome(
                rows.signal, rows.step,
                static_cast<std::ptrdiff_t>(rows.begin + int64_t{lane} * rows.stretch + i));
        Transpose(square);
        for (int lane = 0; lane < lanes; ++lane)
            square[lane].store(vectors + (i + lane) * lanes);
    }
}
inline void LayOutSquares(const Rows<ElementType::CDB> &, Range, double *) {}

template <class Sums>
void LayOutOneByOne(const Rows<Sums::code> &rows, Range range, double *vectors) {
    typedef typename Element<Sums::code>::type T;
    const T zero = {};
    for (int lane = 0; lane < lanes; ++lane) {
        const int64_t begin = rows.begin + int64_t{lane} * rows.stretch;
        double *const place = vectors + lane;
        for (int i = range.from; i < range.to; ++i) {
            const int64_t at = begin + i;
            const T *const value = at < 0 || at >= rows.length
                                       ? &zero
                                       : rows.signal + static_cast<std::ptrdiff_t>(at) * rows.step;
            Put(place + i * Sums::parts * lanes, value);
        }
    }
}

// Rearranges `count` vectors.
template <class Sums>
void LayOut(const Rows<Sums::code> &rows, int count, double *vectors) {
    const Range squares = SquaresOf(rows, count);
    LayOutOneByOne<Sums>(rows, {0, squares.from}, vectors);
    LayOutSquares(rows, squares, vectors);
    LayOutOneByOne<Sums>(rows, {squares.to, count}, vectors);
}

// `together` sums of each lane over all taps of the tile.
inline void SumTaps(RealSums, const double *vectors, const double *tap, int taps, double *sums) {
    constexpr int together = RealSums::together;
    L sum[together];
    for (int p = 0; p < together; ++p)
        sum[p] = L::load(sums + p * lanes);
    int k = 0;
    for (; k + 2 <= taps; k += 2) {
        const L first(tap[k]);
        const L second(tap[k + 1]);
        const double *v = vectors + k * lanes;
        // g++ would keep vectors for the next iteration and run out of registers.
        asm("" : "+r"(v));
        sum[0] = sum[0] + first * L::load(v);
#pragma GCC unroll 16
        for (int p = 1; p < together; ++p) {
            L value = L::load(v + p * lanes);
            KeepInRegister(value);
            sum[p - 1] = sum[p - 1] + second * value;
            sum[p] = sum[p] + first * value;
        }
        sum[together - 1] = sum[together - 1] + second * L::load(v + together * lanes);
    }
    for (; k < taps; ++k)
        for (int p = 0; p < together; ++p)
            sum[p] = sum[p] + L(tap[k]) * L::load(vectors + (k + p) * lanes);
    for (int p = 0; p < together; ++p)
        sum[p].store(sums + p * lanes);
}

inline void SumTaps(ComplexSums, const double *vectors, const double *tap, int taps, double *sums) {
    constexpr int together = ComplexSums::together;
    L re[together], im[together];
    for (int p = 0; p < together; ++p) {
        re[p] = L::load(sums + 2 * p * lanes);
        im[p] = L::load(sums + (2 * p + 1) * lanes);
    }
    for (int k = 0; k < taps; ++k) {
        const L tapRe(tap[2 * k]);
        const L tapIm(tap[2 * k + 1]);
        const double *const v = vectors + 2 * k * lanes;
#pragma GCC unroll 8
        for (int p = 0; p < together; ++p) {
            const L valueRe = L::load(v + 2 * p * lanes);
            const L valueIm = L::load(v + (2 * p + 1) * lanes);
            re[p] = re[p] + (tapRe * valueRe - tapIm * valueIm);
            im[p] = im[p] + (tapIm * valueRe + tapRe * valueIm);
        }
    }
    for (int p = 0; p < together; ++p) {
        re[p].store(sums + 2 * p * lanes);
        im[p].store(sums + (2 * p + 1) * lanes);
    }
}

inline int StoreSquares(const SlidingJob<ElementType::DBL> &job, int64_t start, int stretch,
                        int64_t count, const double *sums) {
    if (count < int64_t{stretch} * lanes || (job.out.step != 1 && job.out.step != -1))
        return 0;
    int i = 0;
    for (; i + lanes <= stretch; i += lanes) {
        L square[lanes];
        for (int lane = 0; lane < lanes; ++lane)
            square[lane] = L::load(sums + (i + lane) * lanes);
        Transpose(square);
        for (int lane = 0; lane < lanes; ++lane)
            StoreSome(square[lane], job.out.at, job.out.step,
                      static_cast<std::ptrdiff_t>(start + int64_t{lane} * stretch + i));
    }
    return i;
}
inline int StoreSquares(const SlidingJob<ElementType::CDB> &, int64_t, int, int64_t,
                        const double *) {
    return 0;
}

template <class Sums>
void StoreSums(const SlidingJob<Sums::code> &job, int64_t start, int stretch, int64_t count,
               const double *sums) {
    const int done = StoreSquares(job, start, stretch, count, sums);
    for (int lane = 0; lane < lanes; ++lane) {
        const int64_t begin = int64_t{lane} * stretch;
        const int64_t left = count - begin;
        const int end = static_cast<int>(left < stretch ? left : stretch);
        for (int i = done; i < end; ++i)
            Take(sums + i * Sums::parts * lanes + lane,
                 job.out.at + static_cast<std::ptrdiff_t>(start + begin + i) * job.out.step);
    }
}

// Adds the taps from `tap` on that fit into one tile, all of one row.
template <class Sums>
void AddTaps(const SlidingJob<Sums::code> &job, std::ptrdiff_t row, int32_t tap, int taps,
             int64_t start, int stretch, Tile<Sums> &tile) {
    const Rows<Sums::code> rows = {job.signal.at + row * job.signalSegment, job.signal.step,
                                   job.length, job.first + start + tap, stretch};
    LayOut<Sums>(rows, stretch + taps, tile.signal);
    const typename Element<Sums::code>::type *const first =
        job.taps.at + row * job.tapSegment + std::ptrdiff_t{tap} * job.taps.step;
    for (int k = 0; k < taps; ++k)
        __builtin_memcpy(tile.tap + k * Sums::parts, first + k * job.taps.step, sizeof *first);
    for (int p = 0; p < stretch; p += Sums::together)
        SumTaps(Sums(), tile.signal + p * Sums::parts * lanes, tile.tap, taps,
                tile.sums + p * Sums::parts * lanes);
}

// Computes outputs start .. start + count - 1, at most those of one tile.
template <class Sums>
void RunTile(const SlidingJob<Sums::code> &job, int64_t start, int64_t count, Tile<Sums> &tile) {
    const int needed = static_cast<int>((count + lanes - 1) / lanes);
    const int stretch = (needed + Sums::together - 1) / Sums::together * Sums::together;
    for (int i = 0; i < stretch * Sums::parts * lanes; ++i)
        tile.sums[i] = 0.0;
    for (std::ptrdiff_t row = 0; row < job.segments; ++row)
        for (int32_t tap = 0; tap < job.tapCount; tap += Tile<Sums>::taps) {
            const int left = job.tapCount - tap;
            AddTaps<Sums>(job, row, tap, left < Tile<Sums>::taps ? left : Tile<Sums>::taps, start,
                          stretch, tile);
        }
    StoreSums<Sums>(job, start, stretch, count, tile.sums);
}

// From the last tile to the first; each is read completely before it is written.
template <class Sums>
void RunTiles(const SlidingJob<Sums::code> &job) {
    Tile<Sums> tile;
    constexpr int64_t most = int64_t{Tile<Sums>::outputs} * lanes;
    for (int64_t end = job.count; end > 0;) {
        const int64_t start = end > most ? end - most : 0;
        RunTile<Sums>(job, start, end - start, tile);
        end = start;
    }
}

} // namespace

void SlidingSumsInLanes(const SlidingJob<ElementType::DBL> &job) { RunTiles<RealSums>(job); }
void ComplexSlidingSumsInLanes(const SlidingJob<ElementType::CDB> &job) {
    RunTiles<ComplexSums>(job);
}

} // namespace qx::QX_WIDTH

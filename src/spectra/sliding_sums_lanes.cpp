#include "frame/lanes.h"
#include "spectra/sliding_sums.h"

// Each lane runs along a stretch of outputs of its own, `stretch` outputs away from its neighbour.
// The signal is laid out accordingly beforehand, once per tile: vector i holds, for each lane, the
// value i places after the start of the lane's first window. Then output p of all lanes takes tap k
// from vector p + k: whole vectors at aligned addresses, several sums at once in registers, and
// each vector that is read serves two taps.
namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
constexpr int lanes = nativeLanes;

// What one tile holds: outputs of one lane, and taps. Both in all, the signal of a tile takes 16
// KiB with four lanes.
constexpr int tileOutputs = 240;
constexpr int tileTaps = 256;

struct RealSums {
    static constexpr auto code = ElementType::DBL;
    static constexpr int parts = 1;
    static constexpr int together = 12; // sums in registers; divides tileOutputs
};
struct ComplexSums {
    static constexpr auto code = ElementType::CDB;
    static constexpr int parts = 2; // real parts in even places, imaginary parts in odd ones
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

// Rows and columns of a square of values exchanged.
inline void Transpose(L (&v)[lanes]) {
#ifdef __AVX__
    const auto low01 = __builtin_shufflevector(v[0].v, v[1].v, 0, 4, 2, 6);
    const auto high01 = __builtin_shufflevector(v[0].v, v[1].v, 1, 5, 3, 7);
    const auto low23 = __builtin_shufflevector(v[2].v, v[3].v, 0, 4, 2, 6);
    const auto high23 = __builtin_shufflevector(v[2].v, v[3].v, 1, 5, 3, 7);
    v[0] = L(__builtin_shufflevector(low01, low23, 0, 1, 4, 5));
    v[1] = L(__builtin_shufflevector(high01, high23, 0, 1, 4, 5));
    v[2] = L(__builtin_shufflevector(low01, low23, 2, 3, 6, 7));
    v[3] = L(__builtin_shufflevector(high01, high23, 2, 3, 6, 7));
#else
    const auto low = __builtin_shufflevector(v[0].v, v[1].v, 0, 2);
    v[1] = L(__builtin_shufflevector(v[0].v, v[1].v, 1, 3));
    v[0] = L(low);
#endif
}

// The values i .. i + lanes - 1 of a sequence of step 1 or -1.
inline L LoadSome(const DBL *at, std::ptrdiff_t step, std::ptrdiff_t i) {
    return step == 1 ? L::load(at + i) : L::load(at - i - (lanes - 1)).reversed();
}
inline void StoreSome(L values, DBL *at, std::ptrdiff_t step, std::ptrdiff_t i) {
    if (step == 1)
        values.store(at + i);
    else
        values.reversed().store(at - i - (lanes - 1));
}

// The first of `count` vectors whose lane l begins at signal[begin + l stretch], as far as a square
// at a time serves; their number.
inline int LayOutSquares(const SlidingJob<ElementType::DBL> &job, int64_t begin, int stretch,
                         int count, double *vectors) {
    const bool within = begin >= 0 && begin + int64_t{stretch} * (lanes - 1) + count <= job.length;
    if (!within || (job.signal.step != 1 && job.signal.step != -1))
        return 0;
    int i = 0;
    for (; i + lanes <= count; i += lanes) {
        L square[lanes];
        for (int lane = 0; lane < lanes; ++lane)
            square[lane] =
                LoadSome(job.signal.at, job.signal.step,
                         static_cast<std::ptrdiff_t>(begin + int64_t{lane} * stretch + i));
        Transpose(square);
        for (int lane = 0; lane < lanes; ++lane)
            square[lane].store(vectors + (i + lane) * lanes);
    }
    return i;
}
inline int LayOutSquares(const SlidingJob<ElementType::CDB> &, int64_t, int, int, double *) {
    return 0;
}

// Lays out `count` vectors whose lane l begins at signal[start + l stretch].
template <class Sums>
void LayOut(const SlidingJob<Sums::code> &job, int64_t start, int stretch, int count,
            double *vectors) {
    typedef typename Element<Sums::code>::type T;
    const T zero = {};
    const int done = LayOutSquares(job, start, stretch, count, vectors);
    for (int lane = 0; lane < lanes; ++lane) {
        const int64_t begin = start + int64_t{lane} * stretch;
        const int64_t before = begin < 0 ? -begin : 0;
        const int64_t left = job.length - begin;
        const int low = static_cast<int>(before < count ? before : count);
        const int high = static_cast<int>(left < low ? low : left < count ? left : count);
        double *const place = vectors + lane;
        int i = done;
        for (; i < low; ++i)
            Put(place + i * Sums::parts * lanes, &zero);
        const T *value = job.signal.at + static_cast<std::ptrdiff_t>(begin + i) * job.signal.step;
        for (; i < high; ++i, value += job.signal.step)
            Put(place + i * Sums::parts * lanes, value);
        for (; i < count; ++i)
            Put(place + i * Sums::parts * lanes, &zero);
    }
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
        // g++ would keep vectors for the next round, and run out of registers.
        asm("" : "+r"(v));
        sum[0] = sum[0] + first * L::load(v);
#pragma GCC unroll 16
        for (int p = 1; p < together; ++p) {
            L value = L::load(v + p * lanes);
            asm("" : "+x"(value.v)); // read once, not once per product
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

template <class Sums>
void StartSums(const SlidingJob<Sums::code> &job, int64_t start, int stretch, int64_t count,
               double *sums) {
    for (int i = 0; i < stretch * Sums::parts * lanes; ++i)
        sums[i] = 0.0;
    if (job.continues)
        for (int64_t t = 0; t < count; ++t)
            Put(sums + t % stretch * Sums::parts * lanes + t / stretch,
                job.out.at + static_cast<std::ptrdiff_t>(start + t) * job.out.step);
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

// Outputs start .. start + count - 1, at most those of one tile.
template <class Sums>
void RunTile(const SlidingJob<Sums::code> &job, int64_t start, int64_t count, Tile<Sums> &tile) {
    const int needed = static_cast<int>((count + lanes - 1) / lanes);
    const int stretch = (needed + Sums::together - 1) / Sums::together * Sums::together;
    StartSums<Sums>(job, start, stretch, count, tile.sums);
    for (int32_t tap = 0; tap < job.tapCount; tap += Tile<Sums>::taps) {
        const int left = job.tapCount - tap;
        const int taps = left < Tile<Sums>::taps ? left : Tile<Sums>::taps;
        LayOut<Sums>(job, job.first + start + tap, stretch, stretch + taps, tile.signal);
        for (int k = 0; k < taps; ++k) {
            const typename Element<Sums::code>::type *value =
                job.taps.at + (std::ptrdiff_t{tap} + k) * job.taps.step;
            __builtin_memcpy(tile.tap + k * Sums::parts, value, sizeof *value);
        }
        for (int p = 0; p < stretch; p += Sums::together)
            SumTaps(Sums(), tile.signal + p * Sums::parts * lanes, tile.tap, taps,
                    tile.sums + p * Sums::parts * lanes);
    }
    StoreSums<Sums>(job, start, stretch, count, tile.sums);
}

// From the last tile to the first, each read as a whole before it is written.
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

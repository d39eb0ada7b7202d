#include "qx/shuffling.h"
#include "frame/export.h"
#include "signal/counter_noise.h"
#include "util/shuffle.h"

#include <cmath>

namespace qx {
namespace {

// Exchanges two elements of an array.
template <class Array>
struct ExchangeOf {
    typename HandleTraits<Array>::T *elements;
    void operator()(int32_t i, int32_t j) const {
        const auto held = elements[i];
        elements[i] = elements[j];
        elements[j] = held;
    }
};
struct NoExchange {
    void operator()(int32_t, int32_t) const {}
};

// Sets `indices` to the numbers 0 to n - 1 and lets `shuffle` exchange pairs of them, together with
// what `exchange` exchanges.
template <class Exchange, class ShuffleBy>
Outcome ShuffleNumbers(Out<I32_1D> &indices, int32_t n, const Exchange &exchange,
                       const ShuffleBy &shuffle) {
    if (const Outcome bad = indices.resize(n))
        return bad;
    for (int32_t i = 0; i < n; ++i)
        indices.data()[i] = i;
    const ExchangeOf<I32_1D> numbers = {indices.data()};
    shuffle([&](int32_t i, int32_t j) {
        numbers(i, j);
        exchange(i, j);
    });
    return 0;
}

template <class Exchange>
Outcome Riffle(Out<I32_1D> &indices, int32_t n, int32_t seed, RandomState *state, bool isUnbiased,
               const Exchange &exchange) {
    if (n < 1)
        return ErrEmptyInput;
    return ShuffleNumbers(indices, n, exchange, [&](const auto &both) {
        if (seed >= 0)
            RandomSeed(seed, *state);
        Shuffle(n, isUnbiased, *state, both);
    });
}

template <class Array>
Outcome RiffleArray(InOut<Array> x, Out<I32_1D> indices, int32_t seed, RandomState *state,
                    int32_t unbiased) {
    return Riffle(indices, x.size(), seed, state, unbiased != 0, ExchangeOf<Array>{x.data()});
}

Outcome RiffleNumbers(Out<I32_1D> indices, int32_t count, int32_t seed, RandomState *state,
                      int32_t unbiased) {
    return Riffle(indices, count, seed, state, unbiased != 0, NoExchange());
}

// Where the shuffles of 2026 take their random numbers: that of element i is at position + i.
struct Start {
    int32_t key, stream;
    double position;
};

template <class Exchange>
Outcome CounterRiffle(Out<I32_1D> &indices, int32_t n, const Start &start,
                      const Exchange &exchange) {
    const auto &[key, stream, position] = start;
    const bool hasPlace =
        position >= 0.0 && position <= 0x1p53 - n && position == std::floor(position);
    if (const Outcome bad = FirstFailed({{n < 1, ErrEmptyInput}, {!hasPlace, ErrIndexOutOfRange}}))
        return bad;
    const NoisePlace place = {key, stream, static_cast<uint64_t>(position), NoiseKind::Order};
    return ShuffleNumbers(indices, n, exchange,
                          [&](const auto &both) { CounterShuffle(n, place, both); });
}

template <class Array>
Outcome CounterRiffleArray(InOut<Array> x, Out<I32_1D> indices, Start start) {
    return CounterRiffle(indices, x.size(), start, ExchangeOf<Array>{x.data()});
}

Outcome CounterRiffleNumbers(Out<I32_1D> indices, int32_t count, Start start) {
    return CounterRiffle(indices, count, start, NoExchange());
}

} // namespace
} // namespace qx

using qx::Returned;
using qx::Start;

ErrorCode RiffleArrayDBL2012_head(DBL1D x, I32_1D indices, int32_t seed, RandomState *state,
                                  int32_t unbiased) {
    return Returned(qx::RiffleArray<DBL1D>, x, indices, seed, state, unbiased);
}

ErrorCode RiffleArrayDBL_head(DBL1D x, I32_1D indices, int32_t seed, RandomState *state) {
    return RiffleArrayDBL2012_head(x, indices, seed, state, 0);
}

ErrorCode RiffleArrayCDB2012_head(CDB1D x, I32_1D indices, int32_t seed, RandomState *state,
                                  int32_t unbiased) {
    return Returned(qx::RiffleArray<CDB1D>, x, indices, seed, state, unbiased);
}

ErrorCode RiffleArrayCDB_head(CDB1D x, I32_1D indices, int32_t seed, RandomState *state) {
    return RiffleArrayCDB2012_head(x, indices, seed, state, 0);
}

ErrorCode RiffleArrayInt2012_head(I32_1D x, I32_1D indices, int32_t seed, RandomState *state,
                                  int32_t unbiased) {
    return Returned(qx::RiffleArray<I32_1D>, x, indices, seed, state, unbiased);
}

ErrorCode RiffleArrayInt_head(I32_1D x, I32_1D indices, int32_t seed, RandomState *state) {
    return RiffleArrayInt2012_head(x, indices, seed, state, 0);
}

ErrorCode RiffleIntNum2012_head(I32_1D indices, int32_t count, int32_t seed, RandomState *state,
                                int32_t unbiased) {
    return Returned(qx::RiffleNumbers, indices, count, seed, state, unbiased);
}

ErrorCode RiffleIntNum_head(I32_1D indices, int32_t count, int32_t seed, RandomState *state) {
    return RiffleIntNum2012_head(indices, count, seed, state, 0);
}

ErrorCode RiffleArrayDBL2026_head(DBL1D x, I32_1D indices, int32_t key, int32_t stream,
                                  double position) {
    return Returned(qx::CounterRiffleArray<DBL1D>, x, indices, Start{key, stream, position});
}

ErrorCode RiffleArrayCDB2026_head(CDB1D x, I32_1D indices, int32_t key, int32_t stream,
                                  double position) {
    return Returned(qx::CounterRiffleArray<CDB1D>, x, indices, Start{key, stream, position});
}

ErrorCode RiffleArrayInt2026_head(I32_1D x, I32_1D indices, int32_t key, int32_t stream,
                                  double position) {
    return Returned(qx::CounterRiffleArray<I32_1D>, x, indices, Start{key, stream, position});
}

ErrorCode RiffleIntNum2026_head(I32_1D indices, int32_t count, int32_t key, int32_t stream,
                                double position) {
    return Returned(qx::CounterRiffleNumbers, indices, count, Start{key, stream, position});
}

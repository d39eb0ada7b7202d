#include "frame/lane_masks.h"
#include "util/scaling.h"

#include <cmath>

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;
typedef Lanes<1> One;

constexpr int partials = 16;
constexpr int vectors = partials / L::count;

template <class Operation>
QX_INLINE void Each(DBL *x, int32_t n, Operation operation) {
    int32_t i = 0;
    for (; n - i >= L::count; i += L::count)
        operation(L::load(x + i)).store(x + i);
    for (; i < n; ++i)
        operation(One::load(x + i)).store(x + i);
}

// Updates sixteen values, each with every sixteenth element.
template <class Take>
QX_INLINE void Gather(const DBL *x, int32_t n, DBL *values, Take take) {
    L held[vectors];
    for (int k = 0; k < vectors; ++k)
        held[k] = L::load(values + k * L::count);
    int32_t i = 0;
    for (; n - i >= partials; i += partials)
        for (int k = 0; k < vectors; ++k)
            held[k] = take(held[k], L::load(x + i + k * L::count));
    for (int k = 0; k < vectors; ++k)
        held[k].store(values + k * L::count);
    for (int k = 0; i < n; ++i, ++k)
        take(One::load(values + k), One::load(x + i)).store(values + k);
}

// Combines them by halves, so that the order is the same for all widths.
template <class Take>
QX_INLINE double Combined(DBL *values, Take take) {
    for (int half = partials / 2; half > 0; half /= 2)
        for (int k = 0; k < half; ++k)
            take(One::load(values + k), One::load(values + k + half)).store(values + k);
    return values[0];
}

template <class Take>
QX_INLINE double Reduced(const DBL *x, int32_t n, double start, Take take) {
    double values[partials];
    for (double &value : values)
        value = start;
    Gather(x, n, values, take);
    return Combined(values, take);
}

// The comparisons are false for NaN, which is therefore never selected.
struct Highest {
    template <class V>
    QX_INLINE V operator()(V held, V x) const {
        return Larger(x, held);
    }
};
struct Lowest {
    template <class V>
    QX_INLINE V operator()(V held, V x) const {
        return Smaller(x, held);
    }
};
struct HighestMagnitude {
    template <class V>
    QX_INLINE V operator()(V held, V x) const {
        const V opposite = -x;
        return Highest()(Highest()(held, x), opposite);
    }
};

constexpr double infinity = __builtin_inf();

} // namespace

Range RangeOf(const DBL *x, int32_t n) {
    double low[partials];
    double high[partials];
    for (int k = 0; k < partials; ++k) {
        low[k] = infinity;
        high[k] = -infinity;
    }
    // Block by block, so that the second pass finds the elements in the cache.
    constexpr int32_t block = 2048;
    for (int32_t i = 0; i < n; i += n - i < block ? n - i : block) {
        const int32_t count = n - i < block ? n - i : block;
        Gather(x + i, count, low, Lowest());
        Gather(x + i, count, high, Highest());
    }
    return {Combined(low, Lowest()), Combined(high, Highest())};
}

double LargestMagnitude(const DBL *x, int32_t n) { return Reduced(x, n, 0.0, HighestMagnitude()); }

double SumOf(const DBL *x, int32_t n) {
    return Reduced(x, n, 0.0, [](auto sum, auto value) { return sum + value; });
}

double SumOfSquares(const DBL *x, int32_t n, double centre) {
    double sums[partials] = {};
    Gather(x, n, sums, [centre]<class V>(V sum, V value) {
        const V deviation = value - V(centre);
        return sum + deviation * deviation;
    });
    return Combined(sums, [](auto sum, auto other) { return sum + other; });
}

void ShiftAndMultiply(DBL *x, int32_t n, double shift, double factor) {
    Each(x, n, [=]<class V>(V value) { return (value - V(shift)) * V(factor); });
}

void MultiplyAndShift(DBL *x, int32_t n, double factor, double shift) {
    Each(x, n, [=]<class V>(V value) { return value * V(factor) + V(shift); });
}

void MultiplyAndDivide(DBL *x, int32_t n, double factor, double divisor) {
    Each(x, n, [=]<class V>(V value) { return value * V(factor) / V(divisor); });
}

// The number of turns rarely changes from one element to the next. While it does not, the unwrapped
// values depend only on the given ones and not on the value before: a vector of them is computed
// with the current number of turns, and kept if the rule gives this number for each element.
void Unwrap(DBL *x, int32_t n, double period) {
    const L ones(1.0);
    double turns = 0.0;
    int32_t i = 1;
    while (i < n) {
        if (n - i >= L::count) {
            const L given = L::load(x + i);
            const L unwrapped = given - L(turns) * L(period);
            double before[L::count + 1];
            before[0] = x[i - 1];
            unwrapped.store(before + 1);
            const L rule = (given - L::load(before)) / L(period) + L(0.5);
            const L next = L(turns) + ones;
            const auto holds = (rule >= L(turns)) & (rule < next);
            bool all = true;
            for (int lane = 0; lane < L::count; ++lane)
                all = all && holds.m[lane] != 0;
            if (all) {
                unwrapped.store(x + i);
                i += L::count;
                continue;
            }
        }
        turns = std::floor((x[i] - x[i - 1]) / period + 0.5);
        x[i] = x[i] - turns * period;
        ++i;
    }
}

} // namespace qx::QX_WIDTH

#include "filters/median_filter.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;

// Two vectors of stretches at a time; a single one would wait for its own results.
constexpr int vectors = 2;

// Removes the first value equal to `leaving` from the sorted window and inserts `entering` after
// all values that are not above it. If b is the window without the leaving value, rank k becomes
// the middle one of b[k - 1], b[k] and the entering value. Equal values keep their order.
QX_INLINE void Replace(DBL *window, int32_t width, const L (&leaving)[vectors],
                       const L (&entering)[vectors]) {
    L current[vectors], before[vectors];
    for (int i = 0; i < vectors; ++i) {
        current[i] = L::load(window + i * nativeLanes);
        before[i] = L(-__builtin_inf());
    }
    for (int32_t k = 0; k < width; ++k) {
        DBL *const row = window + std::ptrdiff_t{k} * medianStretches;
        for (int i = 0; i < vectors; ++i) {
            const L next = L::load(row + medianStretches + i * nativeLanes);
            const L remaining = Select(current[i] < leaving[i], current[i], next);
            Larger(before[i], Smaller(entering[i], remaining)).store(row + i * nativeLanes);
            before[i] = remaining;
            current[i] = next;
        }
    }
}

QX_INLINE void Run(DBL *window, int32_t width, DBL *samples, int32_t steps) {
    const DBL *const upper = window + std::ptrdiff_t{width / 2} * medianStretches;
    const DBL *const lower = upper - medianStretches;
    for (std::ptrdiff_t t = 0; t < steps; ++t) {
        DBL *const out = samples + t * medianStretches;
        const DBL *const in = out + std::ptrdiff_t{width} * medianStretches;
        L leaving[vectors], entering[vectors];
        for (int i = 0; i < vectors; ++i) {
            const int at = i * nativeLanes;
            leaving[i] = L::load(out + at);
            entering[i] = L::load(in + at);
            const L middle = L::load(upper + at);
            (width % 2 != 0 ? middle : (L::load(lower + at) + middle) * L(0.5)).store(out + at);
        }
        Replace(window, width, leaving, entering);
    }
}

} // namespace

void MedianSteps(DBL *window, int32_t width, DBL *samples, int32_t steps) {
    for (int32_t first = 0; first < medianStretches; first += vectors * nativeLanes)
        Run(window + first, width, samples + first, steps);
}

} // namespace qx::QX_WIDTH

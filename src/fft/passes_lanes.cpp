#include "fft/passes.h"

#include "frame/lanes.h"

#include <cstddef>

namespace qx::QX_WIDTH {
namespace {

using std::ptrdiff_t;

typedef Lanes<nativeLanes> Wide;
constexpr int complexes = nativeLanes / 2; // values in one Wide

QX_INLINE Wide Conjugate(Wide x) { return NegatedInPairs(x, false); }

struct AsItIs {
    template <class L>
    QX_INLINE L operator()(L x) const {
        return x;
    }
};
struct Times {
    double scale;
    template <class L>
    QX_INLINE L operator()(L x) const {
        return x * L(scale);
    }
};

// Pairs from k on, one in each lane; scaled(x) is the value that replaces x.
template <class L, class Scaled>
QX_INLINE void MirrorSome(DBL *values, ptrdiff_t k, ptrdiff_t n, const Scaled &scaled) {
    const ptrdiff_t opposite = n - k - (L::count - 1);
    const L a = scaled(L::load(values + k));
    const L b = scaled(L::load(values + opposite).reversed());
    (a - b).store(values + k);
    (a + b).reversed().store(values + opposite);
}

template <class Scaled>
QX_INLINE void MirrorAll(DBL *values, ptrdiff_t n, const Scaled &scaled) {
    const ptrdiff_t last = (n - 1) / 2;
    ptrdiff_t k = 1;
    for (; k + nativeLanes - 1 <= last; k += nativeLanes)
        MirrorSome<Wide>(values, k, n, scaled);
    for (; k <= last; ++k)
        MirrorSome<Lanes<1>>(values, k, n, scaled);
}

} // namespace

void MirrorSums(DBL *values, int32_t n) { MirrorAll(values, n, AsItIs{}); }

void ScaledMirrorSums(DBL *values, double scale, int32_t n) {
    values[0] *= scale;
    if (n % 2 == 0)
        values[n / 2] *= scale;
    MirrorAll(values, n, Times{scale});
}

void ScaleReversed(DBL *values, double scale, int32_t n) {
    values[0] *= scale;
    values[1] *= scale;
    DBL *low = values + 2;
    DBL *high = values + 2 * ptrdiff_t{n};
    for (; high - low >= 2 * nativeLanes; low += nativeLanes, high -= nativeLanes) {
        const Wide a = Wide::load(low) * Wide(scale);
        const Wide b = Wide::load(high - nativeLanes) * Wide(scale);
        ReversedPairs(b).store(low);
        ReversedPairs(a).store(high - nativeLanes);
    }
    for (; high - low >= 2; low += 2, high -= 2) { // the last two may be the same value
        const Lanes<2> a = Lanes<2>::load(low) * Lanes<2>(scale);
        const Lanes<2> b = Lanes<2>::load(high - 2) * Lanes<2>(scale);
        b.store(low);
        a.store(high - 2);
    }
}

void JoinMirrored(const DBL *up, const DBL *down, DBL *complex, int32_t count) {
    ptrdiff_t k = 0;
    for (; k + nativeLanes <= count; k += nativeLanes) {
        const Wide re = Wide::load(up + k);
        const Wide im = Wide::load(down - k - (nativeLanes - 1)).reversed();
        TurnsLow(re, im).store(complex + 2 * k);
        TurnsHigh(re, im).store(complex + 2 * k + nativeLanes);
    }
    for (; k < count; ++k) {
        complex[2 * k] = up[k];
        complex[2 * k + 1] = down[-k];
    }
}

void ConjugateBackward(const DBL *from, DBL *to, int32_t count) {
    ptrdiff_t k = 0;
    for (; k + complexes <= count; k += complexes)
        ReversedPairs(Conjugate(Wide::load(from + 2 * k))).store(to - 2 * (k + complexes - 1));
    for (; k < count; ++k) {
        to[-2 * k] = from[2 * k];
        to[-2 * k + 1] = -from[2 * k + 1];
    }
}

void SpreadRows(const RowsToSpread &job) {
    const ptrdiff_t values = 2 * ptrdiff_t{job.count};
    for (ptrdiff_t r = 0; r < job.rows; ++r) {
        const DBL *const from = job.from + r * job.fromPitch;
        DBL *const to = job.to + r * job.toPitch;
        ptrdiff_t i = 0;
        for (; i + nativeLanes <= values; i += nativeLanes)
            Wide::load(from + i).store(to + i);
        for (; i < values; i += 2)
            Lanes<2>::load(from + i).store(to + i);
        ConjugateBackward(from + 2 * ptrdiff_t{job.skip}, job.opposite + r * job.oppositePitch,
                          job.conjugates);
    }
}

} // namespace qx::QX_WIDTH

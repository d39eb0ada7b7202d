#include "mathlib/elementary.h"
#include "mathlib/lane_functions.h"

#include <cmath>

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;

// Calls lanes(at) for all whole groups of lanes, and one(at) for the remaining elements and for
// each element of a group for which lanes(at) returned false because it had rare arguments.
template <class OfLanes, class OfOne>
QX_INLINE void ForEach(int32_t n, OfLanes lanes, OfOne one) {
    int32_t i = 0;
    for (; n - i >= nativeLanes; i += nativeLanes)
        if (!lanes(i))
            for (int32_t k = i; k < i + nativeLanes; ++k)
                one(k);
    for (; i < n; ++i)
        one(i);
}

} // namespace

void Sines(const DBL *x, int32_t n, DBL *sines) {
    ForEach(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L sine = SineCosine(L::load(x + i), rare).sine;
            if (Any(rare))
                return false;
            sine.store(sines + i);
            return true;
        },
        [&](int32_t i) { sines[i] = std::sin(x[i]); });
}

void SinesAndCosines(const DBL *x, int32_t n, DBL *sines, DBL *cosines) {
    ForEach(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const SineAndCosine<L> both = SineCosine(L::load(x + i), rare);
            if (Any(rare))
                return false;
            both.sine.store(sines + i);
            both.cosine.store(cosines + i);
            return true;
        },
        [&](int32_t i) {
            const double angle = x[i];
            sines[i] = std::sin(angle);
            cosines[i] = std::cos(angle);
        });
}

void ArcTangents(const DBL *y, const DBL *x, int32_t n, DBL *angles) {
    ForEach(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L angle = ArcTangent(L::load(y + i), L::load(x + i), rare);
            if (Any(rare))
                return false;
            angle.store(angles + i);
            return true;
        },
        [&](int32_t i) { angles[i] = std::atan2(y[i], x[i]); });
}

void Hypotenuses(const DBL *x, const DBL *y, int32_t n, DBL *lengths) {
    ForEach(
        n,
        [&](int32_t i) {
            LaneMask<L> rare = {};
            const L length = Hypotenuse(L::load(x + i), L::load(y + i), rare);
            if (Any(rare))
                return false;
            length.store(lengths + i);
            return true;
        },
        [&](int32_t i) { lengths[i] = std::hypot(x[i], y[i]); });
}

} // namespace qx::QX_WIDTH
